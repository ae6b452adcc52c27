// VPD and transceiver reads through the adapter library, with descriptions
// written here and failures injected for one device.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "decode_test_support.h"
#include "inventory/AdapterFunc_Transceiver.h"
#include "inventory/AdapterFunc_VPD.h"
#include "zorap_sim_control.h"

using decode_test::VpdStream;

namespace {

std::string hexOf(std::vector<std::uint8_t> const& bytes) {
    std::string text;
    char pair[3];
    for (std::uint8_t b : bytes) {
        std::snprintf(pair, sizeof pair, "%02x", b);
        text += pair;
    }
    return text;
}

// An adapter with one FC function on port 0, with or without a transceiver.
// `identity` gives the chip and VPD members, `fc` further members of the
// function.
std::string adapter(int index, std::string const& identity, std::string const& fc = "",
                    bool transceiver = false) {
    char wwns[128];
    std::snprintf(wwns, sizeof wwns,
                  "\"nodeWWN\": \"30:00:02:7e:5a:00:00:%02x\", \"portWWN\": \"31:00:02:7e:5a:00:00:%02x\"",
                  index, index);
    std::string port = "{\"portNumber\": 0, ";
    if (transceiver)
        port += "\"transceiver\": {\"vendor\": \"VEXLAN\", \"partNumber\": \"VXS-16G-SR\", "
                "\"serialNumber\": \"VXS1A2B3C4D\"}, ";
    port += "\"protocols\": [{\"type\": \"fc\", " + std::string(wwns) + fc + "}]}";
    return "{\"model\": \"VXF1622\", \"serialNumber\": \"VXA000" + std::to_string(index) + "\", " +
           identity + ", \"ports\": [" + port + "]}";
}

// Adapters in the order of the description.
enum Device {
    kNewChip,       // code 25, full VPD and an I2C UUID
    kOlderChip,     // code 7, VPD present but not readable by the provider
    kUnknownChip,   // unknown device ID, VPD read
    kNoVpd,         // code 8 without VPD
    kNoEndTag,      // raw stream without end tag
    kOverrun,       // raw stream whose last keyword claims more than it has
    kMezzanine,     // code 24 on a mezzanine board, no module state
    kEmptyCage,     // code 24, no transceiver
    kDeviceCount
};

std::string description() {
    std::vector<std::uint8_t> noEnd = VpdStream().readOnly(9).keyword("PN", "NE-1").bytes();

    // "SN" claims 200 bytes; the zeroed rest of the buffer follows its 8.
    VpdStream overrun;
    overrun.identifier("HBA").keywordWithLength("SN", "ABCDEFGH", 200);

    std::vector<std::string> adapters = {
        adapter(kNewChip, "\"chip\": \"RSX-1620\", \"i2cUuid\": \"6c1e-i2c\", "
                          "\"vpd\": {\"productId\": \"Vexlan 16Gb HBA\", \"PN\": \"VXF1622-01\", "
                          "\"SN\": \"VXA1631K0042\", \"V9\": \"036412\", \"YU\": \"3f2a-vpd\"}"),
        adapter(kOlderChip, "\"chip\": \"RSX-251\", \"i2cUuid\": \"older-i2c\", "
                            "\"vpd\": {\"PN\": \"OLD-01\"}"),
        adapter(kUnknownChip, "\"pciDeviceId\": 30583, \"vpd\": {\"SN\": \"UNK-77\"}"),
        adapter(kNoVpd, "\"chip\": \"RSX-460\""),
        adapter(kNoEndTag, "\"chip\": \"RSX-880\", \"vpdHex\": \"" + hexOf(noEnd) + "\""),
        adapter(kOverrun, "\"chip\": \"RSX-880\", \"vpdHex\": \"" + hexOf(overrun.bytes()) + "\""),
        adapter(kMezzanine, "\"chip\": \"RSX-1610\", \"subsystemDeviceId\": 24833",
                ", \"transceiverState\": 0", true),
        adapter(kEmptyCage, "\"chip\": \"RSX-1610\""),
    };
    std::string text = "{\"adapters\": [";
    for (std::size_t i = 0; i < adapters.size(); ++i) text += (i ? ", " : "") + adapters[i];
    return text + "]}";
}

class LibraryDecode : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_EQ(zorap_sim_load_json(description().c_str()), 0);
        ASSERT_EQ(ZORAP_Initialize(0, 0), ZORAP_OK);
        zorap_sim_reset();
        decode_test::clearVpdBuffers();

