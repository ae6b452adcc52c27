// Vexlan_NIC_IPProtocolEndpointCapabilities: what the IP endpoint of each NIC
// port accepts, keyed by InstanceID, the port's MAC.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_IPPROTOCOLENDPOINTCAPABILITIES_H
#define VEXLAN_CLASSES_VEXLAN_NIC_IPPROTOCOLENDPOINTCAPABILITIES_H

#include "CmpiImpl.h"
#include "classes/ClassModule.h"
#include "inventory/AdapterFunc.h"

CmpiObjectPath makePath_IPProtocolEndPointCapabilities(const char* className, const char* nameSpace,
                                                       _CNAPortStruc* port);
CmpiInstance makeInstance_IPProtocolEndPointCapabilities(const char* className, const char* nameSpace,
                                                         const char** properties, _CNAPortStruc* port);
VEXLAN_DECLARE_CLASS_REQUESTS(IPProtocolEndPointCapabilities);

#endif
