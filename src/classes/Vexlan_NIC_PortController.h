// Vexlan_NIC_PortController: one instance per adapter of m_CNAList, the NIC
// twin of Vexlan_FCHBA_PortController.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_PORTCONTROLLER_H
#define VEXLAN_CLASSES_VEXLAN_NIC_PORTCONTROLLER_H

#include "classes/NicClassModule.h"

// Room for a NIC port controller's device ID, terminating zero included.
constexpr std::size_t kPortControllerDeviceIdSize = 256;

// The NIC port controller's device ID of an adapter serial, "<serial>_NIC",
// in a buffer of the function that the next call on the same thread
// overwrites. A null serial counts as empty.
char* BuildPortControllerDeviceID(char* serial);
// The same text of an adapter, copied into `out` (kPortControllerDeviceIdSize
// bytes). Returns `out`.
char* calcDeviceID_PortController(_CNAStruc* adapter, char* out);

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(Nic_PortController, (_CNAStruc* adapter));

#endif
