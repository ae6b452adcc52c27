// The four entry points of the library. A server looks them up by name and
// may call them in any order and any number of times: the first constructs
// and initialises the one provider object, the others attach to it, and each
// raises its use count. The last cleanup (through the wrapper's
// driveBaseCleanup) deletes it, so that factories called after that start a
// new one.
#include <deque>
#include <exception>
#include <mutex>

#include "CmpiImpl.h"
#include "provider/Vexlan_CNA_Provider_CMPI.h"

namespace {

CmpiProviderBase baseVexlan_CNA_Provider;

// Two first calls on two threads must not make two providers.
std::mutex factoryMutex;

// Every factory call hands out an MI object of its own. A server may call one
// factory many times (sfcb does, once per registered class) and then cleans up
// every MI it got: as each MI's cleanup lowers the use count once, the count
// reaches 0 at the last one, which stops the polling thread before the
// library is unloaded. The objects stay until the library is unloaded.
template <class MI>
MI& newMI()
{
    static std::deque<MI> handedOut;
    handedOut.emplace_back();
    return handedOut.back();
}

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
MI* createMI(FT* ft, const CMPIBroker* mb, const CMPIContext* ctx, CMPIStatus* rc)
{
    std::lock_guard<std::mutex> serial(factoryMutex);
    try {
        MI& mi = newMI<MI>();
        mi.ft = ft;
        mi.hdl = nullptr;
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
        mi.hdl = static_cast<CmpiBaseMI*>(provider);
        baseVexlan_CNA_Provider.incUseCount();
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
    return createMI<CMPIInstanceMI>(&instMIFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIAssociationMI* Vexlan_CNA_Provider_Create_AssociationMI(const CMPIBroker* mb,
                                                                                   const CMPIContext* ctx,
                                                                                   CMPIStatus* rc)
{
    return createMI<CMPIAssociationMI>(&assocMIFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIMethodMI* Vexlan_CNA_Provider_Create_MethodMI(const CMPIBroker* mb,
                                                                         const CMPIContext* ctx, CMPIStatus* rc)
{
    return createMI<CMPIMethodMI>(&methMIFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIIndicationMI* Vexlan_CNA_Provider_Create_IndicationMI(const CMPIBroker* mb,
                                                                                 const CMPIContext* ctx,
                                                                                 CMPIStatus* rc)
{
    return createMI<CMPIIndicationMI>(&indMIFT, mb, ctx, rc);
}
