// Helpers shared by the fuzz targets: a reader that turns the input bytes
// into choices, numbers and texts, and the check that a target writing fixed
// paths runs with private /opt and /var/tmp.
#pragma once

#include <sys/stat.h>
#include <sys/vfs.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

namespace fuzzin {

// Reads the input front to back; past its end every number is 0 and every
// text empty, so a short input still makes a whole (small) request.
class Reader {
public:
    Reader(const std::uint8_t* data, std::size_t size) : data_(data), size_(size) {}

    bool empty() const { return pos_ >= size_; }
    std::size_t left() const { return size_ - pos_; }

    std::uint8_t byte() { return pos_ < size_ ? data_[pos_++] : 0; }

    // A number of `bytes` little-endian bytes.
    std::uint64_t number(int bytes) {
        std::uint64_t v = 0;
        for (int i = 0; i < bytes; ++i) v |= static_cast<std::uint64_t>(byte()) << (8 * i);
        return v;
    }

    // One of n choices (n > 0).
    std::size_t pick(std::size_t n) { return n == 0 ? 0 : byte() % n; }

    // A text of up to `max` bytes: one length byte (two when the first is
    // 255, for long texts), then the bytes, cut at the input's end.
    std::string text(std::size_t max = 65535) {
        std::size_t n = byte();
        if (n == 255) n = static_cast<std::size_t>(number(2));
        if (n > max) n = max;
        if (n > left()) n = left();
        std::string s(reinterpret_cast<const char*>(data_ + pos_), n);
        pos_ += n;
        return s;
    }

    // The rest of the input.
    std::string rest() {
        std::string s(reinterpret_cast<const char*>(data_ + pos_), left());
        pos_ = size_;
        return s;
    }

private:
    const std::uint8_t* data_;
    std::size_t size_;
    std::size_t pos_ = 0;
};

// The targets that write /opt/Vexlan_Corporation/... or /var/tmp/... run
// only where both are private tmpfs mounts (tests/isolate.sh), never over a
// machine's real files. There they make the provider's directories under
// /opt: the settings file's and the log's.
inline void startIsolated(const char* target) {
    constexpr long kTmpfsMagic = 0x01021994;
    for (const char* dir : {"/opt", "/var/tmp"}) {
        struct statfs fs {};
        if (statfs(dir, &fs) != 0 || static_cast<long>(fs.f_type) != kTmpfsMagic) {
            std::fprintf(stderr, "%s: %s is not a private tmpfs; run under tests/isolate.sh\n", target, dir);
            std::exit(77);
        }
    }
    mkdir("/opt/Vexlan_Corporation", 0755);
    mkdir("/opt/Vexlan_Corporation/CNAProviders", 0755);
    mkdir("/opt/Vexlan_Corporation/CNAProviders/log", 0755);
}

// A text field filled by the code under test ends within its array.
template <std::size_t N>
void requireTerminated(const char (&field)[N]) {
    if (std::memchr(field, 0, N) == nullptr) __builtin_trap();
}

// Writes `bytes` to `path` whole (mode 0600); false when it can't.
inline bool writeWhole(const char* path, const std::string& bytes) {
    std::FILE* f = std::fopen(path, "wb");
    if (f == nullptr) return false;
    bool ok = std::fwrite(bytes.data(), 1, bytes.size(), f) == bytes.size();
    return std::fclose(f) == 0 && ok;
}

}  // namespace fuzzin
