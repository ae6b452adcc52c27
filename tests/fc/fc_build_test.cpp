// The builds of the FC class lists over adapter descriptions written here:
// the values each slot takes from the adapter library, and how each list
// places and counts its slots.
#include <cstring>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "classes/Vexlan_FC_FCPortStatistics_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "classes/Vexlan_FC_LogicalPortGroup_CMPI.h"
#include "classes/Vexlan_FC_PortController_CMPI.h"
#include "classes/Vexlan_FCHBA_SoftwareIdentity_CMPI.h"
#include "fc_test_support.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/ossimpl-CIM.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using fctest::fcAdapter;
using fctest::fcFunction;
using fctest::host;
using fctest::json;

namespace {

class FCBuild : public ::testing::Test {
protected:
    void SetUp() override
    {
        // No log file is written by these tests.
        g_EnableDebugPrint = false;
        g_EnableLogError = false;
    }

    void TearDown() override
    {
        removeFCPortList();
        removePortControllerList();
        removeLogicalPortGroupList();
        removeFCPortStatisticsList();
        zorap_sim_reset();
        ZORAP_Uninitialize();
    }

    static void use(const json& description)
    {
        ZORAP_Uninitialize();
        ASSERT_EQ(0, zorap_sim_load_json(description.dump().c_str()));
        ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    }

    // One adapter of the chip with one physical port carrying `functions`.
    static json oneAdapter(const std::string& chip, std::vector<json> functions, const std::string& serial = "SER1")
    {
        json a = fcAdapter(1, chip, 0, serial);
        a["ports"] = json::array({{{"portNumber", 0}, {"protocols", functions}}});
        return host(json::array({a}));
    }

