// The association module engine: the seven operations of every row, in the
// plain and the filtering form.
#include "associations/AssocModule.h"

#include <strings.h>

#include <cstdint>
#include <cstring>

#include "support/ClassTests.h"
#include "support/RequestLists.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

namespace {

#define ASSOC_DEBUG(...)                                   \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)
#define ASSOC_ERROR(...)                                 \
    do {                                                 \
        if (g_EnableLogError)                            \
            Vexlan_FC_Utils_CMPI::LogError(__VA_ARGS__); \
    } while (0)

bool filtering(const AssocRow& row)
{
    return row.form == AssocForm::Filtering;
}

const char* textOf(CMPIString* s)
{
    return s != nullptr && s->ft != nullptr ? s->ft->getCharPtr(s, nullptr) : nullptr;
}

std::string opName(const char* op, const AssocRow& row)
{
    return std::string(op) + "_" + row.stem;
}

// "Entering <op>" (plain) or "<File>: <op> was called" (filtering).
void enteringLine(const AssocRow& row, const std::string& op)
{
    if (filtering(row))
        ASSOC_DEBUG("%s: %s was called\n", row.file, op.c_str());
    else
        ASSOC_DEBUG("Entering %s", op.c_str());
}

void exitingLine(const AssocRow& row, const std::string& op)
{
    if (!filtering(row))
        ASSOC_DEBUG("Exiting  %s", op.c_str());
}

// Plain rows with the computer system as their first end also know it by the
// CIM classes it derives from.
bool isRole1(const AssocRow& row, const CmpiObjectPath& path)
{
    if (classtests::isAFixed(path, row.end1.cls->className))
        return true;
    if (filtering(row) || std::strcmp(row.end1.cls->className, "Vexlan_Adapter_ComputerSystem") != 0)
        return false;
    return classtests::isAFixed(path, "CIM_System") || classtests::isAFixed(path, "CIM_ComputerSystem");
}

bool isRole2(const AssocRow& row, const CmpiObjectPath& path)
{
    return classtests::isAFixed(path, row.end2.cls->className);
}

// A source of neither end: the class name goes into the thrown status. A row
// that logs it reads the name through the path's own call first, and returns
// the status of a failed read instead of throwing.
CmpiStatus neitherEnd(const AssocRow& row, const std::string& op, const CmpiObjectPath& path)
{
    if (row.flags & kAssocUnsupportedClassLog) {
        CMPIObjectPath* enc = path.getEnc();
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        CMPIString* name = enc->ft->getClassName(enc, &rc);
        if (rc.rc != CMPI_RC_OK) {
            ASSOC_ERROR("%s: Error getting classname, status.rc=%d!", op.c_str(), static_cast<int>(rc.rc));
            return CmpiStatus(rc);
        }
        // The line has always shown the class name's address as a number; its
        // low 32 bits are printed, as a decimal.
        const char* text = textOf(name);
        ASSOC_ERROR("%s: Error unsupported class, classname=%d!", op.c_str(),
                    static_cast<int>(static_cast<std::uint32_t>(reinterpret_cast<std::uintptr_t>(text))));
    }
    const std::string cls = path.getClassName().charPtr();
    throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, cls.c_str());
}

CmpiStatus search(const AssocRow& row, CmpiResult& rslt, const CmpiObjectPath& path, const char** properties,
                  FuncType funcType, bool sourceIsRole1)
{
    AssocRequest request(row, rslt, path, properties, funcType, sourceIsRole1);
    if (!request.readNameSpace())
        return request.status();
    const SearchFn fn = sourceIsRole1 ? row.role2Search : row.role1Search;
    if (fn != nullptr && !fn(request))
        return request.status();
    return CmpiStatus(CMPI_RC_OK);
}

