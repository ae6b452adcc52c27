// The adapter library's own picture of the host: what the adapter description
// says, plus the live state that changes while the library runs (link states,
// FC port states, versions after a flash write).  The contract's records are
// encoded from it (encode.cpp); nothing here is seen by callers.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace zorap_sim {

using Wwn = std::array<uint8_t, 8>;
using Mac = std::array<uint8_t, 6>;

// A description that cannot be used; the text names the place and the fault.
struct DescriptionError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

struct IpAddress {
    uint8_t family = 0;  // 1 IPv4, 2 IPv6
    std::array<uint8_t, 16> bytes{};
    uint8_t prefixLength = 0;
};

struct Transceiver {
    std::string vendor;
    std::string partNumber;
    std::string serialNumber;
    std::string revision;
    std::array<uint8_t, 3> oui{};
    uint16_t wavelengthNm = 850;
    std::string dateCode;  // YYMMDD plus optional lot
    double temperatureC = 35.0;
    double vccVolts = 3.3;
    double txBiasMa = 7.0;
    double txPowerMw = 0.6;
    double rxPowerMw = 0.5;
};

struct Lun {
    uint16_t number = 0;
    std::vector<uint8_t> id;  // 8 or 16 bytes
    std::string vendor, product, revision, osDevice;
    uint32_t blockSize = 512;
    uint64_t capacityBlocks = 0;
};

struct Target {
    Wwn portWwn{}, nodeWwn{};
    uint32_t portId = 0;
    std::vector<Lun> luns;
};

// Counters in the order of the device record: io, megabytes, lip, link
// failures, loss of sync, loss of signal, primitive sequence errors, invalid
// transmission words, CRC errors.
using FcStats = std::array<uint32_t, 9>;

struct FcFunction {
    uint32_t handle = 0;  // assigned by the library when the description is installed
    uint32_t portIndex = 0;
    Wwn nodeWwn{}, portWwn{};
    uint8_t stateCode = 1;  // live
    uint8_t typeCode = 5;
    uint32_t speedCode = 0;
    uint16_t transceiverState = 0;
    uint32_t fcId = 0;
    uint32_t supportedSpeedMask = 0;
    FcStats stats{};
    Mac enodeMac{};
    std::vector<Target> targets;
};

struct FcoeLink {
    Wwn portWwn{}, nodeWwn{}, fabricName{};
    Mac fcfMac{};
    uint16_t vlan = 0;
    uint32_t priority = 0;
    uint32_t loggedIn = 1;
    uint32_t maxFrameSize = 2112;
    std::array<uint8_t, 3> portId{};
    Mac enodeMac{};
    std::string fcHostName;
};

// NIC counters in the order of the stats record (rx/tx bytes, packets, ...).
using NicStats = std::array<uint64_t, 13>;

struct NicFunction {
    Mac mac{};
    std::string interfaceName;
    uint32_t portNumber = 0;
    uint32_t mtu = 1500;
    uint64_t linkSpeed = 10000;  // Mbit/s as configured; live
    uint32_t linkState = 1;      // live
    uint32_t fullDuplex = 1;
    uint32_t autoNegotiation = 1;
    IpAddress ipv4, netmask, gateway, broadcast;
    bool dhcp = false;
    std::string domain;
    std::vector<IpAddress> ipv6, dnsServers, ipv6Gateways;
    std::vector<FcoeLink> fcoe;
    std::string driverName, driverVersion, firmwareVersion;
    uint32_t pciBus = 0, pciDevice = 0, pciFunction = 0;
    NicStats stats{};
};

struct Protocol {
    uint32_t type = 0;  // 0 FC, 1 FCoE, 2 NIC, or any other value as given
    FcFunction fc;
    NicFunction nic;
    bool isFc() const { return type < 2; }
    bool isNic() const { return type == 2; }
};

struct PhysPort {
    uint8_t number = 0;
    std::optional<Transceiver> transceiver;
    std::vector<Protocol> protocols;
};

struct OptionRom {
    std::string biosText;
    std::array<uint8_t, 3> firmware{};
    std::array<uint8_t, 2> efi{};
    std::array<uint8_t, 3> fcode{};
    std::string firmwareText, efiText, fcodeText;
    uint32_t mask = 0;
};

struct Mbi {
    int major = 0, minor = 0, build = 0;
    int year = 0, month = 0, day = 0;
};

// The version facts of an adapter, the part that a flash write may change.
struct Versions {
    std::string driverVersion;
    std::string firmwareVersion;
    std::string versionString;
    std::string productVersion;
    OptionRom optionRom;
    std::optional<Mbi> mbi;
};

struct Adapter {
    int32_t instance = 0;
    std::string model, serialNumber, deviceSerial, productName, partNumber;
    uint32_t kind = 1;
    uint16_t pciVendorId = 0, pciDeviceId = 0, subsystemVendorId = 0, subsystemDeviceId = 0;
    uint16_t transceiverSupport = 1;
    Wwn nicNodeWwn{};
    Versions versions;
    std::optional<std::string> i2cUuid;
    std::string vpdProductId;
    bool hasVpd = false;
    std::vector<std::pair<std::string, std::string>> vpd;  // keyword, value; in order
    std::optional<std::vector<uint8_t>> vpdRaw;
    // What a successful flash write changes: applied over versions and vpd.
    std::optional<Versions> afterFlashVersions;
    std::vector<std::pair<std::string, std::string>> afterFlashVpd;
    std::vector<PhysPort> ports;
};

// Where a host read from the running system came from (sysfs.h): the root
// directory of its sysfs and procfs, and its configuration (everything but
// live state) in one comparable text.
struct SysfsOrigin {
    std::string root;
    std::string configuration;
};

struct Host {
    std::string osName;
    uint32_t flashDurationMs = 1000;
    uint32_t flashResult = 0;
    std::vector<Adapter> adapters;
    // Set for the sysfs source: live calls read the tree afresh, flash writes
    // are refused.
    std::optional<SysfsOrigin> sysfs;
};

// Reading a description (description.cpp).  Both throw DescriptionError.
Host parseDescription(const std::string& jsonText);
std::string defaultOsName();

}  // namespace zorap_sim
