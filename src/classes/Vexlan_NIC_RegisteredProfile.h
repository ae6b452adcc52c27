// Vexlan_NIC_RegisteredProfile: the management profiles that the NIC side
// claims, held as a chain of eight constant nodes, m_RegisteredProfileList.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_REGISTEREDPROFILE_H
#define VEXLAN_CLASSES_VEXLAN_NIC_REGISTEREDPROFILE_H

#include <cstdint>

#include "classes/NicClassModule.h"

// One node of the chain, allocated with malloc. `description` is
// "Vexlan NIC " followed by `name`.
struct _RegisteredProfile {
    std::uint32_t id;
    char name[128];
    char description[128];
    char registeredName[128];
    char registeredVersion[128];
    std::uint16_t registeredOrganization;
    _RegisteredProfile* next;
};

// Head of the chain; null when empty.
extern _RegisteredProfile* m_RegisteredProfileList;

// Builds the chain of eight profiles. A chain that is still there is freed
// first, so that a second call gives eight nodes again.
void InitializeRegisteredProfileList();
// Frees every node; the chain becomes empty.
void Clear_RegisteredProfile_List();

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(Nic_RegisteredProfile, (_RegisteredProfile* profile));

#endif
