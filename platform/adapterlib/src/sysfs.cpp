// The sysfs source (sysfs.h): the host model from /sys and /proc.
#include "sysfs.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <initializer_list>
#include <sstream>
#include <tuple>

#include "sysfs_files.h"
#include "zorap_cna.h"

namespace zorap_sim {
namespace {

using namespace sysfs;

// A kernel text and the code the library gives it.
struct TextCode {
    const char* text;
    uint32_t code;
};

// fc_host port_state: 1 online, 2 suspended, 3 loop down; any other text 0.
constexpr TextCode kPortStates[] = {
    {"Online", ZORAP_PORT_STATE_ONLINE},      {"Blocked", ZORAP_PORT_STATE_SUSPENDED},
    {"Diagnostics", ZORAP_PORT_STATE_SUSPENDED}, {"Loopback", ZORAP_PORT_STATE_SUSPENDED},
    {"Bypassed", ZORAP_PORT_STATE_SUSPENDED}, {"Linkdown", ZORAP_PORT_STATE_LOOPDOWN},
    {"Offline", ZORAP_PORT_STATE_LOOPDOWN},
};
// fc_host port_type: 1 N port, 2 NL port, 7 other; "Unknown" and any other text 0.
constexpr TextCode kPortTypes[] = {
    {"NPort (fabric via point-to-point)", 1}, {"Point-To-Point (direct nport connection)", 1},
    {"NPIV VPORT", 1}, {"NLPort (fabric via loop)", 2}, {"LPort (private loop)", 2}, {"Other", 7},
};
// fc_host speed and supported_speeds entries: the library's speed codes;
// speeds without a code give 0.
constexpr TextCode kSpeeds[] = {
    {"1 Gbit", 1}, {"2 Gbit", 2}, {"4 Gbit", 4}, {"8 Gbit", 8}, {"10 Gbit", 10}, {"16 Gbit", 16},
};
// net operstate: 1 up, 2 down, 3 testing; "unknown" and other texts go by
// the carrier.
constexpr TextCode kOperStates[] = {
    {"up", ZORAP_LINK_UP},        {"down", ZORAP_LINK_DOWN},       {"lowerlayerdown", ZORAP_LINK_DOWN},
    {"notpresent", ZORAP_LINK_DOWN}, {"dormant", ZORAP_LINK_DOWN}, {"testing", 3},
};

template <size_t N>
uint32_t codeOf(const TextCode (&table)[N], const std::optional<std::string>& text, uint32_t otherwise) {
    if (text)
        for (const TextCode& row : table)
            if (*text == row.text) return row.code;
    return otherwise;
}

// The nine counters of the device record (io, megabytes, LIP, link failures,
// loss of sync, loss of signal, primitive sequence errors, invalid
// transmission words, CRC errors), each the sum of up to three files of
// fc_host statistics.
constexpr const char* kFcStatFiles[9][3] = {
    {"fcp_input_requests", "fcp_output_requests", "fcp_control_requests"},
    {"fcp_input_megabytes", "fcp_output_megabytes", nullptr},
    {"lip_count", nullptr, nullptr},
    {"link_failure_count", nullptr, nullptr},
    {"loss_of_sync_count", nullptr, nullptr},
    {"loss_of_signal_count", nullptr, nullptr},
    {"prim_seq_protocol_err_count", nullptr, nullptr},
    {"invalid_tx_word_count", nullptr, nullptr},
    {"invalid_crc_count", nullptr, nullptr},
};
// The NIC counters in the order of the stats record; pause frames have no file.
constexpr const char* kNicStatFiles[13] = {
    "rx_bytes",   "tx_bytes",  "rx_packets",  "tx_packets",    "rx_errors", "tx_errors", "rx_dropped",
    "tx_dropped", "multicast", "collisions", "rx_crc_errors", nullptr,     nullptr,
};

// fc_host statistics give all ones for a counter the driver does not keep.
constexpr uint64_t kNoCounter = ~0ull;

// ARPHRD_ETHER, the `type` of an Ethernet interface.
constexpr uint64_t kEthernetType = 1;

// "0x200000109b123456" -> 8 bytes; nothing for another text.
std::optional<Wwn> readWwn(const std::string& path) {
    auto n = readNumber(path);
    if (!n) return std::nullopt;
    Wwn w{};
    for (int i = 0; i < 8; ++i) w[static_cast<size_t>(i)] = static_cast<uint8_t>(*n >> (56 - 8 * i));
    return w;
}

// "02:7e:5a:00:06:00" -> 6 bytes; nothing for another text (an InfiniBand
// address, say).
std::optional<Mac> readMac(const std::string& path) {
    auto line = readLine(path);
    unsigned b[6];
    char tail = 0;
    if (!line || line->size() != 17 ||
        std::sscanf(line->c_str(), "%2x:%2x:%2x:%2x:%2x:%2x%c", &b[0], &b[1], &b[2], &b[3], &b[4], &b[5], &tail) != 6)
        return std::nullopt;
    Mac m{};
    for (size_t i = 0; i < 6; ++i) m[i] = static_cast<uint8_t>(b[i]);
    return m;
}

// "host12" -> 12; "rport-3:0-2" -> {3, 0, 2}; "3:0:1:7" -> {3, 0, 1, 7}:
// names of the kernel's SCSI and FC objects, parsed exactly.
bool parseNumbers(const std::string& name, const char* prefix, const char* separators,
                  std::vector<unsigned long>& out) {
    out.clear();
    const size_t plen = std::strlen(prefix);
    if (name.compare(0, plen, prefix) != 0) return false;
    const char* p = name.c_str() + plen;
    for (size_t i = 0;; ++i) {
        if (!std::isdigit(static_cast<unsigned char>(*p))) return false;
        char* end = nullptr;
        errno = 0;
        unsigned long v = std::strtoul(p, &end, 10);
        if (errno != 0 || end - p > 9) return false;
        out.push_back(v);
        p = end;
        if (*p == '\0') return i == std::strlen(separators);
        if (i >= std::strlen(separators) || *p != separators[i]) return false;
        ++p;
    }
}

// A PCI function name "0000:05:00.1" (the domain may be longer).
struct PciAddress {
    unsigned domain = 0, bus = 0, device = 0, function = 0;
    bool operator<(const PciAddress& o) const {
        return std::tie(domain, bus, device, function) < std::tie(o.domain, o.bus, o.device, o.function);
    }
};

std::optional<PciAddress> parsePciAddress(const std::string& name) {
    PciAddress a;
    char tail = 0;
    int used = 0;
    if (name.size() < 12 || name.size() > 16 || name.find_first_not_of("0123456789abcdef:.") != std::string::npos ||
        std::sscanf(name.c_str(), "%8x:%2x:%2x.%1x%n%c", &a.domain, &a.bus, &a.device, &a.function, &used, &tail) != 4 ||
        static_cast<size_t>(used) != name.size() || name[name.size() - 5] != ':' || name[name.size() - 2] != '.' ||
        a.device > 31 || a.function > 7)
        return std::nullopt;
    return a;
}

// The directory of the nearest PCI function that holds `path`, below root.
std::optional<std::string> pciFunctionHolding(const std::string& root, const std::string& path) {
    std::string dir = path;
    while (dir.size() > root.size() && dir.size() > 1) {
        if (parsePciAddress(baseName(dir))) return dir;
        dir = dir.substr(0, dir.rfind('/'));
    }
    return std::nullopt;
}

std::string fcHostDir(const std::string& root, const std::string& host) {
    return under(root, "sys/class/fc_host/" + host);
}

// Every FC host's directory with its port WWN.
std::vector<std::pair<std::string, Wwn>> fcHostsByWwn(const std::string& root) {
    std::vector<std::pair<std::string, Wwn>> hosts;
    for (const std::string& host : listDir(under(root, "sys/class/fc_host"))) {
        std::string dir = fcHostDir(root, host);
        if (auto wwn = readWwn(dir + "/port_name")) hosts.emplace_back(dir, *wwn);
    }
    return hosts;
}

// One PCI function that carries FC hosts or interfaces.
struct PciFunction {
    std::string dir;
    std::vector<std::pair<unsigned long, std::string>> fcHosts;  // host number, name
    std::vector<std::string> interfaces;
};

// The PCI function of an interface: its device, or the PCI function under a
// virtio device; nothing for a virtual, USB or other interface.
std::optional<std::string> pciFunctionOfInterface(const std::string& root, const std::string& netDir) {
    auto device = resolveUnder(root, netDir + "/device");
    if (!device) return std::nullopt;
    if (parsePciAddress(baseName(*device))) return device;
    auto bus = resolveUnder(root, *device + "/subsystem");
    if (!bus || baseName(*bus) != "virtio") return std::nullopt;
    std::string parent = device->substr(0, device->rfind('/'));
    if (parsePciAddress(baseName(parent))) return parent;
    return std::nullopt;
}

std::map<PciAddress, PciFunction> findPciFunctions(const std::string& root) {
    std::map<PciAddress, PciFunction> functions;
    auto functionAt = [&](const std::string& dir) -> PciFunction& {
        PciFunction& f = functions[*parsePciAddress(baseName(dir))];
        f.dir = dir;
        return f;
    };
    std::vector<unsigned long> n;
    for (const std::string& host : listDir(under(root, "sys/class/fc_host"))) {
        if (!parseNumbers(host, "host", "", n)) continue;
        auto dir = resolveUnder(root, fcHostDir(root, host));
        auto pci = dir ? pciFunctionHolding(root, *dir) : std::nullopt;
        if (pci) functionAt(*pci).fcHosts.emplace_back(n[0], host);
    }
    for (const std::string& name : listDir(under(root, "sys/class/net"))) {
        const std::string dir = under(root, "sys/class/net/" + name);
        if (readNumber(dir + "/type") != kEthernetType || !readMac(dir + "/address")) continue;
        if (auto pci = pciFunctionOfInterface(root, dir)) functionAt(*pci).interfaces.push_back(name);
    }
    for (auto& entry : functions) std::sort(entry.second.fcHosts.begin(), entry.second.fcHosts.end());
    return functions;
}

// The driver of a device directory and its version: the module's version,
// else the kernel release (the version of a driver built into the kernel).
std::pair<std::string, std::string> driverOf(const std::string& root, const std::string& deviceDir) {
    auto driver = resolveUnder(root, deviceDir + "/driver");
    if (!driver) return {"", ""};
    auto module = resolveUnder(root, *driver + "/module");
    std::optional<std::string> version;
    if (module) version = readLine(under(root, "sys/module/" + baseName(*module) + "/version"));
    if (!version) version = readLine(under(root, "proc/sys/kernel/osrelease"));
    return {printable(baseName(*driver), 31), version.value_or("").substr(0, 31)};
}

void readFcLiveAt(const std::string& dir, FcFunction& fc) {
    fc.stateCode = static_cast<uint8_t>(codeOf(kPortStates, readLine(dir + "/port_state"), 0));
    fc.typeCode = static_cast<uint8_t>(codeOf(kPortTypes, readLine(dir + "/port_type"), 0));
    fc.speedCode = codeOf(kSpeeds, readLine(dir + "/speed"), 0);
    fc.fcId = static_cast<uint32_t>(readNumber(dir + "/port_id").value_or(0) & 0xFFFFFF);
    for (size_t i = 0; i < 9; ++i) {
        uint64_t sum = 0;
        for (const char* file : kFcStatFiles[i]) {
            if (!file) break;
            uint64_t v = readNumber(dir + "/statistics/" + file).value_or(0);
            if (v != kNoCounter) sum += std::min<uint64_t>(v, 0xFFFFFFFFu);
        }
        fc.stats[i] = static_cast<uint32_t>(std::min<uint64_t>(sum, 0xFFFFFFFFu));
    }
}

void readNicLiveAt(const std::string& dir, NicFunction& nic) {
    auto carrier = readNumber(dir + "/carrier");
    const uint32_t byCarrier = !carrier ? 0 : *carrier == 1 ? ZORAP_LINK_UP : ZORAP_LINK_DOWN;
    nic.linkState = codeOf(kOperStates, readLine(dir + "/operstate"), byCarrier);
    // "speed" is -1 or unreadable while the link is down.
    nic.linkSpeed = readNumber(dir + "/speed").value_or(0);
    nic.fullDuplex = readLine(dir + "/duplex") == "full" ? 1 : 0;
}

// The fc_host directory whose port_name is the WWN.
std::optional<std::string> fcHostDirOf(const std::string& root, const Wwn& portWwn) {
    for (const auto& host : fcHostsByWwn(root))
        if (host.second == portWwn) return host.first;
    return std::nullopt;
}

Lun readLun(const std::string& root, const std::string& scsiDevice, unsigned long number) {
    Lun lun;
    lun.number = static_cast<uint16_t>(number);
    lun.id.assign(16, 0);
    auto dir = resolveUnder(root, under(root, "sys/class/scsi_device/" + scsiDevice + "/device"));
    if (!dir) return lun;
    lun.vendor = readLine(*dir + "/vendor").value_or("").substr(0, 8);
    lun.product = readLine(*dir + "/model").value_or("").substr(0, 16);
    lun.revision = readLine(*dir + "/rev").value_or("").substr(0, 4);
    // "naa.600a..." (16 bytes) or "naa.5000..." (8 bytes), the same for eui.
    if (auto wwid = readLine(*dir + "/wwid")) {
        std::string hex = wwid->size() > 4 ? wwid->substr(4) : "";
        if ((wwid->compare(0, 4, "naa.") == 0 || wwid->compare(0, 4, "eui.") == 0) &&
            (hex.size() == 16 || hex.size() == 32) && hex.find_first_not_of("0123456789abcdefABCDEF") == std::string::npos) {
            lun.id.clear();
            for (size_t i = 0; i < hex.size(); i += 2)
                lun.id.push_back(static_cast<uint8_t>(std::strtoul(hex.substr(i, 2).c_str(), nullptr, 16)));
        }
    }
    auto blocks = listDir(*dir + "/block");
    if (!blocks.empty()) {
        const std::string block = *dir + "/block/" + blocks.front();
        lun.osDevice = printable("/dev/" + blocks.front(), 63);
        auto size = readNumber(block + "/queue/logical_block_size");
        if (size && *size > 0 && *size <= 0xFFFFFFFFu) lun.blockSize = static_cast<uint32_t>(*size);
        // "size" counts 512-byte sectors whatever the block size.
        lun.capacityBlocks = readNumber(block + "/size").value_or(0) / (lun.blockSize / 512 ? lun.blockSize / 512 : 1);
    }
    return lun;
}

// The FCP targets that an FC host has logged in to, with their SCSI devices.
std::vector<Target> readTargets(const std::string& root, unsigned long hostNumber) {
    std::vector<std::pair<unsigned long, Target>> targets;
    const auto devices = listDir(under(root, "sys/class/scsi_device"));
    std::vector<unsigned long> r, d;
    for (const std::string& rport : listDir(under(root, "sys/class/fc_remote_ports"))) {
        if (!parseNumbers(rport, "rport-", ":-", r) || r[0] != hostNumber) continue;
        const std::string dir = under(root, "sys/class/fc_remote_ports/" + rport);
        auto roles = readLine(dir + "/roles");
        if (!roles || roles->find("FCP Target") == std::string::npos || readLine(dir + "/port_state") == "Not Present")
            continue;
        Target t;
        auto portWwn = readWwn(dir + "/port_name");
        if (!portWwn) continue;
        t.portWwn = *portWwn;
        t.nodeWwn = readWwn(dir + "/node_name").value_or(Wwn{});
        t.portId = static_cast<uint32_t>(readNumber(dir + "/port_id").value_or(0) & 0xFFFFFF);
        // scsi_target_id is -1 (no number) until the target is bound.
        if (auto target = readNumber(dir + "/scsi_target_id")) {
            std::vector<std::pair<unsigned long, std::string>> luns;
            for (const std::string& device : devices)
                if (parseNumbers(device, "", ":::", d) && d[0] == r[0] && d[1] == r[1] &&
                    d[2] == *target)
                    luns.emplace_back(d[3], device);
            std::sort(luns.begin(), luns.end());
            for (const auto& lun : luns) t.luns.push_back(readLun(root, lun.second, lun.first));
        }
        targets.emplace_back(r[2], std::move(t));
    }
    std::sort(targets.begin(), targets.end(), [](const auto& a, const auto& b) { return a.first < b.first; });
    std::vector<Target> out;
    for (auto& t : targets) out.push_back(std::move(t.second));
    return out;
}

// Sets the IPv4 address, mask, broadcast and gateway and the IPv6 lists.
void readAddresses(const std::string& root, NicFunction& nic) {
    for (const IpAddress& a : interfaceAddresses(root, nic.interfaceName)) {
        if (a.family == ZORAP_IP_FAMILY_IPV6) {
            nic.ipv6.push_back(a);
        } else if (nic.ipv4.family == 0) {
            nic.ipv4 = a;
            uint32_t mask = a.prefixLength == 0 ? 0 : ~0u << (32 - std::min<unsigned>(a.prefixLength, 32));
            nic.netmask.family = nic.broadcast.family = ZORAP_IP_FAMILY_IPV4;
            for (size_t i = 0; i < 4; ++i) {
                nic.netmask.bytes[i] = static_cast<uint8_t>(mask >> (24 - 8 * i));
                nic.broadcast.bytes[i] = static_cast<uint8_t>(a.bytes[i] | ~nic.netmask.bytes[i]);
            }
        }
    }
    // Default routes through the interface: /proc/net/route (gateway in the
    // kernel's byte order) and /proc/net/ipv6_route.
    std::istringstream v4(readFile(under(root, "proc/net/route"), kTableMax).value_or(""));
    for (std::string line; std::getline(v4, line);) {
        char iface[64] = {};
        unsigned dest = 1, gateway = 0, flags = 0, mask = 1;
        if (std::sscanf(line.c_str(), "%63s %x %x %x %*s %*s %*s %x", iface, &dest, &gateway, &flags, &mask) == 5 &&
            nic.interfaceName == iface && dest == 0 && mask == 0 && (flags & 0x2) && nic.gateway.family == 0) {
            nic.gateway.family = ZORAP_IP_FAMILY_IPV4;
            std::memcpy(nic.gateway.bytes.data(), &gateway, 4);
        }
    }
    std::istringstream v6(readFile(under(root, "proc/net/ipv6_route"), kTableMax).value_or(""));
    for (std::string line; std::getline(v6, line);) {
        char dest[33] = {}, hop[33] = {}, iface[64] = {};
        unsigned plen = 1;
        if (std::sscanf(line.c_str(), "%32s %x %*s %*s %32s %*s %*s %*s %*s %63s", dest, &plen, hop, iface) != 4 ||
            nic.interfaceName != iface || plen != 0 || std::string(dest) != std::string(32, '0') ||
            std::string(hop) == std::string(32, '0') || std::strlen(hop) != 32)
            continue;
        IpAddress g;
        g.family = ZORAP_IP_FAMILY_IPV6;
        for (size_t i = 0; i < 16; ++i)
            g.bytes[i] = static_cast<uint8_t>(std::strtoul(std::string(hop + 2 * i, 2).c_str(), nullptr, 16));
        nic.ipv6Gateways.push_back(g);
    }
}

FcFunction readFc(const std::string& root, unsigned long hostNumber, const std::string& host) {
    const std::string dir = fcHostDir(root, host);
    FcFunction fc;
    // The SCSI host number: unique in the host, and the number of the alarms.
    fc.portIndex = static_cast<uint32_t>(hostNumber);
    fc.nodeWwn = readWwn(dir + "/node_name").value_or(Wwn{});
    fc.portWwn = readWwn(dir + "/port_name").value_or(Wwn{});
    if (auto speeds = readLine(dir + "/supported_speeds")) {
        std::istringstream list(*speeds);
        for (std::string item; std::getline(list, item, ',');) {
            item.erase(0, item.find_first_not_of(' '));
            if (uint32_t code = codeOf(kSpeeds, item, 0)) fc.supportedSpeedMask |= 1u << code;
        }
    }
    readFcLiveAt(dir, fc);
    fc.targets = readTargets(root, hostNumber);
    return fc;
}

NicFunction readNic(const std::string& root, const std::string& name, const PciAddress& pci) {
    const std::string dir = under(root, "sys/class/net/" + name);
    NicFunction nic;
    nic.mac = readMac(dir + "/address").value_or(Mac{});
    nic.interfaceName = name.substr(0, 31);
    nic.portNumber = pci.function;
    nic.mtu = static_cast<uint32_t>(std::min<uint64_t>(readNumber(dir + "/mtu").value_or(1500), 0xFFFFFFFFu));
    nic.autoNegotiation = 0;  // not told by sysfs
    readNicLiveAt(dir, nic);
    for (size_t i = 0; i < 13; ++i)
        if (kNicStatFiles[i]) nic.stats[i] = readNumber(dir + "/statistics/" + kNicStatFiles[i]).value_or(0);
    readAddresses(root, nic);
    auto device = resolveUnder(root, dir + "/device");
    std::tie(nic.driverName, nic.driverVersion) = driverOf(root, device.value_or(""));
    nic.firmwareVersion = firmwareVersion(root, name).substr(0, 31);
    nic.pciBus = pci.bus;
    nic.pciDevice = pci.device;
    nic.pciFunction = pci.function;
    return nic;
}

// What an fc_host tells of its adapter, where its driver publishes it.
struct FcHostIdentity {
    std::string model, description, serial, driverVersion, firmwareVersion, optionRom;
};

FcHostIdentity fcHostIdentity(const std::string& root, const std::string& host) {
    const std::string dir = fcHostDir(root, host);
    auto text = [&](const char* file, size_t max) { return readLine(dir + "/" + file).value_or("").substr(0, max); };
    return {text("model", 63),          text("model_description", 127), text("serial_number", 63),
            text("driver_version", 31), text("firmware_version", 31),   text("optionrom_version", 31)};
}

std::string firstNonEmpty(std::initializer_list<std::string> texts) {
    for (const std::string& t : texts)
        if (!t.empty()) return t;
    return "";
}

std::string vpdKeyword(const Adapter& a, const char* keyword, size_t max) {
    for (const auto& kv : a.vpd)
        if (kv.first == keyword) return kv.second.substr(0, max);
    return "";
}

Adapter readAdapter(const std::string& root, int32_t instance,
                    const std::vector<std::pair<PciAddress, const PciFunction*>>& functions) {
    Adapter a;
    a.instance = instance;
    // The identity comes from the first function with an FC host (the chip
    // classification is the FC side's), else from the first function.
    auto idFunction = functions.front();
    for (const auto& f : functions)
        if (!f.second->fcHosts.empty()) {
            idFunction = f;
            break;
        }
    const std::string& idDir = idFunction.second->dir;
    auto id = [&](const char* file) { return static_cast<uint16_t>(readNumber(idDir + "/" + file).value_or(0)); };
    a.pciVendorId = id("vendor");
    a.pciDeviceId = id("device");
    a.subsystemVendorId = id("subsystem_vendor");
    a.subsystemDeviceId = id("subsystem_device");
    for (const auto& f : functions)
        if (auto vpd = readVpd(f.second->dir + "/vpd")) {
            a.hasVpd = true;
            decodeVpd(*vpd, a.vpdProductId, a.vpd);
            a.vpdRaw = std::move(*vpd);
            break;
        }
    FcHostIdentity fc;
    if (!idFunction.second->fcHosts.empty()) fc = fcHostIdentity(root, idFunction.second->fcHosts.front().second);
    const auto driver = driverOf(root, idDir);
    char fallbackModel[64];
    std::snprintf(fallbackModel, sizeof fallbackModel, "%s %04x:%04x", driver.first.c_str(), a.pciVendorId,
                  a.pciDeviceId);
    char slot[32];
    std::snprintf(slot, sizeof slot, "%04x:%02x:%02x", idFunction.first.domain, idFunction.first.bus,
                  idFunction.first.device);
    a.partNumber = vpdKeyword(a, "PN", 63);
    a.model = firstNonEmpty({fc.model, a.partNumber, fallbackModel});
    a.serialNumber = firstNonEmpty({vpdKeyword(a, "SN", 63), fc.serial, slot});
    a.deviceSerial = a.serialNumber;
    a.productName = firstNonEmpty({a.vpdProductId.substr(0, 127), fc.description, a.model});
    a.versions.productVersion = vpdKeyword(a, "EC", 63);
    a.versions.driverVersion = firstNonEmpty({fc.driverVersion, driver.second});
    a.versions.optionRom.biosText = fc.optionRom;
    a.transceiverSupport = 1;

    bool anyFc = false, anyNic = false;
    for (const auto& f : functions) {
        PhysPort port;
        port.number = static_cast<uint8_t>(f.first.function);
        // An FC host beside an Ethernet interface on one function is FCoE.
        for (const auto& host : f.second->fcHosts) {
            Protocol q;
            q.type = f.second->interfaces.empty() ? ZORAP_PROTOCOL_FC : ZORAP_PROTOCOL_FCOE;
            q.fc = readFc(root, host.first, host.second);
            if (!anyFc) a.nicNodeWwn = q.fc.nodeWwn;
            anyFc = true;
            port.protocols.push_back(std::move(q));
        }
        for (const std::string& name : f.second->interfaces) {
            Protocol q;
            q.type = ZORAP_PROTOCOL_NIC;
            q.nic = readNic(root, name, f.first);
            anyNic = true;
            port.protocols.push_back(std::move(q));
        }
        a.ports.push_back(std::move(port));
    }
    a.kind = anyFc && anyNic ? ZORAP_ADAPTER_KIND_CNA : anyFc ? ZORAP_ADAPTER_KIND_FC_HBA : ZORAP_ADAPTER_KIND_NIC;
    // Firmware: the FC host's, else the first interface's.
    std::string nicFirmware;
    for (const PhysPort& port : a.ports)
        for (const Protocol& q : port.protocols)
            if (q.isNic() && nicFirmware.empty()) nicFirmware = q.nic.firmwareVersion;
    a.versions.firmwareVersion = firstNonEmpty({fc.firmwareVersion, nicFirmware});
    a.versions.versionString = a.versions.firmwareVersion;
    return a;
}

// The configuration of a host in one text: every field the source fills but
// the live state, so that two reads of an unchanged system give equal texts.
class Configuration {
public:
    template <typename T>
    Configuration& operator<<(const T& value) {
        out_ << value << '\x1f';
        return *this;
    }
    Configuration& operator<<(const std::vector<uint8_t>& bytes) {
        out_.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
        out_ << '\x1f';
        return *this;
    }
    template <size_t N>
    Configuration& operator<<(const std::array<uint8_t, N>& bytes) {
        return *this << std::vector<uint8_t>(bytes.begin(), bytes.end());
    }
    Configuration& operator<<(const IpAddress& ip) {
        return *this << unsigned(ip.family) << ip.bytes << unsigned(ip.prefixLength);
    }
    std::string text() const { return out_.str(); }

private:
    std::ostringstream out_;
};

std::string configurationOfHost(const Host& h) {
    Configuration c;
    c << h.osName << h.adapters.size();
    for (const Adapter& a : h.adapters) {
        c << a.instance << a.model << a.serialNumber << a.productName << a.partNumber << a.kind << a.pciVendorId
          << a.pciDeviceId << a.subsystemVendorId << a.subsystemDeviceId << a.versions.driverVersion
          << a.versions.firmwareVersion << a.versions.productVersion << a.versions.optionRom.biosText
          << a.vpdRaw.value_or(std::vector<uint8_t>()) << a.ports.size();
        for (const PhysPort& port : a.ports) {
            c << unsigned(port.number) << port.protocols.size();
            for (const Protocol& q : port.protocols) {
                c << q.type;
                if (q.isFc()) {
                    c << q.fc.portIndex << q.fc.nodeWwn << q.fc.portWwn << q.fc.supportedSpeedMask << q.fc.targets.size();
                    for (const Target& t : q.fc.targets) {
                        c << t.portWwn << t.nodeWwn << t.portId << t.luns.size();
                        for (const Lun& l : t.luns)
                            c << l.number << l.id << l.vendor << l.product << l.revision << l.osDevice << l.blockSize
                              << l.capacityBlocks;
                    }
                } else {
                    const NicFunction& n = q.nic;
                    c << n.mac << n.interfaceName << n.portNumber << n.mtu << n.ipv4 << n.netmask << n.broadcast
                      << n.gateway << n.ipv6.size();
                    for (const IpAddress& ip : n.ipv6) c << ip;
                    c << n.ipv6Gateways.size();
                    for (const IpAddress& ip : n.ipv6Gateways) c << ip;
                    c << n.driverName << n.driverVersion << n.firmwareVersion;
                }
            }
        }
    }
    return c.text();
}

std::string osNameOf(const std::string& root) {
    auto type = readLine(under(root, "proc/sys/kernel/ostype"));
    auto release = readLine(under(root, "proc/sys/kernel/osrelease"));
    if (type && release) return (*type + " " + *release).substr(0, ZORAP_OS_NAME_BUFFER_SIZE - 1);
    return defaultOsName();
}

}  // namespace

Host readSysfsHost(const std::string& rootPath) {
    Host h;
    // The root is resolved once: links inside the tree must stay under it.
    std::string root = resolveUnder("/", rootPath).value_or(rootPath);
    h.osName = osNameOf(root);
    const auto functions = findPciFunctions(root);
    std::vector<std::pair<PciAddress, const PciFunction*>> slot;
    auto flush = [&] {
        if (slot.empty()) return;
        h.adapters.push_back(readAdapter(root, static_cast<int32_t>(h.adapters.size()), slot));
        slot.clear();
    };
    for (const auto& entry : functions) {
        const PciAddress& a = entry.first;
        if (!slot.empty() && std::tie(slot.front().first.domain, slot.front().first.bus, slot.front().first.device) !=
                                 std::tie(a.domain, a.bus, a.device))
            flush();
        slot.emplace_back(a, &entry.second);
    }
    flush();
    h.sysfs = SysfsOrigin{root, configurationOfHost(h)};
    return h;
}

bool readFcLive(const std::string& root, FcFunction& fc) {
    auto dir = fcHostDirOf(root, fc.portWwn);
    if (!dir) return false;
    readFcLiveAt(*dir, fc);
    return true;
}

bool readNicLive(const std::string& root, NicFunction& nic) {
    const std::string dir = under(root, "sys/class/net/" + nic.interfaceName);
    if (readMac(dir + "/address") != nic.mac) return false;
    readNicLiveAt(dir, nic);
    return true;
}

std::map<Wwn, uint8_t> readFcStates(const std::string& root) {
    std::map<Wwn, uint8_t> states;
    for (const auto& host : fcHostsByWwn(root))
        states[host.second] = static_cast<uint8_t>(codeOf(kPortStates, readLine(host.first + "/port_state"), 0));
    return states;
}

std::map<Wwn, uint8_t> fcStatesOf(const Host& host) {
    std::map<Wwn, uint8_t> states;
    for (const Adapter& a : host.adapters)
        for (const PhysPort& p : a.ports)
            for (const Protocol& q : p.protocols)
                if (q.isFc()) states[q.fc.portWwn] = q.fc.stateCode;
    return states;
}

PortAlarm portStateAlarm(const FcFunction& fc, uint8_t from) {
    char text[80];
    const Wwn& w = fc.portWwn;
    std::snprintf(text, sizeof text, "FC port %02x:%02x:%02x:%02x:%02x:%02x:%02x:%02x state %u to %u", w[0], w[1],
                  w[2], w[3], w[4], w[5], w[6], w[7], static_cast<unsigned>(from),
                  static_cast<unsigned>(fc.stateCode));
    return {fc.portIndex, text};
}

std::vector<PortAlarm> takeFcStates(Host& model, const std::map<Wwn, uint8_t>& states) {
    std::vector<PortAlarm> alarms;
    for (Adapter& a : model.adapters)
        for (PhysPort& p : a.ports)
            for (Protocol& q : p.protocols) {
                if (!q.isFc()) continue;
                auto it = states.find(q.fc.portWwn);
                if (it == states.end() || it->second == q.fc.stateCode) continue;
                const uint8_t from = q.fc.stateCode;
                q.fc.stateCode = it->second;
                alarms.push_back(portStateAlarm(q.fc, from));
            }
    return alarms;
}

}  // namespace zorap_sim
