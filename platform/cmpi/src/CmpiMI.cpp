// The MI classes: default operations and the static drivers that the C
// function tables of a provider point to.  Each driver turns the C
// arguments into handles, finds the provider object through the MI's
// handle and calls its virtual operation inside drive(), which keeps every
// C++ exception on this side of the C interface.
#include "CmpiAssociationMI.h"
#include "CmpiBaseMI.h"
#include "CmpiIndicationMI.h"
#include "CmpiInstanceMI.h"
#include "CmpiMethodMI.h"

#include <exception>

namespace {

const CMPIBroker* brokerOf(const CmpiBaseMI* base) noexcept
{
    if (base != nullptr && base->getBroker() != nullptr && base->getBroker()->getEnc() != nullptr)
        return base->getBroker()->getEnc();
    return CmpiProviderBase::getBroker();
}

CMPIStatus cStatus(const CMPIBroker* mb, CMPIrc rc, const char* msg) noexcept
{
    CMPIStatus st = {rc, nullptr};
    if (msg != nullptr && mb != nullptr && mb->eft != nullptr && mb->eft->newString != nullptr)
        st.msg = mb->eft->newString(mb, msg, nullptr);
    return st;
}

// The status of the exception being handled: a thrown CmpiStatus as it
// was thrown, any other CMPI_RC_ERR_FAILED, with the text of a
// std::exception as its message.  Called only inside a catch block.
CMPIStatus caughtStatus(const CMPIBroker* mb) noexcept
{
    try {
        throw;
    } catch (const CmpiStatus& st) {
        return st.status(mb);
    } catch (const CMPIStatus& st) {
        return st;  // a plain status thrown by the provider goes out as it stands
    } catch (const std::exception& e) {
        return cStatus(mb, CMPI_RC_ERR_FAILED, e.what());
    } catch (...) {
        return cStatus(mb, CMPI_RC_ERR_FAILED, nullptr);
    }
}

// Runs call(mi) for the provider object behind an MI handle, as the MI
// type of the table, turning any exception into a status (caughtStatus).
template <class MI, class Call>
CMPIStatus drive(const void* hdl, Call&& call) noexcept
{
    CmpiBaseMI* base = static_cast<CmpiBaseMI*>(const_cast<void*>(hdl));
    const CMPIBroker* mb = brokerOf(base);
    if (base == nullptr)
        return cStatus(mb, CMPI_RC_ERR_FAILED, "no provider object");
    try {
        MI* mi = dynamic_cast<MI*>(base);
        if (mi == nullptr)
            return cStatus(mb, CMPI_RC_ERR_NOT_SUPPORTED, nullptr);
        CmpiStatus st = call(*mi);
        return st.status(mb);
    } catch (...) {
        return caughtStatus(mb);
    }
}

} // namespace

// ---- CmpiBaseMI -----------------------------------------------------------

CmpiBaseMI::CmpiBaseMI(const CmpiBroker& mbp, const CmpiContext& /*ctx*/)
    : broker(new CmpiBroker(mbp)), providerBase(nullptr)
{
    if (mbp.getEnc() != nullptr)
        CmpiProviderBase::setBroker(mbp.getEnc());
}

CmpiBaseMI::~CmpiBaseMI()
{
    delete broker;
}

void CmpiBaseMI::setProviderBase(CmpiProviderBase* base)
{
    providerBase = base;
    if (base != nullptr && broker->getEnc() != nullptr)
        CmpiProviderBase::setBroker(broker->getEnc());
}

// Cleanup of one MI; see CmpiBaseMI.h for the rules.
CMPIStatus CmpiBaseMI::cleanupMI(void* mi, const void* hdl, const CMPIContext* eCtx,
                                 CMPIBoolean terminating) noexcept
{
    if (mi == nullptr || hdl == nullptr)
        return cStatus(nullptr, CMPI_RC_OK, nullptr);
    CmpiBaseMI* base = static_cast<CmpiBaseMI*>(const_cast<void*>(hdl));
    const CMPIBroker* mb = brokerOf(base);
    try {
        if (!terminating && !base->isUnloadable())
            return cStatus(mb, CMPI_RC_DO_NOT_UNLOAD, nullptr);
        CmpiProviderBase* pb = base->providerBase;
        if (pb == nullptr)
            return cStatus(mb, CMPI_RC_OK, nullptr);
        if (pb->releaseMI(mi) != 0)
            return cStatus(mb, CMPI_RC_OK, nullptr);
        pb->setBaseMI(nullptr);
        base->setProviderBase(nullptr);
        CmpiContext ctx(eCtx);
        CmpiStatus st;
        try {
            st = base->cleanup(ctx);
        } catch (...) {
            delete base;
            throw;
        }
        delete base;
        return st.status(mb);
    } catch (...) {
        return caughtStatus(mb);
    }
}

