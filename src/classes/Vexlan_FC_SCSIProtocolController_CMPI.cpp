// Vexlan_FCHBA_SCSIProtocolController as a class module: one slot per FC
// protocol, DeviceID the port WWN.
#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"

ClassList<SCSIPortNameEntry> g_SCSIProtocolControllerList = {0, nullptr};

const char* const kSCSIEndpointKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name",
                                         nullptr};

void buildSCSIPortNameList(ClassList<SCSIPortNameEntry>& list)
{
    auto isFC = [](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol) {
        return protocol->protocolType < 2;
    };
    int wanted = 0;
    bool haveAdapters = classmodule::walkProtocols([&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
        if (isFC(a, p, pr))
            ++wanted;
    });
    if (!haveAdapters || !list.allocate(wanted))
        return;
    const int capacity = wanted;
    int index = 0;
    classmodule::walkProtocols([&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
        // A tree that grew between the two walks finds no slot.
        if (!isFC(a, p, pr) || index >= capacity)
            return;
        SCSIPortNameEntry& entry = list.entries[index++];
        FormatWWN(pr->fcDevice.portWWN, entry.name, sizeof(entry.name));
        entry.valid = 1;
    });
}

void buildSCSIProtocolControllerList()
{
    buildSCSIPortNameList(g_SCSIProtocolControllerList);
}

void removeSCSIProtocolControllerList()
{
    g_SCSIProtocolControllerList.remove();
}

namespace {

const char kClassName[] = "Vexlan_FCHBA_SCSIProtocolController";

const PropertyRow<SCSIPortNameEntry> kProperties[] = {
    {"SystemCreationClassName", CMPI_string,
     CLASS_VALUE(SCSIPortNameEntry, entryText("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(kClassName))},
    {"DeviceID", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(e.name))},
    {"MaxUnitsControlled", CMPI_uint32, CLASS_VALUE(SCSIPortNameEntry, CmpiData(static_cast<CMPIUint32>(0)))},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID", nullptr};

const ClassModule<SCSIPortNameEntry> kSCSIProtocolController =
    ClassModule<SCSIPortNameEntry>("SCSIProtocolController")
        .list(g_SCSIProtocolControllerList, ListKind::Full)
        .key("DeviceID", [](const SCSIPortNameEntry& e) -> const char* { return e.name; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties);

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(SCSIProtocolController, kSCSIProtocolController)
