#include "support/Vexlan_NIC_Properties.h"

#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

#include <cctype>
#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <mutex>
#include <new>
#include <sstream>
#include <string>
#include <strings.h>

#include "support/ProviderFiles.h"

bool g_EnableZORAPLog = false;
#define VEXLAN_DEFAULT_INTEROP_NAMESPACE "root/PG_InterOp"
#define VEXLAN_DEFAULT_CIMOM_NAME_VERSION "Pegasus CIM Server"
#define VEXLAN_DEFAULT_CIM_SCHEMA_VERSION "Unknown Version"

// The defaults stand also before the provider's constructor has read the file.
char g_InteropNamespace[256] = VEXLAN_DEFAULT_INTEROP_NAMESPACE;
char g_CIMOMNameVersion[256] = VEXLAN_DEFAULT_CIMOM_NAME_VERSION;
char g_CIMSchemaVersion[256] = VEXLAN_DEFAULT_CIM_SCHEMA_VERSION;

namespace {

char const kDefaultInteropNamespace[] = VEXLAN_DEFAULT_INTEROP_NAMESPACE;
char const kDefaultImplementationNamespace[] = "root/vexlan_cmpi";

// Copies a configured text, cut to the size of the global.
void setText(char (&target)[256], char const* value) {
    std::snprintf(target, sizeof target, "%s", value);
}

// Keys of the provider constructor's reading, in the order they are tried.
enum class ProviderKey { ErrorLog, DebugLog, ZORAPLog, InteropNamespace, CIMOMNameVersion, CIMSchemaVersion };

struct ProviderKeyRow {
    char const* name;
    ProviderKey key;
};

ProviderKeyRow const kProviderKeys[] = {
    {"ErrorLog", ProviderKey::ErrorLog},
    {"DebugLog", ProviderKey::DebugLog},
    {"ZORAPLog", ProviderKey::ZORAPLog},
    {"InteropNamespace", ProviderKey::InteropNamespace},
    {"CIMOMNameVersion", ProviderKey::CIMOMNameVersion},
    {"CIMSchemaVersion", ProviderKey::CIMSchemaVersion},
};

}  // namespace

void LoadProviderProperties() {
    g_EnableLogError = false;
    g_EnableDebugPrint = false;
    setText(g_InteropNamespace, kDefaultInteropNamespace);
    setText(g_CIMOMNameVersion, VEXLAN_DEFAULT_CIMOM_NAME_VERSION);
    setText(g_CIMSchemaVersion, VEXLAN_DEFAULT_CIM_SCHEMA_VERSION);

    char path[256];
    std::snprintf(path, sizeof path, VEXLAN_PROPERTIES_DIRECTORY_FORMAT, VEXLAN_PROPERTIES_FILE_NAME);

    // Opened without blocking and read whole within its bound; a FIFO, a
    // device, a directory or a huge file is refused and the defaults stand.
    bounded_file::Result read = ReadProviderFile("settings file", path, kSettingsFileMax);
    if (read.outcome == bounded_file::Outcome::Taken) {
        std::istringstream file(read.text);
        long errorLog = 0;
        long debugLog = 0;
        long zorapLog = 0;
        char line[256];
        while (!file.eof()) {
            file.getline(line, sizeof line);
            // A line too long for the buffer ends the reading after its first
            // 255 characters; the stream delivers nothing more.
            bool lastLine = file.fail() && !file.eof();
            if (file.fail() && file.gcount() == 0) line[0] = '\0';

            Trim(line);
            if (line[0] != '#') {
                for (ProviderKeyRow const& row : kProviderKeys) {
                    if (std::strstr(line, row.name) == nullptr) continue;
                    char const* equals = std::strrchr(line, '=');
                    if (equals != nullptr) {
                        char const* value = equals + 1;
                        switch (row.key) {
                        case ProviderKey::ErrorLog: errorLog = std::strtol(value, nullptr, 10); break;
                        case ProviderKey::DebugLog: debugLog = std::strtol(value, nullptr, 10); break;
                        case ProviderKey::ZORAPLog: zorapLog = std::strtol(value, nullptr, 10); break;
                        case ProviderKey::InteropNamespace:
                            setText(g_InteropNamespace, value);
                            Trim(g_InteropNamespace);
                            break;
                        case ProviderKey::CIMOMNameVersion: setText(g_CIMOMNameVersion, value); break;
                        case ProviderKey::CIMSchemaVersion: setText(g_CIMSchemaVersion, value); break;
                        }
                    }
                    break;
                }
            }
            if (lastLine) break;
        }
        g_EnableLogError = errorLog > 0;
        g_EnableDebugPrint = debugLog > 0;
        g_EnableZORAPLog = zorapLog > 0;
    }

    if (g_EnableDebugPrint) {
        Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider constructor was called *****");
        Vexlan_FC_Utils_CMPI::DebugPrint("PropertiesFileName=%s", path);
        Vexlan_FC_Utils_CMPI::DebugPrint("Config: %s=%d", "DebugLog", 1);
        Vexlan_FC_Utils_CMPI::DebugPrint("Config: %s=%d", "ErrorLog", g_EnableLogError ? 1 : 0);
        if (g_EnableZORAPLog) Vexlan_FC_Utils_CMPI::DebugPrint("Config: %s=%d", "ZORAPLog", 1);
        Vexlan_FC_Utils_CMPI::DebugPrint("Config: %s=%s", "InteropNamespace", g_InteropNamespace);
        Vexlan_FC_Utils_CMPI::DebugPrint("Config: %s=%s", "CIMOMNameVersion", g_CIMOMNameVersion);
        Vexlan_FC_Utils_CMPI::DebugPrint("Config: %s=%s", "CIMSchemaVersion", g_CIMSchemaVersion);
    }
}