CMPIStatus CmpiBaseMI::driveBaseCleanup(CMPIInstanceMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating)
{
    return cleanupMI(mi, mi != nullptr ? mi->hdl : nullptr, eCtx, terminating);
}

CMPIStatus CmpiBaseMI::driveBaseCleanup(CMPIAssociationMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating)
{
    return cleanupMI(mi, mi != nullptr ? mi->hdl : nullptr, eCtx, terminating);
}

CMPIStatus CmpiBaseMI::driveBaseCleanup(CMPIMethodMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating)
{
    return cleanupMI(mi, mi != nullptr ? mi->hdl : nullptr, eCtx, terminating);
}

CMPIStatus CmpiBaseMI::driveBaseCleanup(CMPIIndicationMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating)
{
    return cleanupMI(mi, mi != nullptr ? mi->hdl : nullptr, eCtx, terminating);
}

CmpiStatus CmpiBaseMI::initialize(const CmpiContext&)
{
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus CmpiBaseMI::cleanup(CmpiContext&)
{
    return CmpiStatus(CMPI_RC_OK);
}

bool CmpiBaseMI::isUnloadable() const
{
    return true;
}

// ---- CmpiInstanceMI -------------------------------------------------------

CmpiInstanceMI::CmpiInstanceMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {}

CMPIStatus CmpiInstanceMI::driveEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                                  const CMPIResult* eRslt, const CMPIObjectPath* eCop)
{
    return drive<CmpiInstanceMI>(mi->hdl, [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.enumInstanceNames(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop));
    });
}

CMPIStatus CmpiInstanceMI::driveEnumInstances(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                              const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                              const char** properties)
{
    return drive<CmpiInstanceMI>(mi->hdl, [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.enumInstances(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), properties);
    });
}

CMPIStatus CmpiInstanceMI::driveGetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                            const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                            const char** properties)
{
    return drive<CmpiInstanceMI>(mi->hdl, [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.getInstance(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), properties);
    });
}

CMPIStatus CmpiInstanceMI::driveCreateInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                               const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                               const CMPIInstance* eInst)
{
    return drive<CmpiInstanceMI>(mi->hdl, [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.createInstance(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), CmpiInstance(eInst));
    });
}

CMPIStatus CmpiInstanceMI::driveSetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                            const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                            const CMPIInstance* eInst, const char** properties)
{
    return drive<CmpiInstanceMI>(mi->hdl, [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.setInstance(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), CmpiInstance(eInst),
                             properties);
    });
}

CMPIStatus CmpiInstanceMI::driveDeleteInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                               const CMPIResult* eRslt, const CMPIObjectPath* eCop)
{
    return drive<CmpiInstanceMI>(mi->hdl, [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.deleteInstance(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop));
    });
}

CMPIStatus CmpiInstanceMI::driveExecQuery(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                          const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                          const char* query, const char* language)
{
    return drive<CmpiInstanceMI>(mi->hdl, [&](CmpiInstanceMI& p) {
        CmpiResult rslt(eRslt);
        return p.execQuery(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), query, language);
    });
}

CmpiStatus CmpiInstanceMI::enumInstanceNames(const CmpiContext&, CmpiResult&, const CmpiObjectPath&)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::enumInstances(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                         const char**)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::getInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                       const char**)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::createInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                          const CmpiInstance&)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::setInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                       const CmpiInstance&, const char**)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::deleteInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiInstanceMI::execQuery(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                     const char*, const char*)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

// ---- CmpiAssociationMI ----------------------------------------------------

CmpiAssociationMI::CmpiAssociationMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {}

CMPIStatus CmpiAssociationMI::driveAssociators(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                               const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                               const char* assocClass, const char* resultClass,
                                               const char* role, const char* resultRole,
                                               const char** properties)
{
    return drive<CmpiAssociationMI>(mi->hdl, [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.associators(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), assocClass, resultClass,
                             role, resultRole, properties);
    });
}

CMPIStatus CmpiAssociationMI::driveAssociatorNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                                   const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                                   const char* assocClass, const char* resultClass,
                                                   const char* role, const char* resultRole)
{
    return drive<CmpiAssociationMI>(mi->hdl, [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.associatorNames(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), assocClass,
                                 resultClass, role, resultRole);
    });
}

CMPIStatus CmpiAssociationMI::driveReferences(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                              const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                              const char* resultClass, const char* role,
                                              const char** properties)
{
    return drive<CmpiAssociationMI>(mi->hdl, [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.references(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), resultClass, role,
                            properties);
    });
}

