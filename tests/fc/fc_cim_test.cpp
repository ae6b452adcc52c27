// The four FC classes through the shipped provider library and the embedded
// CIM host in strict mode: what a client sees from ei, ein and gi, with the
// default adapter description and with descriptions written here.
#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <set>
#include <string>
#include <vector>

#include "fc_test_support.h"
#include "provider_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using cimhost::Host;
using cimhost::Instance;
using cimhost::ObjectPath;
using cimhost::OpResult;
using cimhost::Type;
using cimhost::Value;
using fctest::json;

namespace {

const char kFCPort[] = "Vexlan_FCHBA_FCPort";
const char kPortController[] = "Vexlan_FCHBA_PortController";
const char kLogicalPortGroup[] = "Vexlan_FCHBA_LogicalPortGroup";
const char kStatistics[] = "Vexlan_FCHBA_FCPortStatistics";

std::string lower(std::string s)
{
    std::transform(s.begin(), s.end(), s.begin(), [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return s;
}

ObjectPath devicePath(const char* className, const std::string& deviceId)
{
    ObjectPath p = classPath(className);
    p.setKey("SystemCreationClassName", Value::fromString("Vexlan_Adapter_ComputerSystem"));
    p.setKey("SystemName", Value::fromString(expectedHost().name));
    p.setKey("CreationClassName", Value::fromString(className));
    p.setKey("DeviceID", Value::fromString(deviceId));
    return p;
}

ObjectPath instanceIdPath(const char* className, const std::string& id)
{
    ObjectPath p = classPath(className);
    p.setKey("InstanceID", Value::fromString(id));
    return p;
}

// The one element of a one-element uint16 array.
std::uint64_t firstOf(const Instance& inst, const std::string& name)
{
    const Value* v = inst.property(name);
    EXPECT_NE(v, nullptr) << name;
    if (v == nullptr || !v->array || v->elems.size() != 1)
        return ~0ull;
    EXPECT_EQ(v->type, Type::UInt16) << name;
    return v->elems[0].u;
}

}  // namespace

// ---- The default host ------------------------------------------------------------

class FCDefaultHost : public ProviderSuite<FCDefaultHost> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, nullptr, kPortController); }
};

// What each class shows on this host is compared whole in
// tests/provider/recorded_hosts_test.cpp; here what getInstance finds.
TEST_F(FCDefaultHost, GetInstanceIgnoresCaseStepsOverAnUnfilledSlotAndAMissNamesTheKey)
{
    const std::string id = "VXA1631K0042_3000027E5A160042_3101027E5A160042";
    OpResult r = host_->getInstance(devicePath(kFCPort, lower(id)));
    ASSERT_TRUE(r.ok()) << r.message;
    ASSERT_EQ(r.instances.size(), 1u);
    EXPECT_EQ(propertyText(r.instances[0], "DeviceID"), id);

    OpResult filtered = host_->getInstance(devicePath(kFCPort, id), std::vector<std::string>{"Model"});
    ASSERT_TRUE(filtered.ok()) << filtered.message;
    ASSERT_EQ(filtered.instances.size(), 1u);
    EXPECT_EQ(propertyNames(filtered.instances[0]),
              (std::vector<std::string>{"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID",
                                        "Model"}));

    OpResult stats = host_->getInstance(instanceIdPath(kStatistics, "3000027e5a041234_3100027e5a041234"));
    ASSERT_TRUE(stats.ok()) << stats.message;
    ASSERT_EQ(stats.instances.size(), 1u);
    EXPECT_EQ(scalar(stats.instances[0], "LIPCount", Type::UInt64).u, 7u);

    const std::string hostName = expectedHost().name;
    OpResult group = host_->getInstance(
        instanceIdPath(kLogicalPortGroup, lower(hostName + "_VXC2447M0193_3000027E5A244793_3100027E5A244793")));
    ASSERT_TRUE(group.ok()) << group.message;
    ASSERT_EQ(group.instances.size(), 1u);
    EXPECT_EQ(propertyText(group.instances[0], "Name"), "3000027E5A244793");

    // The second logical port group is an unfilled slot with an empty
    // InstanceID: a search for "" steps over it.
    OpResult empty = host_->getInstance(instanceIdPath(kLogicalPortGroup, ""));
    EXPECT_EQ(empty.rc, 6);
    EXPECT_EQ(empty.message, "");
    EXPECT_GE(countLog("getInstance_LogicalPortGroup: Found a device that has the same InstanceID but the entry is "
                       "invalid.  Move on..."),
              1);

    for (const char* cls : {kFCPort, kPortController}) {
        OpResult miss = host_->getInstance(devicePath(cls, "NO_SUCH_DEVICE"));
        EXPECT_EQ(miss.rc, 6) << cls;
        EXPECT_EQ(miss.message, "NO_SUCH_DEVICE") << cls;
        EXPECT_TRUE(miss.instances.empty());
    }
    for (const char* cls : {kLogicalPortGroup, kStatistics}) {
        OpResult miss = host_->getInstance(instanceIdPath(cls, "NO_SUCH_ID"));
        EXPECT_EQ(miss.rc, 6) << cls;
        EXPECT_EQ(miss.message, "NO_SUCH_ID") << cls;
    }
    EXPECT_GE(countLog("getInstance_FCPort: Error no matching instance found, KeyValue=NO_SUCH_DEVICE!"), 1);
    // The CNA's second function shares its adapter's serial: one controller.
    EXPECT_GE(countLog("Exiting  createPortController: Current device has the same the serial number as a device "
                       "in the list at index=1. Skip!"),
              1);
}

