// Vexlan_NIC_RemoteServiceAccessPoint: a remote access point of each NIC port,
// keyed by its MAC. Complete as a module, but the dispatcher has no route to
// it: adding its routes switches the class on.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_REMOTESERVICEACCESSPOINT_H
#define VEXLAN_CLASSES_VEXLAN_NIC_REMOTESERVICEACCESSPOINT_H

#include "classes/NicClassModule.h"

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(RemoteServiceAccessPoint, (_CNAPortStruc* port));

#endif
