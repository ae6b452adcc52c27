// The four entry points of the library. A server looks them up by name and
// may call them in any order and any number of times: the first constructs
// and initialises the one provider object, the others attach to it, and each
// MI type handed out counts once in its use count. The cleanup of the last
// MI type (through the wrapper's driveBaseCleanup) deletes it, so that
// factories called after that start a new one.
#include <exception>
#include <mutex>

#include "CmpiImpl.h"
#include "provider/Vexlan_CNA_Provider_CMPI.h"

namespace {

CmpiProviderBase baseVexlan_CNA_Provider;

// Two first calls on two threads must not make two providers.
std::mutex factoryMutex;

// Runs when the library is unloaded (dlclose, or the end of the process).
// A server that unloads the library without the cleanups that end the
// provider object would leave its polling thread (and the adapter library's
// alarm thread) running in unmapped code: stop and join them here, shut the
// adapter library down and delete the object, so no code of the provider
// runs after the unload whatever the server did. Declared after the base
// and the mutex, so it goes before them.
struct UnloadGuard {
    UnloadGuard() = default;
    UnloadGuard(const UnloadGuard&) = delete;
    UnloadGuard& operator=(const UnloadGuard&) = delete;
    ~UnloadGuard()
    {
        std::lock_guard<std::mutex> serial(factoryMutex);
        CmpiBaseMI* provider = baseVexlan_CNA_Provider.getBaseMI();
        if (provider == nullptr)
            return;
        baseVexlan_CNA_Provider.setBaseMI(nullptr);
        provider->setProviderBase(nullptr);
        try {
            CmpiContext context;
            provider->cleanup(context);
        } catch (...) {
        }
        delete provider;
    }
} unloadGuard;

// One MI structure per MI type, the same for every call of its factory.
// The provider base counts each structure once per life of the provider
// object (attachMI), so the object lives until every MI type handed out
// has had its cleanup: OpenPegasus calls each factory once per load and
// cleans up each MI; sfcb calls a factory once per registered class section
// but cleans up once per library and MI type. The last of those cleanups
// stops the polling thread and shuts the adapter library down before the
// library is unloaded.
CMPIInstanceMI instanceMI;
CMPIAssociationMI associationMI;
CMPIMethodMI methodMI;
CMPIIndicationMI indicationMI;

CMPIInstanceMIFT instMIFT = {
    CMPICurrentVersion,
    CMPICurrentVersion,
    "instanceVexlan_CNA_Provider",
    CmpiBaseMI::driveBaseCleanup,
    CmpiInstanceMI::driveEnumInstanceNames,
    CmpiInstanceMI::driveEnumInstances,
    CmpiInstanceMI::driveGetInstance,
    CmpiInstanceMI::driveCreateInstance,
    CmpiInstanceMI::driveSetInstance,
    CmpiInstanceMI::driveDeleteInstance,
    CmpiInstanceMI::driveExecQuery,
};

CMPIAssociationMIFT assocMIFT = {
    CMPICurrentVersion,
    CMPICurrentVersion,
    "associationVexlan_CNA_Provider",
    CmpiBaseMI::driveBaseCleanup,
    CmpiAssociationMI::driveAssociators,
    CmpiAssociationMI::driveAssociatorNames,
    CmpiAssociationMI::driveReferences,
    CmpiAssociationMI::driveReferenceNames,
};

CMPIMethodMIFT methMIFT = {
    CMPICurrentVersion,
    CMPICurrentVersion,
    "methodVexlan_CNA_Provider",
    CmpiBaseMI::driveBaseCleanup,
    CmpiMethodMI::driveInvokeMethod,
};

CMPIIndicationMIFT indMIFT = {
    CMPICurrentVersion,
    CMPICurrentVersion,
    "indicationVexlan_CNA_Provider",
    CmpiBaseMI::driveBaseCleanup,
    CmpiIndicationMI::driveAuthorizeFilter,
    CmpiIndicationMI::driveMustPoll,
    CmpiIndicationMI::driveActivateFilter,
    CmpiIndicationMI::driveDeActivateFilter,
    CmpiIndicationMI::driveEnableIndications,
    CmpiIndicationMI::driveDisableIndications,
};

void setStatus(CMPIStatus* rc, const CMPIBroker* mb, const CmpiStatus& st)
{
    if (rc == nullptr)
        return;
    rc->rc = st.rc();
    rc->msg = nullptr;
    if (st.hasMsg() && mb != nullptr && mb->eft != nullptr && mb->eft->newString != nullptr)
        rc->msg = mb->eft->newString(mb, st.msg(), nullptr);
}

// The body of all four factories.
template <class MI, class FT>
MI* createMI(MI& mi, FT* ft, const CMPIBroker* mb, const CMPIContext* ctx, CMPIStatus* rc)
{
    std::lock_guard<std::mutex> serial(factoryMutex);
    try {
        // A server may call a factory again (sfcb: once per class section)
        // while its request threads use the MI handed out before, without a
        // lock of ours: the MI's fields are written only when they change,
        // so a repeated call writes nothing that those threads read.
        if (mi.ft != ft)
            mi.ft = ft;
        CmpiBaseMI* provider = baseVexlan_CNA_Provider.getBaseMI();
        if (provider == nullptr) {
            CmpiBroker broker(mb);
            CmpiContext context(ctx);
            auto* created = new Vexlan_CNA_Provider(broker, context);
            created->setProviderBase(&baseVexlan_CNA_Provider);
            CmpiStatus st = static_cast<CmpiBaseMI*>(created)->initialize(context);
            if (st.rc() != CMPI_RC_OK) {
                delete created;
                setStatus(rc, mb, st);
                return nullptr;
            }
            baseVexlan_CNA_Provider.setBaseMI(created);
            provider = created;
        }
        void* const handle = static_cast<CmpiBaseMI*>(provider);
        if (mi.hdl != handle)
            mi.hdl = handle;
        baseVexlan_CNA_Provider.attachMI(&mi);
        return &mi;
    } catch (const CmpiStatus& st) {
        setStatus(rc, mb, st);
    } catch (const std::exception& e) {
        setStatus(rc, mb, CmpiStatus(CMPI_RC_ERR_FAILED, e.what()));
    } catch (...) {
        setStatus(rc, mb, CmpiStatus(CMPI_RC_ERR_FAILED));
    }
    return nullptr;
}

}  // namespace

CMPI_PROVIDER_FACTORY CMPIInstanceMI* Vexlan_CNA_Provider_Create_InstanceMI(const CMPIBroker* mb,
                                                                             const CMPIContext* ctx,
                                                                             CMPIStatus* rc)
{
    return createMI<CMPIInstanceMI>(instanceMI, &instMIFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIAssociationMI* Vexlan_CNA_Provider_Create_AssociationMI(const CMPIBroker* mb,
                                                                                   const CMPIContext* ctx,
                                                                                   CMPIStatus* rc)
{
    return createMI<CMPIAssociationMI>(associationMI, &assocMIFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIMethodMI* Vexlan_CNA_Provider_Create_MethodMI(const CMPIBroker* mb,
                                                                         const CMPIContext* ctx, CMPIStatus* rc)
{
    return createMI<CMPIMethodMI>(methodMI, &methMIFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIIndicationMI* Vexlan_CNA_Provider_Create_IndicationMI(const CMPIBroker* mb,
                                                                                 const CMPIContext* ctx,
                                                                                 CMPIStatus* rc)
{
    return createMI<CMPIIndicationMI>(indicationMI, &indMIFT, mb, ctx, rc);
}