    static const FCPortEntry& port(int i) { return g_FCPortList.entries[i]; }
};

TEST_F(FCBuild, PortStateGivesOperationalStatusAndDeviceStatus)
{
    use(oneAdapter("RSX-1610", {fcFunction(1, 0, {{"state", "online"}}), fcFunction(1, 1, {{"state", "loopdown"}}),
                                fcFunction(1, 2, {{"state", "suspended"}}), fcFunction(1, 3, {{"state", 9}})}));
    buildFCPortList();
    ASSERT_EQ(4, g_FCPortList.count);
    const unsigned expected[4][2] = {{2, 0}, {6, 4097}, {1, 0}, {1, 0}};
    for (int i = 0; i < 4; ++i) {
        EXPECT_EQ(expected[i][0], port(i).operationalStatus) << i;
        EXPECT_EQ(expected[i][1], port(i).deviceStatus) << i;
        EXPECT_EQ(1, port(i).valid);
    }
}

TEST_F(FCBuild, PortTypeCodesMapToCimPortTypes)
{
    std::vector<json> functions;
    for (int code = 0; code <= 10; ++code)
        functions.push_back(fcFunction(1, code, {{"portType", code}}));
    use(oneAdapter("RSX-1610", functions));
    buildFCPortList();
    const unsigned expected[] = {0, 10, 11, 12, 13, 15, 16, 1, 14, 17, 0};
    ASSERT_EQ(11, g_FCPortList.count);
    for (int i = 0; i < 11; ++i)
        EXPECT_EQ(expected[i], port(i).portType) << "code " << i;
}

// One port per row: the speed and its description from the speed code,
// where code 16 means the chip generation's top speed.
TEST_F(FCBuild, SpeedAndDescriptionFromSpeedCodeAndChip)
{
    const struct {
        const char* chip;
        int speedCode;
        unsigned long long speed;
        const char* description;
    } rows[] = {{"RSX-1610", 0, 0ull, "See Speed"},           {"RSX-1610", 1, 1062500000ull, "See Speed"},
                {"RSX-1610", 2, 2125000000ull, "See Speed"},  {"RSX-1610", 3, 0ull, "Auto Negotiate"},
                {"RSX-1610", 4, 4250000000ull, "See Speed"},  {"RSX-1610", 5, 0ull, "See Speed"},
                {"RSX-1610", 8, 8500000000ull, "See Speed"},  {"RSX-1610", 10, 10625000000ull, "See Speed"},
                {"RSX-1610", 16, 17000000000ull, "See Speed"}, {"RSX-A20", 16, 10625000000ull, "See Speed"},
                {"RSX-AB1", 16, 10625000000ull, "See Speed"},  {"RSX-A30", 16, 17000000000ull, "See Speed"}};
    for (const auto& row : rows) {
        SCOPED_TRACE(std::string(row.chip) + " code " + std::to_string(row.speedCode));
        removeFCPortList();
        use(oneAdapter(row.chip, {fcFunction(1, 0, {{"speed", row.speedCode}})}));
        buildFCPortList();
        ASSERT_EQ(1, g_FCPortList.count);
        EXPECT_EQ(row.speed, port(0).speed);
        EXPECT_STREQ(row.description, port(0).speedDescription);
    }
}

TEST_F(FCBuild, MaxSpeedByChipGeneration)
{
    const struct {
        const char* chip;
        unsigned long long maxSpeed;
    } chips[] = {{"RSX-1610", 17000000000ull}, {"RSX-1620", 17000000000ull}, {"RSX-A20", 10625000000ull},
                 {"RSX-A40", 10625000000ull},  {"RSX-A80", 10625000000ull},  {"RSX-AB0", 10625000000ull},
                 {"RSX-880", 8500000000ull},   {"RSX-460", 4250000000ull},   {"RSX-471", 4250000000ull},
                 {"RSX-890", 2125000000ull},   {"RSX-A10", 2125000000ull},   {"RSX-210", 2125000000ull}};
    json adapters = json::array();
    for (std::size_t i = 0; i < sizeof(chips) / sizeof(chips[0]); ++i)
        adapters.push_back(fcAdapter(static_cast<int>(i), chips[i].chip, 1, "S" + std::to_string(i)));
    json unknown = fcAdapter(99, "RSX-210", 1, "UNKNOWN");
    unknown.erase("chip");
    unknown["pciDeviceId"] = "0x9999";
    adapters.push_back(unknown);
    use(host(adapters));
    buildFCPortList();
    ASSERT_EQ(static_cast<int>(adapters.size()), g_FCPortList.count);
    for (std::size_t i = 0; i < sizeof(chips) / sizeof(chips[0]); ++i)
        EXPECT_EQ(chips[i].maxSpeed, port(static_cast<int>(i)).maxSpeed) << chips[i].chip;
    EXPECT_EQ(2125000000ull, port(g_FCPortList.count - 1).maxSpeed) << "an unknown device ID";
}

TEST_F(FCBuild, OlderChipsTakeTheLibrarySerialAndReadNoVpd)
{
    json option = fcAdapter(1, "RSX-250", 1, "VPD-SERIAL");   // code 6: option ROM, no VPD
    option["deviceSerial"] = "LIB-SERIAL6";
    json oldest = fcAdapter(2, "RSX-231", 1, "VPD-SERIAL3");  // code 3: neither
    oldest["deviceSerial"] = "LIB-SERIAL3";
    use(host(json::array({option, oldest})));
    buildFCPortList();
    ASSERT_EQ(2, g_FCPortList.count);
    EXPECT_STREQ("", port(0).vpdData);
    EXPECT_STREQ("LIB-SERIAL6", port(0).serialNumber);
    EXPECT_EQ(0, std::strncmp(port(0).deviceId, "LIB-SERIAL6_", 12));
    EXPECT_STRNE("", port(0).optionROMVersions);
    EXPECT_STREQ("", port(1).vpdData);
    EXPECT_STREQ("", port(1).optionROMVersions);
    EXPECT_STREQ("LIB-SERIAL3", port(1).serialNumber);
}

TEST_F(FCBuild, ENodeMacOnlyOnConvergedChips)
{
    json cna = fcAdapter(1, "RSX-A20", 0, "CNA");
    cna["ports"] = json::array(
        {{{"protocols", json::array({fcFunction(1, 0, {{"type", "fcoe"}, {"enodeMac", "02:7e:5a:00:00:01"}})})}}});
    json plain = fcAdapter(2, "RSX-A10", 0, "PLAIN");
    plain["ports"] = json::array(
        {{{"protocols", json::array({fcFunction(2, 0, {{"type", "fcoe"}, {"enodeMac", "02:7e:5a:00:00:02"}})})}}});
    use(host(json::array({cna, plain})));
    buildFCPortList();
    buildPortControllerList();
    ASSERT_EQ(2, g_FCPortList.count);
    const unsigned char mac[6] = {0x02, 0x7e, 0x5a, 0x00, 0x00, 0x01};
    EXPECT_EQ(1, port(0).macAvailable);
    EXPECT_EQ(0, std::memcmp(mac, port(0).macAddress, 6));
    EXPECT_EQ(0, port(1).macAvailable);
    ASSERT_EQ(2, g_PortControllerList.count);
    EXPECT_EQ(1, g_PortControllerList.entries[0].macAvailable);
    EXPECT_EQ(0, std::memcmp(mac, g_PortControllerList.entries[0].macAddress, 6));
    EXPECT_EQ(0, g_PortControllerList.entries[1].macAvailable);
}

TEST_F(FCBuild, UnreadableVpdReusesTheSerialOfTheDeviceBefore)
{
    json first = fcAdapter(1, "RSX-1610", 1, "FIRST");
    first.erase("vpd");
    json second = fcAdapter(2, "RSX-1610", 1, "SECOND");
    json third = fcAdapter(3, "RSX-1610", 1, "THIRD");
    third.erase("vpd");
    use(host(json::array({first, second, third})));
    buildFCPortList();
    buildPortControllerList();
    ASSERT_EQ(3, g_FCPortList.count);
    EXPECT_STREQ("_3000000000010000_3100000000010000", port(0).deviceId);
    EXPECT_STREQ("SECOND", port(1).serialNumber);
    EXPECT_STREQ("SECOND_3000000000030000_3100000000030000", port(2).deviceId);
    EXPECT_STREQ("", port(2).vpdData);
    // The third device's reused serial makes it a duplicate controller.
    ASSERT_EQ(2, g_PortControllerList.count);
    EXPECT_STREQ("", g_PortControllerList.entries[0].deviceId);
    EXPECT_STREQ("SECOND", g_PortControllerList.entries[1].deviceId);
}

TEST_F(FCBuild, NoAdaptersLeavesEveryListEmpty)
{
    use(host(json::array()));
    buildFCPortList();
    buildPortControllerList();
    buildLogicalPortGroupList();
    buildFCPortStatisticsList();
    for (int count : {g_FCPortList.count, g_PortControllerList.count, g_LogicalPortGroupList.count,
                      g_FCPortStatisticsList.count})
        EXPECT_EQ(0, count);
}

TEST_F(FCBuild, LogicalPortGroupSlotsAndCountPartAfterADuplicate)
{
    use(host(json::array({fcAdapter(1, "RSX-1620", 2, "A1"), fcAdapter(2, "RSX-1620", 2, "A2")})));
    buildLogicalPortGroupList();
    ASSERT_EQ(3, g_LogicalPortGroupList.count);
    const LogicalPortGroupEntry* e = g_LogicalPortGroupList.entries;
    EXPECT_EQ(1, e[0].valid);
    EXPECT_EQ(0, e[1].valid);
    EXPECT_STREQ("", e[1].instanceId);
    EXPECT_STREQ("", e[1].nodeWWN);
    EXPECT_EQ(1, e[2].valid);
    EXPECT_STREQ("3000000000020000", e[2].nodeWWN);
    // Slot 3 was compared with slots 0 and 1 only, so it holds a second group
    // of adapter 2, out of reach of the enumerations.
    EXPECT_EQ(1, e[3].valid);
    EXPECT_STREQ("3000000000020000", e[3].nodeWWN);
}

TEST_F(FCBuild, StatisticsCopyTheNineCountersInOrder)
{
    json counters = {{"ioCount", 1},       {"megabyteCount", 2},      {"lipCount", 3},
                     {"linkFailures", 4},  {"lossOfSync", 5},         {"lossOfSignal", 6},
                     {"primitiveSeqErrors", 7}, {"invalidTxWords", 8}, {"crcErrors", 4294967295u}};
    use(oneAdapter("RSX-1610", {fcFunction(1, 0, {{"stats", counters}})}));
    buildFCPortStatisticsList();
    ASSERT_EQ(1, g_FCPortStatisticsList.count);
    const FCPortStatisticsEntry& s = g_FCPortStatisticsList.entries[0];
    EXPECT_STREQ("3000000000010000_3100000000010000", s.instanceId);
    EXPECT_STREQ("3100000000010000", s.portWWN);
    EXPECT_EQ(3u, s.lipCount);
    EXPECT_EQ(4u, s.linkFailures);
    EXPECT_EQ(5u, s.lossOfSync);
    EXPECT_EQ(6u, s.lossOfSignal);
    EXPECT_EQ(7u, s.primitiveSeqErrors);
    EXPECT_EQ(4294967295ull, s.crcErrors) << "widened without sign";
    EXPECT_EQ(8u, s.invalidTxWords);
    EXPECT_EQ(1u, s.ioCount);
    EXPECT_EQ(2u, s.megabyteCount);
}

}  // namespace

