// The class module mechanism: what every CIM class module of the provider is
// made of, held once.
//
// A class module serves one CIM class from one process-wide list of ready-made
// records (or from a fixed set of records, such as the one host). The module
// itself is a set of tables:
//
//   - its entry record, starting with the one-byte `valid` flag;
//   - its list, `ClassList<Entry> g_<Class>List`;
//   - its property rows: name, CIM type and a function that gives the value
//     from an entry, in the order in which the instance sets them;
//   - its key lists: the `keys` of the property filter, the keys of the
//     object path in setKey order, and the one key that getInstance matches;
//   - whether its enumerations skip invalid slots, and whether its build
//     drops duplicates (dense) or fills every counted slot (full).
//
// `ClassModule<Entry>` turns those tables into the operations of the class
// (makePath_X, makeInstance_X, enumInstances_X, enumInstanceNames_X and
// getInstance_X, with their log texts), and VEXLAN_LIST_CLASS_OPERATIONS /
// VEXLAN_SINGLE_CLASS_OPERATIONS give those operations their names. See
// docs/design.md for a worked example.
//
// Modules take no lock and own no thread: the dispatcher calls them under
// provider_lock, and the polling thread builds and removes the lists under it.
#ifndef VEXLAN_CLASSES_CLASSMODULE_H
#define VEXLAN_CLASSES_CLASSMODULE_H

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <initializer_list>
#include <new>
#include <strings.h>
#include <optional>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "CmpiImpl.h"
#include "inventory/AdapterWalk.h"
#include "zorap_cna.h"

// ---------------------------------------------------------------------------
// ClassList: the two-word container behind every g_<Class>List.
// ---------------------------------------------------------------------------
template <class Entry>
struct ClassList {
    std::int32_t count;   // slots that enumerations visit
    Entry* entries;       // one block of capacity slots (global new[]), or null

    // Allocates `capacity` zeroed slots, every `valid` 0, and sets `count` to
    // the capacity. A capacity of 0 or less, or no memory, leaves the list
    // empty. Returns false when the list stays empty.
    bool allocate(int capacity)
    {
        remove();
        if (capacity <= 0)
            return false;
        entries = new (std::nothrow) Entry[static_cast<std::size_t>(capacity)]();
        if (entries == nullptr)
            return false;
        for (int i = 0; i < capacity; ++i)
            entries[i].valid = 0;
        count = capacity;
        return true;
    }

    // removeXList: count 0, the block deleted, entries null.
    void remove()
    {
        count = 0;
        if (entries != nullptr) {
            delete[] entries;
            entries = nullptr;
        }
    }
};

// ---------------------------------------------------------------------------
// Property rows.
// ---------------------------------------------------------------------------

// The value of a property for one entry; no value leaves the property unset.
using PropertyValue = std::optional<CmpiData>;

template <class Entry>
struct PropertyRow {
    const char* name;
    CMPIType type;                               // CIM type: CMPI_string, CMPI_uint16, CMPI_uint16A, ...
    PropertyValue (*value)(const Entry& entry);  // from the entry, constants and host names only
};

// The text of a row that lives as long as the list entry or longer (a field
// of the entry, a constant, the host name): handed to the instance without a
// copy of its own, as makeInstance sets it before the entry can change.
inline CmpiData entryText(const char* text)
{
    return CmpiData::borrowedChars(text);
}

// A text field of a record that stays put while the instance is built (an
// entry, or a record of the library's tree, which changes only under the same
// lock as the requests) and may fill its array without a terminating zero:
// lent when it ends within its array, else copied up to the array's end.
template <std::size_t N>
CmpiData fieldText(const char (&field)[N])
{
    const std::size_t length = strnlen(field, N);
    if (length < N)
        return CmpiData::borrowedChars(field);
    return CmpiData(std::string(field, length));
}

// A row's value function written in place: CLASS_VALUE(FCPortEntry, CmpiData(e.DeviceID)).
// The entry is `e`.
#define CLASS_VALUE(Entry, expression) [](const Entry& e) -> PropertyValue { (void)e; return (expression); }

// Array values. Each makes the array through the broker.
CmpiData uint16Array(std::initializer_list<CMPIUint16> values);
CmpiData stringArray(std::initializer_list<const char*> values);
CmpiData uint8Array(const unsigned char* bytes, std::size_t length);

