// The NIC flavour of the class module mechanism.
//
// The NIC classes keep no list of their own: every request walks m_CNAList (or
// the NIC profile chain) at the moment it arrives and makes its answers from
// the adapter and port records directly. Their request operations read the
// name space first, then the class name, and log texts that each class words
// in its own way. What differs between the NIC classes is held as data:
//
//   - which records the class answers for (NicWalk: one per port, one per
//     adapter, one per node of the profile chain);
//   - its property rows (PropertyRow<NicRecord>, as in ClassModule), in the
//     order in which the instance sets them; the object path takes the keys
//     from the rows of the same name;
//   - its keys (the same list serves setKey and the property filter) and the
//     one key that getInstance compares, with the function that gives that
//     key's text for a record;
//   - its log texts.
//
// `NicClassModule` turns those into makePath, makeInstance, enumInstances,
// enumInstanceNames and getInstance; VEXLAN_CLASS_REQUESTS of ClassModule.h
// gives the last three their names.
#ifndef VEXLAN_CLASSES_NICCLASSMODULE_H
#define VEXLAN_CLASSES_NICCLASSMODULE_H

#include <cstddef>
#include <cstring>
#include <functional>
#include <string>
#include <vector>

#include "classes/ClassModule.h"
#include "inventory/AdapterFunc.h"

struct _RegisteredProfile;

// One thing a NIC class answers for. Port classes fill adapter and port,
// the port controller the adapter alone, the profile class the profile alone.
struct NicRecord {
    _CNAStruc* adapter = nullptr;
    _CNAPortStruc* port = nullptr;
    _RegisteredProfile* profile = nullptr;
    int softwareType = 0;   // software identities: 2 driver, 3 flash firmware
};

// Which records a NIC class walks.
enum class NicWalk {
    Ports,      // every port of every adapter of m_CNAList, in chain order
    Adapters,   // every adapter of m_CNAList, ports or not
    Profiles,   // every node of m_RegisteredProfileList
    AdapterSoftware,  // every adapter of m_CNAList twice: software type 2, then 3
};

// Room for a key text that the NIC modules and the associations format: a
// MAC, "<serial>_<port number>", "<serial>_NIC" or a profile number.
constexpr std::size_t kNicKeyTextSize = 256;

// Log texts of one request operation: the debug line at entry and the error
// lines when the name space or the class name of the path can't be read.
struct NicRequestTexts {
    const char* entry;
    const char* nameSpaceError;
    const char* classNameError;
};

// The error line for a key of another type than string: the type number
// stands between the two parts.
struct NicKeyTypeText {
    const char* before;
    const char* after;
};

class NicClassModule {
public:
    explicit NicClassModule(const char* name) : name_(name) {}

    NicClassModule& walk(NicWalk w)
    {
        walk_ = w;
        return *this;
    }
    // The key that getInstance reads, and the text of that key for a record
    // (into kNicKeyTextSize bytes), compared by strcasecmp.
    NicClassModule& key(const char* name, void (*text)(const NicRecord&, char* out))
    {
        keyName_ = name;
        keyText_ = text;
        return *this;
    }
    // The keys in setKey order, null-terminated; also the `keys` of the filter.
    NicClassModule& keys(const char* const* keys)
    {
        keys_ = keys;
        resolvePathKeys();
        return *this;
    }
    template <std::size_t N>
    NicClassModule& properties(const PropertyRow<NicRecord> (&rows)[N])
    {
        rows_ = rows;
        rowCount_ = N;
        resolvePathKeys();
        return *this;
    }
    NicClassModule& enumInstancesTexts(NicRequestTexts t)
    {
        enumInstances_ = t;
        return *this;
    }
    NicClassModule& enumInstanceNamesTexts(NicRequestTexts t)
    {
        enumInstanceNames_ = t;
        return *this;
    }
    NicClassModule& getInstanceTexts(NicRequestTexts t)
    {
        getInstance_ = t;
        return *this;
    }
    // Debug lines at the entry of makePath and makeInstance.
    NicClassModule& makeTexts(const char* makePath, const char* makeInstance)
    {
        makePathEntry_ = makePath;
        makeInstanceEntry_ = makeInstance;
        return *this;
    }
    // The line for a key that can't be read, and the one for a key of another
    // type (with `type.before` null the first line serves both).
    NicClassModule& keyErrors(const char* readError, NicKeyTypeText typeError = {nullptr, nullptr})
    {
        keyReadError_ = readError;
        keyTypeError_ = typeError;
        return *this;
    }
    // The key lines go to the debug output rather than the error log.
    NicClassModule& keyErrorsAreDebugLines()
    {
        keyErrorsDebug_ = true;
        return *this;
    }
    // A debug line that enumInstanceNames prints for every record it answers.
    NicClassModule& perNameDebugLine(const char* line)
    {
        perNameDebug_ = line;
        return *this;
    }

    const char* name() const { return name_; }
    const char* keyName() const { return keyName_; }
    const char* const* filterKeys() const { return keys_; }
    const PropertyRow<NicRecord>* rows() const { return rows_; }
    std::size_t rowCount() const { return rowCount_; }

    // Faults of the tables (a key without a property row, a missing text),
    // one text each; empty when the module is sound.
    std::vector<std::string> tableFaults() const;

