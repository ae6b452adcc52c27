// The embedded CIM host: loads a CMPI 2.0 provider library, acts as its
// broker and runs CIM operations against it, as OpenPegasus or sfcb would.
//
//   cimhost::Host h;
//   h.setStrict(true);
//   h.loadMof("mof/");                       // class declarations
//   h.load("build/lib/libX.so", "X");        // X_Create_InstanceMI ...
//   auto r = h.enumerateInstances(cls);      // r.rc, r.message, r.instances
//
// Operations may be called from several threads at once; load/unload must
// not overlap with operations (they wait for running ones to finish).
#pragma once

#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "cimhost/repository.h"
#include "cimhost/value.h"

namespace cimhost {

// How the host calls a provider where the two servers differ.
enum class Flavour {
    // Each factory once per load, lazily at the first request of its type;
    // indications: activateFilter, enableIndications on the first filter,
    // deActivateFilter, disableIndications after the last.
    Pegasus,
    // Each factory once per registered class section and provider type;
    // indications: authorizeFilter, mustPoll, activateFilter,
    // enableIndications on the first filter; deActivateFilter only at the end.
    Sfcb,
};
bool flavourFromName(const std::string& name, Flavour& out);
const char* flavourName(Flavour f);

enum class MiType { Instance = 0, Association = 1, Method = 2, Indication = 3 };
const char* miTypeName(MiType t);   // "Instance", "Association", ...

// CMPI status: rc is a CMPIrc value.
struct Status {
    int rc = 0;
    std::string message;
    bool ok() const { return rc == 0; }
};
// "CMPI_RC_ERR_NOT_FOUND" for 6, and so on.
const char* rcName(int rc);
// "CMPI_RC_ERR_NOT_FOUND: message" (or the name alone).
std::string statusLine(const Status& s);

struct OpResult : Status {
    std::vector<Instance> instances;    // returnInstance
    std::vector<ObjectPath> paths;      // returnObjectPath
    std::vector<Value> data;            // returnData (a method's return value is the first)
    std::vector<NamedValue> outArgs;    // InvokeMethod output arguments
    bool done = false;                  // the provider called returnDone
    std::vector<std::string> strictErrors;
};

// Names of the properties wanted; nullopt asks for all.
using PropertyList = std::optional<std::vector<std::string>>;

// Association operation parameters; an empty text is passed as NULL.
struct AssocParams {
    std::string assocClass;    // associators, associatorNames
    std::string resultClass;
    std::string role;
    std::string resultRole;    // associators, associatorNames
};

// One delivered indication. `nameSpace` is the namespace the server gives it
// (OpenPegasus matches filters by it; sfcb matches by class only);
// `deliveredTo` the namespace argument of deliverIndication.
// `error` is set when strict checking failed.
struct Indication {
    std::string nameSpace;
    std::string deliveredTo;
    Instance instance;
    std::string error;
};

// A registration section as sfcb has one per class: the class and which
// provider types serve it.
struct Registration {
    std::string className;
    std::vector<MiType> types;
};

// What the host did with the provider, for tests.
struct Counters {
    int loads = 0;
    int unloads = 0;          // dlclose calls
    int factoryCalls[4] = {0, 0, 0, 0};   // indexed by MiType
    int cleanupCalls = 0;
    int indicationsDelivered = 0;
    int indicationsDropped = 0;
    int indicationsFromUnattachedThreads = 0;   // deliverIndication on a thread the host does not know
    int classPathIsACalls = 0;   // the broker's classPathIsA, every call
    std::vector<std::string> events;   // "activateFilter first=1", "enableIndications", ...
};

class Host {
public:
    Host();
    ~Host();   // unloads with cleanup(terminating = true)
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    void setFlavour(Flavour f);
    Flavour flavour() const;
    void setStrict(bool on);
    bool strict() const;
    // OpenPegasus refuses returnDone of a GetInstance that delivered no
    // instance ("Too few objects delivered.", CMPI_RC_ERR_FAILED). Off by
    // default; on, the host answers returnDone that way, so a test can check
    // what a provider makes of the refusal.
    void setRefuseEmptyGetInstance(bool on);
    // getKey of a key that the path does not have reports CMPI_RC_ERR_NOT_FOUND
    // with a message ("no key X in the path") instead of none.
    void setMissingKeyMessage(bool on);
    void setDefaultNamespace(const std::string& ns);   // "root/cimv2" unless set
    const std::string& defaultNamespace() const;