// How a build counts its slots (see ClassModule::build).
enum class ListKind {
    Full,   // count is the number of wanted protocols; every counted slot is filled
    Dense,  // count grows as slots are created; a fill that declines (a duplicate) takes no slot
    Ordinal,  // count grows as slots are created, but a protocol's slot is its ordinal among the
              // wanted ones: a declined fill leaves its slot unfilled (valid 0) and the later
              // slots keep their places, so slot positions and count part
};

// ---------------------------------------------------------------------------
// Shared parts of the mechanism, independent of the entry type.
// ---------------------------------------------------------------------------
namespace classmodule {

// The class name and name space of a request path, read through the raw
// handle. On failure the matching error line "<operation>: Error getting
// classname, status.rc=%d!" (or namespace) is logged and the status given.
struct PathNames {
    const char* className = nullptr;
    const char* nameSpace = nullptr;
};
CmpiStatus readPathNames(const CmpiObjectPath& path, const std::string& operation, PathNames& names);

// The key text of a getInstance request. `found` is false, with the status to
// return, when the key could not be read ("Error getting key data") or is not
// a string ("Error invalid key data type", status OK).
struct KeyRead {
    bool found = false;
    CmpiStatus status;
    std::string text;
};
KeyRead readStringKey(const CmpiObjectPath& path, const char* keyName, const std::string& operation);

// Logs the miss and throws CmpiStatus(CMPI_RC_ERR_NOT_FOUND, key text).
// `matchingElement` non-null selects the single-instance form of the line.
[[noreturn]] void throwNotFound(const std::string& operation, const std::string& key,
                                const char* matchingElement);

void logInvalidSlot(const std::string& operation, const char* keyName);
void debugLine(const char* prefix, const std::string& operation);

// Checks a value against the row's CIM type before it is set as a property
// or key; a mismatch is a fault of the module's table and throws
// CMPI_RC_ERR_TYPE_MISMATCH naming the property. The two matches nearly every
// row gives (the declared type itself, a text for a string) are settled
// here, every other case by checkTypeOtherwise.
void checkTypeOtherwise(const char* name, CMPIType declared, const CmpiData& value);
inline void checkType(const char* name, CMPIType declared, const CmpiData& value)
{
    const CMPIType given = value.getType();
    if (given == declared || (given == CMPI_chars && declared == CMPI_string))
        return;
    checkTypeOtherwise(name, declared, value);
}

// The adapter walk of the builds: every protocol of every physical port of
// every adapter of the main tree, skipping null headers. Returns false when
// the library gives no adapter list.
template <class Visit>
bool walkProtocols(Visit&& visit)
{
    return forEachProtocol(std::forward<Visit>(visit));
}

void buildLine(bool entering, const char* stem, int index);

// The rows named by a null-terminated key list, in its order; null where no
// row has the name.
template <class Entry>
std::vector<const PropertyRow<Entry>*> rowsOfKeys(const char* const* keys, const PropertyRow<Entry>* rows,
                                                  std::size_t rowCount)
{
    std::vector<const PropertyRow<Entry>*> found;
    if (keys == nullptr)
        return found;
    for (std::size_t k = 0; keys[k] != nullptr; ++k) {
        const PropertyRow<Entry>* row = nullptr;
        for (std::size_t i = 0; i < rowCount && row == nullptr; ++i)
            if (std::strcmp(rows[i].name, keys[k]) == 0)
                row = &rows[i];
        found.push_back(row);
    }
    return found;
}

// makePath of both module kinds: the path on (nameSpace, className) with the
// keys from their rows in order; a missing row or an unset value is left out.
template <class Entry>
CmpiObjectPath pathFromRows(const char* className, const char* nameSpace,
                            const std::vector<const PropertyRow<Entry>*>& keyRows, const Entry& entry)
{
    CmpiObjectPath path(nameSpace, className);
    for (const PropertyRow<Entry>* row : keyRows) {
        if (row == nullptr)
            continue;
        PropertyValue value = row->value(entry);
        if (!value)
            continue;
        checkType(row->name, row->type, *value);
        path.setKey(row->name, *value);
    }
    return path;
}

// makeInstance of both module kinds: an instance on a key-less path, the
// property filter with `filterKeys`, then every row in order.
template <class Entry>
CmpiInstance instanceFromRows(const char* className, const char* nameSpace, const char** properties,
                              const char* const* filterKeys, const PropertyRow<Entry>* rows, std::size_t rowCount,
                              const Entry& entry)
{
    CmpiObjectPath path(nameSpace, className);
    CmpiInstance instance(path);
    if (properties != nullptr)
        instance.setPropertyFilter(properties, const_cast<const char**>(filterKeys));
    for (std::size_t i = 0; i < rowCount; ++i) {
        const PropertyRow<Entry>& row = rows[i];
        PropertyValue value = row.value(entry);
        if (!value)
            continue;
        checkType(row.name, row.type, *value);
        instance.setProperty(row.name, *value);
    }
    return instance;
}

// The start of a build of one slot per adapter or per physical port: the
// library's adapter list, with `list` holding that many zeroed slots,
// `capacity` their number and the list's count 0 for a dense fill. Null when
// the library gives no adapter list (the list untouched) or there is nothing
// to allocate.
enum class SlotPer { Adapter, PhyPort };
template <class Entry>
_zorap_adapter_list_t* startBuild(ClassList<Entry>& list, SlotPer per, int& capacity)
{
    _zorap_adapter_list_t* adapters = ZORAP_GetAdapterList();
    if (adapters == nullptr)
        return nullptr;
    capacity = 0;
    if (per == SlotPer::Adapter) {
        for (_zorap_adapter_t* a = adapters->firstAdapter; a != nullptr; a = a->next)
            ++capacity;
    } else {
        forEachPhyPortIn(adapters, [&](_zorap_adapter_t*, _zorap_phy_port_t*) { ++capacity; });
    }
    if (!list.allocate(capacity))
        return nullptr;
    list.count = 0;
    return adapters;
}

// The indexed operations on a slot that a lookup found; no slot (-1) gives a
// null handle (isNull()).
inline CmpiObjectPath pathOfSlot(CmpiObjectPath (*makePath)(const char*, const char*, int), int slot,
                                 const char* className, const char* nameSpace)
{
    if (slot < 0)
        return CmpiObjectPath(static_cast<CMPIObjectPath*>(nullptr));
    return makePath(className, nameSpace, slot);
}

inline CmpiInstance instanceOfSlot(CmpiInstance (*makeInstance)(const char*, const char*, const char**, int),
                                   int slot, const char* className, const char* nameSpace, const char** properties)
{
    if (slot < 0)
        return CmpiInstance(static_cast<CMPIInstance*>(nullptr));
    return makeInstance(className, nameSpace, properties, slot);
}

// The end of a dense build: the count is the number of valid slots.
template <class Entry>
void countValid(ClassList<Entry>& list)
{
    int valid = 0;
    for (int i = 0; i < list.count; ++i)
        if (list.entries[i].valid)
            ++valid;
    list.count = valid;
}

// The first slot below the list's count whose `tag` is `tag`, or -1.
template <class Entry>
int slotWithTag(const ClassList<Entry>& list, const char* tag)
{
    for (int i = 0; i < list.count; ++i)
        if (std::strcmp(list.entries[i].tag, tag) == 0)
            return i;
    return -1;
}

}  // namespace classmodule

