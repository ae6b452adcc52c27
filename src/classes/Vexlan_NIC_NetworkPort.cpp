// Vexlan_NIC_NetworkPort as a NIC class module: one instance per port.
#include "classes/Vexlan_NIC_NetworkPort.h"

#include <cstdio>

#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

constexpr CMPIUint64 kTenGigabitLineRate = 10625000000ULL;

void deviceIdText(const NicRecord& r, char* out)
{
    calcDeviceID_NetworkPort(r.adapter, r.port, out);
}

PropertyValue deviceId(const NicRecord& r)
{
    char text[kNicKeyTextSize];
    return CmpiData(calcDeviceID_NetworkPort(r.adapter, r.port, text));
}

// PortType comes before PortNumber here, and Speed is the link's as it stands.
const PropertyRow<NicRecord> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, NIC_TEXT("Vexlan_Adapter_ComputerSystem")},
    {"SystemName", CMPI_string, NIC_TEXT(hostName_ComputerSystem)},
    {"CreationClassName", CMPI_string, NIC_TEXT("Vexlan_NIC_NetworkPort")},
    {"DeviceID", CMPI_string, deviceId},
    {"LinkTechnology", CMPI_uint16, NIC_UINT16(2)},
    {"PermanentAddress", CMPI_string, nicMacValue},
    {"PortType", CMPI_uint16, NIC_UINT16(105)},
    {"PortNumber", CMPI_uint16, NIC_UINT16(e.port->portNumber & 0xFFFFu)},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(NicRecord, uint16Array({nicLinkStatus(e.port).operationalStatus}))},
    {"StatusDescriptions", CMPI_stringA, CLASS_VALUE(NicRecord, stringArray({nicLinkStatus(e.port).description}))},
    {"Caption", CMPI_string, nicMacValue},
    {"Description", CMPI_string, NIC_TEXT("Vexlan CNA Network Port")},
    {"ElementName", CMPI_string, nicMacValue},
    {"Name", CMPI_string, nicMacValue},
    {"MaxSpeed", CMPI_uint64, CLASS_VALUE(NicRecord, CmpiData(kTenGigabitLineRate))},
    {"ActiveMaximumTransmissionUnit", CMPI_uint64,
     CLASS_VALUE(NicRecord, CmpiData(static_cast<CMPIUint64>(e.port->maxTransmissionUnit)))},
    {"Speed", CMPI_uint64, CLASS_VALUE(NicRecord, CmpiData(static_cast<CMPIUint64>(e.port->linkProperties.linkSpeed)))},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID", nullptr};

const NicRequestTexts kRequestTexts = {nullptr, "Vexlan_NIC_NetworkPort: Error getting namespace\n",
                                       "Vexlan_NIC_NetworkPort: Error getting ClassName\n"};

NicRequestTexts withEntry(const char* entry)
{
    NicRequestTexts t = kRequestTexts;
    t.entry = entry;
    return t;
}

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_NetworkPort")
        .walk(NicWalk::Ports)
        .key("DeviceID", deviceIdText)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts(withEntry("Vexlan_NIC_NetworkPort enumInstances_NetworkPort was called\n"))
        .enumInstanceNamesTexts(withEntry("Vexlan_NIC_NetworkPort enumInstanceNames was called\n"))
        .getInstanceTexts(withEntry("Vexlan_NIC_NetworkPort getInstance_NetworkPort was called\n"))
        .makeTexts("Vexlan_NIC_NetworkPort makePath_NetworkPort was called\n",
                   "Vexlan_NIC_NetworkPort makeInstance was called\n")
        .keyErrors("Vexlan_NIC_NetworkPort: Error getting DeviceID key in findMatchedRole1\n");

// Where the two calc functions write when the caller gives no buffer.
thread_local char tDeviceId[kNicKeyTextSize];
thread_local char tElementName[kNicKeyTextSize];

}  // namespace

char* calcDeviceID_NetworkPort(_CNAStruc* adapter, _CNAPortStruc* port, char* out)
{
    if (out == nullptr)
        out = tDeviceId;
    std::snprintf(out, kNicKeyTextSize, "%s_%u", nicFieldText(adapter->serialNumber).c_str(), port->portNumber);
    return out;
}

char* calcElementName_NetworkPort(_CNAStruc*, _CNAPortStruc* port, char* out)
{
    if (out == nullptr)
        out = tElementName;
    return nicMacText(port, out);
}

VEXLAN_NIC_CLASS_OPERATIONS(NetworkPort, kModule, (_CNAStruc * adapter, _CNAPortStruc * port),
                            (NicRecord{adapter, port, nullptr}))
