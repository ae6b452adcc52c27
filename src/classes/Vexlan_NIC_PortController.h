// Vexlan_NIC_PortController: one instance per adapter of m_CNAList, the NIC
// twin of Vexlan_FCHBA_PortController.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_PORTCONTROLLER_H
#define VEXLAN_CLASSES_VEXLAN_NIC_PORTCONTROLLER_H

#include "CmpiImpl.h"
#include "classes/ClassModule.h"
#include "inventory/AdapterFunc.h"

// Room for a NIC port controller's device ID, terminating zero included.
constexpr std::size_t kPortControllerDeviceIdSize = 256;

// The NIC port controller's device ID of an adapter serial, "<serial>_NIC",
// in a buffer of the function that the next call on the same thread
// overwrites. A null serial counts as empty.
char* BuildPortControllerDeviceID(char* serial);
// The same text of an adapter, copied into `out` (kPortControllerDeviceIdSize
// bytes). Returns `out`.
char* calcDeviceID_PortController(_CNAStruc* adapter, char* out);

CmpiObjectPath makePath_Nic_PortController(const char* className, const char* nameSpace, _CNAStruc* adapter);
CmpiInstance makeInstance_Nic_PortController(const char* className, const char* nameSpace, const char** properties,
                                             _CNAStruc* adapter);
VEXLAN_DECLARE_CLASS_REQUESTS(Nic_PortController);

#endif
