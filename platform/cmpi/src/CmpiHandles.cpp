// CmpiObjectPath, CmpiInstance, CmpiArgs, CmpiResult, CmpiContext,
// CmpiSelectExp, CmpiDateTime and CmpiBroker: thin calls through the
// encapsulated objects' function tables, failures turned into CmpiStatus.
#include "CmpiArgs.h"
#include "CmpiBroker.h"
#include "CmpiContext.h"
#include "CmpiDateTime.h"
#include "CmpiInstance.h"
#include "CmpiInternal.h"
#include "CmpiObjectPath.h"
#include "CmpiResult.h"
#include "CmpiSelectExp.h"
#include "CmpiStatus.h"

using cmpi_impl::check;
using cmpi_impl::requireBroker;

namespace {

// The encapsulated object of a handle given as an argument; a null handle
// throws instead of reaching the broker.
template <class Handle>
auto need(const Handle& h) -> decltype(h.getEnc())
{
    auto enc = h.getEnc();
    if (enc == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_INVALID_HANDLE, "null CMPI object");
    return enc;
}

CMPIObjectPath* makePath(const CMPIBroker* mb, const char* ns, const char* cls)
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIObjectPath* op = mb->eft->newObjectPath(mb, ns, cls, &rc);
    check(rc, cls);
    if (op == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_FAILED, "newObjectPath returned no path");
    return op;
}

CMPIInstance* makeInstance(const CMPIBroker* mb, const CmpiObjectPath& op)
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIInstance* inst = mb->eft->newInstance(mb, need(op), &rc);
    check(rc);
    if (inst == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_FAILED, "newInstance returned no instance");
    return inst;
}

bool pathIsA(const CMPIBroker* mb, const CMPIObjectPath* op, const char* className)
{
    if (op == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_INVALID_HANDLE, "null CMPI object");
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIBoolean is = mb->eft->classPathIsA(mb, op, className, &rc);
    check(rc, className);
    return is != 0;
}

// Reads a named value (key, property, argument, context entry) through a
// getter of the form get(obj, name, &rc).  Absent values become a null
// CmpiData marked not found unless `absentThrows`.
template <class Obj, class Getter>
CmpiData readNamed(Obj* obj, Getter get, const char* name, bool absentThrows)
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData d = get(obj, name, &rc);
    if (rc.rc != CMPI_RC_OK && cmpi_impl::isAbsent(rc.rc) && !absentThrows)
        return CmpiData(cmpi_impl::notFoundData());
    check(rc, name);
    return CmpiData(d);
}

// The same by index; the name is handed out through *name.
template <class Obj, class Getter>
CmpiData readAt(Obj* obj, Getter get, int index, CmpiString* name)
{
    if (index < 0)
        throw CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, "negative index");
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* s = nullptr;
    CMPIData d = get(obj, static_cast<CMPICount>(index), &s, &rc);
    check(rc);
    if (name != nullptr)
        *name = CmpiString(s);
    return CmpiData(d);
}

template <class Obj, class Counter>
unsigned int readCount(Obj* obj, Counter count)
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPICount n = count(obj, &rc);
    check(rc);
    return n;
}

template <class Obj, class Getter>
CmpiString readString(Obj* obj, Getter get)
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* s = get(obj, &rc);
    check(rc);
    return CmpiString(s);
}

} // namespace

// ---- CmpiObjectPath -------------------------------------------------------

CmpiObjectPath::CmpiObjectPath(const char* ns, const char* cls)
    : CmpiObject(makePath(requireBroker(), ns, cls))
{
}

CmpiObjectPath::CmpiObjectPath(const CmpiString& ns, const char* cls)
    : CmpiObject(makePath(requireBroker(), ns.charPtr(), cls))
{
}

bool CmpiObjectPath::classPathIsA(const char* className) const
{
    return pathIsA(requireBroker(), getEnc(), className);
}

#define CMPI_PATH_STRING(getter, ftGetter, setter, ftSetter)                         \
    CmpiString CmpiObjectPath::getter() const                                        \
    {                                                                                \
        CMPIObjectPath* op = static_cast<CMPIObjectPath*>(requireEnc());             \
        return readString(op, op->ft->ftGetter);                                     \
    }                                                                                \
    void CmpiObjectPath::setter(const char* text)                                    \
    {                                                                                \
        CMPIObjectPath* op = static_cast<CMPIObjectPath*>(requireEnc());             \
        check(op->ft->ftSetter(op, text), text);                                     \
    }

CMPI_PATH_STRING(getHostname, getHostname, setHostname, setHostname)
CMPI_PATH_STRING(getNameSpace, getNameSpace, setNameSpace, setNameSpace)
CMPI_PATH_STRING(getClassName, getClassName, setClassName, setClassName)

