// Debug lines of the decoders, read back from the diagnostic log. Runs under
// tests/isolate.sh, with a private /opt.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstring>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "decode_test_support.h"
#include "inventory/AdapterFunc_Transceiver.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

namespace {

char const kLogDir[] = "/opt/Vexlan_Corporation/CNAProviders/log";

bool isolated() {
    std::ifstream mounts("/proc/self/mounts");
    std::string line;
    while (std::getline(mounts, line))
        if (line.rfind("vexlan-opt /opt ", 0) == 0) return true;
    return false;
}

// The messages of the log, without their time stamps (24 characters and a
// blank).
std::vector<std::string> logMessages() {
    std::ifstream file(std::string(kLogDir) + "/Vexlan_CNA_Provider.log");
    std::vector<std::string> messages;
    std::string line;
    while (std::getline(file, line))
        if (line.size() > 25) messages.push_back(line.substr(25));
    return messages;
}

class DecodeLog : public ::testing::Test {
protected:
    void SetUp() override {
        if (!isolated()) GTEST_SKIP() << "needs tests/isolate.sh";
        for (char const* dir : {"/opt/Vexlan_Corporation", "/opt/Vexlan_Corporation/CNAProviders", kLogDir})
            mkdir(dir, 0755);
        std::remove((std::string(kLogDir) + "/Vexlan_CNA_Provider.log").c_str());
        Vexlan_FC_Utils_CMPI::InitializeLogFile();
        g_EnableDebugPrint = true;
    }
    void TearDown() override { g_EnableDebugPrint = false; }
};

TEST_F(DecodeLog, TransceiverFieldsAndMezzanineBoard) {
    _tagZORAPSDMDevice device = decode_test::deviceOfChip("RSX-1620");
    device.subsystemDeviceId = 0x6102;
    std::vector<std::uint8_t> page(84, ' ');
    std::memcpy(&page[20], "VEXLAN", 6);
    std::memcpy(&page[40], "VXS-16G-SR", 10);
    std::memcpy(&page[68], "VXS1A2B3C4D", 11);
    _SFPFields fields;
    std::memset(&fields, 0, sizeof fields);
    parseSFPFields(&device, page.data(), 84, &fields);

    _Nic_SFPFields nic;
    std::memset(&nic, 0, sizeof nic);
    parseSFPFields(page.data(), 56, &nic);

    std::vector<std::string> expected = {
        "16G Mezzanine CNA/HBA detected (SSVID/SSDID = 0x7e5a/0x6102)",
        "SFPField.PartNumber:   VXS-16G-SR",
        "SFPField.SerialNumber: VXS1A2B3C4D",
        "SFPFIELD.Manufacturer: VEXLAN",
        "SFPField.PartNumber:   VXS-16G-SR",
        "SFPField.SerialNumber: ",
        "SFPFIELD.Manufacturer: VEXLAN",
    };
    EXPECT_EQ(logMessages(), expected);
}

TEST_F(DecodeLog, EachBoardKindHasItsLine) {
    struct Case {
        std::uint16_t vendor;
        std::uint16_t board;
        char const* line;
    } const cases[] = {
        {0x7E5A, 0x6805, "8G Mezzanine CNA/HBA detected (SSVID/SSDID = 0x7e5a/0x6805)"},
        {0x1137, 0x0075, "8G Mezzanine CNA/HBA detected (SSVID/SSDID = 0x1137/0x0075)"},
        {0x1028, 0x018A, "Dell 8G Mezzanine CNA/HBA detected (SSVID/SSDID = 0x1028/0x018a)"},
        {0x0E11, 0x0105, "Mezzanine HBA/FibreDown detected (SSVID/SSDID = 0x0e11/0x0105)"},
        {0x103C, 0x1329, "Mezzanine HBA/FibreDown detected (SSVID/SSDID = 0x103c/0x1329)"},
        {0x7E5A, 0x6203, "Dell Yellowstone platform motherboard 2G (SSVID/SSDID = 0x7e5a/0x6203)"},
    };
    _tagZORAPSDMDevice device = decode_test::deviceOfChip("RSX-880");
    std::vector<std::string> expected;
    for (Case const& c : cases) {
        device.subsystemVendorId = c.vendor;
        device.subsystemDeviceId = c.board;
        EXPECT_EQ(isMezzHBA(&device), 1);
        expected.push_back(c.line);
    }
    // An ordinary board prints nothing.
    device.subsystemVendorId = 0x7E5A;
    device.subsystemDeviceId = 0x0001;
    EXPECT_EQ(isMezzHBA(&device), 0);
    EXPECT_EQ(logMessages(), expected);
}

TEST_F(DecodeLog, EnodeMacLineAndSilenceWhenDebugIsOff) {
    _tagZORAPSDMDevice device = decode_test::deviceOfChip("RSX-A80");
    unsigned char const mac[6] = {0x02, 0x7E, 0x5A, 0x0B, 0xC4, 0x0F};
    std::memcpy(device.macAddress, mac, sizeof mac);
    char out[6];
    EXPECT_EQ(GetDeviceMacAddress(&device, out), 0);

    g_EnableDebugPrint = false;
    EXPECT_EQ(GetDeviceMacAddress(&device, out), 0);
    device.subsystemDeviceId = 0x6101;
    EXPECT_EQ(isMezzHBA(&device), 1);

    std::vector<std::string> expected = {"GetDeviceMacAddress: MAC Address=02:7E:5A:0B:C4:0F"};
    EXPECT_EQ(logMessages(), expected);
}

}  // namespace
