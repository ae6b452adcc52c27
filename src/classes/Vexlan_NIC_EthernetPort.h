// Vexlan_NIC_EthernetPort2: one instance per NIC port of m_CNAList, keyed by
// the port's MAC, with the FCoE linkage of the port.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_ETHERNETPORT_H
#define VEXLAN_CLASSES_VEXLAN_NIC_ETHERNETPORT_H

#include "classes/NicClassModule.h"

// DeviceID of the port: its MAC as twelve upper-case hex digits, into
// kMacTextSize bytes or more (a null `out` uses a buffer of macaddrToStr).
// The adapter is not looked at. Returns the text.
char* calcDeviceID_EthernetPort(_CNAStruc* adapter, _CNAPortStruc* port, char* out);

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(EthernetPort, (_CNAStruc* adapter, _CNAPortStruc* port));

#endif