#undef CMPI_PATH_STRING

unsigned int CmpiObjectPath::getKeyCount() const
{
    CMPIObjectPath* op = static_cast<CMPIObjectPath*>(requireEnc());
    return readCount(op, op->ft->getKeyCount);
}

CmpiData CmpiObjectPath::getKey(const char* name) const
{
    CMPIObjectPath* op = static_cast<CMPIObjectPath*>(requireEnc());
    return readNamed(op, op->ft->getKey, name, true);
}

CmpiData CmpiObjectPath::getKey(int index, CmpiString* name) const
{
    CMPIObjectPath* op = static_cast<CMPIObjectPath*>(requireEnc());
    return readAt(op, op->ft->getKeyAt, index, name);
}

void CmpiObjectPath::setKey(const char* name, const CmpiData& data)
{
    CMPIObjectPath* op = static_cast<CMPIObjectPath*>(requireEnc());
    cmpi_impl::CValue c(data);
    check(op->ft->addKey(op, name, c.ptr, c.type), name);
}

CmpiString CmpiObjectPath::toString() const
{
    CMPIObjectPath* op = static_cast<CMPIObjectPath*>(requireEnc());
    return readString(op, op->ft->toString);
}

// ---- CmpiInstance ---------------------------------------------------------

CmpiInstance::CmpiInstance(const CmpiObjectPath& op)
    : CmpiObject(makeInstance(requireBroker(), op))
{
}

unsigned int CmpiInstance::getPropertyCount() const
{
    CMPIInstance* inst = static_cast<CMPIInstance*>(requireEnc());
    return readCount(inst, inst->ft->getPropertyCount);
}

CmpiData CmpiInstance::getProperty(const char* name) const
{
    CMPIInstance* inst = static_cast<CMPIInstance*>(requireEnc());
    return readNamed(inst, inst->ft->getProperty, name, false);
}

CmpiData CmpiInstance::getProperty(int index, CmpiString* name) const
{
    CMPIInstance* inst = static_cast<CMPIInstance*>(requireEnc());
    return readAt(inst, inst->ft->getPropertyAt, index, name);
}

void CmpiInstance::setProperty(const char* name, const CmpiData& data)
{
    CMPIInstance* inst = static_cast<CMPIInstance*>(requireEnc());
    cmpi_impl::CValue c(data);
    check(inst->ft->setProperty(inst, name, c.ptr, c.type), name);
}

void CmpiInstance::setPropertyFilter(const char** properties, const char** keys)
{
    static const char* noKeys[] = {nullptr};
    CMPIInstance* inst = static_cast<CMPIInstance*>(requireEnc());
    check(inst->ft->setPropertyFilter(inst, properties, keys != nullptr ? keys : noKeys));
}

CmpiObjectPath CmpiInstance::getObjectPath() const
{
    CMPIInstance* inst = static_cast<CMPIInstance*>(requireEnc());
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIObjectPath* op = inst->ft->getObjectPath(inst, &rc);
    check(rc);
    return CmpiObjectPath(op);
}

// ---- CmpiArgs -------------------------------------------------------------

CmpiArgs::CmpiArgs()
{
    const CMPIBroker* mb = requireBroker();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIArgs* args = mb->eft->newArgs(mb, &rc);
    check(rc);
    if (args == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_FAILED, "newArgs returned no argument list");
    enc_ = args;
}

unsigned int CmpiArgs::getArgCount() const
{
    CMPIArgs* args = static_cast<CMPIArgs*>(requireEnc());
    return readCount(args, args->ft->getArgCount);
}

CmpiData CmpiArgs::getArg(const char* name) const
{
    CMPIArgs* args = static_cast<CMPIArgs*>(requireEnc());
    return readNamed(args, args->ft->getArg, name, false);
}

CmpiData CmpiArgs::getArg(int index, CmpiString* name) const
{
    CMPIArgs* args = static_cast<CMPIArgs*>(requireEnc());
    return readAt(args, args->ft->getArgAt, index, name);
}

void CmpiArgs::setArg(const char* name, const CmpiData& data)
{
    CMPIArgs* args = static_cast<CMPIArgs*>(requireEnc());
    cmpi_impl::CValue c(data);
    check(args->ft->addArg(args, name, c.ptr, c.type), name);
}

// ---- CmpiResult -----------------------------------------------------------

void CmpiResult::returnData(const CmpiData& d)
{
    CMPIResult* r = static_cast<CMPIResult*>(requireEnc());
    cmpi_impl::CValue c(d);
    check(r->ft->returnData(r, c.ptr, c.type));
}

void CmpiResult::returnData(const CmpiInstance& inst)
{
    CMPIResult* r = static_cast<CMPIResult*>(requireEnc());
    check(r->ft->returnInstance(r, need(inst)));
}

