// Vexlan_FCHBA_SCSIProtocolEndpointHBA as a class module: the controller's
// list again, seen as initiator endpoints (Role 2).
#include "classes/Vexlan_FC_SCSIProtocolEndpointHBA_CMPI.h"

ClassList<SCSIPortNameEntry> g_SCSIProtocolEndpointHBAList = {0, nullptr};

void buildSCSIProtocolEndpointHBAList()
{
    buildSCSIPortNameList(g_SCSIProtocolEndpointHBAList);
}

void removeSCSIProtocolEndpointHBAList()
{
    g_SCSIProtocolEndpointHBAList.remove();
}

namespace {

constexpr char kClassName[] = "Vexlan_FCHBA_SCSIProtocolEndpointHBA";

const ClassModule<SCSIPortNameEntry> kSCSIProtocolEndpointHBA =
    scsiEndpointModule<kClassName, 2>("SCSIProtocolEndpointHBA", g_SCSIProtocolEndpointHBAList);

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(SCSIProtocolEndpointHBA, kSCSIProtocolEndpointHBA)
