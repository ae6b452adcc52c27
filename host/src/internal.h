// Internals shared by the broker (broker.cpp) and the host (host.cpp): the
// encapsulated CMPI objects, the arenas that own them, and the host's state.
#pragma once

#include <cmpift.h>

#include <atomic>
#include <condition_variable>
#include <deque>
#include <map>
#include <mutex>
#include <set>
#include <shared_mutex>
#include <unordered_map>
#include <unordered_set>

#include "cimhost/check.h"
#include "cimhost/host.h"

namespace cimhost {
namespace detail {

struct Arena;

// Base of every encapsulated object the broker hands out. `hdl` of the CMPI
// struct points at the object itself.
struct Obj {
    virtual ~Obj() = default;
    Host::Impl* core = nullptr;
    Arena* arena = nullptr;
};

// Owns broker objects until the request, the attached thread or the loaded
// provider that they belong to ends. release() takes one out early.
struct Arena {
    explicit Arena(unsigned long long i, bool scope = false) : id(i), threadScope(scope) {}
    ~Arena();
    void adopt(Obj* o);
    void forget(Obj* o);
    const unsigned long long id;
    // A request's or an attached thread's arena (not one of mark): the
    // thread may make broker calls.
    const bool threadScope;
    std::mutex m;
    std::unordered_set<Obj*> objs;
};

struct EncString : Obj {
    CMPIString enc{};
    std::string s;
    bool null = false;
};

struct EncDateTime : Obj {
    CMPIDateTime enc{};
    DateTime dt;
};

struct EncPath : Obj {
    CMPIObjectPath enc{};
    ObjectPath p;
};

struct EncArray : Obj {
    CMPIArray enc{};
    Type elemType = Type::Null;
    std::vector<Value> elems;   // null Values of elemType until set
    // A uint8 array made from a byte array value keeps its bytes here
    // (shared until the provider sets an element), and elems stays empty.
    std::shared_ptr<const std::vector<std::uint8_t>> bytes;
};

struct EncInstance : Obj {
    CMPIInstance enc{};
    Instance inst;
    bool filtered = false;
    std::vector<std::string> filter;   // wanted properties; keys always kept
    std::vector<std::string> filterKeys;
    bool wanted(const std::string& name) const;
};

struct EncArgs : Obj {
    CMPIArgs enc{};
    std::vector<NamedValue> args;
};

struct EncContext : Obj {
    CMPIContext enc{};
    std::vector<NamedValue> entries;
};

struct EncEnum : Obj {
    CMPIEnumeration enc{};
    std::vector<Value> items;
    mutable size_t next = 0;
};

enum class ResultKind { Instances, Paths, Data, Method };

struct EncResult : Obj {
    CMPIResult enc{};
    ResultKind kind = ResultKind::Instances;
    std::mutex m;
    OpResult* sink = nullptr;
    // A GetInstance result: see Host::setRefuseEmptyGetInstance.
    bool expectsOneInstance = false;
};

struct EncSelectExp : Obj {
    CMPISelectExp enc{};
    std::string query;
    std::string lang;
    std::string fromClass;
};

// The function tables of the encapsulated types and the broker.
struct Tables {
    CMPIBrokerFT bft;
    CMPIBrokerEncFT eft;
    CMPIBrokerExtFT xft;
    CMPIBrokerMemFT mft;
    CMPIStringFT stringFT;
    CMPIDateTimeFT dateTimeFT;
    CMPIObjectPathFT pathFT;
    CMPIArrayFT arrayFT;
    CMPIInstanceFT instanceFT;
    CMPIArgsFT argsFT;
    CMPIContextFT contextFT;
    CMPIEnumerationFT enumFT;
    CMPIResultFT resultFT;
    CMPISelectExpFT selectFT;
};
Tables& tables();

// Pushes an arena onto this thread's stack for the life of a request.
class RequestScope {
public:
    explicit RequestScope(Host::Impl* core);
    ~RequestScope();
    RequestScope(const RequestScope&) = delete;
    RequestScope& operator=(const RequestScope&) = delete;

private:
    Host::Impl* core_;
    unsigned long long id_;
};

// Object factories; the object lands in this thread's current arena of
// `core`, or in the provider-life arena when the thread has none.
EncString* newString(Host::Impl* core, std::string s);
EncPath* newPath(Host::Impl* core, ObjectPath p);
EncInstance* newInstance(Host::Impl* core, Instance i);
EncArgs* newArgs(Host::Impl* core, std::vector<NamedValue> a);
EncContext* newContext(Host::Impl* core, const std::string& ns);
EncResult* newResult(Host::Impl* core, ResultKind kind, OpResult* sink);
EncSelectExp* newSelectExp(Host::Impl* core, const std::string& query, const std::string& lang);
EncDateTime* newDateTime(Host::Impl* core, const DateTime& dt);
EncArray* newArray(Host::Impl* core, Type elemType, std::vector<Value> elems);
EncArray* newByteArray(Host::Impl* core, std::shared_ptr<const std::vector<std::uint8_t>> bytes);

// Conversions between CMPI values and host values. toValue returns a CMPI
// rc: CMPI_RC_OK, or CMPI_RC_ERR_INVALID_DATA_TYPE for what the host cannot hold.
CMPIrc toValue(const CMPIValue* v, CMPIType type, Value& out);
CMPIData toData(Host::Impl* core, const Value& v);
std::string stringOf(const CMPIString* s);
// The instance as the client sees it (with its path's keys filled from key
// properties of its class).
ObjectPath instancePath(const Host::Impl* core, const Instance& inst);

// The class after FROM in "SELECT ... FROM Class ..."; false if none.
bool queryClass(const std::string& query, std::string& cls);


}  // namespace detail

struct ActiveFilter {
    int id = 0;
    std::string query;
    std::string fromClass;
    std::string sourceNs;
};

struct MiEntry {
    MiType type;
    std::string section;   // registration section ("" for the flavour of one MI per type)
    void* mi = nullptr;    // CMPIInstanceMI* etc.
};

using detail::Arena;

struct Host::Impl {
    Impl();
    ~Impl();

