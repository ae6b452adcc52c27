// Vexlan_FCHBA_SCSIProtocolEndpointTarget as a class module: a full list of
// one slot per target that the FC devices report (Role 3).
#include "classes/Vexlan_FC_SCSIProtocolEndpointTarget_CMPI.h"

#include <cstdint>
#include <cstdio>

#include "classes/Vexlan_FC_FCPort_CMPI.h"

ClassList<SCSIPortNameEntry> g_SCSIProtocolEndpointTargetList = {0, nullptr};

void buildSCSIProtocolEndpointTargetList()
{
    // The capacity is what the devices say they have; a sum beyond the
    // signed count leaves the list empty.
    std::uint64_t wanted = 0;
    bool haveAdapters = classmodule::walkProtocols([&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* pr) {
        if (pr->protocolType < 2)
            wanted += pr->fcDevice.targetCount;
    });
    ClassList<SCSIPortNameEntry>& list = g_SCSIProtocolEndpointTargetList;
    if (!allocateCounted(list, haveAdapters, wanted))
        return;
    const int capacity = static_cast<int>(wanted);
    int index = 0;
    // A chain longer than the counts gives no slot beyond the capacity.
    walkFCTargets([&](_tagZORAPSDMDevice*, _zorap_target_t*, const char* local, const char* remote) {
        if (index >= capacity)
            return false;
        SCSIPortNameEntry& entry = list.entries[index++];
        JoinFCText(entry.name, sizeof(entry.name), {local, "_", remote});
        entry.valid = 1;
        return true;
    });
}

void removeSCSIProtocolEndpointTargetList()
{
    g_SCSIProtocolEndpointTargetList.remove();
}

namespace {

constexpr char kClassName[] = "Vexlan_FCHBA_SCSIProtocolEndpointTarget";

const ClassModule<SCSIPortNameEntry> kSCSIProtocolEndpointTarget =
    scsiEndpointModule<kClassName, 3>("SCSIProtocolEndpointTarget", g_SCSIProtocolEndpointTargetList);

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(SCSIProtocolEndpointTarget, kSCSIProtocolEndpointTarget)
