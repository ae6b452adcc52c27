// Vexlan_FCHBA_Namespace: the provider's own name space and the server's
// interop name space, two fixed rows.
#ifndef VEXLAN_CLASSES_VEXLAN_FCHBA_NAMESPACE_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FCHBA_NAMESPACE_CMPI_H

#include "classes/ClassModule.h"

// Row 0 "root/vexlan_cmpi", row 1 the configured interop name space
// (g_InteropNamespace); both null until buildNamespaceList.
constexpr int kNamespaceRows = 2;
extern const char* namespace_array[kNamespaceRows];

void buildNamespaceList();
// Nothing to remove: the rows are constants.
void removeNamespaceList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(Namespace);

#endif
