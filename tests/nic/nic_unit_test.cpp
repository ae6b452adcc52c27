// The helpers of the NIC and interop class modules that need no broker: key
// texts that the associations compute, the configured server name, the NIC
// profile chain and the FC profile rows.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FCHBA_RegisteredSubProfile_CMPI.h"
#include "classes/Vexlan_FCHBA_ObjectManager_CMPI.h"
#include "classes/Vexlan_NIC_EthernetPort.h"
#include "classes/Vexlan_NIC_IPProtocolEndPoint.h"
#include "classes/Vexlan_NIC_NetworkPort.h"
#include "classes/Vexlan_NIC_PortController.h"
#include "classes/Vexlan_NIC_RegisteredProfile.h"

namespace {

// An adapter record with one port, zero-filled as the adapter list makes them.
struct Records {
    _CNAStruc adapter;
    _CNAPortStruc port;

    Records(const char* serial, std::uint32_t portNumber, std::vector<std::uint8_t> mac)
    {
        std::memset(&adapter, 0, sizeof(adapter));
        std::memset(static_cast<void*>(&port), 0, sizeof(port));
        std::strncpy(adapter.serialNumber, serial, sizeof(adapter.serialNumber));
        port.portNumber = portNumber;
        std::memcpy(port.macAddress.octet, mac.data(), 6);
        adapter.portList = &port;
    }
};

std::string formatted(const char* configured, std::size_t size = 256)
{
    std::vector<char> out(size + 1, 'X');
    formatCIMOMNameVersion(configured, out.data(), size);
    return out.data();
}

}  // namespace

TEST(NicKeyTexts, PortKeysFromSerialNumberAndMac)
{
    Records r("VXN0001", 3, {0x02, 0xab, 0xcd, 0x0e, 0xf0, 0x01});
    char text[kNicKeyTextSize];

    // The texts themselves stand in the recorded EthernetPort2, NetworkPort
    // and IPProtocolEndpoint instances. Without a buffer the text lives in
    // the function's own until its next call.
    EXPECT_STREQ(calcName_IPProtocolEndPoint(&r.port, text), "02ABCD0EF001");
    char* first = calcDeviceID_NetworkPort(&r.adapter, &r.port, nullptr);
    EXPECT_STREQ(first, "VXN0001_3");
    r.port.portNumber = 4294967295u;
    EXPECT_EQ(calcDeviceID_NetworkPort(&r.adapter, &r.port, nullptr), first);
    EXPECT_STREQ(first, "VXN0001_4294967295");
    EXPECT_STREQ(calcElementName_NetworkPort(&r.adapter, &r.port, nullptr), "02ABCD0EF001");
}

TEST(NicKeyTexts, PortControllerDeviceIdIsTheSerialWithNicBehind)
{
    char serial[] = "VXC2447M0193";
    char* id = BuildPortControllerDeviceID(serial);
    EXPECT_STREQ(id, "VXC2447M0193_NIC");
    char empty[] = "";
    EXPECT_EQ(BuildPortControllerDeviceID(empty), id) << "one buffer, overwritten by the next call";
    EXPECT_STREQ(id, "_NIC");
    EXPECT_STREQ(BuildPortControllerDeviceID(nullptr), "_NIC");

    Records r("VXN0001", 0, {0, 0, 0, 0, 0, 0});
    char out[kPortControllerDeviceIdSize];
    EXPECT_STREQ(calcDeviceID_PortController(&r.adapter, out), "VXN0001_NIC");

    // A serial that fills its field to the last byte ends at the field's end.
    std::memset(r.adapter.serialNumber, 'S', sizeof(r.adapter.serialNumber));
    r.adapter.versionString[0] = 'V';
    EXPECT_EQ(std::string(calcDeviceID_PortController(&r.adapter, out)),
              std::string(sizeof(r.adapter.serialNumber), 'S') + "_NIC");

    // A serial too long for the buffer is cut so that the suffix still fits.
    std::string longSerial(1000, 'L');
    std::string cut = BuildPortControllerDeviceID(&longSerial[0]);
    EXPECT_EQ(cut.size(), kPortControllerDeviceIdSize - 1);
    EXPECT_EQ(cut.substr(cut.size() - 4), "_NIC");
}

TEST(ObjectManagerName, ConfiguredTextIsNeverReadAsAFormat)
{
    EXPECT_EQ(formatted("Pegasus CIM Server"), "Pegasus CIM Server");
    EXPECT_EQ(formatted("100%% busy"), "100% busy");
    EXPECT_EQ(formatted("%%%%"), "%%");
    EXPECT_EQ(formatted("%s %n %d %x"), "%s %n %d %x");
    EXPECT_EQ(formatted("trailing %"), "trailing %");
    EXPECT_EQ(formatted("%%s"), "%s");
    EXPECT_EQ(formatted(""), "");
    EXPECT_EQ(formatted(nullptr), "");
    // Cut to the room given, always terminated.
    EXPECT_EQ(formatted("abcdef", 4), "abc");
    EXPECT_EQ(formatted("a%%b", 3), "a%");
}

TEST(NicProfileChain, EightNodesRebuiltWithoutGrowing)
{
    InitializeRegisteredProfileList();
    InitializeRegisteredProfileList();
    // What each node holds is the recorded Vexlan_NIC_RegisteredProfile text.
    int nodes = 0;
    for (_RegisteredProfile* p = m_RegisteredProfileList; p != nullptr; p = p->next)
        ++nodes;
    EXPECT_EQ(nodes, 8);

    Clear_RegisteredProfile_List();
    EXPECT_EQ(m_RegisteredProfileList, nullptr);
    Clear_RegisteredProfile_List();
}

TEST(FcProfileRows, ConstantRowsNamedAfterTheHost)
{
    std::strcpy(hostName_ComputerSystem, "10.0.0.7");
    buildRegisteredProfileList();
    buildRegisteredSubProfileList();
    // The rows' values are the recorded FC profile texts.
    ASSERT_EQ(g_RegisteredProfileList.count, 4);
    ASSERT_EQ(g_RegisteredSubProfileList.count, 2);
    EXPECT_STREQ(g_RegisteredSubProfileList.entries[1].instanceId, "Vexlan_IndicationsSubProfile_10.0.0.7");

    // A rebuild follows the host name; a long one is cut to the field.
    removeRegisteredProfileList();
    EXPECT_EQ(g_RegisteredProfileList.entries, nullptr);
    std::memset(hostName_ComputerSystem, 'h', sizeof(hostName_ComputerSystem) - 1);
    buildRegisteredProfileList();
    const std::string id = g_RegisteredProfileList.entries[0].instanceId;
    EXPECT_EQ(id.size(), sizeof(RegisteredProfileEntry::instanceId) - 1);
    EXPECT_EQ(id.rfind("Vexlan_FCHBAProfile_hhh", 0), 0u);
    removeRegisteredProfileList();
    removeRegisteredSubProfileList();
    hostName_ComputerSystem[0] = '\0';
}