TEST_F(FCDefaultHost, PortsAndStatisticsAreRebuiltForEachRequestControllersAreNot)
{
    const char* wwn = "3101027E5A160042";
    ASSERT_EQ(0, zorap_sim_set_fc_port_state(wwn, ZORAP_PORT_STATE_LOOPDOWN));
    const std::uint32_t counters[9] = {100, 200, 3, 4, 5, 6, 7, 8, 9};
    ASSERT_EQ(0, zorap_sim_set_fc_port_stats(wwn, counters));

    OpResult ports = enumerate(*host_, kFCPort);
    ASSERT_EQ(ports.instances.size(), 5u);
    EXPECT_EQ(firstOf(ports.instances[1], "OperationalStatus"), 6u);
    EXPECT_EQ(scalar(ports.instances[1], "DeviceStatus", Type::SInt32).i, 4097);
    EXPECT_EQ(firstOf(ports.instances[0], "OperationalStatus"), 2u);
    EXPECT_GE(countLog("Port state - Loopdown..."), 1);

    OpResult stats = host_->getInstance(instanceIdPath(kStatistics, "3000027E5A160042_3101027E5A160042"));
    ASSERT_TRUE(stats.ok()) << stats.message;
    ASSERT_EQ(stats.instances.size(), 1u);
    EXPECT_EQ(scalar(stats.instances[0], "LIPCount", Type::UInt64).u, 3u);
    EXPECT_EQ(scalar(stats.instances[0], "IOCount", Type::UInt64).u, 100u);
    EXPECT_EQ(scalar(stats.instances[0], "CRCErrors", Type::UInt64).u, 9u);

    const unsigned long vpdReads = zorap_sim_call_count(ZORAP_FN_GetVpd);
    enumerate(*host_, kPortController);
    enumerate(*host_, kLogicalPortGroup);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_GetVpd), vpdReads);
    enumerate(*host_, kFCPort);
    EXPECT_GT(zorap_sim_call_count(ZORAP_FN_GetVpd), vpdReads);

    const std::uint32_t described[9] = {17220931, 880412, 1, 0, 2, 0, 0, 9, 1};
    ASSERT_EQ(0, zorap_sim_set_fc_port_stats(wwn, described));
    ASSERT_EQ(0, zorap_sim_set_fc_port_state(wwn, ZORAP_PORT_STATE_ONLINE));
    EXPECT_EQ(firstOf(enumerate(*host_, kFCPort).instances[1], "OperationalStatus"), 2u);
}

