// Vexlan_NIC_IPProtocolEndpointCapabilities: what the IP endpoint of each NIC
// port accepts, keyed by InstanceID, the port's MAC.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_IPPROTOCOLENDPOINTCAPABILITIES_H
#define VEXLAN_CLASSES_VEXLAN_NIC_IPPROTOCOLENDPOINTCAPABILITIES_H

#include "classes/NicClassModule.h"

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(IPProtocolEndPointCapabilities, (_CNAPortStruc* port));

#endif
