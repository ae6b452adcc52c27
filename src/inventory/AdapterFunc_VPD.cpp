// VPD decoding: the tag walk over the adapter's VPD stream, one table of the
// keywords and their lines, and the option ROM version lines.
#include "inventory/AdapterFunc_VPD.h"

#include <charconv>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include "inventory/AdapterFunc_Chip.h"
#include "support/Vexlan_NIC_Utils.h"

char g_productId[kVpdLineSize];
char g_RTag[kVpdLineSize];
char g_partNumber[kVpdLineSize];
char g_serialNumber[kVpdLineSize];
char g_miscInfo[kVpdLineSize];
char g_manufacturingId[kVpdLineSize];
char g_efiVersion[kVpdLineSize];
char g_fwVersion[kVpdLineSize];
char g_biosVersion[kVpdLineSize];
char g_fcodeVersion[kVpdLineSize];
char g_fruNumberVersion[kVpdLineSize];
char g_fcCodeVersion[kVpdLineSize];
char g_flashImageVersion[kVpdLineSize];
char g_assetTag[kVpdLineSize];
char g_UUID[kVpdLineSize];
char g_I2CUUID[kVpdLineSize];
char g_endTag[kVpdLineSize];
char g_optionROMBIOS[kVpdLineSize];
char g_optionROMEFI[kVpdLineSize];
char g_optionROMFCode[kVpdLineSize];
char g_optionROMFirmware[kVpdLineSize];

