// Vexlan_FCHBA_PortController: the FC controller of one adapter board, one
// instance per adapter serial; its DeviceID is the serial alone.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_PORTCONTROLLER_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_PORTCONTROLLER_CMPI_H

#include <cstdint>

#include "classes/ClassModule.h"
#include "zorap_cna.h"

struct PortControllerEntry {
    std::uint8_t valid;
    std::uint8_t macAvailable;         // 1 when the chip has an ENode MAC
    char deviceId[128];                // the adapter's serial
    std::uint8_t macAddress[6];        // ENode MAC
    _tagZORAPSDMDevice* device;        // the first device seen with this serial
};

// A dense list: the build drops a device whose serial (compared with case)
// is already in the list.
extern ClassList<PortControllerEntry> g_PortControllerList;

void buildPortControllerList();
void removePortControllerList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(PortController);

// Looks for the serial among the slots below count, ignoring case and `valid`.
// On a match stores the slot's index and returns 1; otherwise 0.
int IsDeviceInPortControllerList(unsigned char* serial, int* index);

#endif
