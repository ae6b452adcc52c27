// The NIC classes, the object manager, its communication mechanism, the
// namespaces and the NIC profiles, through the shipped provider library in a
// strict embedded CIM host. Runs under tests/isolate.sh: /opt and /var/tmp
// are private, so the settings file and the log are the test's own.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "provider_env.h"
#include "zorap_sim_control.h"

using namespace provtest;

using cimhost::Host;
using cimhost::Instance;
using cimhost::ObjectPath;
using cimhost::OpResult;
using cimhost::Value;

namespace {

ObjectPath keyPath(const std::string& className, const std::string& key, const Value& value)
{
    ObjectPath p = classPath(className);
    p.setKey(key, value);
    return p;
}

ObjectPath keyPath(const std::string& className, const std::string& key, const std::string& text)
{
    return keyPath(className, key, Value::fromString(text));
}

std::uint64_t number(const Instance& inst, const std::string& name)
{
    const Value* v = inst.property(name);
    return v != nullptr ? v->u : 0xDEADBEEFu;
}

// The one element of a uint16 or string array property, as text.
std::string single(const Instance& inst, const std::string& name)
{
    const Value* v = inst.property(name);
    if (v == nullptr || !v->array || v->elems.size() != 1)
        return "<not one element>";
    const Value& e = v->elems[0];
    return e.type == cimhost::Type::String ? e.s : std::to_string(e.u);
}

}  // namespace

// ---- The NIC side of the default host ----------------------------------------------

class NicDefaultHost : public ProviderSuite<NicDefaultHost> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, nullptr, nullptr); }
};

// What each class shows on this host is compared whole in
// tests/provider/recorded_hosts_test.cpp; here what getInstance finds.
TEST_F(NicDefaultHost, GetInstanceFindsKeysWithoutRegardToCase)
{
    const std::string hostName = expectedHost().name;
    const struct {
        const char* cls;
        const char* key;
        std::string text;
        const char* answer;  // the property that shows the match
        std::string value;
    } cases[] = {
        {"Vexlan_NIC_NetworkPort", "DeviceID", "vxc2447m0193_1", "DeviceID", "VXC2447M0193_1"},
        {"Vexlan_NIC_PortController", "DeviceID", "VXC2447M0193_nic", "DeviceID", "VXC2447M0193_NIC"},
        // The remote access point of each port is keyed by the port's MAC.
        {"Vexlan_NIC_RemoteServiceAccessPoint", "Name", "027e5a244700", "Name", "027E5A244700"},
        // Two profiles share the InstanceID 6: the first answers.
        {"Vexlan_NIC_RegisteredProfile", "InstanceID", "6", "RegisteredName", "Vexlan_SoftwareInventory"},
        {"Vexlan_FCHBA_ObjectManager", "Name", "PEGASUS:" + hostName, "Name", "pegasus:" + hostName},
    };
    for (const auto& c : cases) {
        OpResult g = host().getInstance(keyPath(c.cls, c.key, c.text));
        ASSERT_EQ(g.instances.size(), 1u) << c.cls << ": " << g.message;
        EXPECT_TRUE(g.strictErrors.empty()) << c.cls;
        EXPECT_EQ(propertyText(g.instances[0], c.answer), c.value) << c.cls;
    }
    EXPECT_EQ(host().getInstance(keyPath("Vexlan_FCHBA_CIMXMLCommMech", "Name", "other")).rc, 6);
}