CMPIStatus CmpiAssociationMI::driveReferenceNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                                  const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                                  const char* resultClass, const char* role)
{
    return drive<CmpiAssociationMI>(mi->hdl, [&](CmpiAssociationMI& p) {
        CmpiResult rslt(eRslt);
        return p.referenceNames(CmpiContext(eCtx), rslt, CmpiObjectPath(eOp), resultClass, role);
    });
}

CmpiStatus CmpiAssociationMI::associators(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                          const char*, const char*, const char*, const char*,
                                          const char**)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiAssociationMI::associatorNames(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                              const char*, const char*, const char*, const char*)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiAssociationMI::references(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                         const char*, const char*, const char**)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiAssociationMI::referenceNames(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                             const char*, const char*)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

// ---- CmpiMethodMI ---------------------------------------------------------

CmpiMethodMI::CmpiMethodMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {}

CMPIStatus CmpiMethodMI::driveInvokeMethod(CMPIMethodMI* mi, const CMPIContext* eCtx,
                                           const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                           const char* methodName, const CMPIArgs* eIn,
                                           CMPIArgs* eOut)
{
    return drive<CmpiMethodMI>(mi->hdl, [&](CmpiMethodMI& p) {
        CmpiResult rslt(eRslt);
        CmpiArgs out(eOut);
        return p.invokeMethod(CmpiContext(eCtx), rslt, CmpiObjectPath(eCop), methodName,
                              CmpiArgs(eIn), out);
    });
}

CmpiStatus CmpiMethodMI::invokeMethod(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                      const char*, const CmpiArgs&, CmpiArgs&)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

// ---- CmpiIndicationMI -----------------------------------------------------

CmpiIndicationMI::CmpiIndicationMI(const CmpiBroker& mbp, const CmpiContext& ctx) : CmpiBaseMI(mbp, ctx) {}

CMPIStatus CmpiIndicationMI::driveAuthorizeFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                                  const CMPISelectExp* se, const char* className,
                                                  const CMPIObjectPath* op, const char* owner)
{
    return drive<CmpiIndicationMI>(mi->hdl, [&](CmpiIndicationMI& p) {
        return p.authorizeFilter(CmpiContext(eCtx), CmpiSelectExp(se), className, CmpiObjectPath(op),
                                 owner);
    });
}

CMPIStatus CmpiIndicationMI::driveMustPoll(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                           const CMPISelectExp* se, const char* className,
                                           const CMPIObjectPath* op)
{
    return drive<CmpiIndicationMI>(mi->hdl, [&](CmpiIndicationMI& p) {
        return p.mustPoll(CmpiContext(eCtx), CmpiSelectExp(se), className, CmpiObjectPath(op));
    });
}

CMPIStatus CmpiIndicationMI::driveActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                                 const CMPISelectExp* se, const char* className,
                                                 const CMPIObjectPath* op, CMPIBoolean first)
{
    return drive<CmpiIndicationMI>(mi->hdl, [&](CmpiIndicationMI& p) {
        return p.activateFilter(CmpiContext(eCtx), CmpiSelectExp(se), className, CmpiObjectPath(op),
                                first);
    });
}

CMPIStatus CmpiIndicationMI::driveDeActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                                   const CMPISelectExp* se, const char* className,
                                                   const CMPIObjectPath* op, CMPIBoolean last)
{
    return drive<CmpiIndicationMI>(mi->hdl, [&](CmpiIndicationMI& p) {
        return p.deActivateFilter(CmpiContext(eCtx), CmpiSelectExp(se), className,
                                  CmpiObjectPath(op), last);
    });
}

CMPIStatus CmpiIndicationMI::driveEnableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx)
{
    return drive<CmpiIndicationMI>(mi->hdl, [&](CmpiIndicationMI& p) {
        return p.enableIndications(CmpiContext(eCtx));
    });
}

CMPIStatus CmpiIndicationMI::driveDisableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx)
{
    return drive<CmpiIndicationMI>(mi->hdl, [&](CmpiIndicationMI& p) {
        return p.disableIndications(CmpiContext(eCtx));
    });
}

CmpiStatus CmpiIndicationMI::authorizeFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                             const CmpiObjectPath&, const char*)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::mustPoll(const CmpiContext&, const CmpiSelectExp&, const char*,
                                      const CmpiObjectPath&)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::activateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                            const CmpiObjectPath&, CMPIBoolean)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::deActivateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                              const CmpiObjectPath&, CMPIBoolean)
{
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

CmpiStatus CmpiIndicationMI::enableIndications(const CmpiContext&)
{
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus CmpiIndicationMI::disableIndications(const CmpiContext&)
{
    return CmpiStatus(CMPI_RC_OK);
}
