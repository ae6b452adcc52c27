// Reads an adapter description (JSON) into the library's host model.
// Every fault is reported with the JSON path of the offending value.
#include <arpa/inet.h>
#include <sys/utsname.h>

#include <nlohmann/json.hpp>

#include <cctype>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <initializer_list>
#include <set>

#include "model.h"
#include "sysfs.h"
#include "zorap_chip_ids.h"
#include "zorap_cna.h"

namespace zorap_sim {
namespace {

using json = nlohmann::ordered_json;

[[noreturn]] void fail(const std::string& path, const std::string& message) {
    throw DescriptionError(path + ": " + message);
}

// One JSON value with its path, for reading and for messages.
class Node {
public:
    Node(const json& value, std::string path) : v_(value), path_(std::move(path)) {}

    const json& value() const { return v_; }
    const std::string& path() const { return path_; }
    bool has(const char* key) const { return v_.contains(key) && !v_.at(key).is_null(); }
    Node at(const char* key) const { return Node(v_.at(key), path_ + "." + key); }
    Node item(size_t i) const { return Node(v_.at(i), path_ + "[" + std::to_string(i) + "]"); }

    void requireObject() const {
        if (!v_.is_object()) fail(path_, "expected an object");
    }
    // Unknown keys are refused, so that a misspelt key is not silently ignored.
    void allowKeys(std::initializer_list<const char*> keys) const {
        requireObject();
        std::set<std::string> allowed(keys.begin(), keys.end());
        for (auto it = v_.begin(); it != v_.end(); ++it)
            if (!allowed.count(it.key())) fail(path_ + "." + it.key(), "unknown key");
    }
    size_t arraySize() const {
        if (!v_.is_array()) fail(path_, "expected an array");
        return v_.size();
    }

    std::string text(size_t maxLen) const {
        if (!v_.is_string()) fail(path_, "expected a string");
        std::string s = v_.get<std::string>();
        if (s.size() > maxLen)
            fail(path_, "longer than " + std::to_string(maxLen) + " characters");
        if (s.find('\0') != std::string::npos) fail(path_, "contains a NUL character");
        return s;
    }
    std::string text(const char* key, size_t maxLen, const std::string& def = "") const {
        return has(key) ? at(key).text(maxLen) : def;
    }
    std::string requiredText(const char* key, size_t maxLen) const {
        if (!has(key)) fail(path_ + "." + key, "missing");
        return at(key).text(maxLen);
    }

    // A non-negative integer: a JSON number, or a string in decimal or 0x hex.
    uint64_t unsignedValue(uint64_t max) const {
        uint64_t n = 0;
        if (v_.is_number_unsigned()) {
            n = v_.get<uint64_t>();
        } else if (v_.is_number_integer()) {
            fail(path_, "must not be negative");
        } else if (v_.is_string()) {
            const std::string s = v_.get<std::string>();
            char* end = nullptr;
            errno = 0;
            n = std::strtoull(s.c_str(), &end, 0);
            if (s.empty() || s[0] == '-' || *end != '\0' || errno != 0)
                fail(path_, "expected a number, got \"" + s + "\"");
        } else {
            fail(path_, "expected a non-negative integer");
        }
        if (n > max) fail(path_, "larger than " + std::to_string(max));
        return n;
    }
    uint64_t unsignedValue(const char* key, uint64_t max, uint64_t def) const {
        return has(key) ? at(key).unsignedValue(max) : def;
    }
    double number(const char* key, double def) const {
        if (!has(key)) return def;
        if (!v_.at(key).is_number()) fail(path_ + "." + key, "expected a number");
        return v_.at(key).get<double>();
    }
    bool boolean(const char* key, bool def) const {
        if (!has(key)) return def;
        if (!v_.at(key).is_boolean()) fail(path_ + "." + key, "expected true or false");
        return v_.at(key).get<bool>();
    }

