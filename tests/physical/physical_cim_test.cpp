// The SCSI and physical classes through the shipped provider library and the
// embedded CIM host in strict mode: what a client sees from ei, ein and gi,
// with the default adapter description and with descriptions written here.
#include <gtest/gtest.h>

#include <cstdio>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "physical_test_support.h"
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

const char kController[] = "Vexlan_FCHBA_SCSIProtocolController";
const char kEndpointHBA[] = "Vexlan_FCHBA_SCSIProtocolEndpointHBA";
const char kEndpointTarget[] = "Vexlan_FCHBA_SCSIProtocolEndpointTarget";
const char kExtent[] = "Vexlan_FCHBA_StorageExtent";
const char kPackage[] = "Vexlan_Adapter_PhysicalPackage";
const char kProduct[] = "Vexlan_Adapter_Product";
const char kConnector[] = "Vexlan_Adapter_PhysicalConnector";
const char kPort[] = "Vexlan_Adapter_PhysicalPort";

using Names = std::vector<std::string>;

// A path of the class with the given keys, in order.
ObjectPath pathWith(const char* className, const std::vector<std::pair<std::string, std::string>>& keys)
{
    ObjectPath p = classPath(className);
    for (const auto& k : keys)
        p.setKey(k.first, Value::fromString(k.second));
    return p;
}

ObjectPath systemPath(const char* className, const char* keyName, const std::string& key)
{
    return pathWith(className, {{"SystemCreationClassName", "Vexlan_Adapter_ComputerSystem"},
                                {"SystemName", expectedHost().name},
                                {"CreationClassName", className},
                                {keyName, key}});
}

std::vector<std::string> texts(const OpResult& r, const std::string& name)
{
    std::vector<std::string> out;
    for (const auto& inst : r.instances)
        out.push_back(propertyText(inst, name));
    return out;
}

}  // namespace

// ---- The default host ------------------------------------------------------------

class PhysicalDefaultHost : public ProviderSuite<PhysicalDefaultHost> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, nullptr, kController); }
};

// What each class shows on this host is compared whole in
// tests/provider/recorded_hosts_test.cpp; here which lists a request rebuilds,
// the deduplication that the log tells, and the property filter.
TEST_F(PhysicalDefaultHost, ExtentsAndTargetsAreRebuiltForEachRequestTheOthersAreNot)
{
    // Extents and target endpoints are built again for every request; the
    // controller and the HBA endpoints answer from the polling thread's lists.
    unsigned long walks = zorap_sim_call_count(ZORAP_FN_GetAdapterList);
    enumerate(*host_, kController);
    enumerate(*host_, kEndpointHBA);
    enumerate(*host_, kPackage);
    enumerate(*host_, kConnector);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_GetAdapterList), walks);
    enumerate(*host_, kExtent);
    EXPECT_GT(zorap_sim_call_count(ZORAP_FN_GetAdapterList), walks);
    walks = zorap_sim_call_count(ZORAP_FN_GetAdapterList);
    enumerate(*host_, kEndpointTarget);
    EXPECT_GT(zorap_sim_call_count(ZORAP_FN_GetAdapterList), walks);
    EXPECT_GE(countLog("Entering createStorageExtent, index = 5"), 1);
    // The NIC functions of the CNA share the FCoE functions' modules.
    EXPECT_GE(countLog("Exiting  createPhysicalConnector: Current device has the same the serial number as a device "
                       "in the list at index=2. Skip!"),
              1);
}

TEST_F(PhysicalDefaultHost, APropertyListKeepsThePathsKeys)
{
    OpResult package = host_->getInstance(
        pathWith(kPackage, {{"Tag", "8D1E5C40-2B6F-4E19-A3C7-7E5A24470193"}, {"CreationClassName", kPackage}}),
        Names{"Model"});
    ASSERT_TRUE(package.ok()) << package.message;
    ASSERT_EQ(package.instances.size(), 1u);
    EXPECT_EQ(propertyNames(package.instances[0]), (Names{"Tag", "CreationClassName", "Model"}));

    // The connector's filter keeps Tag alone, so a property list drops the
    // path's other key, CreationClassName, from the instance; the strict host
    // refuses such an instance, so this one request is checked leniently.
    host_->setStrict(false);
    OpResult connector = host_->getInstance(
        pathWith(kConnector, {{"CreationClassName", kConnector}, {"Tag", "vxs2c3d4e60_vxc2447m0193_1"}}),
        Names{"SFPStatus"});
    host_->setStrict(true);
    ASSERT_TRUE(connector.ok()) << connector.message;
    ASSERT_EQ(connector.instances.size(), 1u);
    EXPECT_EQ(propertyNames(connector.instances[0]), (Names{"Tag", "SFPStatus"}));
    EXPECT_EQ(propertyText(connector.instances[0], "Tag"), "VXS2C3D4E60_VXC2447M0193_1");
}

