// Vexlan_NIC_LANEndpoint: the LAN endpoint of each NIC port, keyed by its MAC.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_LANENDPOINT_H
#define VEXLAN_CLASSES_VEXLAN_NIC_LANENDPOINT_H

#include "classes/NicClassModule.h"

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(LANEndPoint, (_CNAPortStruc* port));

#endif
