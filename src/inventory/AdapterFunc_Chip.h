// Chip classification of an FC device: the PCI device ID of a device record
// turned into the ordinal chip type code of the shared device ID table
// (zorap_chip_ids.h), and the few generation tests the class builds use.
#ifndef VEXLAN_INVENTORY_ADAPTERFUNC_CHIP_H
#define VEXLAN_INVENTORY_ADAPTERFUNC_CHIP_H

#include "zorap_cna.h"

// Chip type code of the device: 0 for a null device, 100 for a device ID
// that is not in the table. Every comparison in the program is "greater
// than", so an unknown chip counts as newer than all known ones.
int GetRSXType(_tagZORAPSDMDevice* device);

// 1 or 2 for the two 4G pairs of device IDs (codes 10, 11 and 8, 9); else 0.
int GetRSX4GbType(_tagZORAPSDMDevice* device);

// 1 for the 8G device ID (code 12); else 0.
int GetRSX8GbType(_tagZORAPSDMDevice* device);

// 1 when the chip code is above 7: the serial comes from the VPD rather than
// from the device record.
int GetRSX4GbOrNewerType(_tagZORAPSDMDevice* device);

// Converged chips with an ENode MAC, 10G FC speed and a flash image line in
// the VPD text: codes 15, 17, 21 and 26.
bool IsEnodeMacChipCode(int chipCode);

#endif
