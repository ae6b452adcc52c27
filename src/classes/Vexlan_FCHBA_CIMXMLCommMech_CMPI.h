// Vexlan_FCHBA_CIMXMLCommMech: the CIM-XML communication mechanism of the
// object manager. One instance of constants.
#ifndef VEXLAN_CLASSES_VEXLAN_FCHBA_CIMXMLCOMMMECH_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FCHBA_CIMXMLCOMMMECH_CMPI_H

#include "classes/ClassModule.h"

// Nothing to build or remove; kept so that the build sequence stays uniform.
void buildCIMXMLCommMech();
void removeCIMXMLCommMech();

VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(CIMXMLCommMech);

#endif
