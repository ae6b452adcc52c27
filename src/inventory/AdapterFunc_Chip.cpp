// Chip classification by the shared device ID table.
#include "inventory/AdapterFunc_Chip.h"

#include "zorap_chip_ids.h"

namespace {

// The table row of the device's chip, or null for a null device or an
// unknown device ID.
zorap_chip_row const* chipRow(_tagZORAPSDMDevice const* device) {
    return device == nullptr ? nullptr : zorap_chip_row_for_device_id(device->pciDeviceId);
}

}  // namespace

int GetRSXType(_tagZORAPSDMDevice* device) {
    if (device == nullptr) return ZORAP_CHIP_CODE_NONE;
    return zorap_chip_code_for_device_id(device->pciDeviceId);
}

int GetRSX4GbType(_tagZORAPSDMDevice* device) {
    zorap_chip_row const* row = chipRow(device);
    return row == nullptr ? 0 : row->fourGbKind;
}

int GetRSX8GbType(_tagZORAPSDMDevice* device) {
    zorap_chip_row const* row = chipRow(device);
    return row == nullptr ? 0 : row->eightGb;
}

int GetRSX4GbOrNewerType(_tagZORAPSDMDevice* device) {
    return GetRSXType(device) > 7 ? 1 : 0;
}

bool IsEnodeMacChipCode(int chipCode) {
    return chipCode == 15 || chipCode == 17 || chipCode == 21 || chipCode == 26;
}