TEST_F(NicDefaultHost, GetInstanceMissesAndOddKeys)
{
    struct Case {
        const char* cls;
        const char* key;
    } cases[] = {
        {"Vexlan_NIC_EthernetPort2", "DeviceID"},        {"Vexlan_NIC_NetworkPort", "DeviceID"},
        {"Vexlan_NIC_PortController", "DeviceID"},       {"Vexlan_NIC_LANEndpoint", "Name"},
        {"Vexlan_NIC_IPProtocolEndpoint", "Name"},       {"Vexlan_NIC_IPProtocolEndpointCapabilities", "InstanceID"},
        {"Vexlan_NIC_RegisteredProfile", "InstanceID"},
    };
    for (const Case& c : cases) {
        // A key that matches nothing: NOT_FOUND with the key text.
        OpResult miss = host().getInstance(keyPath(c.cls, c.key, "NO-SUCH-KEY"));
        EXPECT_EQ(miss.rc, 6) << c.cls;
        EXPECT_EQ(miss.message, "NO-SUCH-KEY") << c.cls;
        // A number where a text is expected: success without an instance.
        OpResult numeric = host().getInstance(keyPath(c.cls, c.key, Value::fromUnsigned(cimhost::Type::UInt32, 6)));
        EXPECT_TRUE(numeric.ok()) << c.cls << ": " << numeric.message;
        EXPECT_TRUE(numeric.instances.empty()) << c.cls;
        // No key at all: the module's status is not passed on.
        OpResult none = host().getInstance(classPath(c.cls));
        EXPECT_TRUE(none.ok()) << c.cls << ": " << none.message;
        EXPECT_TRUE(none.instances.empty()) << c.cls;
    }
    // A very long key is refused in full, never cut or overrun.
    std::string longKey(100000, 'A');
    OpResult longMiss = host().getInstance(keyPath("Vexlan_NIC_EthernetPort2", "DeviceID", longKey));
    EXPECT_EQ(longMiss.rc, 6);
    EXPECT_EQ(longMiss.message.size(), longKey.size());

    EXPECT_GE(countLog("Vexlan_NIC_EthernetPort: Error getting DeviceID key in findMatchedRole1"), 2);
    EXPECT_GE(countLog("Vexlan_NIC_LANEndPoint: Error invalid key data type(160)"), 1);
    EXPECT_GE(countLog("Vexlan_NIC_IPProtocolEndPoint: Error invalid key data type, keyData.type=160!"), 1);
    EXPECT_GE(countLog("Vexlan_NIC_IPProtocolEndPointCapabilities: Error invalid key data type in getInstance (160)"), 1);
    EXPECT_GE(countLog("Vexlan_NIC_RegisteredProfile: Error getting Name key in getInstance"), 2);
    EXPECT_GE(countLog("Vexlan_NIC_PortController getInstance was called"), 3);
}

TEST_F(NicDefaultHost, PropertyListKeepsTheKeys)
{
    OpResult r = host().enumerateInstances(classPath("Vexlan_NIC_EthernetPort2"),
                                           std::vector<std::string>{"Speed"});
    ASSERT_TRUE(r.ok()) << r.message;
    ASSERT_EQ(r.instances.size(), 2u);
    EXPECT_EQ(propertyNames(r.instances[0]),
              (std::vector<std::string>{"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID",
                                        "Speed"}));
}

// ---- Adapter descriptions of the tests ------------------------------------------------

namespace {

// Adapter 0 "VXN0001": five NIC ports, one per physical port, in every link
// state; only the first has IP addresses and FCoE linkage, the last a MAC with
// letters and a speed of 25 Gbit/s. Adapter 1: the same serial, one port.
// Adapter 2: FC alone.
const char kTestAdapters[] = R"({
  "adapters": [
    {"model": "VXN4-A", "serialNumber": "VXN0001", "chip": "RSX-AB0", "nodeWWN": "30:11:22:33:44:55:66:77",
     "ports": [
       {"protocols": [{"type": "nic", "mac": "02:00:00:00:01:00", "interface": "vxa0", "linkState": "up",
                       "linkSpeed": 10000, "mtu": 1500, "ipv4": "10.1.2.3", "netmask": "255.255.255.0",
                       "ipv6": ["fd00::1:2/64", "fd00::9/64"],
                       "fcoe": [{"portWWN": "31:00:00:00:00:00:01:00", "portId": "01-02-03",
                                 "enodeMac": "02:00:00:00:01:01"}]}]},
       {"protocols": [{"type": "nic", "mac": "02:00:00:00:01:02", "interface": "vxa1", "linkState": "down"}]},
       {"protocols": [{"type": "nic", "mac": "02:00:00:00:01:04", "interface": "vxa2", "linkState": "testing"}]},
       {"protocols": [{"type": "nic", "mac": "02:00:00:00:01:06", "interface": "vxa3", "linkState": 7}]},
       {"protocols": [{"type": "nic", "mac": "02:ab:cd:ef:01:08", "interface": "vxa4", "linkState": "up",
                       "linkSpeed": 25000, "mtu": 9000}]}
     ]},
    {"model": "VXN4-B", "serialNumber": "VXN0001", "chip": "RSX-AB0",
     "ports": [{"protocols": [{"type": "nic", "mac": "02:00:00:00:02:00", "interface": "vxb0"}]}]},
    {"model": "VXF1622", "serialNumber": "VXA0000", "chip": "RSX-1620",
     "ports": [{"protocols": [{"type": "fc", "nodeWWN": "30:00:00:00:00:00:00:01",
                               "portWWN": "31:00:00:00:00:00:00:01"}]}]}
  ]
})";

}  // namespace

