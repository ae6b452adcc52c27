// Vexlan_Adapter_ComputerSystem: the host that carries the adapters, the one
// instance that every other instance of the model names in its keys.
#ifndef VEXLAN_CLASSES_VEXLAN_ADAPTER_COMPUTERSYSTEM_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_ADAPTER_COMPUTERSYSTEM_CMPI_H

#include "classes/ClassModule.h"
#include "support/ossimpl-CIM.h"

// The host's name as GetHostName gives it (a dotted address when the resolver
// knows the name), and what kind of text it is (HOST_NAME_KIND_*). Filled by
// the polling thread before its first build; the SystemName of every instance.
extern char hostName_ComputerSystem[kHostNameBufferSize];
extern int hostNameType_ComputerSystem;

// The one instance has no list: both do nothing.
void buildComputerSystem();
void removeComputerSystem();

VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(ComputerSystem);

#endif
