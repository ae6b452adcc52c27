// Transceiver data of a port: the serial ID page of an SFP module decoded into
// text fields, the mezzanine board test (boards without a pluggable module)
// and the ENode MAC of a converged FC port.
#ifndef VEXLAN_INVENTORY_ADAPTERFUNC_TRANSCEIVER_H
#define VEXLAN_INVENTORY_ADAPTERFUNC_TRANSCEIVER_H

#include <cstdint>

#include "zorap_cna.h"

// Size of the transceiver data the adapter library gives for an FC device.
constexpr unsigned int kSFPDataSize = 512;

// The decoded transceiver of an FC device. Callers clear it before decoding.
struct _SFPFields {
    char Name[64];              // left as the caller set it
    char Manufacturer[32];      // vendor name, page bytes 20..35
    char SerialNumber[32];      // vendor serial, page bytes 68..83
    char PartNumber[32];        // vendor part number, page bytes 40..55
    unsigned char RawData[kSFPDataSize]; // the whole data, when 512 bytes came
    std::uint16_t SFPStatus;    // 1 for a good module state or a mezzanine board
};

// The decoded transceiver of a NIC port: the text fields of _SFPFields.
struct _Nic_SFPFields {
    char Name[64];
    char Manufacturer[32];
    char SerialNumber[32];
    char PartNumber[32];
};

// Copies a blank-padded text field of inSize bytes into out (outSize bytes,
// always terminated, cut to outSize-1) and strips the trailing blanks. A null
// or empty input gives an empty text; a null or empty output is left alone.
void copySFPString(char* out, char* in, unsigned int outSize, unsigned int inSize);

// Decodes the page of `size` bytes: Manufacturer, PartNumber and SerialNumber
// as far as the page reaches, the raw copy when exactly 512 bytes came, and
// SFPStatus from the device's module state or its board.
void parseSFPFields(_tagZORAPSDMDevice* device, unsigned char* data, unsigned int size,
                    _SFPFields* fields);
// The NIC twin: the three text fields only.
void parseSFPFields(unsigned char* data, unsigned int size, _Nic_SFPFields* fields);

// 1 when the device sits on a mezzanine or embedded board (by its PCI
// subsystem IDs), which has no pluggable module; else 0, also for null.
int isMezzHBA(_tagZORAPSDMDevice* device);

// Copies the six bytes of the device's ENode MAC to out. 0 on success, 1 for
// a null device (or a null out).
int GetDeviceMacAddress(_tagZORAPSDMDevice* device, char* out);

#endif
