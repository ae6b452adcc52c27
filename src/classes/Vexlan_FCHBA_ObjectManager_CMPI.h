// Vexlan_FCHBA_ObjectManager: the CIM server that hosts the provider, as a
// client following SMI-S discovery sees it. One instance.
#ifndef VEXLAN_CLASSES_VEXLAN_FCHBA_OBJECTMANAGER_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FCHBA_OBJECTMANAGER_CMPI_H

#include <cstddef>

#include "classes/ClassModule.h"
#include "support/ossimpl-CIM.h"

// "pegasus:<host>", whichever server loaded the provider.
extern char name_ObjectManager[kHostNameBufferSize + 16];
// The host text of GetHostName, a copy of the object manager's own.
extern char hostName_ObjectManager[kHostNameBufferSize];

// Fills hostName_ObjectManager and name_ObjectManager.
void buildObjectManager();
// Nothing to remove.
void removeObjectManager();
// name_ObjectManager, for the Namespace keys and the associations.
char* getNameObjectManager();

// The configured CIMOMNameVersion text as the instance shows it: "%%" stands
// for one "%", and every other character, "%" included, stands as it is.
// Cut to targetSize-1 characters; `target` is always terminated.
void formatCIMOMNameVersion(const char* configured, char* target, std::size_t targetSize);

VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(ObjectManager);

#endif