    // Hex bytes with optional ':', '-' or ' ' separators, exactly n of them
    // (or, with allowShort, 8 or 16).
    std::vector<uint8_t> hexBytes(size_t n, const char* what, size_t maxChars = 256) const {
        std::string s = text(maxChars), digits;
        for (char c : s) {
            if (c == ':' || c == '-' || c == ' ') continue;
            if (!std::isxdigit(static_cast<unsigned char>(c)))
                fail(path_, std::string("expected ") + what + ", got \"" + s + "\"");
            digits += c;
        }
        if (n != 0 && digits.size() != 2 * n)
            fail(path_, std::string("expected ") + what + " of " + std::to_string(n) +
                            " bytes, got \"" + s + "\"");
        if (n == 0 && (digits.empty() || digits.size() % 2 != 0))
            fail(path_, std::string("expected ") + what + ", got \"" + s + "\"");
        std::vector<uint8_t> out;
        for (size_t i = 0; i < digits.size(); i += 2)
            out.push_back(static_cast<uint8_t>(std::stoul(digits.substr(i, 2), nullptr, 16)));
        return out;
    }
    Wwn wwn() const {
        auto b = hexBytes(8, "a WWN like 21:00:00:0e:1e:c2:a0:10");
        Wwn w{};
        std::copy(b.begin(), b.end(), w.begin());
        return w;
    }
    Mac mac() const {
        auto b = hexBytes(6, "a MAC address like 00:0e:1e:c2:a0:10");
        Mac m{};
        std::copy(b.begin(), b.end(), m.begin());
        return m;
    }

private:
    const json& v_;
    std::string path_;
};

// "8.07.12" -> {8, 7, 12}; "6.60" -> {6, 60}.
template <size_t N>
std::array<uint8_t, N> versionNumbers(const Node& n, const std::string& s) {
    std::array<uint8_t, N> out{};
    size_t pos = 0;
    for (size_t i = 0; i < N; ++i) {
        size_t end = s.find('.', pos);
        std::string part = s.substr(pos, end == std::string::npos ? std::string::npos : end - pos);
        if (part.empty() || part.size() > 3 ||
            part.find_first_not_of("0123456789") != std::string::npos || std::stoul(part) > 255)
            fail(n.path(), "expected a version of " + std::to_string(N) +
                               " numbers 0..255 separated by dots, got \"" + s + "\"");
        out[i] = static_cast<uint8_t>(std::stoul(part));
        if (i + 1 < N) {
            if (end == std::string::npos)
                fail(n.path(), "expected " + std::to_string(N) + " numbers in \"" + s + "\"");
            pos = end + 1;
        } else if (end != std::string::npos) {
            fail(n.path(), "expected " + std::to_string(N) + " numbers in \"" + s + "\"");
        }
    }
    return out;
}

IpAddress ipAddress(const Node& n, bool allowPrefix) {
    std::string s = n.text(64);
    IpAddress a;
    std::string addr = s;
    int prefix = -1;
    if (auto slash = s.find('/'); allowPrefix && slash != std::string::npos) {
        addr = s.substr(0, slash);
        std::string p = s.substr(slash + 1);
        if (p.empty() || p.size() > 3 || p.find_first_not_of("0123456789") != std::string::npos ||
            std::stoi(p) > 128)
            fail(n.path(), "bad prefix length in \"" + s + "\"");
        prefix = std::stoi(p);
    }
    if (inet_pton(AF_INET, addr.c_str(), a.bytes.data()) == 1) {
        a.family = ZORAP_IP_FAMILY_IPV4;
        if (prefix > 32) fail(n.path(), "IPv4 prefix above 32 in \"" + s + "\"");
    } else if (inet_pton(AF_INET6, addr.c_str(), a.bytes.data()) == 1) {
        a.family = ZORAP_IP_FAMILY_IPV6;
    } else {
        fail(n.path(), "expected an IPv4 or IPv6 address, got \"" + s + "\"");
    }
    a.prefixLength = static_cast<uint8_t>(prefix < 0 ? 0 : prefix);
    return a;
}

IpAddress ipv4Address(const Node& n) {
    IpAddress a = ipAddress(n, false);
    if (a.family != ZORAP_IP_FAMILY_IPV4) fail(n.path(), "expected an IPv4 address");
    return a;
}

std::vector<IpAddress> ipList(const Node& parent, const char* key) {
    std::vector<IpAddress> out;
    if (!parent.has(key)) return out;
    Node list = parent.at(key);
    for (size_t i = 0, n = list.arraySize(); i < n; ++i) out.push_back(ipAddress(list.item(i), true));
    return out;
}

// Keyword names of the VPD: two characters, letters or digits.
bool isVpdKeyword(const std::string& k) {
    return k.size() == 2 && std::isalnum(static_cast<unsigned char>(k[0])) &&
           std::isalnum(static_cast<unsigned char>(k[1]));
}

// "vpd": {"productId": "...", "PN": "...", ...}, in the order written.
void readVpd(const Node& n, std::string* productId,
             std::vector<std::pair<std::string, std::string>>& keywords) {
    n.requireObject();
    for (auto it = n.value().begin(); it != n.value().end(); ++it) {
        Node item(it.value(), n.path() + "." + it.key());
        if (it.key() == "productId" && productId) {
            *productId = item.text(0xFFFF);
        } else if (isVpdKeyword(it.key())) {
            if (it.key() == "RV" || it.key() == "RW")
                fail(item.path(), "RV and RW are written by the library itself");
            keywords.emplace_back(it.key(), item.text(255));
        } else {
            fail(item.path(), "a VPD keyword has two letters or digits (or is \"productId\")");
        }
    }
}

void readOptionRom(const Node& n, OptionRom& rom) {
    n.allowKeys({"bios", "firmware", "efi", "fcode", "mask"});
    uint32_t mask = 0;
    rom.biosText = n.text("bios", 31, rom.biosText);
    if (n.has("firmware")) {
        rom.firmwareText = n.at("firmware").text(31);
        rom.firmware = versionNumbers<3>(n.at("firmware"), rom.firmwareText);
    }
    if (n.has("efi")) {
        rom.efiText = n.at("efi").text(31);
        rom.efi = versionNumbers<2>(n.at("efi"), rom.efiText);
    }
    if (n.has("fcode")) {
        rom.fcodeText = n.at("fcode").text(31);
        rom.fcode = versionNumbers<3>(n.at("fcode"), rom.fcodeText);
    }
    if (!rom.firmwareText.empty()) mask |= ZORAP_OPTROM_FIRMWARE;
    if (!rom.efiText.empty()) mask |= ZORAP_OPTROM_EFI;
    if (!rom.fcodeText.empty()) mask |= ZORAP_OPTROM_FCODE;
    rom.mask = static_cast<uint32_t>(n.unsignedValue("mask", 0xFFFFFFFFu, mask));
}

// "2025-06-14"
void readMbiDate(const Node& n, Mbi& mbi) {
    std::string s = n.text(10);
    int y = 0, m = 0, d = 0;
    char tail = 0;
    if (s.size() != 10 || std::sscanf(s.c_str(), "%4d-%2d-%2d%c", &y, &m, &d, &tail) != 3 ||
        m < 1 || m > 12 || d < 1 || d > 31 || y < 1000)
        fail(n.path(), "expected a date like 2025-06-14, got \"" + s + "\"");
    mbi.year = y;
    mbi.month = m;
    mbi.day = d;
}

// The version keys, shared by an adapter and its "afterFlash" block.
void readVersions(const Node& n, Versions& v) {
    v.driverVersion = n.text("driverVersion", 31, v.driverVersion);
    v.firmwareVersion = n.text("firmwareVersion", 31, v.firmwareVersion);
    v.versionString = n.text("versionString", 63, v.versionString);
    v.productVersion = n.text("productVersion", 63, v.productVersion);
    if (n.has("optionRom")) readOptionRom(n.at("optionRom"), v.optionRom);
    if (n.has("mbiVersion") || n.has("mbiDate")) {
        if (!n.has("mbiVersion") || !n.has("mbiDate"))
            fail(n.path(), "mbiVersion and mbiDate go together");
        Mbi mbi;
        std::string text = n.at("mbiVersion").text(16);
        auto nums = versionNumbers<3>(n.at("mbiVersion"), text);
        mbi.major = nums[0];
        mbi.minor = nums[1];
        mbi.build = nums[2];
        readMbiDate(n.at("mbiDate"), mbi);
        v.mbi = mbi;
    }
}

Transceiver readTransceiver(const Node& n) {
    n.allowKeys({"vendor", "partNumber", "serialNumber", "revision", "oui", "wavelengthNm",
                 "dateCode", "temperatureC", "vccVolts", "txBiasMa", "txPowerMw", "rxPowerMw"});
    Transceiver t;
    t.vendor = n.requiredText("vendor", 16);
    t.partNumber = n.requiredText("partNumber", 16);
    t.serialNumber = n.text("serialNumber", 16);
    t.revision = n.text("revision", 4);
    if (n.has("oui")) {
        auto b = n.at("oui").hexBytes(3, "an OUI like 00:0e:1e");
        std::copy(b.begin(), b.end(), t.oui.begin());
    }
    t.wavelengthNm = static_cast<uint16_t>(n.unsignedValue("wavelengthNm", 0xFFFF, 850));
    t.dateCode = n.text("dateCode", 8);
    t.temperatureC = n.number("temperatureC", t.temperatureC);
    t.vccVolts = n.number("vccVolts", t.vccVolts);
    t.txBiasMa = n.number("txBiasMa", t.txBiasMa);
    t.txPowerMw = n.number("txPowerMw", t.txPowerMw);
    t.rxPowerMw = n.number("rxPowerMw", t.rxPowerMw);
    return t;
}

uint8_t portStateCode(const Node& n) {
    if (n.value().is_string()) {
        const std::string s = n.value().get<std::string>();
        if (s == "online") return ZORAP_PORT_STATE_ONLINE;
        if (s == "suspended") return ZORAP_PORT_STATE_SUSPENDED;
        if (s == "loopdown") return ZORAP_PORT_STATE_LOOPDOWN;
        if (s.empty() || !std::isdigit(static_cast<unsigned char>(s[0])))
            fail(n.path(), "expected online, suspended, loopdown or a number, got \"" + s + "\"");
    }
    return static_cast<uint8_t>(n.unsignedValue(255));
}

uint32_t linkStateCode(const Node& n) {
    if (n.value().is_string()) {
        const std::string s = n.value().get<std::string>();
        if (s == "up") return ZORAP_LINK_UP;
        if (s == "down") return ZORAP_LINK_DOWN;
        if (s == "testing") return 3;
        if (s.empty() || !std::isdigit(static_cast<unsigned char>(s[0])))
            fail(n.path(), "expected up, down, testing or a number, got \"" + s + "\"");
    }
    return static_cast<uint32_t>(n.unsignedValue(0xFFFFFFFFu));
}

uint32_t protocolTypeCode(const Node& n) {
    if (n.value().is_string()) {
        const std::string s = n.value().get<std::string>();
        if (s == "fc") return ZORAP_PROTOCOL_FC;
        if (s == "fcoe") return ZORAP_PROTOCOL_FCOE;
        if (s == "nic") return ZORAP_PROTOCOL_NIC;
        fail(n.path(), "expected fc, fcoe, nic or a number, got \"" + s + "\"");
    }
    return static_cast<uint32_t>(n.unsignedValue(0xFFFFFFFFu));
}

uint32_t adapterKindCode(const Node& n) {
    if (n.value().is_string()) {
        const std::string s = n.value().get<std::string>();
        if (s == "fc-hba") return ZORAP_ADAPTER_KIND_FC_HBA;
        if (s == "fc-mezzanine") return ZORAP_ADAPTER_KIND_FC_MEZZANINE;
        if (s == "nic") return ZORAP_ADAPTER_KIND_NIC;
        if (s == "cna") return ZORAP_ADAPTER_KIND_CNA;
        fail(n.path(), "expected fc-hba, fc-mezzanine, nic, cna or a number, got \"" + s + "\"");
    }
    return static_cast<uint32_t>(n.unsignedValue(0xFFFFFFFFu));
}

Lun readLun(const Node& n) {
    n.allowKeys({"lun", "id", "vendor", "product", "revision", "blockSize", "capacityBlocks",
                 "osDevice"});
    Lun l;
    l.number = static_cast<uint16_t>(n.unsignedValue("lun", 0xFFFF, 0));
    if (!n.has("id")) fail(n.path() + ".id", "missing");
    l.id = n.at("id").hexBytes(0, "a LUN identifier of 8 or 16 hex bytes");
    if (l.id.size() != 8 && l.id.size() != 16)
        fail(n.path() + ".id", "a LUN identifier has 8 or 16 bytes");
    l.vendor = n.text("vendor", 8);
    l.product = n.text("product", 16);
    l.revision = n.text("revision", 4);
    l.osDevice = n.text("osDevice", 63);
    l.blockSize = static_cast<uint32_t>(n.unsignedValue("blockSize", 0xFFFFFFFFu, 512));
    l.capacityBlocks = n.unsignedValue("capacityBlocks", UINT64_MAX, 0);
    return l;
}

Target readTarget(const Node& n) {
    n.allowKeys({"portWWN", "nodeWWN", "portId", "luns"});
    Target t;
    if (!n.has("portWWN")) fail(n.path() + ".portWWN", "missing");
    t.portWwn = n.at("portWWN").wwn();
    if (n.has("nodeWWN")) t.nodeWwn = n.at("nodeWWN").wwn();
    t.portId = static_cast<uint32_t>(n.unsignedValue("portId", 0xFFFFFF, 0));
    if (n.has("luns")) {
        Node luns = n.at("luns");
        for (size_t i = 0, c = luns.arraySize(); i < c; ++i) t.luns.push_back(readLun(luns.item(i)));
    }
    return t;
}

FcoeLink readFcoe(const Node& n) {
    n.allowKeys({"portWWN", "nodeWWN", "fabricName", "fcfMac", "vlan", "priority", "loggedIn",
                 "maxFrameSize", "portId", "enodeMac", "fcHostName"});
    FcoeLink f;
    if (!n.has("portWWN")) fail(n.path() + ".portWWN", "missing");
    f.portWwn = n.at("portWWN").wwn();
    if (n.has("nodeWWN")) f.nodeWwn = n.at("nodeWWN").wwn();
    if (n.has("fabricName")) f.fabricName = n.at("fabricName").wwn();
    if (n.has("fcfMac")) f.fcfMac = n.at("fcfMac").mac();
    if (n.has("enodeMac")) f.enodeMac = n.at("enodeMac").mac();
    f.vlan = static_cast<uint16_t>(n.unsignedValue("vlan", 4095, 0));
    f.priority = static_cast<uint32_t>(n.unsignedValue("priority", 0xFFFFFFFFu, 128));
    f.loggedIn = n.boolean("loggedIn", true) ? 1 : 0;
    f.maxFrameSize = static_cast<uint32_t>(n.unsignedValue("maxFrameSize", 0xFFFFFFFFu, 2112));
    if (n.has("portId")) {
        Node p = n.at("portId");
        if (p.value().is_string() && p.value().get<std::string>().find_first_of(":-") != std::string::npos) {
            auto b = p.hexBytes(3, "an FC port ID like 0A-1B-2C");
            std::copy(b.begin(), b.end(), f.portId.begin());
        } else {
            uint32_t id = static_cast<uint32_t>(p.unsignedValue(0xFFFFFF));
            f.portId = {static_cast<uint8_t>(id >> 16), static_cast<uint8_t>(id >> 8),
                        static_cast<uint8_t>(id)};
        }
    }
    f.fcHostName = n.text("fcHostName", 23);
    return f;
}

constexpr const char* kFcStatNames[9] = {"ioCount",      "megabyteCount",      "lipCount",
                                         "linkFailures", "lossOfSync",         "lossOfSignal",
                                         "primitiveSeqErrors", "invalidTxWords", "crcErrors"};
constexpr const char* kNicStatNames[13] = {
    "rxBytes",   "txBytes",   "rxPackets",   "txPackets", "rxErrors",      "txErrors",     "rxDropped",
    "txDropped", "rxMulticast", "collisions", "rxCrcErrors", "rxPauseFrames", "txPauseFrames"};

template <size_t N, typename T>
void readCounters(const Node& n, const char* const (&names)[N], std::array<T, N>& out, uint64_t max) {
    n.requireObject();
    for (auto it = n.value().begin(); it != n.value().end(); ++it) {
        size_t i = 0;
        while (i < N && it.key() != names[i]) ++i;
        if (i == N) fail(n.path() + "." + it.key(), "unknown counter");
        out[i] = static_cast<T>(Node(it.value(), n.path() + "." + it.key()).unsignedValue(max));
    }
}

void readFc(const Node& n, Protocol& p, uint32_t defaultPortIndex, bool portHasTransceiver) {
    n.allowKeys({"type", "portIndex", "nodeWWN", "portWWN", "state", "portType", "speed",
                 "supportedSpeeds", "transceiverState", "fcId", "stats", "enodeMac", "targets"});
    FcFunction& f = p.fc;
    f.portIndex = static_cast<uint32_t>(n.unsignedValue("portIndex", 0xFFFFFFFFu, defaultPortIndex));
    if (!n.has("nodeWWN")) fail(n.path() + ".nodeWWN", "missing");
    if (!n.has("portWWN")) fail(n.path() + ".portWWN", "missing");
    f.nodeWwn = n.at("nodeWWN").wwn();
    f.portWwn = n.at("portWWN").wwn();
    f.stateCode = n.has("state") ? portStateCode(n.at("state")) : ZORAP_PORT_STATE_ONLINE;
    f.typeCode = static_cast<uint8_t>(n.unsignedValue("portType", 255, 5));
    f.speedCode = static_cast<uint32_t>(n.unsignedValue("speed", 0xFFFFFFFFu, 0));
    if (n.has("supportedSpeeds")) {
        Node s = n.at("supportedSpeeds");
        for (size_t i = 0, c = s.arraySize(); i < c; ++i)
            f.supportedSpeedMask |= 1u << s.item(i).unsignedValue(31);
    }
    f.transceiverState = static_cast<uint16_t>(n.unsignedValue(
        "transceiverState", 0xFFFF, portHasTransceiver ? ZORAP_TRANSCEIVER_STATE_GOOD : 0));
    f.fcId = static_cast<uint32_t>(n.unsignedValue("fcId", 0xFFFFFF, 0));
    if (n.has("stats")) readCounters(n.at("stats"), kFcStatNames, f.stats, 0xFFFFFFFFu);
    if (n.has("enodeMac")) f.enodeMac = n.at("enodeMac").mac();
    if (n.has("targets")) {
        Node t = n.at("targets");
        for (size_t i = 0, c = t.arraySize(); i < c; ++i) f.targets.push_back(readTarget(t.item(i)));
    }
}

// "0000:05:00.2" or "05:00.2"
void readPci(const Node& n, NicFunction& f) {
    std::string s = n.text(16);
    unsigned dom = 0, bus = 0, dev = 0, fn = 0;
    char tail = 0;
    if (std::sscanf(s.c_str(), "%x:%x:%x.%x%c", &dom, &bus, &dev, &fn, &tail) == 4 ||
        std::sscanf(s.c_str(), "%x:%x.%x%c", &bus, &dev, &fn, &tail) == 3) {
        if (bus > 255 || dev > 31 || fn > 7) fail(n.path(), "PCI address out of range: \"" + s + "\"");
        f.pciBus = bus;
        f.pciDevice = dev;
        f.pciFunction = fn;
        return;
    }
    fail(n.path(), "expected a PCI address like 0000:05:00.2, got \"" + s + "\"");
}

void readNic(const Node& n, Protocol& p, uint32_t defaultPortNumber, const Adapter& a) {
    n.allowKeys({"type", "mac", "interface", "portNumber", "mtu", "linkSpeed", "linkState",
                 "fullDuplex", "autoNegotiation", "ipv4", "netmask", "gateway", "broadcast",
                 "dhcp", "domain", "ipv6", "dnsServers", "ipv6Gateways", "fcoe", "driverName",
                 "driverVersion", "firmwareVersion", "pci", "stats"});
    NicFunction& f = p.nic;
    if (!n.has("mac")) fail(n.path() + ".mac", "missing");
    f.mac = n.at("mac").mac();
    f.interfaceName = n.requiredText("interface", 31);
    f.portNumber = static_cast<uint32_t>(n.unsignedValue("portNumber", 0xFFFFFFFFu, defaultPortNumber));
    f.mtu = static_cast<uint32_t>(n.unsignedValue("mtu", 0xFFFFFFFFu, 1500));
    f.linkSpeed = n.unsignedValue("linkSpeed", UINT64_MAX, 10000);
    f.linkState = n.has("linkState") ? linkStateCode(n.at("linkState")) : ZORAP_LINK_UP;
    f.fullDuplex = n.boolean("fullDuplex", true) ? 1 : 0;
    f.autoNegotiation = n.boolean("autoNegotiation", true) ? 1 : 0;
    if (n.has("ipv4")) f.ipv4 = ipv4Address(n.at("ipv4"));
    if (n.has("netmask")) f.netmask = ipv4Address(n.at("netmask"));
    if (n.has("gateway")) f.gateway = ipv4Address(n.at("gateway"));
    if (n.has("broadcast")) f.broadcast = ipv4Address(n.at("broadcast"));
    f.dhcp = n.boolean("dhcp", false);
    f.domain = n.text("domain", 27);
    f.ipv6 = ipList(n, "ipv6");
    f.dnsServers = ipList(n, "dnsServers");
    f.ipv6Gateways = ipList(n, "ipv6Gateways");
    if (n.has("fcoe")) {
        Node l = n.at("fcoe");
        for (size_t i = 0, c = l.arraySize(); i < c; ++i) f.fcoe.push_back(readFcoe(l.item(i)));
    }
    f.driverName = n.text("driverName", 31, "vxlnic");
    f.driverVersion = n.text("driverVersion", 31, a.versions.driverVersion);
    f.firmwareVersion = n.text("firmwareVersion", 31, a.versions.firmwareVersion);
    if (n.has("pci")) readPci(n.at("pci"), f);
    if (n.has("stats")) readCounters(n.at("stats"), kNicStatNames, f.stats, UINT64_MAX);
}

Adapter readAdapter(const Node& n, size_t index) {
    n.allowKeys({"model", "serialNumber", "deviceSerial", "productName", "productVersion",
                 "partNumber", "kind", "instance", "chip", "pciDeviceId", "pciVendorId",
                 "subsystemVendorId", "subsystemDeviceId", "transceiverSupport", "nodeWWN",
                 "driverVersion", "firmwareVersion", "versionString", "optionRom", "mbiVersion",
                 "mbiDate", "i2cUuid", "vpd", "vpdHex", "afterFlash", "ports"});
    Adapter a;
    a.model = n.requiredText("model", 63);
    a.serialNumber = n.requiredText("serialNumber", 63);
    a.deviceSerial = n.text("deviceSerial", 63, a.serialNumber);
    a.productName = n.text("productName", 127, a.model);
    a.instance = static_cast<int32_t>(n.unsignedValue("instance", 0x7FFFFFFF, index));
    if (n.has("chip")) {
        std::string chip = n.at("chip").text(32);
        const zorap_chip_row* row = zorap_chip_row_for_name(chip.c_str());
        if (!row) fail(n.path() + ".chip", "unknown chip \"" + chip + "\"");
        a.pciDeviceId = row->pciDeviceId;
    }
    if (n.has("pciDeviceId")) {
        if (n.has("chip")) fail(n.path(), "give chip or pciDeviceId, not both");
        a.pciDeviceId = static_cast<uint16_t>(n.at("pciDeviceId").unsignedValue(0xFFFF));
    } else if (!n.has("chip")) {
        fail(n.path() + ".chip", "missing (or give pciDeviceId)");
    }
    a.pciVendorId = static_cast<uint16_t>(n.unsignedValue("pciVendorId", 0xFFFF, ZORAP_PCI_VENDOR_ID));
    a.subsystemVendorId =
        static_cast<uint16_t>(n.unsignedValue("subsystemVendorId", 0xFFFF, ZORAP_PCI_VENDOR_ID));
    a.subsystemDeviceId = static_cast<uint16_t>(
        n.unsignedValue("subsystemDeviceId", 0xFFFF, ZORAP_SUBSYS_STANDARD_BOARD));
    a.transceiverSupport = n.boolean("transceiverSupport", true) ? 1 : 0;
    readVersions(n, a.versions);
    if (!n.has("versionString")) a.versions.versionString = a.versions.firmwareVersion;
    if (n.has("i2cUuid")) a.i2cUuid = n.at("i2cUuid").text(255);
    if (n.has("vpd")) {
        a.hasVpd = true;
        readVpd(n.at("vpd"), &a.vpdProductId, a.vpd);
    }
    if (n.has("vpdHex")) {
        // 64 KiB of bytes, written with separators at most.
        a.vpdRaw = n.at("vpdHex").hexBytes(0, "VPD bytes in hex", 3 * 0x10000);
        if (a.vpdRaw->size() > 0x10000) fail(n.path() + ".vpdHex", "longer than 64 KiB");
        a.hasVpd = true;
    }
    a.partNumber = n.text("partNumber", 63);
    if (!n.has("partNumber"))
        for (auto& kv : a.vpd)
            if (kv.first == "PN") a.partNumber = kv.second.substr(0, 63);
    if (n.has("afterFlash")) {
        Node f = n.at("afterFlash");
        f.allowKeys({"driverVersion", "firmwareVersion", "versionString", "productVersion",
                     "optionRom", "mbiVersion", "mbiDate", "vpd"});
        Versions v = a.versions;
        readVersions(f, v);
        a.afterFlashVersions = v;
        if (f.has("vpd")) readVpd(f.at("vpd"), nullptr, a.afterFlashVpd);
    }

    bool anyNic = false;
    if (n.has("ports")) {
        Node ports = n.at("ports");
        uint32_t fcIndex = 0;
        for (size_t i = 0, c = ports.arraySize(); i < c; ++i) {
            Node pn = ports.item(i);
            pn.allowKeys({"portNumber", "transceiver", "protocols"});
            PhysPort port;
            port.number = static_cast<uint8_t>(pn.unsignedValue("portNumber", 255, i));
            if (pn.has("transceiver")) port.transceiver = readTransceiver(pn.at("transceiver"));
            if (pn.has("protocols")) {
                Node protos = pn.at("protocols");
                for (size_t k = 0, pc = protos.arraySize(); k < pc; ++k) {
                    Node qn = protos.item(k);
                    qn.requireObject();
                    if (!qn.has("type")) fail(qn.path() + ".type", "missing");
                    Protocol p;
                    p.type = protocolTypeCode(qn.at("type"));
                    if (p.isFc())
                        readFc(qn, p, fcIndex++, port.transceiver.has_value());
                    else if (p.isNic())
                        readNic(qn, p, port.number, a);
                    else
                        qn.allowKeys({"type"});
                    anyNic = anyNic || p.isNic();
                    port.protocols.push_back(std::move(p));
                }
            }
            a.ports.push_back(std::move(port));
        }
    }
    a.kind = n.has("kind") ? adapterKindCode(n.at("kind"))
                           : (anyNic ? ZORAP_ADAPTER_KIND_CNA : ZORAP_ADAPTER_KIND_FC_HBA);
    if (n.has("nodeWWN")) {
        a.nicNodeWwn = n.at("nodeWWN").wwn();
    } else {
        for (auto& port : a.ports)
            for (auto& p : port.protocols)
                if (p.isFc() && a.nicNodeWwn == Wwn{}) a.nicNodeWwn = p.fc.nodeWwn;
    }
    return a;
}

}  // namespace

std::string defaultOsName() {
    struct utsname u {};
    if (uname(&u) != 0) return "Linux";
    return std::string(u.sysname) + " " + u.release;
}

Host parseDescription(const std::string& jsonText) {
    json doc;
    try {
        doc = json::parse(jsonText);
    } catch (const json::parse_error& e) {
        throw DescriptionError(std::string("not valid JSON: ") + e.what());
    }
    Node root(doc, "$");
    // {"source": "sysfs", "root": "/"}: the running system's adapters.
    if (root.has("source")) {
        root.allowKeys({"source", "root"});
        std::string source = root.at("source").text(16);
        if (source != "sysfs") fail("$.source", "expected \"sysfs\", got \"" + source + "\"");
        std::string dir = root.text("root", 4095, "/");
        if (dir.empty() || dir[0] != '/') fail("$.root", "expected an absolute directory, got \"" + dir + "\"");
        return readSysfsHost(dir);
    }
    root.allowKeys({"osName", "flash", "adapters"});
    Host h;
    h.osName = root.text("osName", ZORAP_OS_NAME_BUFFER_SIZE - 1, defaultOsName());
    if (root.has("flash")) {
        Node f = root.at("flash");
        f.allowKeys({"durationMs", "result"});
        h.flashDurationMs = static_cast<uint32_t>(f.unsignedValue("durationMs", 3600000, 1000));
        h.flashResult = static_cast<uint32_t>(f.unsignedValue("result", 0xFFFFFFFFu, 0));
    }
    if (root.has("adapters")) {
        Node list = root.at("adapters");
        for (size_t i = 0, c = list.arraySize(); i < c; ++i) {
            Node an = list.item(i);
            an.requireObject();
            h.adapters.push_back(readAdapter(an, i));
        }
    }
    // The per-interface calls find a NIC function by its name alone.
    std::set<std::string> interfaces;
    for (size_t i = 0; i < h.adapters.size(); ++i)
        for (auto& port : h.adapters[i].ports)
            for (auto& p : port.protocols) {
                if (p.isNic() && !interfaces.insert(p.nic.interfaceName).second)
                    fail("$.adapters[" + std::to_string(i) + "]",
                         "interface \"" + p.nic.interfaceName + "\" is given twice");
            }
    return h;
}

}  // namespace zorap_sim
