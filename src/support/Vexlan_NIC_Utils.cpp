#include "support/Vexlan_NIC_Utils.h"

#include <sys/stat.h>

#include <cctype>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

bool isBlankOrTab(char c) { return c == ' ' || c == '\t'; }

// Appends to a fixed buffer, cutting what does not fit.
class TextWriter {
public:
    TextWriter(char* text, std::size_t size) : text_(text), size_(size) {
        if (size_ > 0) text_[0] = '\0';
    }
    void addText(char const* part) {
        if (used_ + 1 >= size_) return;
        std::size_t const length = std::strlen(part);
        std::size_t const room = size_ - 1 - used_;
        std::size_t const n = length < room ? length : room;
        std::memcpy(text_ + used_, part, n);
        used_ += n;
        text_[used_] = '\0';
    }
    // A number in base 10 or 16 (lower-case digits) with at least `minDigits`
    // digits, as "%d", "%x" and "%02x" print it; written without printf, as
    // the NIC classes write addresses for every instance.
    void addNumber(unsigned value, unsigned base, int minDigits) {
        static char const kDigits[] = "0123456789abcdef";
        char digits[12];
        char* p = digits + sizeof digits - 1;
        *p = '\0';
        int count = 0;
        do {
            *--p = kDigits[value % base];
            value /= base;
            ++count;
        } while (value != 0 || count < minDigits);
        addText(p);
    }

private:
    char* text_;
    std::size_t size_;
    std::size_t used_ = 0;
};

}  // namespace

void RTrim(char* text) {
    if (text == nullptr) return;
    std::size_t length = std::strlen(text);
    while (length > 0 && isBlankOrTab(text[length - 1])) text[--length] = '\0';
}

void LTrim(char* text) {
    if (text == nullptr) return;
    std::size_t skip = 0;
    while (isBlankOrTab(text[skip])) ++skip;
    if (skip == 0) return;

    // The rest is moved to the front through a local copy; a rest that does
    // not fit the copy is moved in place instead.
    std::size_t rest = std::strlen(text + skip);
    char copy[256];
    if (rest < sizeof copy) {
        std::memcpy(copy, text + skip, rest + 1);
        std::memcpy(text, copy, rest + 1);
    } else {
        std::memmove(text, text + skip, rest + 1);
    }
}

void Trim(char* text) {
    if (text == nullptr) return;
    RTrim(text);
    if (text[0] != '\0') LTrim(text);
}

void atollu(char const* text, unsigned long long* value) {
    if (text == nullptr || value == nullptr) return;
    unsigned long long scanned = 0;
    if (std::sscanf(text, "%llu", &scanned) == 1) *value = scanned;
}

void atou(char const* text, unsigned int* value) {
    if (text == nullptr || value == nullptr) return;
    unsigned int scanned = 0;
    if (std::sscanf(text, "%u", &scanned) == 1) *value = scanned;
}

void llutoa(unsigned long long value, char* text) {
    if (text == nullptr) return;
    std::snprintf(text, kLluTextSize, "%llu", value);
}

void utoa(unsigned int value, char* text) {
    if (text == nullptr) return;
    std::snprintf(text, kUTextSize, "%u", value);
}

char* hexBytesText(unsigned char const* bytes, int count, char separator, char* text) {
    // Written directly, not through printf: the NIC classes write several of
    // these texts for every instance.
    static char const kHex[] = "0123456789ABCDEF";
    char* p = text;
    for (int i = 0; i < count; ++i) {
        if (i > 0 && separator != '\0') *p++ = separator;
        *p++ = kHex[bytes[i] >> 4];
        *p++ = kHex[bytes[i] & 0xF];
    }
    *p = '\0';
    return text;
}

char* macaddrToStr(void const* mac, char* text) {
    // One buffer per thread: the text of a call with a null `text` lives until
    // the next such call on the same thread.
    static thread_local char buffer[kMacTextSize];
    if (text == nullptr) text = buffer;
    if (mac == nullptr) {
        text[0] = '\0';
        return text;
    }
    return hexBytesText(static_cast<unsigned char const*>(mac), 6, '\0', text);
}

void IPv4addToStr(void const* address, char* text) {
    if (address == nullptr || text == nullptr) return;
    auto const* b = static_cast<unsigned char const*>(address);
    TextWriter out(text, kIPv4TextSize);
    out.addNumber(b[0], 10, 1);
    for (int i = 1; i < 4; ++i) {
        out.addText(".");
        out.addNumber(b[i], 10, 1);
    }
}