int getPropertyFilePath(char* buffer, unsigned int size) {
    if (buffer == nullptr || size <= 20) return 0;
    int length = std::snprintf(buffer, size, "%s", VEXLAN_PROPERTIES_FILE_NAME);
    return (length >= 0 && static_cast<unsigned int>(length) < size) ? 1 : 0;
}

Vexlan_NIC_Properties* Vexlan_NIC_Properties::singleton = nullptr;

Vexlan_NIC_Properties* Vexlan_NIC_Properties::instance() {
    // The first callers may be the polling thread and a request thread at
    // once: a function-local static is created exactly once. The object lives
    // in storage of its own and is never destroyed: the library's unload code
    // stops the polling thread, which reads it, while the library's other
    // objects are being destroyed. It owns no memory.
    static Vexlan_NIC_Properties* const created = [] {
        alignas(Vexlan_NIC_Properties) static unsigned char storage[sizeof(Vexlan_NIC_Properties)];
        singleton = new (storage) Vexlan_NIC_Properties;
        return singleton;
    }();
    return created;
}

Vexlan_NIC_Properties::Vexlan_NIC_Properties()
    : debugLog(false), errorLog(false), linkStatusPollIntervalSeconds(180) {
    setText(interopNamespace, kDefaultInteropNamespace);
    setText(implementationNamespace, kDefaultImplementationNamespace);
    reload();
}

Vexlan_NIC_Properties::~Vexlan_NIC_Properties() = default;

namespace {

enum class NicKey { ErrorLog, DebugLog, LinkStatusPollIntervalSeconds, InteropNamespace };

struct NicKeyRow {
    char const* name;
    NicKey key;
};

NicKeyRow const kNicKeys[] = {
    {"ErrorLog", NicKey::ErrorLog},
    {"DebugLog", NicKey::DebugLog},
    {"LinkStatusPollIntervalSeconds", NicKey::LinkStatusPollIntervalSeconds},
    {"InteropNamespace", NicKey::InteropNamespace},
};

bool switchValue(char const* value) {
    return strcasecmp(value, "true") == 0 || std::strtol(value, nullptr, 10) != 0;
}

// The next word of `text` from `at`, as fscanf's "%255s" takes it: white
// space skipped, then at most 255 other bytes (the rest of a longer word is
// the next word); the word ends at an embedded NUL. False at the end.
bool nextWord(std::string const& text, std::size_t& at, char (&word)[256]) {
    while (at < text.size() && std::isspace(static_cast<unsigned char>(text[at]))) ++at;
    if (at >= text.size()) return false;
    std::size_t length = 0;
    while (at < text.size() && length < 255 && !std::isspace(static_cast<unsigned char>(text[at])))
        word[length++] = text[at++];
    word[length] = '\0';
    return true;
}

// The poll interval as strtol reads it into the int field: no bound, a word
// that is no number gives 0, a value beyond an int wraps as the conversion
// does. A value that makes polling run at once every round (or every other
// round) is said in the log, with what it was read as.
int pollInterval(char const* value) {
    errno = 0;
    char* end = nullptr;
    const long read = std::strtol(value, &end, 10);
    const bool overflow = errno == ERANGE || read < INT_MIN || read > INT_MAX;
    const int interval = static_cast<int>(static_cast<unsigned int>(static_cast<unsigned long>(read)));
    char const* what = nullptr;
    if (end == value)
        what = "no number";
    else if (overflow)
        what = "beyond the range of an int";
    else if (interval < 0)
        what = "negative";
    else if (interval == 0)
        what = "zero";
    if (what == nullptr) return interval;
    // The loop polls when more seconds than the interval have passed.
    char period[48];
    if (interval < 0)
        std::snprintf(period, sizeof period, "every second");
    else
        std::snprintf(period, sizeof period, "about every %lld seconds", static_cast<long long>(interval) + 2);
    ReportProviderNotice("Config: LinkStatusPollIntervalSeconds=%.64s is %s, read as %d: a poll %s.", value, what,
                         interval, period);
    return interval;
}

}  // namespace

void Vexlan_NIC_Properties::reload() {
    char name[1024];
    if (getPropertyFilePath(name, sizeof name) == 0) return;
    std::cerr << "Vexlan_NIC_Properties::reload, properties file name: " << name << std::endl;

    bounded_file::Result read = ReadProviderFile("settings file", name, kSettingsFileMax);
    if (read.outcome != bounded_file::Outcome::Taken) return;

    char word[256];
    std::size_t at = 0;
    while (nextWord(read.text, at, word)) {
        char const* start = word;
        while (*start == ' ' || *start == '\t') ++start;
        if (*start == '#') continue;  // only this word: the rest of a comment line is read on

        for (NicKeyRow const& row : kNicKeys) {
            std::size_t keyLength = std::strlen(row.name);
            if (strncasecmp(start, row.name, keyLength) != 0) continue;

            char const* value = start + keyLength;
            while (*value == ' ' || *value == '\t' || *value == '=') ++value;
            switch (row.key) {
            case NicKey::ErrorLog: errorLog = switchValue(value); break;
            case NicKey::DebugLog: debugLog = switchValue(value); break;
            case NicKey::LinkStatusPollIntervalSeconds:
                linkStatusPollIntervalSeconds = pollInterval(value);
                break;
            case NicKey::InteropNamespace:
                std::strncpy(interopNamespace, value, 255);
                interopNamespace[255] = '\0';
                break;
            }
            break;
        }
    }
}
