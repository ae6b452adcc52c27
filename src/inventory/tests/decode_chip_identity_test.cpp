// Chip classification over the shared device ID table, and the product
// identity texts: branded models, 11S product IDs, the UUID-shaped tag.
#include <gtest/gtest.h>

#include <cstring>
#include <set>
#include <string>

#include "decode_test_support.h"
#include "inventory/AdapterFunc_Chip.h"
#include "inventory/AdapterFunc_Identity.h"

namespace {

_tagZORAPSDMDevice deviceWithId(std::uint16_t pciDeviceId) {
    _tagZORAPSDMDevice device;
    std::memset(&device, 0, sizeof device);
    device.pciDeviceId = pciDeviceId;
    return device;
}

}  // namespace

TEST(ChipClassification, TableCoversEveryCodeAndTheGenerationTestsFollowTheCode) {
    std::set<int> codes;
    int rowsOf26 = 0;
    for (std::size_t i = 0; i < ZORAP_CHIP_TABLE_ROWS; ++i) {
        zorap_chip_row const& row = ZORAP_CHIP_TABLE[i];
        _tagZORAPSDMDevice device = deviceWithId(row.pciDeviceId);
        int const code = GetRSXType(&device);
        SCOPED_TRACE(row.chipName);
        EXPECT_EQ(code, row.chipCode);
        codes.insert(code);
        rowsOf26 += code == 26;

        int const expected4G = (code == 8 || code == 9) ? 2 : (code == 10 || code == 11) ? 1 : 0;
        EXPECT_EQ(GetRSX4GbType(&device), expected4G);
        EXPECT_EQ(GetRSX8GbType(&device), code == 12 ? 1 : 0);
        EXPECT_EQ(GetRSX4GbOrNewerType(&device), code > 7 ? 1 : 0);
        EXPECT_EQ(IsEnodeMacChipCode(code), code == 15 || code == 17 || code == 21 || code == 26);
    }
    EXPECT_EQ(codes.size(), 27u);
    EXPECT_EQ(*codes.begin(), 0);
    EXPECT_EQ(*codes.rbegin(), 26);
    EXPECT_EQ(rowsOf26, 2);
}

TEST(ChipClassification, NullAndUnknownDevices) {
    EXPECT_EQ(GetRSXType(nullptr), 0);
    EXPECT_EQ(GetRSX4GbType(nullptr), 0);
    EXPECT_EQ(GetRSX8GbType(nullptr), 0);
    EXPECT_EQ(GetRSX4GbOrNewerType(nullptr), 0);

    // An unknown device ID counts as newer than every known chip.
    _tagZORAPSDMDevice unknown = deviceWithId(0xBEEF);
    EXPECT_EQ(GetRSXType(&unknown), 100);
    EXPECT_EQ(GetRSX4GbOrNewerType(&unknown), 1);
    EXPECT_EQ(GetRSX4GbType(&unknown), 0);
    EXPECT_EQ(GetRSX8GbType(&unknown), 0);
}

TEST(ProductIdentity, BrandedModelsIgnoreCase) {
    char exact[] = "KMX3101";
    char lower[] = "kmx3104";
    char other[] = "KMX3105";
    char longer[] = "KMX3101A";
    EXPECT_EQ(IsIBMBrandedAdapter(exact), 1);
    EXPECT_EQ(IsIBMBrandedAdapter(lower), 1);
    EXPECT_EQ(IsIBMBrandedAdapter(other), 0);
    EXPECT_EQ(IsIBMBrandedAdapter(longer), 0);
    EXPECT_EQ(IsIBMBrandedAdapter(nullptr), 0);
}