std::size_t safeStrCpy(char* target, char const* source, std::size_t size) {
    if (target == nullptr || source == nullptr || size == 0) return 0;
    std::size_t count = 0;
    while (count + 1 < size && source[count] != '\0') {
        target[count] = source[count];
        ++count;
    }
    target[count] = '\0';
    return count;
}

std::uint64_t GetFileSize(char const* path) {
    if (path == nullptr) return 0;
    struct stat info;
    if (stat(path, &info) != 0) return 0;
    return static_cast<std::uint64_t>(info.st_size);
}

long getVersion(char* text) {
    if (text == nullptr) return 0;
    char* copy = strdup(text);
    if (copy == nullptr) return 0;

    // Summed without overflow: only "zero or not" matters to callers.
    unsigned long sum = 0;
    char* position = nullptr;
    for (char* token = strtok_r(copy, " .\t\n", &position); token != nullptr;
         token = strtok_r(nullptr, " .\t\n", &position)) {
        sum += static_cast<unsigned long>(std::strtol(token, nullptr, 10));
    }
    std::free(copy);

    if (sum == 0) {
        std::memcpy(text, "N/A", 4);
        return 0;
    }
    return static_cast<long>(sum);
}

int CleanStr(char const* source, char* target, std::size_t targetSize) {
    if (source == nullptr || source[0] == '\0' || target == nullptr || targetSize == 0) return -1;
    char const* from = source;
    if (std::isspace(static_cast<unsigned char>(*from))) ++from;
    std::size_t used = 0;
    for (; *from != '\0' && used + 1 < targetSize; ++from) {
        unsigned char c = static_cast<unsigned char>(*from);
        if (std::isalnum(c) || std::isspace(c) || std::ispunct(c) || c == '.') target[used++] = *from;
    }
    target[used] = '\0';
    return 0;
}

void ipv6addr_build_ipv6_str_compact(unsigned char const* address, bool full, char* text) {
    if (address == nullptr || text == nullptr) return;

    // Map of the eight groups: '0' for an all-zero group.
    char map[9];
    for (int i = 0; i < 8; ++i) map[i] = (address[2 * i] == 0 && address[2 * i + 1] == 0) ? '0' : ' ';
    map[8] = '\0';

    // Longest run of zero groups, the first of equal runs; a single group too.
    int runStart = -1;
    int runLength = 0;
    static char const zeros[] = "00000000";
    for (int length = 8; length >= 1 && runStart < 0; --length) {
        char const* found = std::strstr(map, zeros + (8 - length));
        if (found != nullptr) {
            runStart = static_cast<int>(found - map);
            runLength = length;
        }
    }

    TextWriter out(text, kIPv6TextSize);
    for (int i = 0; i < 8; ++i) {
        if (i == runStart) {
            out.addText("::");
            continue;
        }
        if (runStart >= 0 && i > runStart && i < runStart + runLength) continue;

        unsigned char high = address[2 * i];
        unsigned char low = address[2 * i + 1];
        if (full) {
            out.addNumber(static_cast<unsigned>(high) << 8 | low, 16, 4);
        } else if (high != 0) {
            out.addNumber(static_cast<unsigned>(high) << 8 | low, 16, 1);
        } else {
            out.addNumber(low, 16, 1);
        }

        int next = i + 1;
        bool nextStartsRun = next == runStart;
        bool nextEndsRun = runStart >= 0 && next == runStart + runLength;
        if (!nextStartsRun && !nextEndsRun && i != 7) out.addText(":");
    }
}

void nicadapter_IPaddToStr(unsigned char const* address, char* text, int family) {
    if (address == nullptr || text == nullptr) return;
    if (family != 4 && family != 6) {
        bool tailIsZero = true;
        for (int i = 4; i < 16; ++i) tailIsZero = tailIsZero && address[i] == 0;
        family = tailIsZero ? 4 : 6;
    }
    if (family == 4) {
        std::memset(text, 0, kIPv4TextSize);
        IPv4addToStr(address, text);
    } else {
        std::memset(text, 0, kIPv6TextSize);
        ipv6addr_build_ipv6_str_compact(address, false, text);
    }
}

char* nicadapter_IPToStr(void const* address) {
    // One buffer per thread, valid until the next call on the same thread.
    static thread_local char buffer[kIPTextSize];
    std::memset(buffer, 0, sizeof buffer);
    if (address == nullptr) return buffer;

    auto const* record = static_cast<unsigned char const*>(address);
    switch (record[16]) {
    case 1: nicadapter_IPaddToStr(record, buffer, 4); break;
    case 2: nicadapter_IPaddToStr(record, buffer, 6); break;
    default: break;
    }
    return buffer;
}
