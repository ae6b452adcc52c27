// Vexlan_NIC_SoftwareIdentity: the driver (type 2) and the flash firmware
// (type 3) of each NIC adapter of m_CNAList; no list of its own.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_SOFTWAREIDENTITY_H
#define VEXLAN_CLASSES_VEXLAN_NIC_SOFTWAREIDENTITY_H

#include "classes/NicClassModule.h"

VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(Nic_SoftwareIdentity, (_CNAStruc* adapter, int softwareType));

#endif
