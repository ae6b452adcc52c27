// The class module mechanism with a small module of its own: slots, the two
// build kinds, the valid rule, key matching, the property filter and the
// checks of a module's tables.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <string>

#include "classes/ClassModule.h"
#include "fake_broker.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "provider_env.h"
#include "zorap_sim_control.h"

namespace {

struct PortEntry {
    unsigned char valid;
    char DeviceID[64];
    unsigned short Index;
};

ClassList<PortEntry> g_PortList;

const PropertyRow<PortEntry> kRows[] = {
    {"CreationClassName", CMPI_string, CLASS_VALUE(PortEntry, CmpiData("Vexlan_Test_Port"))},
    {"DeviceID", CMPI_string, CLASS_VALUE(PortEntry, CmpiData(e.DeviceID))},
    {"Index", CMPI_uint16, CLASS_VALUE(PortEntry, CmpiData(CMPIUint16(e.Index)))},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(PortEntry, uint16Array({2}))},
    {"Unset", CMPI_string, [](const PortEntry&) -> PropertyValue { return std::nullopt; }},
};
const char* const kKeys[] = {"CreationClassName", "DeviceID", nullptr};

ClassModule<PortEntry> portModule(ListKind kind, bool testValid)
{
    ClassModule<PortEntry> m = ClassModule<PortEntry>("TestPort")
                                   .list(g_PortList, kind)
                                   .key("DeviceID", [](const PortEntry& e) -> const char* { return e.DeviceID; })
                                   .filterKeys(kKeys)
                                   .pathKeys(kKeys)
                                   .properties(kRows);
    if (testValid)
        m.enumerationsTestValid();
    return m;
}

// Three FC functions; the fill declines the second one.
const char kThreeFunctions[] = R"({"adapters": [{"model": "VXF1622", "serialNumber": "VXA0000009", "chip": "RSX-1620",
  "ports": [{"protocols": [
    {"type": "fc", "nodeWWN": "30:00:00:00:00:00:00:01", "portWWN": "31:00:00:00:00:00:00:01"},
    {"type": "fc", "nodeWWN": "30:00:00:00:00:00:00:02", "portWWN": "31:00:00:00:00:00:00:02"},
    {"type": "nic", "mac": "02:00:00:00:00:03", "interface": "eth3"},
    {"type": "fc", "nodeWWN": "30:00:00:00:00:00:00:04", "portWWN": "31:00:00:00:00:00:00:04"}]}]}]})";

void buildPorts(const ClassModule<PortEntry>& module)
{
    int seen = 0;
    module.build([](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* p) { return p->protocolType < 2; },
                 [&seen](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* p, PortEntry& e, int index) {
                     ++seen;
                     std::snprintf(e.DeviceID, sizeof(e.DeviceID), "PORT%02X", p->fcDevice.portWWN[7]);
                     e.Index = static_cast<unsigned short>(index);
                     return seen != 2;
                 });
}

class ClassModuleTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        provtest::writeSettings("DebugLog=1\nErrorLog=1\n", "");
        provtest::removeLog();
        Vexlan_FC_Utils_CMPI::InitializeLogFile();
        g_EnableDebugPrint = true;
        g_EnableLogError = true;
        fake::reset();
        CmpiProviderBase::setBroker(fake::broker());
        ASSERT_EQ(zorap_sim_load_json(kThreeFunctions), 0);
        ASSERT_EQ(ZORAP_Initialize(0, 0), 0u);
    }
    void TearDown() override
    {
        g_PortList.remove();
        ZORAP_Uninitialize();
    }

    CmpiObjectPath path(const char* key)
    {
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        CMPIObjectPath* op = fake::broker()->eft->newObjectPath(fake::broker(), "root/vexlan_cmpi", "Vexlan_Test_Port", &rc);
        if (key != nullptr) {
            CMPIValue v;
            v.string = fake::broker()->eft->newString(fake::broker(), key, nullptr);
            op->ft->addKey(op, "DeviceID", &v, CMPI_string);
        }
        return CmpiObjectPath(op);
    }

    CmpiContext ctx_{fake::newContext()};
};

}  // namespace

TEST_F(ClassModuleTest, AFullListCountsEveryWantedProtocolAndKeepsDeclinedSlotsInvalid)
{
    ClassModule<PortEntry> module = portModule(ListKind::Full, false);
    buildPorts(module);
    ASSERT_EQ(g_PortList.count, 3);
    EXPECT_EQ(g_PortList.entries[0].valid, 1);
    EXPECT_EQ(g_PortList.entries[1].valid, 0);
    EXPECT_EQ(g_PortList.entries[2].valid, 1);
    EXPECT_STREQ(g_PortList.entries[2].DeviceID, "PORT04");
    EXPECT_EQ(provtest::countLog("Entering createTestPort, index = "), 3);
    // The declined fill logs no "Exiting" line (a fill that declines says why itself).
    EXPECT_EQ(provtest::countLog("Exiting  createTestPort"), 2);

    // Enumerations without the valid test deliver the invalid slot too.
    CMPIResult* all = fake::newResult();
    CmpiResult allResult(all);
    EXPECT_EQ(module.enumInstanceNames(ctx_, allResult, path(nullptr)).rc(), CMPI_RC_OK);
    EXPECT_EQ(fake::resultItems(all).size(), 3u);

    ClassModule<PortEntry> validOnly = portModule(ListKind::Full, true);
    CMPIResult* valid = fake::newResult();
    CmpiResult validResult(valid);
    EXPECT_EQ(validOnly.enumInstances(ctx_, validResult, path(nullptr), nullptr).rc(), CMPI_RC_OK);
    EXPECT_EQ(fake::resultItems(valid).size(), 2u);

    g_PortList.remove();
    EXPECT_EQ(g_PortList.count, 0);
    EXPECT_EQ(g_PortList.entries, nullptr);
}

