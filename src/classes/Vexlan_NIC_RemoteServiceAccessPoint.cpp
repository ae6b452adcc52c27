// Vexlan_NIC_RemoteServiceAccessPoint as a NIC class module: one instance per
// port. No route of the dispatcher reaches it yet.
#include "classes/Vexlan_NIC_RemoteServiceAccessPoint.h"

#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"

namespace {

// InfoFormat is declared uint16 by CIM_RemoteServiceAccessPoint; the class
// shows "IPv4 Address" through the value that the schema's value map gives
// that text, 3.
constexpr CMPIUint16 kInfoFormatIPv4Address = 3;

const PropertyRow<NicRecord> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, NIC_TEXT("Vexlan_Adapter_ComputerSystem")},
    {"SystemName", CMPI_string, NIC_TEXT(hostName_ComputerSystem)},
    {"CreationClassName", CMPI_string, NIC_TEXT("Vexlan_NIC_RemoteServiceAccessPoint")},
    {"Name", CMPI_string, nicMacValue},
    {"AccessInfo", CMPI_string, NIC_TEXT("????")},
    {"InfoFormat", CMPI_uint16, NIC_UINT16(kInfoFormatIPv4Address)},
    {"ElementName", CMPI_string, NIC_TEXT("RemoteServiceAccessPoint???")},
    {"EnabledState", CMPI_uint16, NIC_UINT16(5)},
    {"HealthState", CMPI_uint16, NIC_UINT16(5)},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name", nullptr};

// The two short texts serve every operation.
NicRequestTexts texts(const char* entry)
{
    return {entry, "Vexlan_NIC_RemoteServiceAccessPoint: Error getting namespace\n",
            "Vexlan_NIC_RemoteServiceAccessPoint: Error getting ClassName\n"};
}

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_RemoteServiceAccessPoint")
        .walk(NicWalk::Ports)
        .key("Name", nicMacKey)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts(texts("Vexlan_NIC_RemoteServiceAccessPoint enumInstances_RemoteServiceAccessPoint was called\n"))
        .enumInstanceNamesTexts(
            texts("Vexlan_NIC_RemoteServiceAccessPoint enumInstanceNames_RemoteServiceAccessPoint was called\n"))
        .getInstanceTexts(texts("Vexlan_NIC_RemoteServiceAccessPoint getInstance_RemoteServiceAccessPoint was called\n"))
        .makeTexts("Vexlan_NIC_RemoteServiceAccessPoint makePath_RemoteServiceAccessPoint was called\n",
                   "Vexlan_NIC_RemoteServiceAccessPoint makeInstance_RemoteServiceAccessPoint was called\n")
        .keyErrors("Vexlan_NIC_RemoteServiceAccessPoint: Error getting Name key in getInstance\n");

}  // namespace

VEXLAN_NIC_CLASS_OPERATIONS(RemoteServiceAccessPoint, kModule, (_CNAPortStruc * port),
                            (NicRecord{nullptr, port, nullptr}))
