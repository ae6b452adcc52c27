// Chip classification by the shared device ID table.
#include "inventory/AdapterFunc_Chip.h"

#include <atomic>
#include <cstdint>

#include "zorap_chip_ids.h"

namespace {

// The row of the device ID asked last, kept as one word (row number plus one
// above the device ID; 0: none yet): the builds ask for the chip of every FC
// function several times, nearly always of the same ID as the time before,
// and the table is searched row by row. One word, so that the alarm thread's
// rebuild and a request never read half of another's answer.
std::atomic<std::uint32_t> g_lastRow{0};

zorap_chip_row const* rowOfId(std::uint16_t pciDeviceId) {
    std::uint32_t const last = g_lastRow.load(std::memory_order_relaxed);
    if (last != 0 && (last & 0xFFFFu) == pciDeviceId) return &ZORAP_CHIP_TABLE[(last >> 16) - 1];
    zorap_chip_row const* row = zorap_chip_row_for_device_id(pciDeviceId);
    if (row != nullptr)
        g_lastRow.store((static_cast<std::uint32_t>(row - ZORAP_CHIP_TABLE) + 1) << 16 | pciDeviceId,
                        std::memory_order_relaxed);
    return row;
}

// The table row of the device's chip, or null for a null device or an
// unknown device ID.
zorap_chip_row const* chipRow(_tagZORAPSDMDevice const* device) {
    return device == nullptr ? nullptr : rowOfId(device->pciDeviceId);
}

}  // namespace

int GetRSXType(_tagZORAPSDMDevice* device) {
    if (device == nullptr) return ZORAP_CHIP_CODE_NONE;
    zorap_chip_row const* row = rowOfId(device->pciDeviceId);
    return row != nullptr ? row->chipCode : ZORAP_CHIP_CODE_UNKNOWN;
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
