// Vexlan_FCHBA_RegisteredSubProfile: the sub-profiles that the FC side
// claims, two constant rows alike in form to the profiles. Built but not
// routed, as the profiles.
#ifndef VEXLAN_CLASSES_VEXLAN_FCHBA_REGISTEREDSUBPROFILE_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FCHBA_REGISTEREDSUBPROFILE_CMPI_H

#include "classes/Vexlan_FCHBA_RegisteredProfile_CMPI.h"

extern ClassList<RegisteredProfileEntry> g_RegisteredSubProfileList;

void buildRegisteredSubProfileList();
void removeRegisteredSubProfileList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(RegisteredSubProfile);

#endif
