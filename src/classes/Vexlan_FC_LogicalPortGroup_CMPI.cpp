// Vexlan_FCHBA_LogicalPortGroup as a class module: the slot of a group is the
// ordinal of the FC function that created it (see the header).
#include "classes/Vexlan_FC_LogicalPortGroup_CMPI.h"

#include <cstdio>
#include <cstring>

#include "classes/TextsBelowCount.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "inventory/AdapterFunc_VPD.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/ossimpl-CIM.h"

ClassList<LogicalPortGroupEntry> g_LogicalPortGroupList;

namespace {

using NodeWWNsBelowCount = TextsBelowCount<LogicalPortGroupEntry, sizeof(LogicalPortGroupEntry::nodeWWN)>;

// What one build shares among its FC functions: the serial buffer, which
// keeps its text from one device to the next, the node WWNs of the slots
// below count, and the host name, asked once per build instead of once per
// function (the resolver reads the hosts file at every question).
struct GroupBuild {
    char serial[256] = {};
    NodeWWNsBelowCount nodeWWNs{g_LogicalPortGroupList, &LogicalPortGroupEntry::nodeWWN};
    bool haveHostName = false;
    char hostName[kHostNameBufferSize] = {};

    const char* host()
    {
        if (!haveHostName) {
            int hostNameKind = 0;
            GetHostName(hostName, &hostNameKind, sizeof(hostName));
            haveHostName = true;
        }
        return hostName;
    }
};

// Fills slot `entry` from one FC function unless a slot below count has its
// node WWN already.
bool createLogicalPortGroup(_tagZORAPSDMDevice* device, LogicalPortGroupEntry& entry, GroupBuild& build)
{
    const char* hostName = build.host();
    char* serial = build.serial;
    const std::size_t serialSize = sizeof(build.serial);

    ClearVpdLine(g_serialNumber);
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

    if (build.nodeWWNs.find(nodeWWN) >= 0)
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
    GroupBuild build;
    kLogicalPortGroup.build(
        IsFCProtocol,
        [&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol, LogicalPortGroupEntry& entry, int) {
            return createLogicalPortGroup(&protocol->fcDevice, entry, build);
        });
}

void removeLogicalPortGroupList()
{
    g_LogicalPortGroupList.remove();
}

VEXLAN_LIST_CLASS_OPERATIONS(LogicalPortGroup, kLogicalPortGroup)
