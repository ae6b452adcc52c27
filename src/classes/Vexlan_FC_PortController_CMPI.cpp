// Vexlan_FCHBA_PortController as a class module: a dense list with one slot
// per distinct adapter serial, in the order the adapter walk first meets it.
#include "classes/Vexlan_FC_PortController_CMPI.h"

#include <cstdio>
#include <cstring>
#include <strings.h>

#include "classes/TextsBelowCount.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "inventory/AdapterFunc_VPD.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

ClassList<PortControllerEntry> g_PortControllerList;

namespace {

const char kSystemClassName[] = "Vexlan_Adapter_ComputerSystem";
const char kClassName[] = "Vexlan_FCHBA_PortController";

using SerialsBelowCount = TextsBelowCount<PortControllerEntry, sizeof(PortControllerEntry::deviceId)>;

// Fills the next slot from one FC function unless its adapter's serial is in
// the list already. `serial` is the build's serial buffer, which keeps its
// text from one device to the next.
bool createPortController(_tagZORAPSDMDevice* device, PortControllerEntry& entry, char* serial,
                          std::size_t serialSize, SerialsBelowCount& known)
{
    ClearVpdLine(g_serialNumber);
    const int vpdResult = GetHBAVPDData(device);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint(vpdResult == 0
                                             ? "Vexlan_FC_PortController: createPortController: VPD data retrieved successfully."
                                             : "Vexlan_FC_PortController: createPortController: Unable to retrieve VPD data!");
    TakeFCSerial(device, vpdResult, serial, serialSize);

    const int same = known.find(serial);
    if (same >= 0) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("Exiting  createPortController: Current device has the same the serial "
                                             "number as a device in the list at index=%d. Skip!\n",
                                             same);
        return false;
    }

    FormatFCText(entry.deviceId, sizeof(entry.deviceId), "%s", serial);
    entry.macAvailable = TakeENodeMAC(device, entry.macAddress);
    entry.device = device;
    return true;
}

const PropertyRow<PortControllerEntry> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, CLASS_VALUE(PortControllerEntry, entryText(kSystemClassName))},
    {"SystemName", CMPI_string, CLASS_VALUE(PortControllerEntry, entryText(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(PortControllerEntry, entryText(kClassName))},
    {"DeviceID", CMPI_string, CLASS_VALUE(PortControllerEntry, entryText(e.deviceId))},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(PortControllerEntry, uint16Array({1}))},
    {"StatusDescriptions", CMPI_stringA,
     CLASS_VALUE(PortControllerEntry,
                 stringArray({"Review operational status values for corresponding Vexlan_FCHBA_FCPort instances"}))},
    {"ProtocolSupported", CMPI_uint16, CLASS_VALUE(PortControllerEntry, CmpiData(static_cast<CMPIUint16>(10)))},
    {"ElementName", CMPI_string, CLASS_VALUE(PortControllerEntry, entryText(e.deviceId))},
    {"ControllerType", CMPI_uint16, CLASS_VALUE(PortControllerEntry, CmpiData(static_cast<CMPIUint16>(4)))},
    {"ENodeMACAddress", CMPI_string, CLASS_VALUE(PortControllerEntry, ENodeMACText(e.macAvailable, e.macAddress))},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID", nullptr};

const ClassModule<PortControllerEntry> kPortController =
    ClassModule<PortControllerEntry>("PortController")
        .list(g_PortControllerList, ListKind::Dense)
        .key("DeviceID", [](const PortControllerEntry& e) -> const char* { return e.deviceId; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties);

}  // namespace

void buildPortControllerList()
{
    char serial[256] = {};
    SerialsBelowCount known(g_PortControllerList, &PortControllerEntry::deviceId);
    kPortController.build(
        IsFCProtocol,
        [&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol, PortControllerEntry& entry, int) {
            return createPortController(&protocol->fcDevice, entry, serial, sizeof(serial), known);
        });
}

void removePortControllerList()
{
    g_PortControllerList.remove();
}

int IsDeviceInPortControllerList(unsigned char* serial, int* index)
{
    if (serial == nullptr)
        return 0;
    for (int i = 0; i < g_PortControllerList.count; ++i) {
        if (strcasecmp(reinterpret_cast<const char*>(serial), g_PortControllerList.entries[i].deviceId) == 0) {
            if (index != nullptr)
                *index = i;
            return 1;
        }
    }
    return 0;
}

VEXLAN_LIST_CLASS_OPERATIONS(PortController, kPortController)