void CmpiResult::returnData(const CmpiObjectPath& op)
{
    CMPIResult* r = static_cast<CMPIResult*>(requireEnc());
    check(r->ft->returnObjectPath(r, need(op)));
}

void CmpiResult::returnDone()
{
    CMPIResult* r = static_cast<CMPIResult*>(requireEnc());
    check(r->ft->returnDone(r));
}

// ---- CmpiContext ----------------------------------------------------------

const char* const CmpiContext::invocationFlags = CMPIInvocationFlags;

CmpiData CmpiContext::getEntry(const char* name) const
{
    CMPIContext* ctx = static_cast<CMPIContext*>(requireEnc());
    return readNamed(ctx, ctx->ft->getEntry, name, false);
}

// ---- CmpiSelectExp --------------------------------------------------------

CmpiString CmpiSelectExp::getString() const
{
    CMPISelectExp* se = static_cast<CMPISelectExp*>(requireEnc());
    return readString(se, se->ft->getString);
}

// ---- CmpiDateTime ---------------------------------------------------------

CmpiDateTime::CmpiDateTime()
{
    const CMPIBroker* mb = requireBroker();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    enc_ = mb->eft->newDateTime(mb, &rc);
    check(rc);
    requireEnc();
}

CmpiDateTime::CmpiDateTime(const char* text)
{
    const CMPIBroker* mb = requireBroker();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    enc_ = mb->eft->newDateTimeFromChars(mb, text, &rc);
    check(rc, text);
    requireEnc();
}

CmpiDateTime::CmpiDateTime(CMPIUint64 binTime, bool interval)
{
    const CMPIBroker* mb = requireBroker();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    enc_ = mb->eft->newDateTimeFromBinary(mb, binTime, interval ? 1 : 0, &rc);
    check(rc);
    requireEnc();
}

bool CmpiDateTime::isInterval() const
{
    CMPIDateTime* dt = static_cast<CMPIDateTime*>(requireEnc());
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIBoolean b = dt->ft->isInterval(dt, &rc);
    check(rc);
    return b != 0;
}

CMPIUint64 CmpiDateTime::getDateTime() const
{
    CMPIDateTime* dt = static_cast<CMPIDateTime*>(requireEnc());
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIUint64 v = dt->ft->getBinaryFormat(dt, &rc);
    check(rc);
    return v;
}

CmpiString CmpiDateTime::getStringFormat() const
{
    CMPIDateTime* dt = static_cast<CMPIDateTime*>(requireEnc());
    return readString(dt, dt->ft->getStringFormat);
}

// ---- CmpiBroker -----------------------------------------------------------

CmpiContext CmpiBroker::prepareAttachThread(const CmpiContext& ctx)
{
    const CMPIBroker* mb = static_cast<const CMPIBroker*>(requireEnc());
    CMPIContext* prepared = mb->bft->prepareAttachThread(mb, ctx.getEnc());
    if (prepared == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_FAILED, "prepareAttachThread returned no context");
    return CmpiContext(prepared);
}

void CmpiBroker::attachThread(const CmpiContext& ctx)
{
    const CMPIBroker* mb = static_cast<const CMPIBroker*>(requireEnc());
    check(mb->bft->attachThread(mb, ctx.getEnc()));
}

void CmpiBroker::detachThread(const CmpiContext& ctx)
{
    const CMPIBroker* mb = static_cast<const CMPIBroker*>(requireEnc());
    check(mb->bft->detachThread(mb, ctx.getEnc()));
}

void CmpiBroker::deliverIndication(const CmpiContext& ctx, const char* ns, const CmpiInstance& ind)
{
    const CMPIBroker* mb = static_cast<const CMPIBroker*>(requireEnc());
    check(mb->bft->deliverIndication(mb, ctx.getEnc(), ns, need(ind)));
}

CmpiString CmpiBroker::newString(const char* text) const
{
    const CMPIBroker* mb = static_cast<const CMPIBroker*>(requireEnc());
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* s = mb->eft->newString(mb, text, &rc);
    check(rc);
    return CmpiString(s);
}

CmpiObjectPath CmpiBroker::newObjectPath(const char* ns, const char* cls) const
{
    return CmpiObjectPath(makePath(static_cast<const CMPIBroker*>(requireEnc()), ns, cls));
}

CmpiInstance CmpiBroker::newInstance(const CmpiObjectPath& op) const
{
    return CmpiInstance(makeInstance(static_cast<const CMPIBroker*>(requireEnc()), op));
}

bool CmpiBroker::classPathIsA(const CmpiObjectPath& op, const char* className) const
{
    return pathIsA(static_cast<const CMPIBroker*>(requireEnc()), op.getEnc(), className);
}
