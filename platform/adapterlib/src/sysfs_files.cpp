// Bounded reads of the running system for the sysfs source (sysfs_files.h).
#include "sysfs_files.h"

#include <arpa/inet.h>
#include <dirent.h>
#include <fcntl.h>
#include <ifaddrs.h>
#include <linux/ethtool.h>
#include <linux/sockios.h>
#include <net/if.h>
#include <netinet/in.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>
#include <set>

#include "bounded_file.h"

namespace zorap_sim::sysfs {
namespace {

bool isRunningSystem(const std::string& root) { return root == "/"; }

// An open file descriptor, closed on every way out.
class Fd {
public:
    explicit Fd(int fd) : fd_(fd) {}
    ~Fd() {
        if (fd_ >= 0) ::close(fd_);
    }
    Fd(const Fd&) = delete;
    Fd& operator=(const Fd&) = delete;
    int get() const { return fd_; }

private:
    int fd_;
};

// Entries of the tree already reported as refused: each is reported once,
// not at every look (the alarm thread looks once a second). Static storage
// that is never destroyed, emptied at unload (forgetRefusals).
struct Refusals {
    std::mutex mu;
    std::set<std::string> reported;
};
constexpr size_t kMaxReported = 1024;

Refusals& refusals() {
    alignas(Refusals) static unsigned char storage[sizeof(Refusals)];
    static Refusals* instance = new (storage) Refusals();
    return *instance;
}

// One line on standard error for an entry that is no regular file or is over
// its bound; a missing or unreadable attribute is common and stays silent.
void noteRefusal(const std::string& path, const bounded_file::Result& result) {
    if (result.outcome != bounded_file::Outcome::Refused) return;
    Refusals& r = refusals();
    {
        std::lock_guard<std::mutex> l(r.mu);
        if (r.reported.size() >= kMaxReported || !r.reported.insert(path).second) return;
    }
    std::fprintf(stderr, "libzorap_cna_provider: sysfs file %s: %s; not read\n", path.c_str(),
                 result.reason.c_str());
}

// Opens a regular file for reading without blocking (a FIFO planted in a tree
// can't block the open or a read); -1 for anything else.
int openRegular(const std::string& path, size_t max) {
    bounded_file::Result result;
    const int fd = bounded_file::openRegular(path.c_str(), O_RDONLY, max, result);
    if (fd < 0) noteRefusal(path, result);
    return fd;
}

ssize_t readSome(int fd, void* buffer, size_t want) { return bounded_file::readSome(fd, buffer, want); }

enum class VpdWalk { Incomplete, Complete, Invalid };

// Walks the resource tags of a VPD stream read so far: Complete with the
// stream's length at the end tag.
VpdWalk walkVpd(const std::vector<uint8_t>& v, size_t& length) {
    if (v.empty()) return VpdWalk::Incomplete;
    if (v[0] != 0x82) return VpdWalk::Invalid;
    size_t pos = 0;
    while (pos < v.size()) {
        uint8_t tag = v[pos];
        if (tag == 0x78) {
            length = pos + 1;
            return VpdWalk::Complete;
        }
        if (tag != 0x82 && tag != 0x90 && tag != 0x91) return VpdWalk::Invalid;
        if (pos + 3 > v.size()) return VpdWalk::Incomplete;
        pos += 3 + (static_cast<size_t>(v[pos + 1]) | static_cast<size_t>(v[pos + 2]) << 8);
    }
    return VpdWalk::Incomplete;
}

IpAddress ipFromBytes(int family, const void* bytes, uint8_t prefix) {
    IpAddress a;
    if (family == AF_INET) {
        a.family = 1;
        std::memcpy(a.bytes.data(), bytes, 4);
    } else {
        a.family = 2;
        std::memcpy(a.bytes.data(), bytes, 16);
    }
    a.prefixLength = prefix;
    return a;
}

uint8_t prefixOfMask(const uint8_t* mask, size_t n) {
    unsigned bits = 0;
    for (size_t i = 0; i < n; ++i) bits += static_cast<unsigned>(__builtin_popcount(mask[i]));
    return static_cast<uint8_t>(bits);
}

// "192.0.2.10/24", "2001:db8::10/64"; nothing for anything else.
std::optional<IpAddress> parseAddress(const std::string& text) {
    std::string addr = text;
    long prefix = -1;
    if (auto slash = text.find('/'); slash != std::string::npos) {
        addr = text.substr(0, slash);
        std::string p = text.substr(slash + 1);
        if (p.empty() || p.size() > 3 || p.find_first_not_of("0123456789") != std::string::npos)
            return std::nullopt;
        prefix = std::strtol(p.c_str(), nullptr, 10);
    }
    uint8_t bytes[16] = {};
    if (inet_pton(AF_INET, addr.c_str(), bytes) == 1 && prefix <= 32)
        return ipFromBytes(AF_INET, bytes, static_cast<uint8_t>(prefix < 0 ? 32 : prefix));
    if (inet_pton(AF_INET6, addr.c_str(), bytes) == 1 && prefix <= 128)
        return ipFromBytes(AF_INET6, bytes, static_cast<uint8_t>(prefix < 0 ? 128 : prefix));
    return std::nullopt;
}

std::vector<IpAddress> systemAddresses(const std::string& interfaceName) {
    std::vector<IpAddress> out;
    struct ifaddrs* list = nullptr;
    if (::getifaddrs(&list) != 0) return out;
    for (struct ifaddrs* i = list; i; i = i->ifa_next) {
        if (!i->ifa_addr || !i->ifa_name || interfaceName != i->ifa_name) continue;
        int family = i->ifa_addr->sa_family;
        if (family == AF_INET) {
            auto* a = reinterpret_cast<const sockaddr_in*>(i->ifa_addr);
            auto* m = reinterpret_cast<const sockaddr_in*>(i->ifa_netmask);
            uint8_t prefix = m ? prefixOfMask(reinterpret_cast<const uint8_t*>(&m->sin_addr), 4) : 32;
            out.push_back(ipFromBytes(AF_INET, &a->sin_addr, prefix));
        } else if (family == AF_INET6) {
            auto* a = reinterpret_cast<const sockaddr_in6*>(i->ifa_addr);
            auto* m = reinterpret_cast<const sockaddr_in6*>(i->ifa_netmask);
            uint8_t prefix = m ? prefixOfMask(m->sin6_addr.s6_addr, 16) : 128;
            out.push_back(ipFromBytes(AF_INET6, &a->sin6_addr, prefix));
        }
    }
    ::freeifaddrs(list);
    return out;
}

// One ethtool "get" request on the interface; false when the kernel or the
// driver refuses it.
bool ethtoolGet(const std::string& interfaceName, void* request) {
    if (interfaceName.empty() || interfaceName.size() >= IFNAMSIZ) return false;
    Fd sock(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    if (sock.get() < 0) return false;
    struct ifreq ifr {};
    std::memcpy(ifr.ifr_name, interfaceName.c_str(), interfaceName.size());
    ifr.ifr_data = static_cast<char*>(request);
    return ::ioctl(sock.get(), SIOCETHTOOL, &ifr) == 0;
}

// The module EEPROM with its ETH_MODULE_SFF_* type.
bool systemModuleEeprom(const std::string& interfaceName, uint32_t& type, std::vector<uint8_t>& data) {
    struct ethtool_modinfo info {};
    info.cmd = ETHTOOL_GMODULEINFO;
    if (!ethtoolGet(interfaceName, &info) || info.eeprom_len == 0) return false;
    const uint32_t length = std::min<uint32_t>(info.eeprom_len, ETH_MODULE_SFF_8636_MAX_LEN);
    std::vector<uint8_t> request(sizeof(struct ethtool_eeprom) + length);
    auto* eeprom = reinterpret_cast<struct ethtool_eeprom*>(request.data());
    eeprom->cmd = ETHTOOL_GMODULEEEPROM;
    eeprom->offset = 0;
    eeprom->len = length;
    if (!ethtoolGet(interfaceName, eeprom)) return false;
    type = info.type;
    data.assign(request.begin() + sizeof(struct ethtool_eeprom), request.end());
    return true;
}

// A test tree's module EEPROM: its length tells the type, as the lengths of
// the kernel's module types do.
bool fileModuleEeprom(const std::string& root, const std::string& interfaceName, uint32_t& type,
                      std::vector<uint8_t>& data) {
    auto bytes = readFile(under(root, "syscalls/" + interfaceName + "/ethtool-module-eeprom"),
                          ETH_MODULE_SFF_8636_MAX_LEN);
    if (!bytes || bytes->empty()) return false;
    type = bytes->size() == ETH_MODULE_SFF_8079_LEN   ? ETH_MODULE_SFF_8079
           : bytes->size() == ETH_MODULE_SFF_8472_LEN ? ETH_MODULE_SFF_8472
                                                      : ETH_MODULE_SFF_8636;
    data.assign(bytes->begin(), bytes->end());
    return true;
}

// Where a QSFP module's identity fields (upper page 00, bytes 128..255 of the
// EEPROM) stand in an SFP module's page A0: {from, to, length}.
struct FieldMove {
    size_t from, to, length;
};
constexpr FieldMove kQsfpToSfp[] = {
    {128, 0, 1},     // identifier
    {148, 20, 16},   // vendor name
    {165, 37, 3},    // vendor OUI
    {168, 40, 16},   // part number
    {184, 56, 2},    // revision
    {186, 60, 2},    // wavelength
    {196, 68, 16},   // serial number
    {212, 84, 8},    // date code
};

}  // namespace

std::string under(const std::string& root, const std::string& relative) {
    return (isRunningSystem(root) ? std::string() : root) + "/" + relative;
}

std::string baseName(const std::string& path) {
    auto slash = path.rfind('/');
    return slash == std::string::npos ? path : path.substr(slash + 1);
}

std::optional<std::string> readFile(const std::string& path, size_t max) {
    bounded_file::Result result = bounded_file::readRegular(path.c_str(), max);
    if (result.outcome == bounded_file::Outcome::Taken) return std::move(result.text);
    noteRefusal(path, result);
    return std::nullopt;
}

void forgetRefusals() {
    Refusals& r = refusals();
    std::lock_guard<std::mutex> l(r.mu);
    std::set<std::string>().swap(r.reported);
}

std::string printable(const std::string& text, size_t max) {
    std::string out = text.substr(0, max);
    for (char& c : out)
        if (c < 0x20 || c > 0x7E) c = '?';
    return out;
}

std::optional<std::string> readLine(const std::string& path) {
    auto text = readFile(path, kAttributeMax);
    if (!text) return std::nullopt;
    std::string line = text->substr(0, text->find_first_of(std::string("\n\0", 2)));
    const char* blanks = " \t\r";
    auto first = line.find_first_not_of(blanks);
    if (first == std::string::npos) return std::nullopt;
    line = line.substr(first, line.find_last_not_of(blanks) - first + 1);
    return printable(line, line.size());
}

std::optional<uint64_t> readNumber(const std::string& path) {
    auto line = readLine(path);
    if (!line || !std::isdigit(static_cast<unsigned char>((*line)[0]))) return std::nullopt;
    // Hex with 0x, else decimal: a leading zero does not make octal.
    const bool hex = line->size() > 2 && (*line)[0] == '0' && ((*line)[1] == 'x' || (*line)[1] == 'X');
    const char* digits = line->c_str() + (hex ? 2 : 0);
    if (!std::isxdigit(static_cast<unsigned char>(*digits))) return std::nullopt;
    errno = 0;
    char* end = nullptr;
    unsigned long long value = std::strtoull(digits, &end, hex ? 16 : 10);
    if (errno != 0 || *end != '\0') return std::nullopt;
    return static_cast<uint64_t>(value);
}

std::vector<std::string> listDir(const std::string& path) {
    std::vector<std::string> names;
    DIR* dir = ::opendir(path.c_str());
    if (!dir) return names;
    while (struct dirent* e = ::readdir(dir)) {
        if (std::strcmp(e->d_name, ".") == 0 || std::strcmp(e->d_name, "..") == 0) continue;
        if (names.size() == kMaxEntries) break;
        names.emplace_back(e->d_name);
    }
    ::closedir(dir);
    std::sort(names.begin(), names.end());
    return names;
}

std::optional<std::string> resolveUnder(const std::string& root, const std::string& path) {
    char resolved[PATH_MAX];
    if (!::realpath(path.c_str(), resolved)) return std::nullopt;
    std::string out = resolved;
    if (isRunningSystem(root)) return out;
    if (out.compare(0, root.size(), root) != 0 || (out.size() > root.size() && out[root.size()] != '/'))
        return std::nullopt;
    return out;
}

std::optional<std::vector<uint8_t>> readVpd(const std::string& path) {
    // A sysfs vpd file claims the whole 32 KiB (its size is no bound here).
    Fd fd(openRegular(path, SIZE_MAX));
    if (fd.get() < 0) return std::nullopt;
    // Read in small pieces and stop at the end tag: a device's VPD is read
    // through its configuration space, slowly, and the file often claims
    // the whole 32 KiB.
    std::vector<uint8_t> v;
    uint8_t piece[256];
    while (v.size() < kVpdMax) {
        ssize_t n = readSome(fd.get(), piece, std::min(sizeof piece, kVpdMax - v.size()));
        if (n <= 0) return std::nullopt;
        v.insert(v.end(), piece, piece + n);
        size_t length = 0;
        switch (walkVpd(v, length)) {
            case VpdWalk::Complete:
                v.resize(length);
                return v;
            case VpdWalk::Invalid:
                return std::nullopt;
            case VpdWalk::Incomplete:
                break;
        }
    }
    return std::nullopt;
}

void decodeVpd(const std::vector<uint8_t>& vpd, std::string& productId,
               std::vector<std::pair<std::string, std::string>>& keywords) {
    size_t pos = 0;
    while (pos + 3 <= vpd.size() && vpd[pos] != 0x78) {
        const uint8_t tag = vpd[pos];
        const size_t length = static_cast<size_t>(vpd[pos + 1]) | static_cast<size_t>(vpd[pos + 2]) << 8;
        const size_t start = pos + 3, end = std::min(vpd.size(), start + length);
        if (tag == 0x82) {
            productId = printable(std::string(vpd.begin() + start, vpd.begin() + end), 0xFFFF);
        } else {
            for (size_t k = start; k + 3 <= end;) {
                std::string keyword(vpd.begin() + k, vpd.begin() + k + 2);
                const size_t valueEnd = std::min(end, k + 3 + vpd[k + 2]);
                if (keyword != "RV" && keyword != "RW")
                    keywords.emplace_back(printable(keyword, 2),
                                          printable(std::string(vpd.begin() + k + 3, vpd.begin() + valueEnd), 255));
                k = valueEnd;
            }
        }
        pos = start + length;
    }
}

std::vector<IpAddress> interfaceAddresses(const std::string& root, const std::string& interfaceName) {
    if (isRunningSystem(root)) return systemAddresses(interfaceName);
    std::vector<IpAddress> out;
    auto text = readFile(under(root, "syscalls/" + interfaceName + "/getifaddrs"), kAttributeMax);
    if (!text) return out;
    size_t pos = 0;
    while (pos < text->size()) {
        size_t end = text->find('\n', pos);
        if (end == std::string::npos) end = text->size();
        if (auto a = parseAddress(text->substr(pos, end - pos))) out.push_back(*a);
        pos = end + 1;
    }
    return out;
}

std::string firmwareVersion(const std::string& root, const std::string& interfaceName) {
    if (!isRunningSystem(root))
        return readLine(under(root, "syscalls/" + interfaceName + "/ethtool-fw-version")).value_or("");
    struct ethtool_drvinfo info {};
    info.cmd = ETHTOOL_GDRVINFO;
    if (!ethtoolGet(interfaceName, &info)) return "";
    std::string text(info.fw_version, strnlen(info.fw_version, sizeof info.fw_version));
    return printable(text, text.size());
}

bool modulePages(const std::string& root, const std::string& interfaceName, uint8_t* out512) {
    uint32_t type = 0;
    std::vector<uint8_t> data;
    if (!(isRunningSystem(root) ? systemModuleEeprom(interfaceName, type, data)
                                : fileModuleEeprom(root, interfaceName, type, data)))
        return false;
    std::memset(out512, 0, kModulePagesSize);
    if (type == ETH_MODULE_SFF_8079 || type == ETH_MODULE_SFF_8472) {
        std::memcpy(out512, data.data(), std::min(data.size(), kModulePagesSize));
        return true;
    }
    if (data.size() < 256) return false;
    for (const FieldMove& m : kQsfpToSfp) std::memcpy(out512 + m.to, data.data() + m.from, m.length);
    return true;
}

}  // namespace zorap_sim::sysfs