namespace {

// Tags of the VPD stream; everything else is a two-letter keyword.
constexpr unsigned char kTagIdentifier = 0x82;
constexpr unsigned char kTagReadOnly = 0x90;
constexpr unsigned char kTagWritable = 0x91;
constexpr unsigned char kTagEnd = 0x78;
constexpr unsigned char kFiller = 0x00;

// Every tag and keyword header is three bytes: the tag and a 16-bit length,
// or the two letters and an 8-bit length.
constexpr std::size_t kHeaderSize = 3;

// Room of the local copy that trimmed values go through.
constexpr std::size_t kValueCopySize = 256;

// How a keyword's value becomes its line.
enum class ValueForm {
    Text,     // label and the value bytes as they stand
    Trimmed,  // label and the value, trimmed of blanks
    Version,  // label and the six digits "MMmmss" as "M.m.s"
    Byte,     // label and the first value byte in two hex digits
};

struct KeywordRow {
    char keyword[3];
    char* line;          // null: decoded into a local line and dropped
    char const* label;
    ValueForm form;
};

// In the order the keywords are matched.
KeywordRow const kKeywords[] = {
    {"RV", nullptr, "Checksum & Reserved: ", ValueForm::Byte},
    {"RW", nullptr, "Remaining RW Data: ", ValueForm::Byte},
    {"PN", g_partNumber, "Part Number:", ValueForm::Text},
    {"EC", nullptr, "Engineering Date Code:", ValueForm::Text},
    {"SN", g_serialNumber, "Serial Number:", ValueForm::Text},
    {"V0", g_miscInfo, "Miscellaneous Information:", ValueForm::Text},
    {"V2", nullptr, "Manufacturing Date Code:", ValueForm::Text},
    {"MN", g_manufacturingId, "Manufacturing Id:", ValueForm::Text},
    {"V1", g_efiVersion, "EFI Driver Version:", ValueForm::Trimmed},
    {"V3", g_fwVersion, "Firmware Version:", ValueForm::Trimmed},
    {"V4", g_biosVersion, "BIOS Version:", ValueForm::Trimmed},
    {"V5", g_fcodeVersion, "FCode Version:", ValueForm::Trimmed},
    {"RM", g_flashImageVersion, "Flash Image Version:", ValueForm::Trimmed},
    {"V9", g_flashImageVersion, "Flash Image Version:", ValueForm::Version},
    {"FC", g_fcCodeVersion, "FC Code:", ValueForm::Text},
    {"FN", g_fruNumberVersion, "Fru Number:", ValueForm::Text},
    {"YA", g_assetTag, "Asset Tag:", ValueForm::Text},
    {"YU", g_UUID, "UUID:", ValueForm::Text},
};

// A stream decoded lately and the text each line held after its decode.
struct DecodedStream {
    std::vector<unsigned char> bytes;
    std::vector<std::pair<char*, std::string>> lines;  // in the order first written
};

// The streams decoded lately, by a hash of their bytes, so that the same bytes
// read again give the same lines without a second decode: every function of
// an adapter reads its adapter's VPD, and every build of an FC list reads them
// all again (an association request from one FC port runs five such builds).
// What a decode writes depends on the bytes alone, and the library is asked
// for them at every read as before, so no line is older than its read. At
// most kKeptStreams are kept (one adapter each, about 2 kB); the stream after
// that starts the store afresh. The store is guarded as the lines are: the
// builds run one at a time.
constexpr std::size_t kKeptStreams = 4096;
std::unordered_multimap<std::uint64_t, DecodedStream> g_decoded;
DecodedStream const* g_lastStream = nullptr;   // the one read last, tried first

// While a decode is being remembered: the lines it wrote so far.
std::vector<char*>* g_writtenLines = nullptr;

void noteWritten(char* line) {
    if (g_writtenLines == nullptr) return;
    for (char* known : *g_writtenLines)
        if (known == line) return;
    g_writtenLines->push_back(line);
}

// A label of the table at the start of a line; labels are far shorter than a
// line.
std::size_t putLabel(char* line, char const* label) {
    std::size_t const used = std::strlen(label);
    std::memcpy(line, label, used);
    return used;
}

// "<label><value>" into a line: the value ends at its length or at a zero
// byte, and the whole is cut to the line's room.
void writeLine(char* line, char const* label, char const* value, int length) {
    std::size_t used = putLabel(line, label);
    std::size_t count = strnlen(value, static_cast<std::size_t>(length));
    if (count > kVpdLineSize - 1 - used) count = kVpdLineSize - 1 - used;
    std::memcpy(line + used, value, count);
    line[used + count] = '\0';
}

// The value copied into a zeroed local (at most its room less one byte) and
// trimmed of blanks.
void trimmedCopy(unsigned char const* value, int length, char (&copy)[kValueCopySize]) {
    std::memset(copy, 0, sizeof copy);
    std::size_t count = static_cast<std::size_t>(length);
    if (count > sizeof copy - 1) count = sizeof copy - 1;
    std::strncpy(copy, reinterpret_cast<char const*>(value), count);
    Trim(copy);
}

void decodeKeyword(KeywordRow const& row, unsigned char const* value, int length) {
    char dropped[kVpdLineSize];
    char* line = row.line != nullptr ? row.line : dropped;
    if (row.line != nullptr) noteWritten(row.line);
    char copy[kValueCopySize];

    switch (row.form) {
    case ValueForm::Text:
        writeLine(line, row.label, reinterpret_cast<char const*>(value), length);
        break;
    case ValueForm::Trimmed:
        trimmedCopy(value, length, copy);
        writeLine(line, row.label, copy, length);
        break;
    case ValueForm::Version: {
        trimmedCopy(value, length, copy);
        int major = 0;
        int minor = 0;
        int sub = 0;
        std::sscanf(copy, "%2d%2d%2d", &major, &minor, &sub);
        // "%d.%d.%d" behind the label
        char* end = line + putLabel(line, row.label);
        char* const limit = line + kVpdLineSize - 1;
        int const parts[] = {major, minor, sub};
        for (int i = 0; i < 3; ++i) {
            if (i > 0) *end++ = '.';
            end = std::to_chars(end, limit, parts[i]).ptr;
        }
        *end = '\0';
        break;
    }
    case ValueForm::Byte: {
        // "%02X" of the first value byte behind the label
        static char const kHex[] = "0123456789ABCDEF";
        unsigned const byte = length > 0 ? value[0] : 0u;
        std::size_t const used = putLabel(line, row.label);
        line[used] = kHex[byte >> 4];
        line[used + 1] = kHex[byte & 0xFu];
        line[used + 2] = '\0';
        break;
    }
    }
}

// Little-endian 16-bit length of an identifier tag.
std::size_t identifierLength(unsigned char const* tag) {
    return static_cast<std::size_t>(tag[1]) | (static_cast<std::size_t>(tag[2]) << 8);
}

// FNV-1a over the stream's 64-bit words (and its last bytes).
std::uint64_t hashOf(unsigned char const* vpd, std::size_t size) {
    std::uint64_t hash = 14695981039346656037ull;
    std::size_t i = 0;
    for (; i + 8 <= size; i += 8) {
        std::uint64_t word;
        std::memcpy(&word, vpd + i, 8);
        hash = (hash ^ word) * 1099511628211ull;
    }
    for (; i < size; ++i) hash = (hash ^ vpd[i]) * 1099511628211ull;
    return hash;
}

bool sameStream(DecodedStream const& known, unsigned char const* vpd, std::size_t size) {
    return known.bytes.size() == size && std::memcmp(known.bytes.data(), vpd, size) == 0;
}

// The lines of a stream decoded lately, written again as its decode left
// them; false when the stream is not known. `hash` is the stream's hash when
// it had to be computed.
bool replayKnownStream(unsigned char const* vpd, std::size_t size, std::uint64_t& hash) {
    DecodedStream const* known = nullptr;
    if (g_lastStream != nullptr && sameStream(*g_lastStream, vpd, size)) {
        known = g_lastStream;
    } else {
        hash = hashOf(vpd, size);
        auto const range = g_decoded.equal_range(hash);
        for (auto it = range.first; it != range.second && known == nullptr; ++it)
            if (sameStream(it->second, vpd, size)) known = &it->second;
    }
    if (known == nullptr) return false;
    g_lastStream = known;
    for (auto const& line : known->lines) std::memcpy(line.first, line.second.c_str(), line.second.size() + 1);
    return true;
}

// Decodes the stream and keeps it with the text of the lines it wrote. Without
// memory to keep it, the stream is decoded all the same and nothing is kept.
void decodeAndRemember(unsigned char const* vpd, std::size_t size, std::uint64_t hash) {
    g_lastStream = nullptr;
    std::vector<char*> written;
    bool recording = true;
    try {
        written.reserve(32);
    } catch (...) {
        recording = false;
    }
    g_writtenLines = recording ? &written : nullptr;
    PrintVPD(vpd, size);
    g_writtenLines = nullptr;
    if (!recording) return;
    try {
        if (g_decoded.size() >= kKeptStreams) g_decoded.clear();
        DecodedStream decoded;
        decoded.bytes.assign(vpd, vpd + size);
        for (char* line : written) decoded.lines.emplace_back(line, std::string(line, strnlen(line, kVpdLineSize - 1)));
        g_lastStream = &g_decoded.emplace(hash, std::move(decoded))->second;
    } catch (...) {
        g_lastStream = nullptr;
    }
}

// "<label><text>" into a line of kVpdLineSize bytes, cut to its room, as
// snprintf(line, kVpdLineSize, "%s%s", label, text) writes it: every
// function of every FC build writes the option ROM lines.
void labelledLine(char* line, char const* label, char const* text) {
    std::size_t used = putLabel(line, label);
    std::size_t count = std::strlen(text);
    if (count > kVpdLineSize - 1 - used) count = kVpdLineSize - 1 - used;
    std::memcpy(line + used, text, count);
    line[used + count] = '\0';
}

// The first `count` version bytes as "%d.%02d[.%02d]" prints them.
char const* versionText(char (&out)[32], std::uint8_t const* bytes, int count) {
    char* p = out;
    for (int i = 0; i < count; ++i) {
        unsigned const v = bytes[i];
        if (i > 0) *p++ = '.';
        if (v >= 100) *p++ = static_cast<char>('0' + v / 100);
        if (v >= 10 || i > 0) *p++ = static_cast<char>('0' + v / 10 % 10);
        *p++ = static_cast<char>('0' + v % 10);
    }
    *p = '\0';
    return out;
}

}  // namespace