class NicTestAdapters : public ProviderSuite<NicTestAdapters> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, kTestAdapters, nullptr); }
};

TEST_F(NicTestAdapters, LinkStatesAndSpeeds)
{
    OpResult eth = enumerate(host(), "Vexlan_NIC_EthernetPort2");
    OpResult net = enumerate(host(), "Vexlan_NIC_NetworkPort");
    ASSERT_EQ(eth.instances.size(), 6u);
    ASSERT_EQ(net.instances.size(), 6u);
    const struct {
        const char* mac;
        const char* status;
        const char* description;
        std::uint64_t ethernetSpeed;
        std::uint64_t networkSpeed;
    } expected[] = {
        {"020000000100", "2", "Link Up", 10625000000u, 10000},
        {"020000000102", "3", "Link Down", 0, 0},
        {"020000000104", "1", "Testing", 0, 0},
        {"020000000106", "0", "Unknown", 0, 0},
        {"02ABCDEF0108", "2", "Link Up", 0, 25000},
        {"020000000200", "2", "Link Up", 10625000000u, 10000},
    };
    for (std::size_t i = 0; i < 6; ++i) {
        const auto& x = expected[i];
        EXPECT_EQ(propertyText(eth.instances[i], "DeviceID"), x.mac) << i;
        EXPECT_EQ(propertyText(net.instances[i], "Name"), x.mac) << i;
        for (const OpResult* r : {&eth, &net}) {
            EXPECT_EQ(single(r->instances[i], "OperationalStatus"), x.status) << x.mac;
            EXPECT_EQ(single(r->instances[i], "StatusDescriptions"), x.description) << x.mac;
        }
        EXPECT_EQ(number(eth.instances[i], "Speed"), x.ethernetSpeed) << x.mac;
        EXPECT_EQ(number(net.instances[i], "Speed"), x.networkSpeed) << x.mac;
        EXPECT_EQ(number(eth.instances[i], "MaxSpeed"), 10625000000u);
    }
    EXPECT_EQ(propertyText(net.instances[4], "DeviceID"), "VXN0001_4");
    EXPECT_EQ(propertyText(net.instances[5], "DeviceID"), "VXN0001_0");
}

TEST_F(NicTestAdapters, FCoELinkagePresentAndAbsent)
{
    OpResult eth = enumerate(host(), "Vexlan_NIC_EthernetPort2");
    ASSERT_EQ(eth.instances.size(), 6u);
    EXPECT_EQ(propertyText(eth.instances[0], "FC_WWN"), "31-00-00-00-00-00-01-00");
    EXPECT_EQ(propertyText(eth.instances[0], "FC_PortID"), "01-02-03");
    EXPECT_EQ(propertyText(eth.instances[0], "FC_ENodeMACAddress"), "020000000101");
    for (const char* fc : {"FC_WWN", "FC_PortID", "FC_ENodeMACAddress"})
        EXPECT_EQ(propertyText(eth.instances[1], fc), "") << fc << " is present and empty";
}

TEST_F(NicTestAdapters, AddressesPresentEmptyOrAbsent)
{
    OpResult ip = enumerate(host(), "Vexlan_NIC_IPProtocolEndpoint");
    ASSERT_EQ(ip.instances.size(), 6u);
    EXPECT_EQ(propertyText(ip.instances[0], "IPv4Address"), "10.1.2.3");
    EXPECT_EQ(propertyText(ip.instances[0], "SubnetMask"), "255.255.255.0");
    EXPECT_EQ(propertyText(ip.instances[0], "IPv6Address"), "fd00::1:2");
    // No IPv4 address: the record's type is 0 and the text is empty, present.
    EXPECT_EQ(propertyText(ip.instances[1], "IPv4Address"), "");
    EXPECT_EQ(propertyText(ip.instances[1], "SubnetMask"), "");
    // No IPv6 address: the property is absent.
    EXPECT_EQ(ip.instances[1].property("IPv6Address"), nullptr);
    EXPECT_EQ(propertyNames(ip.instances[1]).size(), 11u);
}

