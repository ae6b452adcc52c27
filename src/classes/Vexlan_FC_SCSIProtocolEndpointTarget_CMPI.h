// Vexlan_FCHBA_SCSIProtocolEndpointTarget: one SCSI target endpoint per target
// that an FC function has discovered, Name "<local port WWN>_<target port WWN>".
// Built only while the SCSI endpoint classes are switched on; the dispatcher
// rebuilds it before every request.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_SCSIPROTOCOLENDPOINTTARGET_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_SCSIPROTOCOLENDPOINTTARGET_CMPI_H

#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"

extern ClassList<SCSIPortNameEntry> g_SCSIProtocolEndpointTargetList;

void buildSCSIProtocolEndpointTargetList();
void removeSCSIProtocolEndpointTargetList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(SCSIProtocolEndpointTarget);

#endif
