// Vexlan_NIC_PortController as a NIC class module: one instance per adapter,
// ports or not.
#include "classes/Vexlan_NIC_PortController.h"

#include <cstdio>
#include <cstring>

#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

// The device ID is built from the serial field, which ends at its array's
// end even when the library filled it to the last byte.
std::string serialOf(const _CNAStruc* adapter)
{
    return nicFieldText(adapter->serialNumber);
}

void deviceIdText(const NicRecord& r, char* out)
{
    calcDeviceID_PortController(r.adapter, out);
}

PropertyValue deviceId(const NicRecord& r)
{
    char text[kPortControllerDeviceIdSize];
    return CmpiData(calcDeviceID_PortController(r.adapter, text));
}

// The first six bytes of the adapter info, without separators.
PropertyValue fcWwn(const NicRecord& r)
{
    char text[kMacTextSize];
    return CmpiData(macaddrToStr(r.adapter->nodeWWN, text));
}

// The status pair is fixed: a link state has no part in it.
const PropertyRow<NicRecord> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, NIC_TEXT("Vexlan_Adapter_ComputerSystem")},
    {"SystemName", CMPI_string, NIC_TEXT(hostName_ComputerSystem)},
    {"CreationClassName", CMPI_string, NIC_TEXT("Vexlan_NIC_PortController")},
    {"DeviceID", CMPI_string, deviceId},
    {"Caption", CMPI_string, NIC_TEXT("Vexlan CNA")},
    {"Description", CMPI_string, NIC_TEXT("Vexlan Converged Network Adapter")},
    {"Name", CMPI_string, CLASS_VALUE(NicRecord, CmpiData(nicFieldText(e.adapter->modelName)))},
    {"ControllerType", CMPI_uint16, NIC_UINT16(2)},
    {"ProtocolSupported", CMPI_uint16, NIC_UINT16(1)},
    {"MaxNumberControlled", CMPI_uint32, CLASS_VALUE(NicRecord, CmpiData(static_cast<CMPIUint32>(0)))},
    {"EnabledState", CMPI_uint16, NIC_UINT16(5)},
    {"RequestedState", CMPI_uint16, NIC_UINT16(12)},
    {"ElementName", CMPI_string, NIC_TEXT("CNA PortController")},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(NicRecord, uint16Array({2}))},
    {"StatusDescriptions", CMPI_stringA, CLASS_VALUE(NicRecord, stringArray({"OK"}))},
    {"FC_WWN", CMPI_string, fcWwn},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID", nullptr};

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_PortController")
        .walk(NicWalk::Adapters)
        .key("DeviceID", deviceIdText)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts({"Vexlan_NIC_PortController enumInstances_PortController was called\n",
                             "Vexlan_NIC_PortController: Error getting namespace in enumInstances\n",
                             "Vexlan_NIC_PortController: Error getting classname in enumInstances\n"})
        .enumInstanceNamesTexts({"Vexlan_NIC_PortController enumInstanceNames was called\n",
                                 "Vexlan_NIC_PortController: Error getting namespace in enumInstanceNames\n",
                                 "Vexlan_NIC_PortController: Error getting ClassName in enumInstanceNames\n"})
        .getInstanceTexts({"Vexlan_NIC_PortController getInstance was called\n",
                           "Vexlan_NIC_PortController: Error getting namespace in getInstances\n",
                           "Vexlan_NIC_PortController: Error getting classname in getInstances\n"})
        .makeTexts("Vexlan_NIC_PortController makePath_PortController was called\n",
                   "Vexlan_NIC_PortController makeInstance_PortController was called\n")
        .keyErrors("Vexlan_NIC_PortController: Error getting DeviceID key in getInstances\n");

// sDeviceId: the text of the last BuildPortControllerDeviceID on this thread.
thread_local char sDeviceId[kPortControllerDeviceIdSize];

}  // namespace

char* BuildPortControllerDeviceID(char* serial)
{
    std::memset(sDeviceId, 0, sizeof(sDeviceId));
    // The serial is cut so that "_NIC" always fits behind it.
    const int room = static_cast<int>(sizeof(sDeviceId)) - 1 - 4;
    std::snprintf(sDeviceId, sizeof(sDeviceId), "%.*s_NIC", room, serial != nullptr ? serial : "");
    return sDeviceId;
}

char* calcDeviceID_PortController(_CNAStruc* adapter, char* out)
{
    std::string serial = serialOf(adapter);
    safeStrCpy(out, BuildPortControllerDeviceID(&serial[0]), kPortControllerDeviceIdSize);
    return out;
}

VEXLAN_NIC_CLASS_OPERATIONS(Nic_PortController, kModule, (_CNAStruc * adapter),
                            (NicRecord{adapter, nullptr, nullptr}))