TEST_F(NicTestAdapters, LowerCaseMacKeysFindTheirPort)
{
    const struct {
        const char* cls;
        const char* key;
        const char* answer;
    } cases[] = {
        {"Vexlan_NIC_EthernetPort2", "DeviceID", "DeviceID"},
        {"Vexlan_NIC_LANEndpoint", "Name", "MACAddress"},
        {"Vexlan_NIC_IPProtocolEndpoint", "Name", "Name"},
        {"Vexlan_NIC_IPProtocolEndpointCapabilities", "InstanceID", "Caption"},
    };
    for (const auto& c : cases) {
        OpResult g = host().getInstance(keyPath(c.cls, c.key, "02abcdef0108"));
        ASSERT_TRUE(g.ok()) << c.cls << ": " << g.message;
        ASSERT_EQ(g.instances.size(), 1u) << c.cls;
        EXPECT_EQ(propertyText(g.instances[0], c.answer), "02ABCDEF0108") << c.cls;
    }
    OpResult lan = host().getInstance(keyPath("Vexlan_NIC_LANEndpoint", "Name", "02abcdef0108"));
    EXPECT_EQ(number(lan.instances[0], "MaxDataSize"), 9000u);
}

TEST_F(NicTestAdapters, TwoAdaptersWithOneSerial)
{
    OpResult pc = enumerate(host(), "Vexlan_NIC_PortController");
    ASSERT_EQ(pc.instances.size(), 2u) << "one per adapter with NIC functions; the FC adapter has none";
    EXPECT_EQ(propertyText(pc.instances[0], "DeviceID"), "VXN0001_NIC");
    EXPECT_EQ(propertyText(pc.instances[1], "DeviceID"), "VXN0001_NIC");
    EXPECT_EQ(propertyText(pc.instances[0], "FC_WWN"), "301122334455");
    EXPECT_EQ(propertyText(pc.instances[1], "FC_WWN"), "000000000000");

    OpResult g = host().getInstance(keyPath("Vexlan_NIC_PortController", "DeviceID", "vxn0001_nic"));
    ASSERT_EQ(g.instances.size(), 1u) << g.message;
    EXPECT_EQ(propertyText(g.instances[0], "Name"), "VXN4-A") << "the first adapter answers";

    // Both adapters' first ports share the NetworkPort key: the first answers.
    OpResult n = host().getInstance(keyPath("Vexlan_NIC_NetworkPort", "DeviceID", "VXN0001_0"));
    ASSERT_EQ(n.instances.size(), 1u) << n.message;
    EXPECT_EQ(propertyText(n.instances[0], "Name"), "020000000100");
}

// ---- Configured texts ------------------------------------------------------------------

class NicConfiguredTexts : public ProviderSuite<NicConfiguredTexts> {
protected:
    static void SetUpTestSuite()
    {
        startSuite("ErrorLog=1\n"
                   "CIMOMNameVersion=Vexlan 100%% CIM %s%s%n %d\n"
                   "InteropNamespace=root/interop\n"
                   "CIMSchemaVersion=2.41.0\n",
                   nullptr, nullptr);
    }
};

TEST_F(NicConfiguredTexts, ServerNameShownAsConfiguredWithPercentSignsLiteral)
{
    OpResult om = enumerate(host(), "Vexlan_FCHBA_ObjectManager");
    ASSERT_EQ(om.instances.size(), 1u);
    EXPECT_EQ(propertyText(om.instances[0], "ElementName"), "Vexlan 100% CIM %s%s%n %d");
    EXPECT_EQ(propertyText(om.instances[0], "Description"), "Vexlan 100% CIM %s%s%n %d");
}

TEST_F(NicConfiguredTexts, InteropNamespaceRowFollowsTheSettings)
{
    OpResult ns = enumerate(host(), "Vexlan_FCHBA_Namespace");
    ASSERT_EQ(ns.instances.size(), 2u);
    EXPECT_EQ(propertyText(ns.instances[0], "Name"), "root/vexlan_cmpi");
    EXPECT_EQ(propertyText(ns.instances[1], "Name"), "root/interop");
    EXPECT_EQ(propertyText(ns.instances[1], "DescriptionOfClassInfo"), "2.41.0");
    OpResult g = host().getInstance(keyPath("Vexlan_FCHBA_Namespace", "Name", "Root/Interop"));
    ASSERT_EQ(g.instances.size(), 1u) << g.message;
    OpResult miss = host().getInstance(keyPath("Vexlan_FCHBA_Namespace", "Name", "root/PG_InterOp"));
    EXPECT_EQ(miss.rc, 6);
}
