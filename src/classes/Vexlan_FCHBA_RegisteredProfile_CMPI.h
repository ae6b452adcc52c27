// Vexlan_FCHBA_RegisteredProfile: the management profiles that the FC side
// claims, four constant rows whose InstanceID holds the host name. The list
// is built, but no instance route of the dispatcher reaches the class; the
// associations read it.
#ifndef VEXLAN_CLASSES_VEXLAN_FCHBA_REGISTEREDPROFILE_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FCHBA_REGISTEREDPROFILE_CMPI_H

#include <cstdint>

#include "classes/ClassModule.h"

// One profile or sub-profile.
struct RegisteredProfileEntry {
    unsigned char valid;
    char instanceId[128];
    char caption[128];              // also Description and ElementName
    char otherOrganization[128];    // always empty
    char registeredName[128];
    char registeredVersion[128];
    std::uint16_t registeredOrganization;
};

extern ClassList<RegisteredProfileEntry> g_RegisteredProfileList;

// One constant row: InstanceID is `instanceIdPrefix` followed by the host name.
struct RegisteredProfileRow {
    const char* instanceIdPrefix;
    const char* caption;
    std::uint16_t registeredOrganization;
    const char* registeredName;
    const char* registeredVersion;
};

// Fills `list` with one valid slot per row, between the debug lines
// "Entering <operation>" and "Exiting  <operation>\n".
void buildRegisteredProfileRows(ClassList<RegisteredProfileEntry>& list, const RegisteredProfileRow* rows,
                                int count, const char* operation);

// The properties of a profile and a sub-profile, in the order set.
constexpr int kRegisteredProfilePropertyCount = 10;
extern const PropertyRow<RegisteredProfileEntry> g_RegisteredProfileProperties[kRegisteredProfilePropertyCount];
extern const char* const g_RegisteredProfileKeys[];

void buildRegisteredProfileList();
void removeRegisteredProfileList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(RegisteredProfile);

#endif