TEST_F(PhysicalDefaultHost, GetInstanceIgnoresCaseAndAMissNamesTheKey)
{
    // A key in other case finds the instance; the same path with the key
    // changed finds nothing and the status names the key.
    struct Case {
        ObjectPath hit;
        const char* keyName;
        std::string keyValue;  // as the instance shows it
    };
    const std::vector<Case> cases = {
        {systemPath(kController, "DeviceID", "3101027e5a244793"), "DeviceID", "3101027E5A244793"},
        {systemPath(kEndpointHBA, "Name", "3100027e5a041234"), "Name", "3100027E5A041234"},
        {systemPath(kEndpointTarget, "Name", "3100027e5a244793_3a00004e4f52c001"), "Name",
         "3100027E5A244793_3A00004E4F52C001"},
        {systemPath(kExtent, "DeviceID", "3101027e5a160042_3a00004e4f52b001_344e4f520000b003_3"), "DeviceID",
         "3101027E5A160042_3A00004E4F52B001_344E4F520000B003_3"},
        {pathWith(kPackage, {{"Tag", "3F2A9C1E-7D44-4B0A-9E51-0C7E5A160042"}, {"CreationClassName", kPackage}}),
         "Tag", "3f2a9c1e-7d44-4b0a-9e51-0c7e5a160042"},
        {pathWith(kProduct, {{"Name", "x"}, {"IdentifyingNumber", "11svxl4g01zv10c4001234"}, {"Vendor", "x"},
                             {"Version", "x"}}),
         "IdentifyingNumber", "11SVXL4G01ZV10C4001234"},
        {pathWith(kConnector, {{"CreationClassName", kConnector}, {"Tag", "vxs0f1e2d3c_11svxl4g01zv10c4001234_0"}}),
         "Tag", "VXS0F1E2D3C_11SVXL4G01ZV10C4001234_0"},
        {pathWith(kPort, {{"CreationClassName", kPort}, {"Tag", "vxc2447m0193_0"}}), "Tag", "VXC2447M0193_0"},
    };
    for (const Case& c : cases) {
        const std::string cls = c.hit.className;
        OpResult hit = host_->getInstance(c.hit);
        ASSERT_TRUE(hit.ok()) << cls << ": " << hit.message;
        EXPECT_TRUE(hit.strictErrors.empty()) << cls;
        ASSERT_EQ(hit.instances.size(), 1u) << cls;
        EXPECT_EQ(propertyText(hit.instances[0], c.keyName), c.keyValue) << cls;

        ObjectPath missing = c.hit;
        missing.setKey(c.keyName, Value::fromString("NOPE_" + cls));
        OpResult miss = host_->getInstance(missing);
        EXPECT_EQ(miss.rc, 6) << cls;
        EXPECT_EQ(miss.message, "NOPE_" + cls);
        EXPECT_TRUE(miss.instances.empty());
    }
    EXPECT_GE(countLog("getInstance_PhysicalConnector: Error no matching instance found, "
                       "KeyValue=NOPE_Vexlan_Adapter_PhysicalConnector!"),
              1);
    EXPECT_GE(countLog("getInstance_StorageExtent: Error no matching instance found, "
                       "KeyValue=NOPE_Vexlan_FCHBA_StorageExtent!"),
              1);

    // A key that is not a string delivers nothing, with success.
    ObjectPath numeric = classPath(kPort);
    numeric.setKey("CreationClassName", Value::fromString(kPort));
    Value number;
    number.type = Type::UInt16;
    number.null = false;
    number.u = 7;
    numeric.setKey("Tag", number);
    OpResult odd = host_->getInstance(numeric);
    EXPECT_TRUE(odd.ok()) << odd.message;
    EXPECT_TRUE(odd.instances.empty());
}

// ---- Hosts written here ------------------------------------------------------------

