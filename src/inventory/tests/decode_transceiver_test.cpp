// Transceiver pages, blank padding, the mezzanine board test and the ENode MAC.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "decode_test_support.h"
#include "inventory/AdapterFunc_Transceiver.h"

namespace {

// A page of `size` bytes with the three text fields blank-padded at their
// offsets (as far as the page reaches); other bytes 0xEE.
std::vector<std::uint8_t> page(unsigned int size) {
    std::vector<std::uint8_t> bytes(size, 0xEE);
    auto put = [&](unsigned int offset, std::string const& text) {
        std::string padded = text + std::string(16 - text.size(), ' ');
        for (unsigned int i = 0; i < 16 && offset + i < size; ++i) bytes[offset + i] = padded[i];
    };
    put(20, "VEXLAN");
    put(40, "VXS-16G-SR");
    put(68, "VXS1A2B3C4D");
    return bytes;
}

_SFPFields cleared() {
    _SFPFields fields;
    std::memset(&fields, 0, sizeof fields);
    return fields;
}

void parse(_tagZORAPSDMDevice* device, std::vector<std::uint8_t> const& bytes, _SFPFields* fields) {
    auto block = decode_test::exactCopy(bytes);
    parseSFPFields(device, block.get(), static_cast<unsigned int>(bytes.size()), fields);
}

TEST(SfpString, BlankPaddingIsStrippedAndOutputBounded) {
    char in[] = "VEXLAN          ";  // 16 bytes
    char out[32];
    copySFPString(out, in, sizeof out, 16);
    EXPECT_STREQ(out, "VEXLAN");

    char blanks[] = "                ";
    copySFPString(out, blanks, sizeof out, 16);
    EXPECT_STREQ(out, "");

    // A field that does not end in a blank is kept whole.
    char full[] = "ABCDEFGHIJKLMNOP";
    copySFPString(out, full, sizeof out, 16);
    EXPECT_STREQ(out, "ABCDEFGHIJKLMNOP");

    // The output holds outSize - 1 characters and its terminator.
    char small[6];
    std::memset(small, '#', sizeof small);
    copySFPString(small, full, sizeof small, 16);
    EXPECT_STREQ(small, "ABCDE");
    char cutAtBlank[] = "ABC   DEFG";
    copySFPString(small, cutAtBlank, sizeof small, 10);
    EXPECT_STREQ(small, "ABC");

    std::strcpy(out, "old");
    copySFPString(out, nullptr, sizeof out, 16);
    EXPECT_STREQ(out, "");
    std::strcpy(out, "old");
    copySFPString(out, in, 0, 16);
    EXPECT_STREQ(out, "old");
    copySFPString(nullptr, in, 32, 16);
}

TEST(SfpPage, FieldsAppearAsThePageReaches) {
    _tagZORAPSDMDevice device = decode_test::deviceOfChip("RSX-1620");

    struct Case {
        unsigned int size;
        char const* manufacturer;
        char const* partNumber;
        char const* serialNumber;
    } const cases[] = {
        {0, "", "", ""},
        {35, "", "", ""},
        {36, "VEXLAN", "", ""},
        {55, "VEXLAN", "", ""},
        {56, "VEXLAN", "VXS-16G-SR", ""},
        {83, "VEXLAN", "VXS-16G-SR", ""},
        {84, "VEXLAN", "VXS-16G-SR", "VXS1A2B3C4D"},
        {511, "VEXLAN", "VXS-16G-SR", "VXS1A2B3C4D"},
    };
    for (Case const& c : cases) {
        SCOPED_TRACE(c.size);
        _SFPFields fields = cleared();
        std::strcpy(fields.Name, "kept");
        parse(&device, page(c.size), &fields);
        EXPECT_STREQ(fields.Manufacturer, c.manufacturer);
        EXPECT_STREQ(fields.PartNumber, c.partNumber);
        EXPECT_STREQ(fields.SerialNumber, c.serialNumber);
        EXPECT_STREQ(fields.Name, "kept");
        // Only a full 512-byte page is kept raw.
        EXPECT_EQ(fields.RawData[20], 0);
    }

    _SFPFields fields = cleared();
    std::vector<std::uint8_t> full = page(kSFPDataSize);
    parse(&device, full, &fields);
    EXPECT_EQ(std::memcmp(fields.RawData, full.data(), kSFPDataSize), 0);
    EXPECT_STREQ(fields.SerialNumber, "VXS1A2B3C4D");

    // Null data reads nothing.
    fields = cleared();
    parseSFPFields(&device, nullptr, kSFPDataSize, &fields);
    EXPECT_STREQ(fields.Manufacturer, "");
    parseSFPFields(&device, full.data(), kSFPDataSize, nullptr);
}

TEST(SfpPage, NicTwinDecodesTheTextFieldsOnly) {
    _Nic_SFPFields fields;
    std::memset(&fields, 0, sizeof fields);
    auto block = decode_test::exactCopy(page(84));
    parseSFPFields(block.get(), 84, &fields);
    EXPECT_STREQ(fields.Manufacturer, "VEXLAN");
    EXPECT_STREQ(fields.PartNumber, "VXS-16G-SR");
    EXPECT_STREQ(fields.SerialNumber, "VXS1A2B3C4D");

    std::memset(&fields, 0, sizeof fields);
    auto shortBlock = decode_test::exactCopy(page(83));
    parseSFPFields(shortBlock.get(), 83, &fields);
    EXPECT_STREQ(fields.SerialNumber, "");
    EXPECT_STREQ(fields.PartNumber, "VXS-16G-SR");
}

TEST(SfpPage, StatusFollowsModuleStateOrMezzanineBoard) {
    _tagZORAPSDMDevice device = decode_test::deviceOfChip("RSX-1620");
    std::vector<std::uint8_t> bytes = page(kSFPDataSize);

    _SFPFields fields = cleared();
    device.transceiverState = ZORAP_TRANSCEIVER_STATE_GOOD;
    parse(&device, bytes, &fields);
    EXPECT_EQ(fields.SFPStatus, 1);

    fields = cleared();
    fields.SFPStatus = 7;
    device.transceiverState = 5;
    parse(&device, bytes, &fields);
    EXPECT_EQ(fields.SFPStatus, 0);

    // A mezzanine board has no module state to read and still shows 1.
    device.subsystemDeviceId = ZORAP_MEZZ_OWN_8G_IDS[0];
    parse(&device, bytes, &fields);
    EXPECT_EQ(fields.SFPStatus, 1);

    fields = cleared();
    parse(nullptr, bytes, &fields);
    EXPECT_EQ(fields.SFPStatus, 0);
    EXPECT_STREQ(fields.SerialNumber, "VXS1A2B3C4D");
}

TEST(Mezzanine, EveryRowOfTheBoardTableAndNearMisses) {
    _tagZORAPSDMDevice device = decode_test::deviceOfChip("RSX-880");
    for (std::size_t r = 0; r < ZORAP_MEZZ_TABLE_ROWS; ++r) {
        zorap_mezz_row const& row = ZORAP_MEZZ_TABLE[r];
        for (std::size_t i = 0; i < row.count; ++i) {
            device.subsystemVendorId = row.subsystemVendorId;
            device.subsystemDeviceId = row.subsystemDeviceIds[i];
            EXPECT_EQ(isMezzHBA(&device), 1) << std::hex << row.subsystemVendorId << "/"
                                             << row.subsystemDeviceIds[i];
        }
    }
    struct Pair {
        std::uint16_t vendor;
        std::uint16_t board;
    } const ordinary[] = {
        {ZORAP_PCI_VENDOR_ID, ZORAP_SUBSYS_STANDARD_BOARD},
        {0x1028, 0x6101},              // the vendor's own ID under another vendor
        {ZORAP_PCI_VENDOR_ID, 0x3261}, // another vendor's ID under the vendor's own
        {0x103C, 0x0069},
        {0x0000, 0x0000},
    };
    for (Pair const& p : ordinary) {
        device.subsystemVendorId = p.vendor;
        device.subsystemDeviceId = p.board;
        EXPECT_EQ(isMezzHBA(&device), 0) << std::hex << p.vendor << "/" << p.board;
    }
    EXPECT_EQ(isMezzHBA(nullptr), 0);
}

TEST(EnodeMac, CopiesSixBytes) {
    _tagZORAPSDMDevice device = decode_test::deviceOfChip("RSX-A20");
    unsigned char const mac[6] = {0x02, 0x7E, 0x5A, 0x00, 0xA2, 0xFF};
    std::memcpy(device.macAddress, mac, sizeof mac);
    char out[8];
    std::memset(out, '#', sizeof out);
    EXPECT_EQ(GetDeviceMacAddress(&device, out), 0);
    EXPECT_EQ(std::memcmp(out, mac, 6), 0);
    EXPECT_EQ(out[6], '#');
    EXPECT_EQ(GetDeviceMacAddress(nullptr, out), 1);
    EXPECT_EQ(GetDeviceMacAddress(&device, nullptr), 1);
}

}  // namespace