// ---------------------------------------------------------------------------
// ClassModule: one class's tables and the operations made from them.
// ---------------------------------------------------------------------------
template <class Entry>
class ClassModule {
    static_assert(std::is_standard_layout<Entry>::value, "entry records are plain records");

public:
    // `stem` is the X of the operation names (enumInstances_X, ...).
    explicit ClassModule(const char* stem) : stem_(stem) {}

    // Where the slots are. A list module reads `list`; a single-instance module
    // has one fixed slot (no loop, and its miss line names the matching
    // element); a fixed module has `n` slots of its own with no `valid` test.
    ClassModule& list(ClassList<Entry>& l, ListKind kind)
    {
        list_ = &l;
        kind_ = kind;
        return *this;
    }
    ClassModule& single(const Entry& slot)
    {
        fixed_ = &slot;
        fixedCount_ = 1;
        single_ = true;
        return *this;
    }
    ClassModule& fixed(const Entry* slots, int n)
    {
        fixed_ = slots;
        fixedCount_ = n;
        return *this;
    }
    // The key that getInstance reads and compares (strcasecmp) with each slot.
    ClassModule& key(const char* name, const char* (*text)(const Entry&))
    {
        keyName_ = name;
        keyText_ = text;
        return *this;
    }
    // The `keys` of setPropertyFilter, null-terminated.
    ClassModule& filterKeys(const char* const* keys)
    {
        filterKeys_ = keys;
        return *this;
    }
    // The object path's keys in setKey order, null-terminated; each takes its
    // value from the property row of the same name.
    ClassModule& pathKeys(const char* const* keys)
    {
        pathKeyNames_ = keys;
        resolvePathKeys();
        return *this;
    }
    template <std::size_t N>
    ClassModule& properties(const PropertyRow<Entry> (&rows)[N])
    {
        rows_ = rows;
        rowCount_ = N;
        resolvePathKeys();
        return *this;
    }
    // The enumerations skip slots whose `valid` is 0.
    ClassModule& enumerationsTestValid()
    {
        enumTestsValid_ = true;
        return *this;
    }

