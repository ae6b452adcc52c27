// Vexlan_CNA_Provider: the one provider object. Everything a CIM server asks
// of the library enters here: the instance, association, indication and
// method operations of CMPI, the lifecycle (initialize, cleanup,
// isUnloadable) and the adapter polling thread that owns the life of the
// process-wide lists. The state it shares with the parts (locks, subscription
// gate, polling thread's block, job map) is its ProviderState `state`
// (state/ProviderState.h); the parts never see this class.
#ifndef VEXLAN_PROVIDER_VEXLAN_CNA_PROVIDER_CMPI_H
#define VEXLAN_PROVIDER_VEXLAN_CNA_PROVIDER_CMPI_H

#include <pthread.h>

#include <atomic>
#include <memory>
#include <vector>

#include "CmpiImpl.h"
#include "state/ProviderState.h"

struct _CNAStruc;
struct _CNAPortStruc;

class Vexlan_CNA_Provider : public CmpiInstanceMI,
                            public CmpiAssociationMI,
                            public CmpiIndicationMI,
                            public CmpiMethodMI {
public:
    Vexlan_CNA_Provider(const CmpiBroker& mbp, const CmpiContext& ctx);

    // Instance operations: routed by class name (see Vexlan_CNA_Provider_Tables.h).
    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                 const CmpiObjectPath& cop) override;
    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override;
    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override;
    // Refused for every class.
    CmpiStatus createInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                              const CmpiInstance& inst) override;
    CmpiStatus setInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const CmpiInstance& inst, const char** properties) override;
    CmpiStatus deleteInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override;

    ~Vexlan_CNA_Provider() override;

    CmpiStatus initialize(const CmpiContext& ctx) override;
    CmpiStatus cleanup(CmpiContext& ctx) override;
    bool isUnloadable() const override;

    // Association operations.
    CmpiStatus associators(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                           const char* assocClass, const char* resultClass, const char* role,
                           const char* resultRole, const char** properties) override;
    CmpiStatus associatorNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                               const char* assocClass, const char* resultClass, const char* role,
                               const char* resultRole) override;
    CmpiStatus references(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                          const char* resultClass, const char* role, const char** properties) override;
    CmpiStatus referenceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                              const char* resultClass, const char* role) override;

    CmpiStatus invokeMethod(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& ref,
                            const char* methodName, const CmpiArgs& in, CmpiArgs& out) override;

    // Indication filters.
    CmpiStatus authorizeFilter(const CmpiContext& ctx, const CmpiSelectExp& se, const char* className,
                               const CmpiObjectPath& op, const char* owner) override;
    CmpiStatus mustPoll(const CmpiContext& ctx, const CmpiSelectExp& se, const char* className,
                        const CmpiObjectPath& op) override;
    CmpiStatus activateFilter(const CmpiContext& ctx, const CmpiSelectExp& se, const char* className,
                              const CmpiObjectPath& op, CMPIBoolean first) override;
    CmpiStatus deActivateFilter(const CmpiContext& ctx, const CmpiSelectExp& se, const char* className,
                                const CmpiObjectPath& op, CMPIBoolean last) override;

    // These two take no argument on purpose: they are operations of this class
    // and leave the CmpiIndicationMI operations of the same name (with a
    // context), which the broker calls, as the base class has them.
    using CmpiIndicationMI::disableIndications;
    using CmpiIndicationMI::enableIndications;
    virtual CmpiStatus enableIndications();
    virtual CmpiStatus disableIndications();

    // The polling thread (Vexlan_CNA_Provider_Polling.cpp).
    void startPollingLoop(const CmpiContext& ctx);
    void stopPollingLoop();
    int GetPollingInterval();
    // Removes every list and shuts the adapter library down, under provider_lock.
    void cleanupAgent();

    // The operations of the parts, on this provider's state: the alerts of
    // src/indications (on the polling thread under provider_lock), the job
    // starts of src/update and the job file of src/update.
    void m_generateIndication(unsigned int deviceNum, int alarmType, int rsltParam, unsigned char* strParam);
    void generatePortAlertIndication(int alarmType, _CNAStruc* adapter, _CNAPortStruc* port);
    bool StartFCFlashUpdateThread(_tagZORAPSDMDevice* device, const unsigned char* fileName,
                                  CmpiObjectPath& jobPath);
    bool StartNICFlashUpdateThread(_CNAStruc* adapter, const unsigned char* fileName,
                                   unsigned long long imageSize, CmpiObjectPath& jobPath);
    void SerializeConcreteJobInfo();
    void DeserializeConcreteJobInfo();

    // What the provider shares with its parts; made and gone with the provider.
    ProviderState state;
    // Set by startPollingLoop, cleared by stopPollingLoop.
    std::atomic<bool> pollingEnabled;

private:
    // Prepares a context for the polling thread; the provider keeps every one
    // it prepared until it is destroyed. Null when the broker gives none.
    CmpiContext* prepareThreadContext(const CmpiContext& ctx);

    std::vector<std::unique_ptr<CmpiContext>> contextHolders_;
};

// Result of the last ZORAP_DidConfigChange; used by the polling thread alone.
extern int gNeedRefresh;

// The polling thread's start routine; `args` is the provider's ThreadArgs.
void* AdapterPollingLoop(void* args);

#endif