TEST(ProductIdentity, ElevenSProductIdIsTrimmedAndExactly22Long) {
    char padded[] = "11S7V12345XQ21B0008765   ";
    EXPECT_EQ(IsIBM11SProductId(padded), 1);
    EXPECT_STREQ(padded, "11S7V12345XQ21B0008765");  // the caller's text is trimmed

    char leading[] = "  11S7V12345XQ21B0008765";
    EXPECT_EQ(IsIBM11SProductId(leading), 1);

    char tooLong[] = "11S7V12345XQ21B00087658";
    char tooShort[] = "11S7V12345XQ21B000876";
    char otherPrefix[] = "12S7V12345XQ21B0008765";
    char empty[] = "";
    EXPECT_EQ(IsIBM11SProductId(tooLong), 0);
    EXPECT_EQ(IsIBM11SProductId(tooShort), 0);
    EXPECT_EQ(IsIBM11SProductId(otherPrefix), 0);
    EXPECT_EQ(IsIBM11SProductId(empty), 0);
    EXPECT_EQ(IsIBM11SProductId(nullptr), 0);
}

TEST(ProductIdentity, SerialAndPartNumberOfAProductId) {
    EXPECT_STREQ(GetSerialNumberFromIBM11SProductId("11S7V12345XQ21B0008765 "), "XQ21B0008765");
    EXPECT_STREQ(GetSerialNumberFromIBM11SProductId("  VXA1631K0042  "), "VXA1631K0042");
    EXPECT_STREQ(GetSerialNumberFromIBM11SProductId("11S7V12345XQ21B00087658"),
                 "11S7V12345XQ21B00087658");
    EXPECT_STREQ(GetSerialNumberFromIBM11SProductId(""), "");
    EXPECT_STREQ(GetSerialNumberFromIBM11SProductId(nullptr), "");

    // A text longer than the work copy is cut, never overrun.
    std::string huge(1000, 'Q');
    EXPECT_EQ(std::strlen(GetSerialNumberFromIBM11SProductId(huge.c_str())), 255u);

    char id[] = "11S7V12345XQ21B0008765";
    EXPECT_STREQ(GetPartNumberFromIBM11SProductId(id), "7V12345");
    char plain[] = "VXA1631K0042";
    EXPECT_EQ(GetPartNumberFromIBM11SProductId(plain), nullptr);
    EXPECT_EQ(GetPartNumberFromIBM11SProductId(nullptr), nullptr);
}

TEST(ProductIdentity, UuidFromSerialKeepsTheTailOfTheSerialBefore) {
    char longSerial[] = "0123456789ABCDEFXYZ";  // only 16 characters count
    EXPECT_STREQ(ConvertSerialNumberToUUID(longSerial), "30313233-3435-3637-3839-414243444546");

    char shortSerial[] = "ABC";
    EXPECT_STREQ(ConvertSerialNumberToUUID(shortSerial), "41424333-3435-3637-3839-414243444546");

    // A byte above 0x7F prints as a negative number: its first two digits
    // are "FF".
    char high[] = "\xE9Z";
    EXPECT_STREQ(ConvertSerialNumberToUUID(high), "FF5A4333-3435-3637-3839-414243444546");

    EXPECT_STREQ(ConvertSerialNumberToUUID(nullptr), "FF5A4333-3435-3637-3839-414243444546");
}

TEST(ProductIdentity, PackageTagOfProductIdUsesItsSerialPart) {
    char id[] = "11S7V12345XQ21B0008765";
    char serial[] = "XQ21B0008765";
    std::string fromId = GetPhysicalPackageTag(id);
    std::string fromSerial = ConvertSerialNumberToUUID(serial);
    EXPECT_EQ(fromId, fromSerial);
    EXPECT_EQ(fromId.substr(0, 8), "58513231");

    // A plain serial is used whole; a short one keeps the tail before it.
    char plain[] = "VX";
    EXPECT_EQ(std::string(GetPhysicalPackageTag(plain)).substr(0, 8), "56583231");
}

// Runs in a process of its own (see CMakeLists.txt): the UUID buffer starts
// as all zeros only once per process.
TEST(FreshProcess, UuidOfAShortSerialAfterAFreshStart) {
    char serial[] = "ABC";
    EXPECT_STREQ(ConvertSerialNumberToUUID(serial), "41424300-0000-0000-0000-000000000000");
}
