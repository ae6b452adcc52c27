// Vexlan_NIC_LANEndpoint as a NIC class module: one instance per port.
#include "classes/Vexlan_NIC_LANEndPoint.h"

#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"

namespace {

const PropertyRow<NicRecord> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, NIC_TEXT("Vexlan_Adapter_ComputerSystem")},
    {"SystemName", CMPI_string, NIC_TEXT(hostName_ComputerSystem)},
    {"CreationClassName", CMPI_string, NIC_TEXT("Vexlan_NIC_LANEndpoint")},
    {"Name", CMPI_string, nicMacValue},
    {"NameFormat", CMPI_string, NIC_TEXT("MAC based")},
    {"LANType", CMPI_uint16, NIC_UINT16(2)},
    {"MaxDataSize", CMPI_uint32, CLASS_VALUE(NicRecord, CmpiData(static_cast<CMPIUint32>(e.port->maxTransmissionUnit)))},
    {"MACAddress", CMPI_string, nicMacValue},
    {"ElementName", CMPI_string, NIC_TEXT("LANEndPoint")},
    {"Caption", CMPI_string, NIC_TEXT("Vexlan LANEndPoint")},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name", nullptr};

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_LANEndPoint")
        .walk(NicWalk::Ports)
        .key("Name", nicMacKey)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts({"Vexlan_NIC_LANEndPoint enumInstances_LANEndPoint was called\n",
                             "Vexlan_NIC_LANEndPoint: Error getting namespace in enumInstances\n",
                             "Vexlan_NIC_LANEndPoint: Error getting ClassName in enumInstances\n"})
        .enumInstanceNamesTexts({"Vexlan_NIC_LANEndPoint enumInstanceNames_LANEndPoint was called\n",
                                 "Vexlan_NIC_LANEndPoint: Error getting namespace in enumInstanceNames\n",
                                 "Vexlan_NIC_LANEndPoint: Error getting ClassName in enumInstanceNames\n"})
        .getInstanceTexts({"Vexlan_NIC_LANEndPoint getInstance_LANEndPoint was called\n",
                           "Vexlan_NIC_LANEndPoint: Error getting namespace in getInstance\n",
                           "Vexlan_NIC_LANEndPoint: Error getting ClassName in getInstance\n"})
        .makeTexts("Vexlan_NIC_LANEndPoint makePath was called\n", "Vexlan_NIC_LANEndPoint makeInstance was called\n")
        .keyErrors("Vexlan_NIC_LANEndPoint: Error getting DeviceID key in getInstances\n",
                   {"Vexlan_NIC_LANEndPoint: Error invalid key data type(", ")"})
        .perNameDebugLine("Vexlan_NIC_LANEndPoint enumInstanceNames_LANEndPoint working");

}  // namespace

VEXLAN_NIC_CLASS_OPERATIONS(LANEndPoint, kModule, (_CNAPortStruc * port), (NicRecord{nullptr, port, nullptr}))