// The joins and WWN texts of the FC builds write what the printf forms they
// stand for write, cut at every room from none to more than enough.
TEST(FCText, JoinsAndWwnsMatchTheirPrintfFormsAtEveryRoom)
{
    const char model[4] = {'V', 'X', 'F', '1'};   // a record field without a terminating zero
    const std::uint8_t wwn[8] = {0x31, 0x00, 0x02, 0x7E, 0x5A, 0xB6, 0x0F, 0xFF};
    for (std::size_t size = 0; size <= 40; ++size) {
        char joined[48];
        char printed[48];
        std::memset(joined, '#', sizeof joined);
        std::memset(printed, '#', sizeof printed);
        const std::size_t n = JoinFCText(joined, size, {"VXA1631K0042", "_", "", "_", "3100027E5AB60FFF"});
        const int m = FormatFCText(printed, size, "%s_%s_%s", "VXA1631K0042", "", "3100027E5AB60FFF");
        EXPECT_EQ(std::string(joined, sizeof joined), std::string(printed, sizeof printed)) << size;
        EXPECT_EQ(static_cast<int>(n), size == 0 ? 0 : m);

        std::memset(joined, '#', sizeof joined);
        std::memset(printed, '#', sizeof printed);
        JoinFCText(joined, size, {{model, sizeof model}, ";"});
        FormatFCText(printed, size, "%.*s;", static_cast<int>(sizeof model), model);
        EXPECT_EQ(std::string(joined, sizeof joined), std::string(printed, sizeof printed)) << size;

        std::memset(joined, '#', sizeof joined);
        std::memset(printed, '#', sizeof printed);
        FormatWWN(wwn, joined, size);
        FormatFCText(printed, size, "%02X%02X%02X%02X%02X%02X%02X%02X", wwn[0], wwn[1], wwn[2], wwn[3], wwn[4],
                     wwn[5], wwn[6], wwn[7]);
        EXPECT_EQ(std::string(joined, sizeof joined), std::string(printed, sizeof printed)) << size;

        const std::uint8_t lun[16] = {0x63, 0x4E, 0x4F, 0x52, 0, 1, 2, 3, 0xA0, 0xB1, 0xC2, 0xD3, 0xE4, 0xF5, 0x06, 0x17};
        std::memset(joined, '#', sizeof joined);
        std::memset(printed, '#', sizeof printed);
        FormatHexBytes(lun, 16, joined, size);
        std::string hex;
        for (std::uint8_t b : lun) {
            char two[3];
            std::snprintf(two, sizeof two, "%02X", b);
            hex += two;
        }
        FormatFCText(printed, size, "%s", hex.c_str());
        EXPECT_EQ(std::string(joined, sizeof joined), std::string(printed, sizeof printed)) << size;
    }
    for (std::uint32_t n : {0u, 7u, 10u, 65535u, 4294967295u}) {
        char text[11];
        EXPECT_EQ(std::string(DecimalText(n, text)), std::to_string(n));
    }
}

// Release dates asked in turn, as an enumeration of several adapters asks
// them: each date keeps its own value however the dates alternate.
TEST(FCText, ReleaseDatesInTurnKeepTheirOwnValues)
{
    const std::uint64_t first = dtGetBinaryFormat(14, 6, 2025);
    const std::uint64_t second = dtGetBinaryFormat(20, 0, 2025);
    const std::uint64_t third = dtGetBinaryFormat(15, 6, 2025);
    ASSERT_NE(0u, first);
    EXPECT_LT(second, first);
    EXPECT_EQ(86400000000ULL, third - first);
    EXPECT_EQ(first, dtGetBinaryFormat(14, 6, 2025));
    EXPECT_EQ(second, dtGetBinaryFormat(20, 0, 2025));
}