// The four traversals. `resultClassOfRef` is the association class test of the
// reference operations; the associator operations test the partner's class
// and both roles instead.
CmpiStatus traverse(const AssocRow& row, const std::string& op, CmpiResult& rslt, const CmpiObjectPath& path,
                    const char* resultClass, const char* role, const char* resultRole, const char** properties,
                    FuncType funcType)
{
    enteringLine(row, op);
    const bool references = funcType == FUNC_REF || funcType == FUNC_REFNAME;
    if (!filtering(row)) {
        CmpiStatus st(CMPI_RC_OK);
        if (isRole1(row, path))
            st = search(row, rslt, path, properties, funcType, true);
        else if (isRole2(row, path))
            st = search(row, rslt, path, properties, funcType, false);
        else
            return neitherEnd(row, op, path);
        exitingLine(row, op);
        return st;
    }
    const CmpiString ns = path.getNameSpace();
    if (references && !MatchResultClass(resultClass, ns, row.assocClass))
        return CmpiStatus(CMPI_RC_OK);
    for (int sourceRole = 1; sourceRole <= 2; ++sourceRole) {
        const bool role1 = sourceRole == 1;
        if (!(role1 ? classtests::isAFixed(path, row.end1.cls->className) : isRole2(row, path)))
            continue;
        const AssocEnd& own = role1 ? row.end1 : row.end2;
        const AssocEnd& other = role1 ? row.end2 : row.end1;
        if (references) {
            if (!MatchRole(role, own.role))
                return CmpiStatus(CMPI_RC_OK);
        } else if (!MatchResultClass(resultClass, ns, other.cls->className) || !MatchRole(role, own.role) ||
                   !MatchRole(resultRole, other.role)) {
            return CmpiStatus(CMPI_RC_OK);
        }
        return search(row, rslt, path, properties, funcType, role1);
    }
    return neitherEnd(row, op, path);
}

const char* findName(bool sourceIsRole1)
{
    return sourceIsRole1 ? "findMatchedRole2" : "findMatchedRole1";
}

CmpiData refData(const CmpiObjectPath& p)
{
    return CmpiData(p);
}

// An instance of the association of `path` with its two role references,
// and the row's uint16 property when `withExtra`.
CmpiInstance pairInstance(const AssocRow& row, const CmpiObjectPath& path, const CmpiObjectPath& p1,
                          const CmpiObjectPath& p2, bool withExtra)
{
    CmpiInstance instance(path);
    instance.setProperty(row.end1.role, refData(p1));
    instance.setProperty(row.end2.role, refData(p2));
    if (row.extra.name != nullptr && withExtra)
        instance.setProperty(row.extra.name, CmpiData(static_cast<CMPIUint16>(row.extra.value)));
    return instance;
}

// Sets the two role keys of a reference path: setKey (plain) or the path's
// own addKey with the reference type, whose failure is logged and returned.
bool setRoleKeys(const AssocRow& row, CmpiObjectPath& target, const CmpiObjectPath& p1, const CmpiObjectPath& p2,
                 const char* where, CmpiStatus& status)
{
    if (!filtering(row)) {
        target.setKey(row.end1.role, refData(p1));
        target.setKey(row.end2.role, refData(p2));
        return true;
    }
    CMPIObjectPath* enc = target.getEnc();
    const CmpiObjectPath* ends[2] = {&p1, &p2};
    const char* roles[2] = {row.end1.role, row.end2.role};
    for (int k = 0; k < 2; ++k) {
        CMPIValue value;
        value.ref = ends[k]->getEnc();
        CMPIStatus rc = enc->ft->addKey(enc, roles[k], &value, CMPI_ref);
        if (rc.rc != CMPI_RC_OK) {
            ASSOC_ERROR("%s: Error addkey Role%d in %s\n", row.file, k + 1, where);
            status = CmpiStatus(rc);
            return false;
        }
    }
    return true;
}

}  // namespace

// ---- helpers -----------------------------------------------------------------------

const char kModelNamespace[] = "root/vexlan_cmpi";

bool MatchRole(const char* role, const char* name)
{
    return role == nullptr || role[0] == '\0' || (name != nullptr && strcasecmp(role, name) == 0);
}

bool MatchResultClass(const char* resultClass, const char* nameSpace, const char* className)
{
    if (resultClass == nullptr || resultClass[0] == '\0')
        return true;
    return classtests::classIsA(nameSpace, className, resultClass);
}

bool MatchResultClass(const char* resultClass, const CmpiString& nameSpace, const char* className)
{
    return MatchResultClass(resultClass, nameSpace.charPtr(), className);
}

std::string suffixToken(const std::string& text)
{
    const std::size_t p = text.rfind('_');
    return p == std::string::npos ? std::string() : text.substr(p + 1);
}

