// Reading the running system for the sysfs source (sysfs.h): bounded reads of
// sysfs and procfs files that never trust their text, and what the kernel
// tells only through system calls (interface addresses, ethtool).
//
// Every path is below a root directory: "/" for the running system, another
// directory for a tree of files that stands for a host (tests). With such a
// root, the answers of system calls are read from files too:
//   <root>/syscalls/<interface>/getifaddrs            one "address/prefix" a line
//   <root>/syscalls/<interface>/ethtool-fw-version    firmware version text
//   <root>/syscalls/<interface>/ethtool-module-eeprom the module EEPROM bytes
// Nothing here writes to a file or to a device: files are opened read-only
// and the ethtool requests are "get" requests.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "model.h"

namespace zorap_sim::sysfs {

// Largest text attribute read: sysfs gives at most a page.
constexpr size_t kAttributeMax = 4096;
// Largest procfs table read (the route tables).
constexpr size_t kTableMax = 1u << 20;
// Largest PCI VPD: the 15-bit address space of the capability.
constexpr size_t kVpdMax = 32768;
// Most entries taken from one directory.
constexpr size_t kMaxEntries = 4096;
// The transceiver pages as the library hands them out: A0, then A2.
constexpr size_t kModulePagesSize = 512;

// "<root>/<relative>" ("/" + relative for the running system).
std::string under(const std::string& root, const std::string& relative);
std::string baseName(const std::string& path);

// A regular file of at most `max` bytes, read whole and opened without
// blocking; nothing for a file that is missing, unreadable, not a regular file
// (a FIFO would block, a device may never end) or larger. An entry that is no
// regular file or is larger is reported once on standard error (once per path
// between two ZORAP_Uninitialize calls).
std::optional<std::string> readFile(const std::string& path, size_t max);
// Forgets which entries were reported (ZORAP_Uninitialize, the unload).
void forgetRefusals();
// The first line of a text attribute, cut at a NUL, blanks at both ends
// removed, bytes outside printable ASCII replaced by '?'; nothing when the
// file can't be read or the line is empty.
std::optional<std::string> readLine(const std::string& path);
// An unsigned number in decimal or 0x hex filling the whole line; nothing
// for anything else (a negative or overflowing number included).
std::optional<uint64_t> readNumber(const std::string& path);
// Names in a directory, sorted, without "." and ".."; at most kMaxEntries.
std::vector<std::string> listDir(const std::string& path);
// The path with every link resolved, when it exists and lies under the
// resolved root (a link out of a test tree is not followed).
std::optional<std::string> resolveUnder(const std::string& root, const std::string& path);

// Printable ASCII of `text`, other bytes as '?', cut to `max` bytes.
std::string printable(const std::string& text, size_t max);

// The PCI VPD stream of a `vpd` file: read until its end tag (0x78), at most
// kVpdMax bytes; nothing when the file is missing, the stream does not start
// with an identifier string, holds a tag other than 0x82, 0x90, 0x91 and
// 0x78, or has no end tag.
std::optional<std::vector<uint8_t>> readVpd(const std::string& path);
// The keywords of the read-only and writable sections in stream order, RV
// and RW left out, values as printable text; and the identifier string.
void decodeVpd(const std::vector<uint8_t>& vpd, std::string& productId,
               std::vector<std::pair<std::string, std::string>>& keywords);

// The IPv4 and IPv6 addresses of an interface with their prefix lengths, in
// the order the kernel gives them.
std::vector<IpAddress> interfaceAddresses(const std::string& root, const std::string& interfaceName);
// The firmware version the interface's driver reports; "" when none.
std::string firmwareVersion(const std::string& root, const std::string& interfaceName);
// The interface's transceiver pages in the library's layout (A0 in 0..255,
// A2 in 256..511; a QSFP module's identity fields moved to their SFP
// places); false when the driver offers no module EEPROM.
bool modulePages(const std::string& root, const std::string& interfaceName, uint8_t* out512);

}  // namespace zorap_sim::sysfs
