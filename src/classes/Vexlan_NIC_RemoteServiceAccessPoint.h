// Vexlan_NIC_RemoteServiceAccessPoint: a remote access point of each NIC port,
// keyed by its MAC. Complete as a module, but the dispatcher has no route to
// it: adding its routes switches the class on.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_REMOTESERVICEACCESSPOINT_H
#define VEXLAN_CLASSES_VEXLAN_NIC_REMOTESERVICEACCESSPOINT_H

#include "CmpiImpl.h"
#include "classes/ClassModule.h"
#include "inventory/AdapterFunc.h"

CmpiObjectPath makePath_RemoteServiceAccessPoint(const char* className, const char* nameSpace,
                                                 _CNAPortStruc* port);
CmpiInstance makeInstance_RemoteServiceAccessPoint(const char* className, const char* nameSpace,
                                                   const char** properties, _CNAPortStruc* port);
VEXLAN_DECLARE_CLASS_REQUESTS(RemoteServiceAccessPoint);

#endif