TEST_F(ClassModuleTest, ADenseListGivesADeclinedSlotToTheNextProtocol)
{
    ClassModule<PortEntry> module = portModule(ListKind::Dense, false);
    buildPorts(module);
    ASSERT_EQ(g_PortList.count, 2);
    EXPECT_STREQ(g_PortList.entries[0].DeviceID, "PORT01");
    EXPECT_STREQ(g_PortList.entries[1].DeviceID, "PORT04");
    EXPECT_EQ(g_PortList.entries[1].valid, 1);
}

TEST_F(ClassModuleTest, NoAdapterListLeavesTheListEmpty)
{
    zorap_sim_fail(ZORAP_FN_GetAdapterList, ZORAP_ERR_FAILED, 1);
    buildPorts(portModule(ListKind::Full, false));
    EXPECT_EQ(g_PortList.count, 0);
    EXPECT_EQ(g_PortList.entries, nullptr);
    zorap_sim_reset();
}

TEST_F(ClassModuleTest, GetInstanceMatchesWithoutCaseStepsOverInvalidSlotsAndThrowsOnAMiss)
{
    ClassModule<PortEntry> module = portModule(ListKind::Full, false);
    buildPorts(module);
    // The invalid slot carries the same key as a valid one behind it.
    std::strcpy(g_PortList.entries[1].DeviceID, "PORT04");

    CMPIResult* found = fake::newResult();
    CmpiResult foundResult(found);
    EXPECT_EQ(module.getInstance(ctx_, foundResult, path("port04"), nullptr, true).rc(), CMPI_RC_OK);
    ASSERT_EQ(fake::resultItems(found).size(), 1u);
    EXPECT_EQ(provtest::countLog("getInstance_TestPort: Found a device that has the same DeviceID but the entry is "
                                 "invalid.  Move on..."), 1);
    const CMPIInstance* inst = fake::resultItems(found)[0].data.value.inst;
    CMPIData index = inst->ft->getProperty(inst, "Index", nullptr);
    EXPECT_EQ(index.value.uint16, 2);

    CMPIResult* silent = fake::newResult();
    CmpiResult silentResult(silent);
    EXPECT_EQ(module.getInstance(ctx_, silentResult, path("PORT01"), nullptr, false).rc(), CMPI_RC_OK);
    EXPECT_TRUE(fake::resultItems(silent).empty());

    CMPIResult* missed = fake::newResult();
    CmpiResult missedResult(missed);
    try {
        module.getInstance(ctx_, missedResult, path("PORT99"), nullptr, false);
        ADD_FAILURE() << "a miss throws";
    } catch (const CmpiStatus& st) {
        EXPECT_EQ(st.rc(), CMPI_RC_ERR_NOT_FOUND);
        EXPECT_STREQ(st.msg(), "PORT99");
    }
    EXPECT_EQ(provtest::countLog("getInstance_TestPort: Error no matching instance found, KeyValue=PORT99!"), 1);
}

TEST_F(ClassModuleTest, InstancesSetTheRowsInOrderAndTheFilterKeepsTheKeys)
{
    ClassModule<PortEntry> module = portModule(ListKind::Full, false);
    buildPorts(module);
    CmpiInstance all = module.makeInstance("Vexlan_Test_Port", "root/vexlan_cmpi", nullptr, 0);
    ASSERT_EQ(all.getPropertyCount(), 4u) << "the unset row stays out";
    CmpiString name;
    all.getProperty(2, &name);
    EXPECT_STREQ(name.charPtr(), "Index");

    const char* wanted[] = {"Index", nullptr};
    CmpiInstance filtered = module.makeInstance("Vexlan_Test_Port", "root/vexlan_cmpi", wanted, 0);
    EXPECT_EQ(filtered.getPropertyCount(), 3u);
    EXPECT_TRUE(filtered.getProperty("OperationalStatus").isNotFound());

    CmpiObjectPath p = module.makePath("Vexlan_Test_Port", "root/vexlan_cmpi", 2);
    ASSERT_EQ(p.getKeyCount(), 2u);
    CmpiString key;
    p.getKey(1, &key);
    EXPECT_STREQ(key.charPtr(), "DeviceID");
    EXPECT_STREQ(static_cast<const char*>(p.getKey("DeviceID")), "PORT04");
}

TEST_F(ClassModuleTest, TableMistakesAreFoundAndAWrongTypeIsRefused)
{
    static const char* const badKeys[] = {"CreationClassName", "NoSuchRow", nullptr};
    ClassModule<PortEntry> bad = portModule(ListKind::Full, false);
    bad.pathKeys(badKeys);
    ASSERT_EQ(bad.tableFaults().size(), 1u);
    EXPECT_NE(bad.tableFaults()[0].find("NoSuchRow"), std::string::npos);
    EXPECT_TRUE(portModule(ListKind::Full, false).tableFaults().empty());

    static const PropertyRow<PortEntry> wrongType[] = {
        {"Index", CMPI_uint32, CLASS_VALUE(PortEntry, CmpiData(CMPIUint16(e.Index)))},
    };
    ClassModule<PortEntry> wrong = portModule(ListKind::Full, false);
    wrong.properties(wrongType);
    buildPorts(wrong);
    try {
        wrong.makeInstance("Vexlan_Test_Port", "root/vexlan_cmpi", nullptr, 0);
        ADD_FAILURE() << "a row set with another type is refused";
    } catch (const CmpiStatus& st) {
        EXPECT_EQ(st.rc(), CMPI_RC_ERR_TYPE_MISMATCH);
        EXPECT_NE(std::string(st.msg()).find("Index"), std::string::npos);
    }
}