    const char* stem() const { return stem_; }
    const char* keyName() const { return keyName_; }
    const char* const* filterKeys() const { return filterKeys_; }
    const PropertyRow<Entry>* rows() const { return rows_; }
    std::size_t rowCount() const { return rowCount_; }
    ClassList<Entry>* classList() const { return list_; }

    // Faults of the tables (a path key without a property row, a missing key
    // or property list), one text each; empty when the module is sound.
    std::vector<std::string> tableFaults() const
    {
        std::vector<std::string> faults;
        if (rows_ == nullptr || rowCount_ == 0)
            faults.push_back(std::string(stem_) + ": no property rows");
        if (keyName_ == nullptr || keyText_ == nullptr)
            faults.push_back(std::string(stem_) + ": no getInstance key");
        if (filterKeys_ == nullptr)
            faults.push_back(std::string(stem_) + ": no filter keys");
        if (pathKeyNames_ == nullptr)
            faults.push_back(std::string(stem_) + ": no path keys");
        for (std::size_t i = 0; pathKeyNames_ != nullptr && pathKeyNames_[i] != nullptr; ++i)
            if (i >= pathKeyRows_.size() || pathKeyRows_[i] == nullptr)
                faults.push_back(std::string(stem_) + ": path key " + pathKeyNames_[i] + " has no property row");
        if (list_ == nullptr && fixed_ == nullptr)
            faults.push_back(std::string(stem_) + ": no slots");
        return faults;
    }

    // ---- slots ----------------------------------------------------------------
    int slotCount() const { return list_ != nullptr ? list_->count : fixedCount_; }
    const Entry& slot(int index) const { return list_ != nullptr ? list_->entries[index] : fixed_[index]; }

    // ---- operations -----------------------------------------------------------

    // makePath_X: the path on (nameSpace, className) with the keys in order.
    // No test of `valid` or of the index: the caller guarantees it.
    CmpiObjectPath makePath(const char* className, const char* nameSpace, int index) const
    {
        return classmodule::pathFromRows(className, nameSpace, pathKeyRows_, slot(index));
    }

    // makeInstance_X: an instance on a key-less path, the property filter with
    // the module's keys, then every row in order.
    CmpiInstance makeInstance(const char* className, const char* nameSpace, const char** properties,
                              int index) const
    {
        return classmodule::instanceFromRows(className, nameSpace, properties, filterKeys_, rows_, rowCount_,
                                             slot(index));
    }

    CmpiStatus enumInstances(const CmpiContext&, CmpiResult& result, const CmpiObjectPath& path,
                             const char** properties) const
    {
        const std::string operation = std::string("enumInstances_") + stem_;
        return enumerate(operation, path, [&](const classmodule::PathNames& names, int index) {
            result.returnData(makeInstance(names.className, names.nameSpace, properties, index));
        });
    }

    CmpiStatus enumInstanceNames(const CmpiContext&, CmpiResult& result, const CmpiObjectPath& path) const
    {
        const std::string operation = std::string("enumInstanceNames_") + stem_;
        return enumerate(operation, path, [&](const classmodule::PathNames& names, int index) {
            result.returnData(makePath(names.className, names.nameSpace, index));
        });
    }

