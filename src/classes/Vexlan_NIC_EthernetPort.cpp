// Vexlan_NIC_EthernetPort2 as a NIC class module: one instance per port.
#include "classes/Vexlan_NIC_EthernetPort.h"

#include <cstdio>

#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

// MaxSpeed, and Speed of a 10 Gbit/s link, in bit/s.
constexpr CMPIUint64 kTenGigabitLineRate = 10625000000ULL;

void deviceIdText(const NicRecord& r, char* out)
{
    calcDeviceID_EthernetPort(r.adapter, r.port, out);
}

// The FCoE linkage of the port, from the first element of its copy alone.
// Without linkage the three texts are present and empty.
const _zorap_fcoe_linkage_t* firstLinkage(const NicRecord& r)
{
    return r.port->fcoeLinkage;
}

PropertyValue fcWwn(const NicRecord& r)
{
    const _zorap_fcoe_linkage_t* l = firstLinkage(r);
    if (l == nullptr)
        return CmpiData("");
    char text[32];
    return CmpiData(hexBytesText(l->portWWN, 8, '-', text));
}

PropertyValue fcPortId(const NicRecord& r)
{
    const _zorap_fcoe_linkage_t* l = firstLinkage(r);
    if (l == nullptr)
        return CmpiData("");
    char text[16];
    return CmpiData(hexBytesText(l->portId, 3, '-', text));
}

PropertyValue fcENodeMac(const NicRecord& r)
{
    const _zorap_fcoe_linkage_t* l = firstLinkage(r);
    if (l == nullptr)
        return CmpiData("");
    char text[kMacTextSize];
    return CmpiData(macaddrToStr(l->enodeMacAddress, text));
}

const PropertyRow<NicRecord> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, NIC_TEXT("Vexlan_Adapter_ComputerSystem")},
    {"SystemName", CMPI_string, NIC_TEXT(hostName_ComputerSystem)},
    {"CreationClassName", CMPI_string, NIC_TEXT("Vexlan_NIC_EthernetPort2")},
    {"DeviceID", CMPI_string, nicMacValue},
    {"LinkTechnology", CMPI_uint16, NIC_UINT16(2)},
    {"PermanentAddress", CMPI_string, nicMacValue},
    {"PortNumber", CMPI_uint16, NIC_UINT16(e.port->portNumber & 0xFFFFu)},
    {"PortType", CMPI_uint16, NIC_UINT16(105)},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(NicRecord, uint16Array({nicLinkStatus(e.port).operationalStatus}))},
    {"StatusDescriptions", CMPI_stringA, CLASS_VALUE(NicRecord, stringArray({nicLinkStatus(e.port).description}))},
    {"Caption", CMPI_string, nicMacValue},
    {"Description", CMPI_string, NIC_TEXT("Vexlan CNA Ethernet Port")},
    {"ElementName", CMPI_string, nicMacValue},
    {"Name", CMPI_string, nicMacValue},
    {"MaxSpeed", CMPI_uint64, CLASS_VALUE(NicRecord, CmpiData(kTenGigabitLineRate))},
    {"ActiveMaximumTransmissionUnit", CMPI_uint64,
     CLASS_VALUE(NicRecord, CmpiData(static_cast<CMPIUint64>(e.port->maxTransmissionUnit)))},
    // Only the 10 Gbit/s link has a speed here; any other shows 0.
    {"Speed", CMPI_uint64,
     CLASS_VALUE(NicRecord, CmpiData(static_cast<CMPIUint64>(
                                e.port->linkProperties.linkSpeed == 10000 ? kTenGigabitLineRate : 0)))},
    {"FC_WWN", CMPI_string, fcWwn},
    {"FC_PortID", CMPI_string, fcPortId},
    {"FC_ENodeMACAddress", CMPI_string, fcENodeMac},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID", nullptr};

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_EthernetPort")
        .walk(NicWalk::Ports)
        .key("DeviceID", deviceIdText)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts({"Vexlan_NIC_EthernetPort enumInstances was called\n",
                             "Vexlan_NIC_EthernetPort: Error getting namespace in enumIntances\n",
                             "Vexlan_NIC_EthernetPort: Error getting classname in enumIntances\n"})
        .enumInstanceNamesTexts({"Vexlan_NIC_EthernetPort enumInstanceNames was called\n",
                                 "Vexlan_NIC_EthernetPort: Error getting namespace in enumInstanceNames\n",
                                 "Vexlan_NIC_EthernetPort: Error getting ClassName in enumInstanceNames\n"})
        .getInstanceTexts({"Vexlan_NIC_EthernetPort getInstance_EthernetPort was called\n",
                           "Vexlan_NIC_EthernetPort: Error getting namespace in getIntances\n",
                           "Vexlan_NIC_EthernetPort: Error getting classname in getIntances\n"})
        .makeTexts("Vexlan_NIC_EthernetPort makePath_EthernetPort was called\n",
                   "Vexlan_NIC_EthernetPort makeInstance_EthernetPort was called\n")
        .keyErrors("Vexlan_NIC_EthernetPort: Error getting DeviceID key in findMatchedRole1\n");

}  // namespace

char* calcDeviceID_EthernetPort(_CNAStruc*, _CNAPortStruc* port, char* out)
{
    return nicMacText(port, out);
}

VEXLAN_NIC_CLASS_OPERATIONS(EthernetPort, kModule, (_CNAStruc * adapter, _CNAPortStruc * port),
                            (NicRecord{adapter, port, nullptr}))