    CMPIBroker broker{};
    // Read by provider threads (newInstance, deliverIndication) too.
    std::atomic<Flavour> flavour{Flavour::Pegasus};
    std::atomic<bool> strict{false};
    std::atomic<bool> refuseEmptyGetInstance{false};
    std::atomic<bool> missingKeyMessage{false};
    std::string defaultNs = "root/cimv2";
    ClassRepository repo;
    std::vector<Registration> registrations;

    // Provider library.
    std::shared_mutex opLock;   // operations shared, load/unload exclusive
    std::mutex miLock;
    void* lib = nullptr;
    std::string libPath, name;
    void* factories[4] = {nullptr, nullptr, nullptr, nullptr};
    std::vector<MiEntry> mis;

    // Arenas: id -> arena, and the arena that lives as long as the provider
    // stays loaded (prepared contexts, clones, objects made on threads that
    // are not attached).
    std::mutex arenaLock;
    std::unordered_map<unsigned long long, Arena*> arenas;
    std::unique_ptr<Arena> lifeArena;
    std::set<void*> mallocs;   // cmpiMalloc blocks not yet freed
    std::mutex mallocLock;

    Arena* currentArena();
    unsigned long long pushArena(bool threadScope = false);   // on this thread
    // True on a request thread or an attached thread of this host.
    bool onServerThread();
    void popArena(unsigned long long id);        // and free it
    void freeAllArenas();
    // dlclose()s the library, then frees what it kept (opLock held).
    void closeLibrary();

    // Indications.
    std::mutex indLock;
    std::condition_variable indCv;
    std::deque<Indication> queue;
    std::function<void(const Indication&)> listener;
    std::vector<ActiveFilter> filters;
    int nextFilterId = 1;
    bool indicationsEnabled = false;
    // `serverThread`: delivered on a request thread or an attached thread.
    void deliver(const std::string& ns, Instance inst, bool serverThread);

    mutable std::mutex counterLock;
    Counters counters;
    void event(const std::string& e);

    // Provider log and trace lines (logMessage, trace), and host notes.
    mutable std::mutex logLock;
    std::function<void(const std::string&)> logSink;
    std::deque<std::string> logLines;
    void log(const std::string& line);

    // Operations.
    void* getMi(MiType type, const std::string& cls, OpResult& r);
    std::string sectionFor(const std::string& cls, MiType type) const;
    // The provider's association classes that OpenPegasus would call it for
    // from an object of `sourceClass`: each one that has a reference to that
    // class or a class it derives from, and is `named` or derives from it
    // (every such class when `named` is empty).
    std::vector<std::string> associationClassesFor(const std::string& sourceClass, const std::string& named) const;
    std::string nsOf(const ObjectPath& p) const { return p.nameSpace.empty() ? defaultNs : p.nameSpace; }
    ObjectPath withNs(const ObjectPath& p) const {
        ObjectPath q = p;
        q.nameSpace = nsOf(p);
        return q;
    }
    void finishStrict(OpResult& r) const;
};

}  // namespace cimhost