std::string prefixToken(const std::string& text)
{
    const std::size_t p = text.find('_');
    return p == std::string::npos ? std::string() : text.substr(0, p);
}

std::string secondToken(const std::string& text)
{
    const std::size_t first = text.find('_');
    if (first == std::string::npos)
        return std::string();
    const std::size_t second = text.find('_', first + 1);
    return text.substr(first + 1, second == std::string::npos ? std::string::npos : second - first - 1);
}

bool sameText(const std::string& a, const std::string& b)
{
    return strcasecmp(a.c_str(), b.c_str()) == 0;
}

// ---- a request -----------------------------------------------------------------------

AssocRequest::AssocRequest(const AssocRow& r, CmpiResult& result, const CmpiObjectPath& src, const char** properties,
                           FuncType funcType, bool sourceIsRole1)
    : row(r), source(src), result_(result), properties_(properties), funcType_(funcType),
      sourceIsRole1_(sourceIsRole1), status_(CMPI_RC_OK)
{
}

bool AssocRequest::readNameSpace()
{
    CMPIObjectPath* enc = source.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    const char* ns = textOf(enc->ft->getNameSpace(enc, &rc));
    if (rc.rc != CMPI_RC_OK) {
        if (filtering(row))
            ASSOC_ERROR("%s: Error getting namespace in %s\n", row.file, findName(sourceIsRole1_));
        else if (row.flags & kAssocNamespaceLog)
            ASSOC_ERROR("%s-%sInstancesOrReferences: Error getting namespace, status.rc=%d!", row.stem,
                        findName(sourceIsRole1_), static_cast<int>(rc.rc));
        status_ = CmpiStatus(rc);
        return false;
    }
    nameSpace_ = ns != nullptr ? ns : "";
    return true;
}

bool AssocRequest::key(const char* name, std::string& out)
{
    if (!filtering(row) && !(row.flags & kAssocCheckedKeys)) {
        // A missing key or one that is not a text throws, as the wrapper does.
        const char* text = source.getKey(name);
        out = text != nullptr ? text : "";
        return true;
    }
    CMPIObjectPath* enc = source.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData data = enc->ft->getKey(enc, name, &rc);
    if (rc.rc != CMPI_RC_OK || data.type != CMPI_string) {
        ASSOC_ERROR("%s: Error getting %s key in %s\n", row.file, name, findName(sourceIsRole1_));
        status_ = CmpiStatus(rc);
        return false;
    }
    const char* text = (data.state & CMPI_nullValue) ? nullptr : textOf(data.value.string);
    out = text != nullptr ? text : "";
    return true;
}

bool AssocRequest::partner(const EndItem& item)
{
    const EndClass& cls = *(sourceIsRole1_ ? row.end2.cls : row.end1.cls);
    // The partner is named where it is served; the reference itself stands
    // in the request's namespace, as the association class does.
    const char* ns = nameSpace_.c_str();
    switch (funcType_) {
    case FUNC_ASSOC:
        result_.returnData(cls.makeInstance(cls.className, kModelNamespace, properties_, item));
        return true;
    case FUNC_ASSOCNAME:
        result_.returnData(cls.makePath(cls.className, kModelNamespace, item));
        return true;
    case FUNC_REF:
    case FUNC_REFNAME: {
        const CmpiObjectPath other = cls.makePath(cls.className, kModelNamespace, item);
        const CmpiObjectPath& p1 = sourceIsRole1_ ? source : other;
        const CmpiObjectPath& p2 = sourceIsRole1_ ? other : source;
        CmpiObjectPath ref(ns, row.assocClass);
        if (funcType_ == FUNC_REF) {
            result_.returnData(pairInstance(row, ref, p1, p2, row.extra.onReferences));
            return true;
        }
        if (!setRoleKeys(row, ref, p1, p2, findName(sourceIsRole1_), status_))
            return false;
        result_.returnData(ref);
        return true;
    }
    }
    return true;
}

