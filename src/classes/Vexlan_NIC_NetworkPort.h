// Vexlan_NIC_NetworkPort: one instance per NIC port of m_CNAList, keyed by the
// adapter's serial and the port's number.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_NETWORKPORT_H
#define VEXLAN_CLASSES_VEXLAN_NIC_NETWORKPORT_H

#include "classes/NicClassModule.h"

// DeviceID "<serial>_<port number>". With a null `out` the text goes to a
// buffer of the function that the next call on the same thread overwrites;
// else `out` must hold kNicKeyTextSize bytes. Returns the text.
char* calcDeviceID_NetworkPort(_CNAStruc* adapter, _CNAPortStruc* port, char* out);
// ElementName: the MAC as twelve upper-case hex digits, with the same rule
// for `out`.
char* calcElementName_NetworkPort(_CNAStruc* adapter, _CNAPortStruc* port, char* out);

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(NetworkPort, (_CNAStruc* adapter, _CNAPortStruc* port));

#endif
