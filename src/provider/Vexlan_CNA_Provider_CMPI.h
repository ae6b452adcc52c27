// Vexlan_CNA_Provider: the one provider object. Everything a CIM server asks
// of the library enters here: the instance, association, indication and
// method operations of CMPI, the lifecycle (initialize, cleanup,
// isUnloadable) and the adapter polling thread that owns the life of the
// process-wide lists.
//
// Locks, always taken in this order when more than one is held:
//   provider_lock                   every request, the first build, every rebuild
//   linux_enable_indications_mutex  held by the polling thread over the first build
//   provider_write_lock             inner lock of invokeMethod and setInstance; the
//                                   polling thread takes it alone around the
//                                   backup enumeration
#ifndef VEXLAN_PROVIDER_VEXLAN_CNA_PROVIDER_CMPI_H
#define VEXLAN_PROVIDER_VEXLAN_CNA_PROVIDER_CMPI_H

#include <pthread.h>

#include <atomic>
#include <memory>
#include <vector>

#include "CmpiImpl.h"
#include "update/ConcreteJob.h"

class Vexlan_CNA_Provider;
struct _CNAStruc;
struct _CNAPortStruc;

// The polling thread's block, inside the provider object.
struct ThreadArgs {
    CmpiBroker* broker;              // the broker of the provider's CmpiBaseMI part
    CmpiContext* context;            // prepared with prepareAttachThread, owned by the provider
    Vexlan_CNA_Provider* provider;
    pthread_t threadId;
    pthread_mutex_t mutex;           // guards threadExited and stopRequested
    pthread_cond_t changed;          // signalled when either of them is set, and when
                                     // an adapter alarm is handed to the thread
    bool threadExited;               // set by the thread as its last act
    bool stopRequested;              // set by stopPollingLoop
};

// Locks a pthread mutex for the life of the guard. The lock call is repeated
// until it succeeds; the unlock happens on every way out of the scope.
class ProviderLockGuard {
public:
    explicit ProviderLockGuard(pthread_mutex_t* mutex);
    ~ProviderLockGuard();
    ProviderLockGuard(const ProviderLockGuard&) = delete;
    ProviderLockGuard& operator=(const ProviderLockGuard&) = delete;

private:
    pthread_mutex_t* mutex_;
};
// Locks with the same repeated call, for the places that unlock by hand.
void lockProviderMutex(pthread_mutex_t* mutex);

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

    // Indications (src/indications), both on the polling thread under
    // provider_lock. An adapter alarm on an FC port: compares the port's live
    // state with the FC port list and, when it changed, rebuilds the list and
    // sends an adapter status alert. A NIC link change found by the link
    // watch: alarm type 1 sends a link up alert, 2 a link down alert.
    void m_generateIndication(unsigned int deviceNum, int alarmType, int rsltParam, unsigned char* strParam);
    void generatePortAlertIndication(int alarmType, _CNAStruc* adapter, _CNAPortStruc* port);

    // Update jobs (src/update). The two start functions begin an
    // asynchronous flash write on a worker thread of its own and enter its
    // job in jobMap; false when no job id is free or the thread can't start.
    // jobPath arrives with its name space and class and gets the InstanceID.
    bool StartFCFlashUpdateThread(_tagZORAPSDMDevice* device, const unsigned char* fileName,
                                  CmpiObjectPath& jobPath);
    bool StartNICFlashUpdateThread(_CNAStruc* adapter, const unsigned char* fileName,
                                   unsigned long long imageSize, CmpiObjectPath& jobPath);
    // Forward to SerializeConcreteJobToPrefFile and DeserializeConcreteJobToPrefFile.
    void SerializeConcreteJobInfo();
    void DeserializeConcreteJobInfo();

    // Every known update job by id, under jobStoreLock().
    ConcreteJobMap jobMap;
    // The context of the method request being served, set by invokeMethod
    // under provider_lock for the length of the call; the start functions
    // prepare each flash worker's own context from it. Null otherwise.
    const CmpiContext* methodContext;

    // Set by the polling thread: initializing as the first build begins,
    // initialized when it has finished. Read without a lock by invokeMethod
    // and cleanup.
    std::atomic<bool> initialized;
    std::atomic<bool> initializing;
    // Set by startPollingLoop, cleared by stopPollingLoop.
    std::atomic<bool> pollingEnabled;
    ThreadArgs threadArgs;

    static pthread_mutex_t provider_lock;
    static pthread_mutex_t provider_write_lock;
    static pthread_mutex_t linux_enable_indications_mutex;
    static pthread_mutex_t properties_file_lock;
    // The subscription gate: on while at least one filter is active.
    static std::atomic<bool> m_bIndicationEnabled;
    static std::atomic<int> m_numSubscriptions;

private:
    // Prepares a context for the polling thread; the provider keeps every one
    // it prepared until it is destroyed. Null when the broker gives none.
    CmpiContext* prepareThreadContext(const CmpiContext& ctx);

    std::vector<std::unique_ptr<CmpiContext>> contextHolders_;
};

// The provider once its polling thread runs; null before and after. Read by
// the flash workers and the alarm callback, which tolerate null.
extern std::atomic<Vexlan_CNA_Provider*> g_Vexlan_CNA_Provider;

// Compile-time switch of the SCSI endpoint, target and storage extent
// classes in every route and in the build sequence.
extern const int g_SUPPORT_HDR;
extern const int g_SupportTRB2xx;

// Result of the last ZORAP_DidConfigChange; used by the polling thread alone.
extern int gNeedRefresh;

// The polling thread's start routine; `args` is the provider's ThreadArgs.
void* AdapterPollingLoop(void* args);

#endif
