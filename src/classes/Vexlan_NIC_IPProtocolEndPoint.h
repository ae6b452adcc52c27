// Vexlan_NIC_IPProtocolEndpoint: the IP endpoint of each NIC port, keyed by
// its MAC, with the port's IPv4 address, mask and first IPv6 address.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_IPPROTOCOLENDPOINT_H
#define VEXLAN_CLASSES_VEXLAN_NIC_IPPROTOCOLENDPOINT_H

#include "classes/NicClassModule.h"

// Name of the endpoint: the port's MAC as twelve upper-case hex digits, into
// kMacTextSize bytes or more (a null `out` uses a buffer of macaddrToStr).
char* calcName_IPProtocolEndPoint(_CNAPortStruc* port, char* out);

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(IPProtocolEndPoint, (_CNAPortStruc* port));

#endif