    // getInstance_X: the slot whose key equals the request's key, without
    // regard to case; the first valid one wins. A miss throws NOT_FOUND with
    // the key text. With sendInstance false nothing is delivered.
    CmpiStatus getInstance(const CmpiContext&, CmpiResult& result, const CmpiObjectPath& path,
                           const char** properties, bool sendInstance) const
    {
        const std::string operation = std::string("getInstance_") + stem_;
        classmodule::debugLine("Entering ", operation);
        classmodule::KeyRead key = classmodule::readStringKey(path, keyName_, operation);
        if (!key.found)
            return key.status;

        int match = -1;
        const int n = single_ ? 1 : slotCount();
        for (int i = 0; i < n && i < slotCount(); ++i) {
            const Entry& entry = slot(i);
            const char* text = keyText_(entry);
            if (text == nullptr || strcasecmp(key.text.c_str(), text) != 0)
                continue;
            if (list_ != nullptr && entry.valid != 1) {
                classmodule::logInvalidSlot(operation, keyName_);
                continue;
            }
            match = i;
            break;
        }
        if (match < 0)
            classmodule::throwNotFound(operation, key.text, single_ ? keyText_(slot(0)) : nullptr);

        if (sendInstance) {
            classmodule::PathNames names;
            CmpiStatus st = classmodule::readPathNames(path, operation, names);
            if (st.rc() != CMPI_RC_OK)
                return st;
            result.returnData(makeInstance(names.className, names.nameSpace, properties, match));
        }
        classmodule::debugLine("Exiting  ", operation);
        return CmpiStatus(CMPI_RC_OK);
    }

    // The two-pass build of a list module:
    //   1. walk the tree and count the protocols that `wants` accepts;
    //   2. allocate that many invalid slots (none: the list stays empty);
    //   3. walk again; for each wanted protocol log "Entering create<X>, index = %d",
    //      call `fill(adapter, phy, protocol, entry, index)`, and when it returns
    //      true set `valid` and log "Exiting  create<X>".
    // A full list fills slot after slot and keeps count at the capacity; a dense
    // list restarts count at 0 and counts only the slots that `fill` created,
    // so a declined slot is used by the next protocol; an ordinal list counts
    // like a dense one but fills slot after slot like a full one. A fill that
    // declines logs its own line instead of the "Exiting" line.
    // wants(adapter, phy, protocol) -> bool;
    // fill(adapter, phy, protocol, Entry&, int index) -> bool.
    template <class Wants, class Fill>
    void build(Wants&& wants, Fill&& fill) const
    {
        ClassList<Entry>& l = *list_;
        int wanted = 0;
        bool haveAdapters = classmodule::walkProtocols(
            [&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
                if (wants(a, p, pr))
                    ++wanted;
            });
        if (!haveAdapters || !l.allocate(wanted))
            return;
        const int capacity = wanted;
        if (kind_ != ListKind::Full)
            l.count = 0;
        int running = 0;
        classmodule::walkProtocols([&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
            if (!wants(a, p, pr))
                return;
            // A tree that grew between the passes finds no slot.
            const int index = kind_ == ListKind::Dense ? l.count : running;
            if (index >= capacity)
                return;
            classmodule::buildLine(true, stem_, index);
            Entry& entry = l.entries[index];
            const bool created = fill(a, p, pr, entry, index);
            if (created) {
                entry.valid = 1;
                if (kind_ != ListKind::Full)
                    ++l.count;
            }
            ++running;
            if (created)
                classmodule::buildLine(false, stem_, index);
        });
    }

private:
    template <class Deliver>
    CmpiStatus enumerate(const std::string& operation, const CmpiObjectPath& path, Deliver&& deliver) const
    {
        classmodule::debugLine("Entering ", operation);
        classmodule::PathNames names;
        CmpiStatus st = classmodule::readPathNames(path, operation, names);
        if (st.rc() != CMPI_RC_OK)
            return st;
        if (single_) {
            deliver(names, 0);
        } else {
            // count is read anew every turn
            for (int i = 0; i < slotCount(); ++i) {
                if (enumTestsValid_ && slot(i).valid == 0)
                    continue;
                deliver(names, i);
            }
        }
        classmodule::debugLine("Exiting  ", operation);
        return CmpiStatus(CMPI_RC_OK);
    }

    void resolvePathKeys() { pathKeyRows_ = classmodule::rowsOfKeys(pathKeyNames_, rows_, rowCount_); }