    ClassRepository& classes();
    const ClassRepository& classes() const;
    Status loadMof(const std::string& fileOrDir);
    // Sections for the sfcb flavour. Without any, every class of the
    // repository is a section (instance; association if it has the
    // Association qualifier; method if it declares methods; indication if it
    // has the Indication qualifier), and a class-less section serves the rest.
    void setRegistrations(std::vector<Registration> regs);

    // dlopen()s the library and checks its factories `<name>_Create_<T>MI`.
    // Refuses a library that exports none of them, or `_Generic_Create_<T>MI`
    // beside them. Factories are called later, as the flavour does.
    Status load(const std::string& libraryPath, const std::string& providerName);
    // Calls cleanup on every MI created. With terminating false a provider
    // may veto the unload (CMPI_RC_DO_NOT_UNLOAD / NEVER_UNLOAD): the MIs that
    // vetoed stay and the library stays loaded, and the status says so.
    // Otherwise the library is dlclose()d. Unloading an unloaded host is OK.
    Status unload(bool terminating = true);
    // dlclose()s the library without calling any cleanup, as a server that
    // lost track of its MIs would: what the provider still runs must end in
    // its own unload code.
    Status unloadWithoutCleanup();
    bool loaded() const;
    std::string providerName() const;

    OpResult enumerateInstanceNames(const ObjectPath& classPath);
    OpResult enumerateInstances(const ObjectPath& classPath, const PropertyList& props = std::nullopt);
    OpResult getInstance(const ObjectPath& path, const PropertyList& props = std::nullopt);
    OpResult createInstance(const ObjectPath& path, const Instance& inst);
    OpResult modifyInstance(const ObjectPath& path, const Instance& inst,
                            const PropertyList& props = std::nullopt);
    OpResult deleteInstance(const ObjectPath& path);
    // Association requests as the flavour's server makes them: sfcb hands
    // the provider the parameters as given; OpenPegasus calls the provider
    // once per association class of the provider that can reference the
    // source's class and is the given class or derives from it (all such
    // classes when none is given), with that class as assocClass
    // (associators) or resultClass (references), and merges the answers.
    // The provider's association classes are those of the registrations
    // (setRegistrations) with the association type, or without any the
    // concrete association classes of the repository that have no subclass.
    OpResult associators(const ObjectPath& path, const AssocParams& p = {},
                         const PropertyList& props = std::nullopt);
    OpResult associatorNames(const ObjectPath& path, const AssocParams& p = {});
    OpResult references(const ObjectPath& path, const AssocParams& p = {},
                        const PropertyList& props = std::nullopt);
    OpResult referenceNames(const ObjectPath& path, const AssocParams& p = {});
    // One call of the provider with the parameters as they stand, whatever
    // the flavour.
    OpResult associatorsAsCalled(const ObjectPath& path, const AssocParams& p,
                                 const PropertyList& props = std::nullopt);
    OpResult associatorNamesAsCalled(const ObjectPath& path, const AssocParams& p);
    OpResult referencesAsCalled(const ObjectPath& path, const AssocParams& p,
                                const PropertyList& props = std::nullopt);
    OpResult referenceNamesAsCalled(const ObjectPath& path, const AssocParams& p);
    OpResult invokeMethod(const ObjectPath& path, const std::string& method, const std::vector<NamedValue>& in);

    // Subscribes with a WQL filter "SELECT * FROM <IndicationClass> [...]" whose
    // source namespace is `sourceNs` (default namespace when empty). Calls the
    // indication MI in the flavour's order. `filterId` identifies it for
    // deactivateFilter.
    Status activateFilter(const std::string& query, const std::string& sourceNs, int& filterId);
    Status deactivateFilter(int filterId);

    // Takes the oldest received indication, waiting up to `timeout`.
    bool waitIndication(Indication& out, std::chrono::milliseconds timeout);
    // Called on the provider's thread for every indication received (after it
    // is queued). Must not call back into the host's operations.
    void setIndicationListener(std::function<void(const Indication&)> listener);

    Counters counters() const;

    // Lines the provider logged through the broker (logMessage, trace) and
    // the host's own notes (cleanup failures). Kept in memory (the newest
    // 10000) and passed to the sink, if set, as they come.
    void setLogSink(std::function<void(const std::string&)> sink);
    std::vector<std::string> logLines() const;

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

}  // namespace cimhost