void PrintVPDField(unsigned char const* tag, unsigned char const* value, int length) {
    if (tag == nullptr) return;
    // A negative precision would print up to the next zero byte.
    if (length < 0) length = 0;
    if (value == nullptr) length = 0;
    if (length == 0) value = reinterpret_cast<unsigned char const*>("");

    switch (tag[0]) {
    case kTagIdentifier:
        noteWritten(g_productId);
        writeLine(g_productId, "Product Identifier:", reinterpret_cast<char const*>(value), length);
        return;
    case kTagReadOnly:
        noteWritten(g_RTag);
        std::snprintf(g_RTag, kVpdLineSize, "VPD-R Tag:");
        return;
    case kTagWritable:
        // Decoded and dropped: nothing reads the writable section's tag.
        return;
    case kTagEnd:
        noteWritten(g_endTag);
        std::snprintf(g_endTag, kVpdLineSize, "End Tag:");
        return;
    default:
        break;
    }
    for (KeywordRow const& row : kKeywords) {
        if (tag[0] == static_cast<unsigned char>(row.keyword[0]) &&
            tag[1] == static_cast<unsigned char>(row.keyword[1])) {
            decodeKeyword(row, value, length);
            return;
        }
    }
}

void PrintVPD(unsigned char const* vpd, std::size_t size) {
    if (vpd == nullptr || size == 0) return;

    // Start of the value behind the header at pos, never beyond the end.
    auto valueAt = [&](std::size_t pos) {
        return pos + kHeaderSize <= size ? vpd + pos + kHeaderSize : vpd + size;
    };

    std::size_t pos = 0;
    if (vpd[pos] == kTagEnd) {
        PrintVPDField(vpd + pos, valueAt(pos), 0);
        return;
    }
    for (;;) {
        unsigned char const tag = vpd[pos];
        if (tag == kTagReadOnly || tag == kTagWritable) {
            // The section tags open their keywords; their bodies are walked
            // keyword by keyword.
            PrintVPDField(vpd + pos, valueAt(pos), 0);
            pos += kHeaderSize;
        } else if (tag == kFiller) {
            pos += kHeaderSize;
        } else {
            if (pos + kHeaderSize > size) return;  // header cut by the end
            std::size_t length = tag == kTagIdentifier ? identifierLength(vpd + pos) : vpd[pos + 2];
            std::size_t available = size - pos - kHeaderSize;
            std::size_t shown = length < available ? length : available;
            PrintVPDField(vpd + pos, vpd + pos + kHeaderSize, static_cast<int>(shown));
            pos += kHeaderSize + length;
        }
        if (pos >= size) return;  // no end tag within the buffer
        if (vpd[pos] == kTagEnd) {
            PrintVPDField(vpd + pos, valueAt(pos), 0);
            return;
        }
    }
}

