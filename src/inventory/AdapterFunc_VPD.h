// Vital product data of an FC device, decoded into labelled text lines held in
// process-wide buffers, and the option ROM version lines.
//
// The buffers are filled by GetHBAVPDData and GetHBAOptionROMVersions and read
// by the class builds right after; they are never cleared here (but for
// g_I2CUUID), so a caller memsets the ones it wants to read before the call.
// A keyword absent from one device's VPD keeps the previous device's line.
// The buffers are unguarded: the builds run one at a time under the
// provider's locks.
#ifndef VEXLAN_INVENTORY_ADAPTERFUNC_VPD_H
#define VEXLAN_INVENTORY_ADAPTERFUNC_VPD_H

#include <cstddef>

#include "zorap_cna.h"

// Size of every VPD and option ROM line buffer, terminating zero included.
constexpr std::size_t kVpdLineSize = 2048;

extern char g_productId[kVpdLineSize];        // tag 0x82 "Product Identifier:..."
extern char g_RTag[kVpdLineSize];             // tag 0x90 "VPD-R Tag:"
extern char g_partNumber[kVpdLineSize];       // "PN" "Part Number:..."
extern char g_serialNumber[kVpdLineSize];     // "SN" "Serial Number:..."
extern char g_miscInfo[kVpdLineSize];         // "V0" "Miscellaneous Information:..."
extern char g_manufacturingId[kVpdLineSize];  // "MN" "Manufacturing Id:..."
extern char g_efiVersion[kVpdLineSize];       // "V1" "EFI Driver Version:..."
extern char g_fwVersion[kVpdLineSize];        // "V3" "Firmware Version:..."
extern char g_biosVersion[kVpdLineSize];      // "V4" "BIOS Version:..."
extern char g_fcodeVersion[kVpdLineSize];     // "V5" "FCode Version:..."
extern char g_fruNumberVersion[kVpdLineSize]; // "FN" "Fru Number:..."
extern char g_fcCodeVersion[kVpdLineSize];    // "FC" "FC Code:..."
extern char g_flashImageVersion[kVpdLineSize];// "RM" or "V9" "Flash Image Version:..."
extern char g_assetTag[kVpdLineSize];         // "YA" "Asset Tag:..."
extern char g_UUID[kVpdLineSize];             // "YU" "UUID:..."
extern char g_I2CUUID[kVpdLineSize];          // raw UUID text of the I2C VPD
extern char g_endTag[kVpdLineSize];           // tag 0x78 "End Tag:"
extern char g_optionROMBIOS[kVpdLineSize];    // "OptionROM BIOS Version:..."
extern char g_optionROMEFI[kVpdLineSize];     // "OptionROM EFI Version:..."
extern char g_optionROMFCode[kVpdLineSize];   // "OptionROM FCode Version:..."
extern char g_optionROMFirmware[kVpdLineSize];// "OptionROM Firmware Version:..."

// Clears a line as a caller does before reading it. Every writer ends a line's
// text with a zero and every reader stops at the first zero, so zeroing the
// text leaves the line as a clear of its whole buffer would, at the cost of
// its text instead of 2048 bytes (an FC port build clears twenty lines per
// function).
void ClearVpdLine(char* line);

// Reads the I2C UUID into g_I2CUUID (cleared first) and, for chips of code 8
// or above, the VPD stream, which it decodes into the buffers (a stream read
// before writes the lines of its decode back). Returns the ZORAP_GetVpd result
// (0 on success), or -1 for a null device or an older chip.
int GetHBAVPDData(_tagZORAPSDMDevice* device);

// Walks a VPD stream of `size` bytes tag by tag up to the end tag 0x78 and
// decodes every field. The walk stops at the buffer's end when the stream has
// no end tag, and a field whose length runs past the end is cut there.
void PrintVPD(unsigned char const* vpd, std::size_t size);
// The same over a buffer of the adapter library's VPD size (0x400 bytes).
void PrintVPD(unsigned char* vpd);

// Decodes one field: `tag` points at the tag byte or the two keyword letters,
// `value` at `length` bytes of value. Keywords not known here are ignored.
void PrintVPDField(unsigned char const* tag, unsigned char const* value, int length);

// Fills the four option ROM lines from the device record; chips below code 6
// have no readable option ROM and leave them alone.
void GetHBAOptionROMVersions(_tagZORAPSDMDevice* device);

#endif