namespace {

// A VPD stream in hex: identifier, read-only section, the given keywords.
std::string vpdHex(const std::vector<std::pair<std::string, std::string>>& keywords, bool endTag)
{
    auto hexOf = [](const std::string& s) {
        std::string out;
        char b[4];
        for (unsigned char c : s) {
            std::snprintf(b, sizeof(b), "%02x", c);
            out += b;
        }
        return out;
    };
    std::string stream = "820300" + hexOf("HBA") + "900000";
    for (const auto& kw : keywords) {
        char len[16];
        std::snprintf(len, sizeof(len), "%02x", static_cast<unsigned>(kw.second.size() & 0xFF));
        stream += hexOf(kw.first) + len + hexOf(kw.second);
    }
    if (endTag)
        stream += "78";
    return stream;
}

}  // namespace

TEST(PhysicalHosts, BadVpdEmptySerialsAndFailingCallsLeaveTheDescribedDefaults)
{
    using phystest::port;
    using phystest::transceiver;
    // An adapter without a serial and without an "SN" keyword, first, so that
    // no serial of a board before it stands in; it has no cages.
    json blank = fctest::fcAdapter(2, "RSX-1620", 1, "");
    blank["vpd"].erase("SN");
    blank["transceiverSupport"] = false;
    // Two modules, of which the first read fails (the first read of the build).
    json flaky = fctest::fcAdapter(3, "RSX-1620", 0, "FLAKY");
    flaky["ports"] = json::array({port(0, json::array({fctest::fcFunction(3, 0)}), transceiver("SFPF0")),
                                  port(1, json::array({fctest::fcFunction(3, 1)}), transceiver("SFPF1"))});
    // A VPD stream without an end tag, whose last keyword claims more bytes
    // than follow.
    json runaway = fctest::fcAdapter(1, "RSX-1620", 0, "RUNAWAY");
    runaway.erase("vpd");
    runaway["vpdHex"] = vpdHex({{"SN", "RUNAWAY"}, {"PN", "RUN-PN"}}, false) + "464eff414243";
    runaway["ports"] = json::array({port(0, json::array({fctest::fcFunction(1, 0)}), transceiver("SFPR"))});
    // A board without a serial or "SN" keyword after others takes the serial
    // of the board before it and so adds no package; its module has no serial.
    json late = fctest::fcAdapter(4, "RSX-1620", 0, "");
    late["vpd"].erase("SN");
    late["ports"] = json::array({port(0, json::array({fctest::fcFunction(4, 0)}), transceiver(""))});
    json description = fctest::host(json::array({blank, flaky, runaway, late}));

    Host host;
    writeSettings(kLogsOn, "");
    removeLog();
    ASSERT_EQ(0, zorap_sim_load_json(description.dump().c_str()));
    zorap_sim_reset();
    // The provider's first build runs on its polling thread at the first
    // request: the first module read of that build fails.
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetSFPData, ZORAP_ERR_FAILED, 1));
    prepareHost(host);

    OpResult packages = enumerate(host, kPackage);
    EXPECT_EQ(texts(packages, "SerialNumber"), (Names{"", "FLAKY", "RUNAWAY"}));
    ASSERT_EQ(packages.instances.size(), 3u);
    // The blank board: its tag is its empty serial.
    EXPECT_EQ(propertyText(packages.instances[0], "Tag"), "");
    EXPECT_EQ(propertyText(packages.instances[0], "Name"), "Vexlan Fibre Channel Adapter ");
    EXPECT_EQ(propertyText(packages.instances[0], "PartNumber"), "VXT-1");
    // The runaway stream gave all its keywords, the last one cut at the end
    // of the data.
    EXPECT_EQ(propertyText(packages.instances[2], "Tag"), "RUNAWAY");
    EXPECT_EQ(propertyText(packages.instances[2], "PartNumber"), "RUN-PN");
    EXPECT_EQ(propertyText(packages.instances[2], "SKU"), "ABC");
    OpResult blankPackage = host.getInstance(pathWith(kPackage, {{"Tag", ""}, {"CreationClassName", kPackage}}));
    ASSERT_TRUE(blankPackage.ok()) << blankPackage.message;
    EXPECT_EQ(blankPackage.instances.size(), 1u);

    // The failed read drops the first connector, the blank module gives none.
    OpResult connectors = enumerate(host, kConnector);
    EXPECT_EQ(texts(connectors, "Tag"), (Names{"SFPF1_FLAKY_1", "SFPR_RUNAWAY_0"}));
    EXPECT_GE(countLog("No Transceiver on DeviceNumber 0"), 1);
    EXPECT_GE(countLog("Empty SerialNumber for the Transceiver on DeviceNumber 0"), 1);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_GetSFPData), 4u);

    // The two boards without a serial have one port tag between them.
    OpResult ports = enumerate(host, kPort);
    EXPECT_EQ(texts(ports, "Tag"), (Names{"_0", "FLAKY_0", "FLAKY_1", "RUNAWAY_0"}));
    EXPECT_GE(countLog("Exiting  createPhysicalPort: Current device has the same the serial number as a device in "
                       "the list at index=0. Skip!"),
              1);
    OpResult blankPort = host.getInstance(pathWith(kPort, {{"CreationClassName", kPort}, {"Tag", "_0"}}));
    ASSERT_TRUE(blankPort.ok()) << blankPort.message;
    EXPECT_EQ(blankPort.instances.size(), 1u);

    OpResult products = enumerate(host, kProduct);
    EXPECT_EQ(texts(products, "IdentifyingNumber"), (Names{"", "FLAKY", "RUNAWAY", ""}));
    ASSERT_TRUE(host.unload(true).ok());
}

