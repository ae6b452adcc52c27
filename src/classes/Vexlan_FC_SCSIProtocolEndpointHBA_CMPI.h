// Vexlan_FCHBA_SCSIProtocolEndpointHBA: the SCSI initiator endpoint of one FC
// function, Name the port WWN. Built only while the SCSI endpoint classes are
// switched on.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_SCSIPROTOCOLENDPOINTHBA_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_SCSIPROTOCOLENDPOINTHBA_CMPI_H

#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"

extern ClassList<SCSIPortNameEntry> g_SCSIProtocolEndpointHBAList;

void buildSCSIProtocolEndpointHBAList();
void removeSCSIProtocolEndpointHBAList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(SCSIProtocolEndpointHBA);

#endif
