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

// ---- The adapters of tests/fixtures/descriptions/nic-adapters.json -------------------

// Adapter 0 "VXN0001": five NIC ports in every link state, the first with
// addresses and FCoE linkage, the last with a MAC of letters; adapter 1: the
// same serial, one port; adapter 2: FC alone. What the classes show of them
// is compared whole in tests/provider/recorded_hosts_test.cpp.
class NicTestAdapters : public ProviderSuite<NicTestAdapters> {
protected:
    static void SetUpTestSuite()
    {
        static const std::string adapters = fileText(VEXLAN_FIXTURES "/descriptions/nic-adapters.json");
        startSuite(kLogsOn, adapters.c_str(), nullptr);
    }
};

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

TEST_F(NicTestAdapters, TwoAdaptersWithOneSerialAnswerWithTheFirst)
{
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
