// The association module mechanism: what every association class of the
// provider is made of, held once.
//
// An association has no list of its own: its instances are pairs of class
// instances that a join finds at the moment of the request. A module is one
// row (AssocRow): the association class, its two ends (role property and end
// class), its form, and three join functions:
//
//   - role2Search: the source path is a role 1 object; visit its role 2 partners;
//   - role1Search: the source path is a role 2 object; visit its role 1 partners;
//   - pairs:       every pair that enumInstances answers.
//
// The engine turns a row into the seven operations (referenceNames,
// references, associatorNames, associators, enumInstances, enumInstanceNames,
// getInstance) of one of the two forms:
//
//   - plain: the role, resultRole and resultClass filters are ignored, keys
//     are read with CmpiObjectPath::getKey (a missing key throws), a computer
//     system end is also recognised as CIM_System and CIM_ComputerSystem, and
//     the log lines read "Entering <op>" / "Exiting  <op>";
//   - filtering: the filters are tested with MatchRole and MatchResultClass,
//     keys are read through the path's own getKey with its status (a failure
//     is logged under the module's file stem and returned), reference paths
//     are built with addKey, and the log line is "<File>: <op> was called".
//
// A row whose association departs from the contract brings its own
// operations (AssocOps). Modules take no lock and keep nothing between calls:
// the dispatcher holds provider_lock.
#ifndef VEXLAN_ASSOCIATIONS_ASSOCMODULE_H
#define VEXLAN_ASSOCIATIONS_ASSOCMODULE_H

#include <functional>
#include <string>

#include "CmpiImpl.h"
#include "state/ModuleOps.h"
#include "support/RequestLists.h"

struct _CNAStruc;
struct _CNAPortStruc;
struct _RegisteredProfile;

// What a traversal hands back for each partner.
enum FuncType { FUNC_ASSOC = 0, FUNC_ASSOCNAME = 1, FUNC_REF = 2, FUNC_REFNAME = 3 };

// The namespace in which every class of the provider is served. Paths that
// the provider builds for the objects of a search or an enumeration (the
// partners, the ends of a pair) name it, whatever namespace the request came
// in, so that a client can follow them: a request in the interop namespace
// reaches ports and systems that are served only here.
extern const char kModelNamespace[];

// True if `role` is null or empty, or names `name` without regard to case.
bool MatchRole(const char* role, const char* name);
// True if `resultClass` is null or empty, or the class (on that namespace)
// is one of it.
bool MatchResultClass(const char* resultClass, const char* nameSpace, const char* className);
bool MatchResultClass(const char* resultClass, const CmpiString& nameSpace, const char* className);

// One instance of an end class: a list slot, an adapter, a port, a profile.
struct EndItem {
    int index = -1;
    _CNAStruc* adapter = nullptr;
    _CNAPortStruc* port = nullptr;
    _RegisteredProfile* profile = nullptr;
    int kind = 0;   // NIC software identities: 2 driver, 3 flash firmware
};

// A class at an end of associations: how to make the path and the instance
// of one of its items, how to prove that a path names one, and its list.
struct EndClass {
    const char* className;
    CmpiObjectPath (*makePath)(const char* className, const char* nameSpace, const EndItem& item);
    CmpiInstance (*makeInstance)(const char* className, const char* nameSpace, const char** properties,
                                 const EndItem& item);
    GetInstanceOp getInstance;
    ListOps list;   // build and remove of the class's list (or nothing)
};

enum class AssocForm {
    Plain,          // with build and remove of both ends
    PlainNoBuild,   // plain, without the build and remove pair
    Filtering,
};

struct AssocRow;

// One search or enumeration in progress: the row, the request, and what the
// join functions use to read the source's keys and to answer.
class AssocRequest {
public:
    AssocRequest(const AssocRow& row, CmpiResult& result, const CmpiObjectPath& source, const char** properties,
                 FuncType funcType, bool sourceIsRole1);

    const AssocRow& row;
    const CmpiObjectPath& source;

    // The text of a key of the source path; false when the key can't be read
    // (filtering form: logged, and the request ends with that status; plain
    // form: the wrapper throws instead).
    bool key(const char* name, std::string& out);
    // The partner step for one partner of the other end; false when the
    // request must end (a failed addKey, filtering form).
    bool partner(const EndItem& item);

    // Used by the engine.
    bool readNameSpace();
    const CmpiStatus& status() const { return status_; }
    FuncType funcType() const { return funcType_; }
    const char* nameSpace() const { return nameSpace_.c_str(); }

private:
    CmpiResult& result_;
    const char** properties_;
    FuncType funcType_;
    bool sourceIsRole1_;
    std::string nameSpace_;
    CmpiStatus status_;
};

// A join: visit each partner with request.partner(item); return false to end
// the request with request.status() (a key that couldn't be read).
using SearchFn = bool (*)(AssocRequest& request);
// Every pair of enumInstances: call pair(item1, item2) for each, in order.
using PairFn = std::function<void(const EndItem&, const EndItem&)>;
using PairsFn = void (*)(const PairFn& pair);