    // Calls visit(record) for each record of the walk, in chain order, until
    // visit returns false.
    void forEach(const std::function<bool(const NicRecord&)>& visit) const;

    CmpiObjectPath makePath(const char* className, const char* nameSpace, const NicRecord& record) const;
    CmpiInstance makeInstance(const char* className, const char* nameSpace, const char** properties,
                              const NicRecord& record) const;

    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& path,
                             const char** properties) const;
    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& path) const;
    // The first record whose key text equals the path's key without regard to
    // case; its instance is made, and delivered only with sendInstance. A miss
    // throws NOT_FOUND with the key text.
    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& result, const CmpiObjectPath& path,
                           const char** properties, bool sendInstance) const;

private:
    struct Names {
        const char* nameSpace = nullptr;
        const char* className = nullptr;
    };
    CmpiStatus readNames(const CmpiObjectPath& path, const NicRequestTexts& texts, Names& names) const;
    void keyLine(const char* text) const;
    void keyTypeLine(int type) const;
    void resolvePathKeys();

    const char* name_;
    NicWalk walk_ = NicWalk::Ports;
    const char* keyName_ = nullptr;
    void (*keyText_)(const NicRecord&, char* out) = nullptr;
    const char* const* keys_ = nullptr;
    std::vector<const PropertyRow<NicRecord>*> pathKeyRows_;
    const PropertyRow<NicRecord>* rows_ = nullptr;
    std::size_t rowCount_ = 0;
    NicRequestTexts enumInstances_ = {nullptr, nullptr, nullptr};
    NicRequestTexts enumInstanceNames_ = {nullptr, nullptr, nullptr};
    NicRequestTexts getInstance_ = {nullptr, nullptr, nullptr};
    const char* makePathEntry_ = nullptr;
    const char* makeInstanceEntry_ = nullptr;
    const char* keyReadError_ = nullptr;
    NicKeyTypeText keyTypeError_ = {nullptr, nullptr};
    bool keyErrorsDebug_ = false;
    const char* perNameDebug_ = nullptr;
};

// ---------------------------------------------------------------------------
// Texts of the records that several NIC classes show.
// ---------------------------------------------------------------------------

// A text field of a library record that may fill its array without a
// terminating zero: read up to the array's end and no further.
template <std::size_t N>
std::string nicFieldText(const char (&field)[N])
{
    return std::string(field, strnlen(field, N));
}

// The port's MAC as twelve upper-case hex digits ("macPlain"), into
// kMacTextSize bytes or more. Returns `out`.
char* nicMacText(const _CNAPortStruc* port, char* out);

// The record's port MAC as a key text (kNicKeyTextSize bytes) and as a value.
void nicMacKey(const NicRecord& record, char* out);
PropertyValue nicMacValue(const NicRecord& record);

// OperationalStatus and StatusDescriptions of a NIC port by the link state
// of its last seen link properties: 1 up, 2 down, 3 testing, else unknown.
struct NicLinkStatus {
    CMPIUint16 operationalStatus;
    const char* description;
};
NicLinkStatus nicLinkStatus(const _CNAPortStruc* port);

// The same text for every record (a constant or the host name, lent):
// CLASS_VALUE(NicRecord, entryText("...")) reads better in the tables as
// NIC_TEXT("...").
#define NIC_TEXT(text) CLASS_VALUE(NicRecord, entryText(text))
#define NIC_UINT16(value) CLASS_VALUE(NicRecord, CmpiData(static_cast<CMPIUint16>(value)))

// The operations of a NIC class module, declared and defined. PARAMS is the
// parenthesised list of the records that makePath_X and makeInstance_X take,
// RECORD the NicRecord made of them:
//     VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(LANEndPoint, (_CNAPortStruc* port));
//     VEXLAN_NIC_CLASS_OPERATIONS(LANEndPoint, kModule, (_CNAPortStruc* port), (NicRecord{nullptr, port}))
#define VEXLAN_NIC_UNPAREN(...) __VA_ARGS__
#define VEXLAN_DECLARE_NIC_CLASS_OPERATIONS(X, PARAMS)                                                \
    CmpiObjectPath makePath_##X(const char* className, const char* nameSpace, VEXLAN_NIC_UNPAREN PARAMS); \
    CmpiInstance makeInstance_##X(const char* className, const char* nameSpace, const char** properties, \
                                  VEXLAN_NIC_UNPAREN PARAMS);                                         \
    VEXLAN_DECLARE_CLASS_REQUESTS(X)
#define VEXLAN_NIC_CLASS_OPERATIONS(X, module, PARAMS, RECORD)                                         \
    CmpiObjectPath makePath_##X(const char* className, const char* nameSpace, VEXLAN_NIC_UNPAREN PARAMS) \
    {                                                                                                 \
        return (module).makePath(className, nameSpace, RECORD);                                       \
    }                                                                                                 \
    CmpiInstance makeInstance_##X(const char* className, const char* nameSpace, const char** properties, \
                                  VEXLAN_NIC_UNPAREN PARAMS)                                          \
    {                                                                                                 \
        return (module).makeInstance(className, nameSpace, properties, RECORD);                       \
    }                                                                                                 \
    VEXLAN_CLASS_REQUESTS(X, module)

#endif
