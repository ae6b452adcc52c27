// Vexlan_NIC_LANEndpoint: the LAN endpoint of each NIC port, keyed by its MAC.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_LANENDPOINT_H
#define VEXLAN_CLASSES_VEXLAN_NIC_LANENDPOINT_H

#include "CmpiImpl.h"
#include "classes/ClassModule.h"
#include "inventory/AdapterFunc.h"

CmpiObjectPath makePath_LANEndPoint(const char* className, const char* nameSpace, _CNAPortStruc* port);
CmpiInstance makeInstance_LANEndPoint(const char* className, const char* nameSpace, const char** properties,
                                      _CNAPortStruc* port);
VEXLAN_DECLARE_CLASS_REQUESTS(LANEndPoint);

#endif