// A uint16 property that some references carry after their two roles.
struct ExtraProperty {
    const char* name = nullptr;
    unsigned short value = 0;
    bool onReferences = false;    // FUNC_REF instances
    bool onEnumeration = false;   // enumInstances instances
};

// The seven operations of a row, when the row brings its own.
struct AssocOps {
    CmpiStatus (*referenceNames)(const AssocRow&, const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                 const char* resultClass, const char* role);
    CmpiStatus (*references)(const AssocRow&, const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                             const char* resultClass, const char* role, const char** properties);
    CmpiStatus (*associatorNames)(const AssocRow&, const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                  const char* assocClass, const char* resultClass, const char* role,
                                  const char* resultRole);
    CmpiStatus (*associators)(const AssocRow&, const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                              const char* assocClass, const char* resultClass, const char* role,
                              const char* resultRole, const char** properties);
    CmpiStatus (*enumInstances)(const AssocRow&, const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                const char** properties);
    CmpiStatus (*enumInstanceNames)(const AssocRow&, const CmpiContext&, CmpiResult&, const CmpiObjectPath&);
    CmpiStatus (*getInstance)(const AssocRow&, const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                              const char** properties, bool sendInstance);
};

// Departures of single rows from their form.
enum AssocFlag : unsigned {
    // A failed namespace read in a find function is logged as
    // "<stem>-findMatchedRole<n>InstancesOrReferences: Error getting namespace, status.rc=%d!".
    kAssocNamespaceLog = 1u << 0,
    // A source of neither end is logged before the throw, with the class name
    // read through the path's own call.
    kAssocUnsupportedClassLog = 1u << 1,
    // A plain row whose keys are read through the path's own call, with the
    // type tested and a failure logged and returned, as the filtering form does.
    kAssocCheckedKeys = 1u << 2,
};

struct AssocEnd {
    const char* role;        // the role property: GroupComponent, Antecedent, ...
    const EndClass* cls;
};

struct AssocRow {
    const char* assocClass;  // Vexlan_FCHBA_ComputerSystemFCPort
    const char* stem;        // AssocComputerSystemFCPort: the X of the operation names
    const char* file;        // log stem of the filtering form: "Assoc_ComputerSystem_EthernetPort"
    AssocForm form;
    AssocEnd end1;
    AssocEnd end2;
    SearchFn role2Search;    // source is role 1
    SearchFn role1Search;    // source is role 2
    PairsFn pairs;
    ExtraProperty extra;
    // getInstance_X proves the ends through these (null: the end classes').
    GetInstanceOp check1;
    GetInstanceOp check2;
    const AssocOps* ops;     // null: the contract's operations
    unsigned flags;          // AssocFlag bits
};

// The contract's operations of a row (or the row's own).
CmpiStatus assocReferenceNames(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                               const CmpiObjectPath& path, const char* resultClass, const char* role);
CmpiStatus assocReferences(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                           const char* resultClass, const char* role, const char** properties);
CmpiStatus assocAssociatorNames(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                                const CmpiObjectPath& path, const char* assocClass, const char* resultClass,
                                const char* role, const char* resultRole);
CmpiStatus assocAssociators(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                            const char* assocClass, const char* resultClass, const char* role,
                            const char* resultRole, const char** properties);
CmpiStatus assocEnumInstances(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                              const CmpiObjectPath& path, const char** properties);
CmpiStatus assocEnumInstanceNames(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                                  const CmpiObjectPath& path);
CmpiStatus assocGetInstance(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                            const CmpiObjectPath& path, const char** properties, bool sendInstance);
// The build and remove of a plain row: both ends' lists, role 1 first.
void assocBuild(const AssocRow& row);
void assocRemove(const AssocRow& row);

// The instance routes and list operations of a row, as the provider's
// tables take them.
template <const AssocRow& R>
CmpiStatus assocRouteEnumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path)
{
    return assocEnumInstanceNames(R, ctx, rslt, path);
}
template <const AssocRow& R>
CmpiStatus assocRouteEnumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                                   const char** properties)
{
    return assocEnumInstances(R, ctx, rslt, path, properties);
}
template <const AssocRow& R>
CmpiStatus assocRouteGetInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                                 const char** properties, bool sendInstance)
{
    return assocGetInstance(R, ctx, rslt, path, properties, sendInstance);
}
template <const AssocRow& R>
void assocRouteBuild()
{
    assocBuild(R);
}
template <const AssocRow& R>
void assocRouteRemove()
{
    assocRemove(R);
}
#define ASSOC_CLASS_OPS(row) \
    ClassOps { assocRouteEnumInstanceNames<row>, assocRouteEnumInstances<row>, assocRouteGetInstance<row> }
#define ASSOC_LIST_OPS(row) \
    ListOps { assocRouteRemove<row>, assocRouteBuild<row> }

// Text helpers of the joins: the text behind the last "_", before the first
// "_", between the first and the second "_" (empty when the text has none).
std::string suffixToken(const std::string& text);
std::string prefixToken(const std::string& text);
std::string secondToken(const std::string& text);
bool sameText(const std::string& a, const std::string& b);   // strcasecmp

#endif