namespace {

// The start of both enumerations: the "Entering" line, and the namespace read
// for its status: a path without one is refused (the filtering form's line
// names the row's file stem and ends with `filteringWhere`), and `failure` is
// the status.
bool startEnumeration(const AssocRow& row, const std::string& op, const CmpiObjectPath& path,
                      const char* filteringWhere, CmpiStatus& failure)
{
    enteringLine(row, op);
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    enc->ft->getNameSpace(enc, &rc);
    if (rc.rc == CMPI_RC_OK)
        return true;
    if (filtering(row))
        ASSOC_ERROR("%s: Error getting namespace %s\n", row.file, filteringWhere);
    else
        ASSOC_ERROR("%s: Error getting namespace, status.rc=%d!", op.c_str(), static_cast<int>(rc.rc));
    failure = CmpiStatus(rc);
    return false;
}

// The paths of the row's pairs in turn, until `visit(p1, p2)` returns false.
// An end that no list slot matches (its list was built without the adapter
// library) names no object: the pair is left out.
template <class Visit>
void forEachPairPath(const AssocRow& row, Visit&& visit)
{
    if (row.pairs == nullptr)
        return;
    bool stop = false;
    row.pairs([&](const EndItem& a, const EndItem& b) {
        if (stop)
            return;
        const CmpiObjectPath p1 = row.end1.cls->makePath(row.end1.cls->className, kModelNamespace, a);
        const CmpiObjectPath p2 = row.end2.cls->makePath(row.end2.cls->className, kModelNamespace, b);
        if (p1.isNull() || p2.isNull())
            return;
        stop = !visit(p1, p2);
    });
}

}  // namespace

// ---- the seven operations -------------------------------------------------------------

CmpiStatus assocReferenceNames(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                               const CmpiObjectPath& path, const char* resultClass, const char* role)
{
    if (row.ops != nullptr)
        return row.ops->referenceNames(row, ctx, rslt, path, resultClass, role);
    return traverse(row, opName("referenceNames", row), rslt, path, resultClass, role, nullptr, nullptr,
                    FUNC_REFNAME);
}

CmpiStatus assocReferences(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                           const char* resultClass, const char* role, const char** properties)
{
    if (row.ops != nullptr)
        return row.ops->references(row, ctx, rslt, path, resultClass, role, properties);
    return traverse(row, opName("references", row), rslt, path, resultClass, role, nullptr, properties, FUNC_REF);
}

CmpiStatus assocAssociatorNames(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                                const CmpiObjectPath& path, const char* assocClass, const char* resultClass,
                                const char* role, const char* resultRole)
{
    if (row.ops != nullptr)
        return row.ops->associatorNames(row, ctx, rslt, path, assocClass, resultClass, role, resultRole);
    return traverse(row, opName("associatorNames", row), rslt, path, resultClass, role, resultRole, nullptr,
                    FUNC_ASSOCNAME);
}

CmpiStatus assocAssociators(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                            const char* assocClass, const char* resultClass, const char* role,
                            const char* resultRole, const char** properties)
{
    if (row.ops != nullptr)
        return row.ops->associators(row, ctx, rslt, path, assocClass, resultClass, role, resultRole, properties);
    return traverse(row, opName("associators", row), rslt, path, resultClass, role, resultRole, properties,
                    FUNC_ASSOC);
}