TEST_F(FCDefaultHost, AFailedLibraryCallForOneDeviceLeavesDefaultsThere)
{
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetHbaDevicePortProperty, ZORAP_ERR_FAILED, 1));
    OpResult ports = enumerate(*host_, kFCPort);
    ASSERT_EQ(ports.instances.size(), 5u);
    const Instance& failed = ports.instances[0];
    EXPECT_EQ(firstOf(failed, "OperationalStatus"), 0u);
    EXPECT_EQ(scalar(failed, "PortType", Type::UInt16).u, 0u);
    EXPECT_EQ(scalar(failed, "Speed", Type::UInt64).u, 0u);
    EXPECT_EQ(propertyText(failed, "SpeedDescription"), "");
    EXPECT_EQ(scalar(failed, "MaxSpeed", Type::UInt64).u, 17000000000ull);
    EXPECT_EQ(firstOf(ports.instances[1], "OperationalStatus"), 2u);

    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_RefreshDeviceStats, ZORAP_ERR_FAILED, 1));
    OpResult stats = enumerate(*host_, kStatistics);
    ASSERT_EQ(stats.instances.size(), 5u);
    EXPECT_EQ(scalar(stats.instances[0], "LIPCount", Type::UInt64).u, 0u);
    EXPECT_EQ(scalar(stats.instances[0], "IOCount", Type::UInt64).u, 0u);
    EXPECT_EQ(scalar(stats.instances[4], "LIPCount", Type::UInt64).u, 7u);
    EXPECT_GE(countLog("Vexlan_FC_FCPortStatistics ERROR in getting statistical data..."), 1);

    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetVpd, ZORAP_ERR_FAILED, 1));
    ports = enumerate(*host_, kFCPort);
    ASSERT_EQ(ports.instances.size(), 5u);
    EXPECT_EQ(propertyText(ports.instances[0], "VPDData"), "");
    EXPECT_EQ(propertyText(ports.instances[0], "DeviceID"), "_3000027E5A160042_3100027E5A160042");
    EXPECT_EQ(propertyText(ports.instances[1], "DeviceID"), "VXA1631K0042_3000027E5A160042_3101027E5A160042");
}

// ---- Hosts written here ------------------------------------------------------------

TEST(FCHosts, SerialsThatDifferInCaseMakeTwoControllersFoundByEitherForm)
{
    json description =
        fctest::host(json::array({fctest::fcAdapter(1, "RSX-1620", 2, "abc1"), fctest::fcAdapter(2, "RSX-1620", 2, "ABC1")}));
    Host host;
    startProvider(host, kLogsOn, description.dump().c_str(), kPortController);

    OpResult controllers = enumerate(host, kPortController);
    ASSERT_EQ(controllers.instances.size(), 2u);
    EXPECT_EQ(propertyText(controllers.instances[0], "DeviceID"), "abc1");
    EXPECT_EQ(propertyText(controllers.instances[1], "DeviceID"), "ABC1");
    for (const char* key : {"ABC1", "Abc1", "abc1"}) {
        OpResult got = host.getInstance(devicePath(kPortController, key));
        ASSERT_TRUE(got.ok()) << key << ": " << got.message;
        ASSERT_EQ(got.instances.size(), 1u);
        EXPECT_EQ(propertyText(got.instances[0], "DeviceID"), "abc1") << key;
    }

    ASSERT_TRUE(host.unload(true).ok());
}

TEST(FCHosts, SixtyFourAdaptersOfFourFCFunctionsEach)
{
    json description = fctest::wideHost();
    Host host;
    startProvider(host, kLogsOn, description.dump().c_str(), kPortController);

    OpResult names = host.enumerateInstanceNames(classPath(kFCPort));
    ASSERT_TRUE(names.ok()) << names.message;
    ASSERT_EQ(names.paths.size(), 256u);
    std::set<std::string> ids;
    for (const auto& p : names.paths)
        ids.insert(p.keys[3].second.s);
    EXPECT_EQ(ids.size(), 256u);

    EXPECT_EQ(enumerate(host, kFCPort).instances.size(), 256u);
    std::set<std::string> statistics;
    for (const Instance& s : enumerate(host, kStatistics).instances)
        statistics.insert(propertyText(s, "InstanceID"));
    EXPECT_EQ(statistics.size(), 256u);
    EXPECT_EQ(enumerate(host, kPortController).instances.size(), 64u);
    EXPECT_EQ(enumerate(host, kLogicalPortGroup).instances.size(), 253u);

    OpResult last = host.getInstance(devicePath(kFCPort, "VXW0063_30000000003F0000_31000000003F0300"));
    ASSERT_TRUE(last.ok()) << last.message;
    ASSERT_EQ(last.instances.size(), 1u);
    EXPECT_EQ(scalar(last.instances[0], "DeviceNumber", Type::UInt16).u, 3u);
    OpResult controller = host.getInstance(devicePath(kPortController, "vxw0063"));
    ASSERT_TRUE(controller.ok()) << controller.message;
    EXPECT_EQ(controller.instances.size(), 1u);
    ASSERT_TRUE(host.unload(true).ok());
}