        _zorap_adapter_list_t* list = ZORAP_GetAdapterList();
        ASSERT_NE(list, nullptr);
        for (_zorap_adapter_t* a = list->firstAdapter; a != nullptr; a = a->next)
            devices_.push_back(&a->phyPortList->firstPhyPort->protocolList->firstProtocol->fcDevice);
        ASSERT_EQ(devices_.size(), static_cast<std::size_t>(kDeviceCount));
    }
    void TearDown() override {
        EXPECT_EQ(zorap_sim_outstanding_allocations(), 0u);
        zorap_sim_reset();
        ZORAP_Uninitialize();
    }
    static unsigned long calls(zorap_sim_function fn) { return zorap_sim_call_count(fn); }

    std::vector<_tagZORAPSDMDevice*> devices_;
};

TEST_F(LibraryDecode, NewChipReadsI2cUuidAndDecodesVpd) {
    EXPECT_EQ(GetHBAVPDData(devices_[kNewChip]), 0);
    EXPECT_STREQ(g_I2CUUID, "6c1e-i2c");
    EXPECT_STREQ(g_productId, "Product Identifier:Vexlan 16Gb HBA");
    EXPECT_STREQ(g_partNumber, "Part Number:VXF1622-01");
    EXPECT_STREQ(g_serialNumber, "Serial Number:VXA1631K0042");
    EXPECT_STREQ(g_flashImageVersion, "Flash Image Version:3.64.12");
    EXPECT_STREQ(g_UUID, "UUID:3f2a-vpd");
    EXPECT_STREQ(g_endTag, "End Tag:");
    EXPECT_EQ(calls(ZORAP_FN_GetVpd), 1u);
    EXPECT_EQ(calls(ZORAP_FN_FreeMem), 1u);
}

TEST_F(LibraryDecode, NullAndOlderChipsHaveNoVpd) {
    EXPECT_EQ(GetHBAVPDData(nullptr), -1);
    EXPECT_EQ(calls(ZORAP_FN_GetUUIDFromI2CVPD), 0u);
    EXPECT_EQ(calls(ZORAP_FN_GetVpd), 0u);

    // The I2C UUID is tried even so.
    EXPECT_EQ(GetHBAVPDData(devices_[kOlderChip]), -1);
    EXPECT_STREQ(g_I2CUUID, "older-i2c");
    EXPECT_STREQ(g_partNumber, "");
    EXPECT_EQ(calls(ZORAP_FN_GetVpd), 0u);

    // A device without an I2C UUID clears the one before.
    EXPECT_EQ(GetHBAVPDData(devices_[kUnknownChip]), 0);
    EXPECT_STREQ(g_I2CUUID, "");
    EXPECT_STREQ(g_serialNumber, "Serial Number:UNK-77");
}

TEST_F(LibraryDecode, FailureForOneDeviceLeavesBuffersAndTheNextDeviceDecodes) {
    EXPECT_EQ(GetHBAVPDData(devices_[kNoVpd]), static_cast<int>(ZORAP_ERR_NOT_PRESENT));
    EXPECT_EQ(decode_test::filledVpdBuffers(), 0);

    ASSERT_EQ(zorap_sim_fail(ZORAP_FN_GetVpd, 42, 1), 0);
    ASSERT_EQ(zorap_sim_fail(ZORAP_FN_GetUUIDFromI2CVPD, 43, 1), 0);
    std::strcpy(g_I2CUUID, "from the device before");
    std::strcpy(g_serialNumber, "Serial Number:from the device before");
    EXPECT_EQ(GetHBAVPDData(devices_[kNewChip]), 42);
    EXPECT_STREQ(g_I2CUUID, "");
    EXPECT_STREQ(g_serialNumber, "Serial Number:from the device before");
    EXPECT_STREQ(g_productId, "");

    EXPECT_EQ(GetHBAVPDData(devices_[kNewChip]), 0);
    EXPECT_STREQ(g_serialNumber, "Serial Number:VXA1631K0042");
}