CmpiStatus assocEnumInstances(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                              const CmpiObjectPath& path, const char** properties)
{
    if (row.ops != nullptr)
        return row.ops->enumInstances(row, ctx, rslt, path, properties);
    const std::string op = opName("enumInstances", row);
    CmpiStatus failure(CMPI_RC_OK);
    if (!startEnumeration(row, op, path, "in enumInstances", failure))
        return failure;
    forEachPairPath(row, [&](const CmpiObjectPath& p1, const CmpiObjectPath& p2) {
        rslt.returnData(pairInstance(row, path, p1, p2, row.extra.onEnumeration));
        return true;
    });
    exitingLine(row, op);
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus assocEnumInstanceNames(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                                  const CmpiObjectPath& path)
{
    if (row.ops != nullptr)
        return row.ops->enumInstanceNames(row, ctx, rslt, path);
    const std::string op = opName("enumInstanceNames", row);
    CmpiStatus failure(CMPI_RC_OK);
    if (!startEnumeration(row, op, path, "i enumInstancesNames", failure))
        return failure;
    // Every answer is the request's path with the two role keys set anew; a
    // copy of it is changed, not the server's own object.
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIObjectPath* copy = enc->ft->clone(enc, &rc);
    if (rc.rc != CMPI_RC_OK || copy == nullptr)
        return CmpiStatus(rc);
    CmpiObjectPath answer(copy);
    CmpiStatus status(CMPI_RC_OK);
    forEachPairPath(row, [&](const CmpiObjectPath& p1, const CmpiObjectPath& p2) {
        if (!setRoleKeys(row, answer, p1, p2, "enumInstanceNames", status))
            return false;
        rslt.returnData(answer);
        return true;
    });
    copy->ft->release(copy);
    exitingLine(row, op);
    return status;
}

CmpiStatus assocGetInstance(const AssocRow& row, const CmpiContext& ctx, CmpiResult& rslt,
                            const CmpiObjectPath& path, const char** properties, bool sendInstance)
{
    if (row.ops != nullptr)
        return row.ops->getInstance(row, ctx, rslt, path, properties, sendInstance);
    const std::string op = opName("getInstance", row);
    enteringLine(row, op);
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    const char* cls = textOf(enc->ft->getClassName(enc, &rc));
    if (rc.rc != CMPI_RC_OK) {
        if (filtering(row))
            ASSOC_ERROR("%s: Error getting classname in getInstance\n", row.file);
        else
            ASSOC_ERROR("%s: Error getting classname, status.rc=%d!", op.c_str(), static_cast<int>(rc.rc));
        return CmpiStatus(rc);
    }
    if (cls == nullptr || strcasecmp(cls, row.assocClass) != 0)
        return CmpiStatus(CMPI_RC_OK);
    CmpiInstance instance(path);
    const AssocEnd* ends[2] = {&row.end1, &row.end2};
    CMPIObjectPath* refs[2] = {nullptr, nullptr};
    for (int k = 0; k < 2; ++k) {
        CMPIData data = enc->ft->getKey(enc, ends[k]->role, &rc);
        if (rc.rc != CMPI_RC_OK) {
            ASSOC_ERROR("%s: Error getting keyData%d, status.rc=%d!", op.c_str(), k + 1, static_cast<int>(rc.rc));
            return CmpiStatus(rc);
        }
        if (data.type != CMPI_ref) {
            ASSOC_ERROR("%s: Error invalid keyData%d type, keyData%d.type=%d!", op.c_str(), k + 1, k + 1,
                        static_cast<int>(data.type));
            return CmpiStatus(rc);
        }
        // A reference key without a value names no object: answered as a
        // missing key instead of reading through a null path.
        if ((data.state & CMPI_nullValue) != 0 || data.value.ref == nullptr) {
            ASSOC_ERROR("%s: Error getting keyData%d, status.rc=%d!", op.c_str(), k + 1, static_cast<int>(CMPI_RC_ERR_NOT_FOUND));
            return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        }
        refs[k] = data.value.ref;
    }
    const CmpiObjectPath p1(refs[0]);
    const CmpiObjectPath p2(refs[1]);
    // The checks prove that each end exists; their returned statuses don't
    // count, only a thrown NOT_FOUND ends the request.
    const GetInstanceOp check1 = row.check1 != nullptr ? row.check1 : row.end1.cls->getInstance;
    const GetInstanceOp check2 = row.check2 != nullptr ? row.check2 : row.end2.cls->getInstance;
    if (check1 != nullptr)
        check1(ctx, rslt, p1, nullptr, false);
    if (check2 != nullptr)
        check2(ctx, rslt, p2, nullptr, false);
    instance.setProperty(row.end1.role, refData(p1));
    instance.setProperty(row.end2.role, refData(p2));
    if (sendInstance)
        rslt.returnData(instance);
    exitingLine(row, op);
    return CmpiStatus(CMPI_RC_OK);
}

void assocBuild(const AssocRow& row)
{
    if (row.form != AssocForm::Plain)
        return;
    requestlists::build(row.end1.cls->list);
    requestlists::build(row.end2.cls->list);
}

void assocRemove(const AssocRow& row)
{
    if (row.form != AssocForm::Plain)
        return;
    requestlists::remove(row.end1.cls->list);
    requestlists::remove(row.end2.cls->list);
}