void PrintVPD(unsigned char* vpd) {
    PrintVPD(vpd, ZORAP_VPD_BUFFER_SIZE);
}

void ClearVpdLine(char* line) {
    std::memset(line, 0, strnlen(line, kVpdLineSize));
}

int GetHBAVPDData(_tagZORAPSDMDevice* device) {
    if (device == nullptr) return -1;

    std::uint32_t length = ZORAP_VPD_BUFFER_SIZE;
    ClearVpdLine(g_I2CUUID);

    char* uuid = nullptr;
    std::uint32_t uuidLength = 0;
    if (ZORAP_GetUUIDFromI2CVPD(device, &uuid, &uuidLength) == ZORAP_OK && uuid != nullptr) {
        safeStrCpy(g_I2CUUID, uuid, sizeof g_I2CUUID);
        ZORAP_FreeMem(uuid);
    }

    // Older chips have no readable VPD.
    if (GetRSXType(device) < 8) return -1;

    // A zeroed buffer of the library's VPD size on the stack: one per FC
    // function and build, where a heap block cost more than the read.
    std::size_t const bufferSize = length;
    unsigned char buffer[ZORAP_VPD_BUFFER_SIZE] = {};

    ZORAP_STATUS status = ZORAP_GetVpd(device->deviceHandle, 0, buffer, &length);
    std::uint64_t hash = 0;
    if (status == ZORAP_OK && !replayKnownStream(buffer, bufferSize, hash))
        decodeAndRemember(buffer, bufferSize, hash);

    return static_cast<int>(status);
}

void GetHBAOptionROMVersions(_tagZORAPSDMDevice* device) {
    if (GetRSXType(device) < 6) return;

    // The record's text need not be terminated within its field.
    char biosText[sizeof device->biosVersionText + 1];
    std::memcpy(biosText, device->biosVersionText, sizeof device->biosVersionText);
    biosText[sizeof device->biosVersionText] = '\0';
    char bios[64] = {};
    CleanStr(biosText, bios, sizeof bios);
    labelledLine(g_optionROMBIOS, "OptionROM BIOS Version:", bios);

    std::uint32_t const mask = device->optionRomMask;
    char version[32];

    if ((mask & ZORAP_OPTROM_FCODE) == 0)
        labelledLine(g_optionROMFCode, "OptionROM FCode Version:", "N/A");
    else
        labelledLine(g_optionROMFCode, "OptionROM FCode Version:",
                     versionText(version, device->fcodeVersion, GetRSX4GbOrNewerType(device) == 0 ? 3 : 2));

    if ((mask & ZORAP_OPTROM_EFI) == 0)
        labelledLine(g_optionROMEFI, "OptionROM EFI Version:", "N/A");
    else
        labelledLine(g_optionROMEFI, "OptionROM EFI Version:", versionText(version, device->efiVersion, 2));

    if ((mask & ZORAP_OPTROM_FIRMWARE) == 0)
        labelledLine(g_optionROMFirmware, "OptionROM Firmware Version:", "N/A");
    else
        labelledLine(g_optionROMFirmware, "OptionROM Firmware Version:",
                     versionText(version, device->firmwareVersion, 3));
}