// The texts of every line buffer.
std::vector<std::string> vpdLines() {
    std::vector<std::string> lines;
    for (char* buffer : decode_test::allVpdBuffers()) lines.emplace_back(buffer, strnlen(buffer, kVpdLineSize));
    return lines;
}

void setVpdLines(std::vector<std::string> const& lines) {
    std::vector<char*> buffers = decode_test::allVpdBuffers();
    for (std::size_t i = 0; i < buffers.size(); ++i) std::snprintf(buffers[i], kVpdLineSize, "%s", lines[i].c_str());
}

// Each function of an adapter reads the adapter's VPD: a stream equal to the
// one read before leaves every line as a fresh decode from the same state
// would, whatever the caller cleared in between, and each read still asks
// the library.
TEST_F(LibraryDecode, TheSameStreamReadAgainGivesTheLinesOfAFreshDecode) {
    const Device order[] = {kNewChip, kNewChip, kUnknownChip, kNewChip, kOverrun, kOverrun, kNewChip, kNewChip};
    unsigned long reads = 0;
    for (std::size_t step = 0; step < sizeof order / sizeof order[0]; ++step) {
        if (step % 2 == 1) {
            std::memset(g_serialNumber, 0, kVpdLineSize);
            std::strcpy(g_fcCodeVersion, "FC Code:left by the caller");
        }
        const std::vector<std::string> before = vpdLines();
        ASSERT_EQ(GetHBAVPDData(devices_[order[step]]), 0) << step;
        EXPECT_EQ(calls(ZORAP_FN_GetVpd), ++reads);
        const std::vector<std::string> read = vpdLines();

        std::vector<unsigned char> stream(ZORAP_VPD_BUFFER_SIZE);
        std::uint32_t length = ZORAP_VPD_BUFFER_SIZE;
        ASSERT_EQ(ZORAP_GetVpd(devices_[order[step]]->deviceHandle, 0, stream.data(), &length), ZORAP_OK);
        ++reads;
        setVpdLines(before);
        PrintVPD(stream.data(), stream.size());
        std::vector<std::string> fresh = vpdLines();
        fresh[15] = read[15];   // g_I2CUUID comes from its own call, not the stream
        EXPECT_EQ(read, fresh) << "step " << step;
    }
}

TEST_F(LibraryDecode, MalformedStreamsStayWithinTheBuffer) {
    EXPECT_EQ(GetHBAVPDData(devices_[kNoEndTag]), 0);
    EXPECT_STREQ(g_RTag, "VPD-R Tag:");
    EXPECT_STREQ(g_partNumber, "Part Number:NE-1");
    EXPECT_STREQ(g_endTag, "");

    EXPECT_EQ(GetHBAVPDData(devices_[kOverrun]), 0);
    EXPECT_STREQ(g_productId, "Product Identifier:HBA");
    EXPECT_STREQ(g_serialNumber, "Serial Number:ABCDEFGH");
}

TEST_F(LibraryDecode, TransceiverDataOfMezzanineAndEmptyCage) {
    std::vector<std::uint8_t> buffer(kSFPDataSize);
    _tagZORAPSDMDevice* mezzanine = devices_[kMezzanine];
    ASSERT_EQ(ZORAP_GetSFPData(mezzanine, buffer.data()), ZORAP_OK);
    _SFPFields fields;
    std::memset(&fields, 0, sizeof fields);
    parseSFPFields(mezzanine, buffer.data(), kSFPDataSize, &fields);
    EXPECT_STREQ(fields.Manufacturer, "VEXLAN");
    EXPECT_STREQ(fields.PartNumber, "VXS-16G-SR");
    EXPECT_STREQ(fields.SerialNumber, "VXS1A2B3C4D");
    EXPECT_EQ(std::memcmp(fields.RawData, buffer.data(), kSFPDataSize), 0);
    EXPECT_NE(mezzanine->transceiverState, ZORAP_TRANSCEIVER_STATE_GOOD);
    EXPECT_EQ(fields.SFPStatus, 1);

    EXPECT_NE(ZORAP_GetSFPData(devices_[kEmptyCage], buffer.data()), ZORAP_OK);
}

}  // namespace