TEST(PhysicalHosts, SixtyFourAdaptersOfFourFCFunctionsEach)
{
    json description = fctest::wideHost();
    Host host;
    startProvider(host, kLogsOn, description.dump().c_str(), kController);
    EXPECT_EQ(enumerate(host, kController).instances.size(), 256u);
    EXPECT_EQ(enumerate(host, kEndpointHBA).instances.size(), 256u);
    EXPECT_EQ(enumerate(host, kPackage).instances.size(), 64u);
    EXPECT_EQ(enumerate(host, kProduct).instances.size(), 64u);
    EXPECT_EQ(enumerate(host, kPort).instances.size(), 128u);
    EXPECT_TRUE(enumerate(host, kConnector).instances.empty());
    EXPECT_TRUE(enumerate(host, kExtent).instances.empty());
    OpResult last = host.getInstance(systemPath(kController, "DeviceID", "31000000003F0300"));
    ASSERT_TRUE(last.ok()) << last.message;
    EXPECT_EQ(last.instances.size(), 1u);

    // Each FC port stands on one physical port of its adapter (Tag
    // "<serial>_<port number>"), found through the library's records from
    // either end and by enumeration, at the end of the host as at its start.
    auto tagOf = [](const ObjectPath& p) { return p.key("Tag") != nullptr ? p.key("Tag")->s : std::string(); };
    cimhost::AssocParams viaPhysicalPort;
    viaPhysicalPort.assocClass = "Vexlan_FCHBA_PhysicalPortFCPort";
    const OpResult fcPorts = host.enumerateInstanceNames(classPath("Vexlan_FCHBA_FCPort"));
    ASSERT_EQ(fcPorts.paths.size(), 256u);
    for (int k : {0, 3, 129, 254, 255}) {
        const OpResult found = host.associatorNames(fcPorts.paths[k], viaPhysicalPort);
        ASSERT_TRUE(found.ok()) << found.message;
        ASSERT_EQ(found.paths.size(), 1u) << k;
        char tag[32];
        std::snprintf(tag, sizeof tag, "VXW%04d_%d", k / 4, k % 4 / 2);
        EXPECT_EQ(tagOf(found.paths[0]), tag) << k;
    }
    const OpResult physicalPorts = host.enumerateInstanceNames(classPath(kPort));
    ASSERT_EQ(physicalPorts.paths.size(), 128u);
    EXPECT_EQ(tagOf(physicalPorts.paths.back()), "VXW0063_1");
    const OpResult lastTwo = host.associatorNames(physicalPorts.paths.back(), viaPhysicalPort);
    ASSERT_TRUE(lastTwo.ok()) << lastTwo.message;
    ASSERT_EQ(lastTwo.paths.size(), 2u);
    EXPECT_TRUE(lastTwo.paths[0] == fcPorts.paths[254]);
    EXPECT_TRUE(lastTwo.paths[1] == fcPorts.paths[255]);
    const OpResult pairs = host.enumerateInstanceNames(classPath("Vexlan_FCHBA_PhysicalPortFCPort"));
    ASSERT_EQ(pairs.paths.size(), 256u);
    std::set<std::string> pairedPorts;
    for (const ObjectPath& pair : pairs.paths)
        pairedPorts.insert(tagOf(*pair.keys[0].second.ref));
    EXPECT_EQ(pairedPorts.size(), 128u);
    ASSERT_TRUE(host.unload(true).ok());
}
