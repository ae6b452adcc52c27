// Vexlan_FCHBA_FCPort: one instance per FC protocol function of a physical
// port, with its VPD text, option ROM versions, port state and speed. The
// other FC classes join on its DeviceID "<serial>_<node WWN>_<port WWN>".
//
// This unit also holds the small device routines that the FC class builds
// share: the WWN text, the adapter serial of a device and the ENode MAC text.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_FCPORT_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_FCPORT_CMPI_H

#include <cstddef>
#include <initializer_list>
#include <cstdint>

#include "classes/ClassModule.h"
#include "zorap_cna.h"

// One FC port, copied from the adapter library at build time.
struct FCPortEntry {
    std::uint8_t valid;
    std::uint8_t macAvailable;         // 1 when the chip has an ENode MAC
    char deviceId[128];                // DeviceID
    char serialNumber[128];            // the serial used in the key
    char portWWN[128];                 // 16 hex digits, PermanentAddress
    char vpdData[2048];                // VPDData
    char optionROMVersions[512];       // OptionROMVersions
    char model[128];                   // Model
    char speedDescription[64];         // SpeedDescription
    std::uint8_t macAddress[6];        // ENode MAC
    std::uint16_t portType;            // PortType
    std::uint16_t operationalStatus;   // first of OperationalStatus
    std::uint64_t speed;               // bits per second
    std::uint64_t maxSpeed;            // bits per second
    std::uint16_t deviceNumber;        // DeviceNumber
    std::uint32_t deviceStatus;        // DeviceStatus
    _tagZORAPSDMDevice* device;        // the library's device of the last build
};

extern ClassList<FCPortEntry> g_FCPortList;

void buildFCPortList();
void removeFCPortList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(FCPort);

// ---- device routines shared by the FC class builds --------------------------

// Room for a WWN text: 16 hex digits and the terminating zero.
constexpr std::size_t kFCWWNTextSize = 17;

// snprintf that cuts silently: the FC texts are fixed-width fields, and a
// longer text is cut to size-1 characters. Gives vsnprintf's result.
int FormatFCText(char* out, std::size_t size, const char* format, ...) __attribute__((format(printf, 3, 4)));

// One text of a join: up to its terminating zero, or up to `limit` bytes
// (what "%.*s" prints).
struct FCTextPart {
    FCTextPart(const char* t) : text(t) {}
    FCTextPart(const char* t, std::size_t n) : text(t), limit(n) {}
    const char* text;
    std::size_t limit = static_cast<std::size_t>(-1);
};

// The texts one after the other into `out`, as FormatFCText(out, size,
// "%s%s...") writes them (cut to size-1 characters, terminated), without
// going through printf: the builds join texts for every function they visit.
// Gives the length of the whole join.
std::size_t JoinFCText(char* out, std::size_t size, std::initializer_list<FCTextPart> parts);

// True for an FC function (protocolType below 2), the protocols every FC
// class build wants.
bool IsFCProtocol(_zorap_adapter_t* adapter, _zorap_phy_port_t* port, _zorap_protocol_t* protocol);

// "%02X" of each of the 8 bytes into `out` (at most size-1 characters).
void FormatWWN(const std::uint8_t* wwn, char* out, std::size_t size);
// "%02X" of each of `count` bytes (at most 16) into `out`, as FormatWWN.
void FormatHexBytes(const std::uint8_t* bytes, int count, char* out, std::size_t size);
// "%u" of a number into `out`, which has room for any 32-bit number.
const char* DecimalText(std::uint32_t value, char (&out)[11]);

// The adapter serial of a device, as every FC build takes it: for chips
// below code 8 the serial the library keeps (`deviceSerial`); for newer chips
// the text behind the first ":" of g_serialNumber when the VPD read
// (`vpdResult`) succeeded and the line has a ":". In any other case `serial`
// is not written and keeps what the previous device left in it.
void TakeFCSerial(_tagZORAPSDMDevice* device, int vpdResult, char* serial, std::size_t size);

// The ENode MAC of a converged chip (codes 15, 17, 21, 26) into `mac`;
// returns the `macAvailable` byte, 1 when the chip has one, else 0.
std::uint8_t TakeENodeMAC(_tagZORAPSDMDevice* device, std::uint8_t* mac);

// ENodeMACAddress: "%02X" of the six bytes when available, else "Not Available".
CmpiData ENodeMACText(std::uint8_t macAvailable, const std::uint8_t* mac);

// The port's speed in bits per second for the library's speed code; sets
// `description` to "Auto Negotiate" or "See Speed" (at most size-1 characters).
std::uint64_t FCPortSpeedForCode(std::uint32_t speedCode, int chipCode, char* description, std::size_t size);
// The highest speed of the device's chip in bits per second.
std::uint64_t FCPortMaxSpeed(_tagZORAPSDMDevice* device);
// CIM PortType of the library's port type code (0 for codes above 9).
std::uint16_t FCPortTypeForCode(std::uint8_t typeCode);

#endif