    const char* stem_;
    ClassList<Entry>* list_ = nullptr;
    ListKind kind_ = ListKind::Full;
    const Entry* fixed_ = nullptr;
    int fixedCount_ = 0;
    bool single_ = false;
    const char* keyName_ = nullptr;
    const char* (*keyText_)(const Entry&) = nullptr;
    const char* const* filterKeys_ = nullptr;
    const char* const* pathKeyNames_ = nullptr;
    std::vector<const PropertyRow<Entry>*> pathKeyRows_;
    const PropertyRow<Entry>* rows_ = nullptr;
    std::size_t rowCount_ = 0;
    bool enumTestsValid_ = false;
};

// ---------------------------------------------------------------------------
// The operation names of a module. In the module's header:
//     VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(FCPort)
// and in its source unit, after the module object:
//     VEXLAN_LIST_CLASS_OPERATIONS(FCPort, kFCPortModule)
// Single-instance modules use the _SINGLE_ forms: their makePath_X and
// makeInstance_X have no index.
// ---------------------------------------------------------------------------
#define VEXLAN_DECLARE_CLASS_REQUESTS(X)                                                                   \
    CmpiStatus enumInstances_##X(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,     \
                                 const char** properties);                                                 \
    CmpiStatus enumInstanceNames_##X(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path); \
    CmpiStatus getInstance_##X(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,       \
                               const char** properties, bool sendInstance)

#define VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(X)                                                        \
    CmpiObjectPath makePath_##X(const char* className, const char* nameSpace, int index);             \
    CmpiInstance makeInstance_##X(const char* className, const char* nameSpace, const char** properties, \
                                  int index);                                                         \
    VEXLAN_DECLARE_CLASS_REQUESTS(X)

#define VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(X)                                                      \
    CmpiObjectPath makePath_##X(const char* className, const char* nameSpace);                        \
    CmpiInstance makeInstance_##X(const char* className, const char* nameSpace, const char** properties); \
    VEXLAN_DECLARE_CLASS_REQUESTS(X)

#define VEXLAN_CLASS_ENUMERATIONS(X, module)                                                               \
    CmpiStatus enumInstances_##X(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,     \
                                 const char** properties)                                                  \
    {                                                                                                      \
        return (module).enumInstances(ctx, rslt, path, properties);                                        \
    }                                                                                                      \
    CmpiStatus enumInstanceNames_##X(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path) \
    {                                                                                                      \
        return (module).enumInstanceNames(ctx, rslt, path);                                                \
    }

#define VEXLAN_CLASS_REQUESTS(X, module)                                                                   \
    VEXLAN_CLASS_ENUMERATIONS(X, module)                                                                   \
    CmpiStatus getInstance_##X(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,       \
                               const char** properties, bool sendInstance)                                 \
    {                                                                                                      \
        return (module).getInstance(ctx, rslt, path, properties, sendInstance);                            \
    }

#define VEXLAN_LIST_CLASS_OPERATIONS(X, module)                                                        \
    CmpiObjectPath makePath_##X(const char* className, const char* nameSpace, int index)              \
    {                                                                                                  \
        return (module).makePath(className, nameSpace, index);                                         \
    }                                                                                                  \
    CmpiInstance makeInstance_##X(const char* className, const char* nameSpace, const char** properties, \
                                  int index)                                                          \
    {                                                                                                  \
        return (module).makeInstance(className, nameSpace, properties, index);                         \
    }                                                                                                  \
    VEXLAN_CLASS_REQUESTS(X, module)

// makePath_X and makeInstance_X of a single instance.
#define VEXLAN_SINGLE_CLASS_MAKERS(X, module)                                                          \
    CmpiObjectPath makePath_##X(const char* className, const char* nameSpace)                         \
    {                                                                                                  \
        return (module).makePath(className, nameSpace, 0);                                             \
    }                                                                                                  \
    CmpiInstance makeInstance_##X(const char* className, const char* nameSpace, const char** properties) \
    {                                                                                                  \
        return (module).makeInstance(className, nameSpace, properties, 0);                             \
    }

#define VEXLAN_SINGLE_CLASS_OPERATIONS(X, module) \
    VEXLAN_SINGLE_CLASS_MAKERS(X, module)         \
    VEXLAN_CLASS_REQUESTS(X, module)

#endif
