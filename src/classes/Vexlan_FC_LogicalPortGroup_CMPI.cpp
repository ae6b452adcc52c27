// Vexlan_FCHBA_LogicalPortGroup as a class module: the slot of a group is the
// ordinal of the FC function that created it (see the header).
#include "classes/Vexlan_FC_LogicalPortGroup_CMPI.h"

#include <cstdio>
#include <cstring>

#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "inventory/AdapterFunc_VPD.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/ossimpl-CIM.h"

ClassList<LogicalPortGroupEntry> g_LogicalPortGroupList;

namespace {

// Fills slot `entry` from one FC function unless a slot below count has its
// node WWN already. `serial` is the build's serial buffer, which keeps its
// text from one device to the next.
bool createLogicalPortGroup(_tagZORAPSDMDevice* device, LogicalPortGroupEntry& entry, char* serial,
                            std::size_t serialSize)
{
    char hostName[kHostNameBufferSize] = {};
    int hostNameKind = 0;
    GetHostName(hostName, &hostNameKind, sizeof(hostName));

    std::memset(g_serialNumber, 0, kVpdLineSize);
    const int vpdResult = GetHBAVPDData(device);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint(
            vpdResult == 0 ? "Vexlan_FC_LogicalPortGroup: createLogicalPortGroup: VPD data retrieved successfully."
                           : "Vexlan_FC_LogicalPortGroup: createLogicalPortGroup: Unable to retrieve VPD data!");
    TakeFCSerial(device, vpdResult, serial, serialSize);

    char nodeWWN[kFCWWNTextSize];
    char portWWN[kFCWWNTextSize];
    FormatWWN(device->nodeWWN, nodeWWN, sizeof(nodeWWN));
    FormatWWN(device->portWWN, portWWN, sizeof(portWWN));

    for (int i = 0; i < g_LogicalPortGroupList.count; ++i)
        if (std::strcmp(nodeWWN, g_LogicalPortGroupList.entries[i].nodeWWN) == 0)
            return false;

    FormatFCText(entry.nodeWWN, sizeof(entry.nodeWWN), "%s", nodeWWN);
    FormatFCText(entry.instanceId, sizeof(entry.instanceId), "%s_%s_%s_%s", hostName, serial, nodeWWN, portWWN);
    return true;
}

const PropertyRow<LogicalPortGroupEntry> kProperties[] = {
    {"InstanceID", CMPI_string, CLASS_VALUE(LogicalPortGroupEntry, entryText(e.instanceId))},
    {"ElementName", CMPI_string, CLASS_VALUE(LogicalPortGroupEntry, entryText(e.nodeWWN))},
    {"Name", CMPI_string, CLASS_VALUE(LogicalPortGroupEntry, entryText(e.nodeWWN))},
    {"NameFormat", CMPI_string, CLASS_VALUE(LogicalPortGroupEntry, entryText("WWN"))},
};

const char* const kKeys[] = {"InstanceID", nullptr};

const ClassModule<LogicalPortGroupEntry> kLogicalPortGroup =
    ClassModule<LogicalPortGroupEntry>("LogicalPortGroup")
        .list(g_LogicalPortGroupList, ListKind::Ordinal)
        .key("InstanceID", [](const LogicalPortGroupEntry& e) -> const char* { return e.instanceId; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties);

}  // namespace

void buildLogicalPortGroupList()
{
    char serial[256] = {};
    kLogicalPortGroup.build(
        IsFCProtocol,
        [&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol, LogicalPortGroupEntry& entry, int) {
            return createLogicalPortGroup(&protocol->fcDevice, entry, serial, sizeof(serial));
        });
}

void removeLogicalPortGroupList()
{
    g_LogicalPortGroupList.remove();
}

VEXLAN_LIST_CLASS_OPERATIONS(LogicalPortGroup, kLogicalPortGroup)
