// The provider object: construction, lifecycle, and the dispatch of instance
// and method requests by class name. The polling thread is in
// Vexlan_CNA_Provider_Polling.cpp, the tables in Vexlan_CNA_Provider_Tables.cpp.
#include "provider/Vexlan_CNA_Provider_CMPI.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <ctime>

#include "associations/AssocDispatch.h"
#include "indications/Vexlan_Adapter_JobIndications.h"
#include "indications/Vexlan_CNA_HBAProviderIndications_CMPI.h"
#include "indications/Vexlan_NIC_ProviderIndications.h"
#include "inventory/AdapterFunc.h"
#include "support/ClassTests.h"
#include "support/RequestLists.h"
#include "provider/Vexlan_CNA_Provider_Tables.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "update/FlashUpdate.h"
#include "update/JobPersistence.h"
#include "support/Vexlan_NIC_Properties.h"

namespace {

// A mutex that can't be initialised ends the process.
void initMutexOrExit(pthread_mutex_t* mutex, const char* logName)
{
    int rc = pthread_mutex_init(mutex, nullptr);
    if (rc != 0) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Error %d Initializing %s mutex", rc, logName);
        exit(1);
    }
}

const char* classNameText(const CmpiObjectPath& cop, CMPIStatus& rc)
{
    CMPIObjectPath* enc = cop.getEnc();
    rc = CMPIStatus{CMPI_RC_OK, nullptr};
    CMPIString* cls = enc->ft->getClassName(enc, &rc);
    if (rc.rc != CMPI_RC_OK || cls == nullptr)
        return nullptr;
    const char* text = cls->ft->getCharPtr(cls, nullptr);
    return text != nullptr ? text : "";
}

// Calls `call(ops)` for the row of each group that the path's class matches,
// rebuilding the row's list first when the row says so.
template <class Call>
void walkRoutes(const CmpiObjectPath& cop, Call&& call)
{
    std::size_t count = 0;
    const InstanceRoute* routes = instanceRoutes(count);
    const RouteGroup groups[] = {RouteGroup::Always, RouteGroup::SupportHdr, RouteGroup::Nic};
    const PathClassTests classes(cop);
    for (RouteGroup group : groups) {
        if (group == RouteGroup::SupportHdr && g_SUPPORT_HDR == 0)
            continue;
        for (std::size_t i = 0; i < count; ++i) {
            const InstanceRoute& route = routes[i];
            if (route.group != group || !classes.isAFixed(route.className))
                continue;
            if (route.rebuild != nullptr) {
                requestlists::remove(*route.rebuild);
                requestlists::build(*route.rebuild);
            }
            call(route.ops);
            break;
        }
    }
}

// Ends the result on a path where the request already failed. A server may
// refuse returnDone for a GetInstance that delivered nothing (OpenPegasus
// answers "Too few objects delivered"); that refusal must not replace the
// request's own status, so it is logged and the caller returns its status.
void returnDoneAfterError(const char* name, CmpiResult& rslt) noexcept
{
    try {
        rslt.returnDone();
    } catch (const CmpiStatus& st) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_CNA_Provider %s: returnDone refused: %d %s", name,
                                             static_cast<int>(st.rc()), st.msg() != nullptr ? st.msg() : "");
    } catch (...) {
    }
}

// The common flow of enumInstanceNames, enumInstances and getInstance, under
// provider_lock from the first step to the last.
template <class Call>
CmpiStatus dispatchInstanceRequest(const char* name, CmpiResult& rslt, const CmpiObjectPath& cop, Call&& call)
{
    {
        ProviderLockGuard lock(&ProviderLocks::provider_lock);
        const RequestScope request;
        try {
            CMPIStatus rc;
            const char* className = classNameText(cop, rc);
            if (rc.rc != CMPI_RC_OK) {
                if (g_EnableLogError)
                    Vexlan_FC_Utils_CMPI::LogError("Vexlan_CNA_Provider %s: Error getting classname, status.rc=%d!",
                                                   name, static_cast<int>(rc.rc));
                returnDoneAfterError(name, rslt);
                return CmpiStatus(rc);
            }
            if (g_EnableDebugPrint)
                Vexlan_FC_Utils_CMPI::DebugPrint("Entering Vexlan_CNA_Provider %s: classname = %s", name,
                                                 className != nullptr ? className : "");
            walkRoutes(cop, call);
            rslt.returnDone();
        } catch (const CmpiStatus& st) {
            if (g_EnableLogError)
                Vexlan_FC_Utils_CMPI::LogError("Vexlan_CNA_Provider %s caught exception status: %d %s", name,
                                               static_cast<int>(st.rc()), st.msg() != nullptr ? st.msg() : "");
            returnDoneAfterError(name, rslt);
            return st;
        } catch (...) {
            if (g_EnableLogError)
                Vexlan_FC_Utils_CMPI::LogError("Vexlan_CNA_Provider %s detected an unknown exception", name);
            returnDoneAfterError(name, rslt);
            std::string text = std::string("Vexlan_CNA_Provider ") + name + " detected an unknown exception";
            return CmpiStatus(CMPI_RC_ERR_FAILED, text.c_str());
        }
    }
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting  Vexlan_CNA_Provider %s\n", name);
    return CmpiStatus(CMPI_RC_OK);
}

}  // namespace

// ---- Construction and lifecycle ---------------------------------------------------

Vexlan_CNA_Provider::Vexlan_CNA_Provider(const CmpiBroker& mbp, const CmpiContext& ctx)
    : CmpiBaseMI(mbp, ctx),
      CmpiInstanceMI(mbp, ctx),
      CmpiAssociationMI(mbp, ctx),
      CmpiIndicationMI(mbp, ctx),
      CmpiMethodMI(mbp, ctx),
      state(),
      pollingEnabled(false)
{
    Vexlan_FC_Utils_CMPI::InitializeLogFile();
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_CNA_Provider constructor was called");

    initMutexOrExit(&ProviderLocks::provider_lock, "provider_lock");
    initMutexOrExit(&ProviderLocks::linux_enable_indications_mutex, "enable_indications_mutex");
    initMutexOrExit(&ProviderLocks::properties_file_lock, "properties_file_lock");
    initMutexOrExit(&ProviderLocks::provider_write_lock, "provider_write_lock");

    // Both log switches off, the configured texts at their defaults, then the
    // settings file; with the debug log on, the banner and the configuration.
    LoadProviderProperties();

    // A provider made again in the same process (after the last cleanup)
    // starts with the subscription gate closed, as a fresh load does.
    IndicationGate::m_bIndicationEnabled = false;
    IndicationGate::m_numSubscriptions = 0;

    state.initialized = false;
    state.initializing = false;
    pollingEnabled = false;
}

Vexlan_CNA_Provider::~Vexlan_CNA_Provider()
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider destructor was called *****");
    pthread_mutex_destroy(&ProviderLocks::provider_lock);
    pthread_mutex_destroy(&ProviderLocks::linux_enable_indications_mutex);
    pthread_mutex_destroy(&ProviderLocks::properties_file_lock);
    pthread_mutex_destroy(&ProviderLocks::provider_write_lock);
    ProviderState* self = &state;
    g_RunningProviderState.compare_exchange_strong(self, nullptr);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_CNA_Provider destructor complete");
}

CmpiContext* Vexlan_CNA_Provider::prepareThreadContext(const CmpiContext& ctx)
{
    try {
        contextHolders_.push_back(std::make_unique<CmpiContext>(broker->prepareAttachThread(ctx)));
        return contextHolders_.back().get();
    } catch (...) {
        return nullptr;
    }
}

CmpiStatus Vexlan_CNA_Provider::initialize(const CmpiContext& ctx)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider initialize was called *****");
    if (state.initialized) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider already initialized *****\n\n");
        sleep(2);
        return CmpiStatus(CMPI_RC_OK);
    }
    // From here until cleanup the flash workers may send their jobs'
    // lifecycle indications.
    jobindication::open();
    // The running thread keeps the context it attached with until it ends.
    if (!pollingEnabled)
        state.threadArgs.context = prepareThreadContext(ctx);
    startPollingLoop(ctx);
    // Gives the new thread time to take provider_lock, so that a request that
    // follows waits for the first build instead of seeing empty lists.
    sleep(2);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider initialize done *****\n\n");
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus Vexlan_CNA_Provider::cleanup(CmpiContext&)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider cleanup was called *****");
    // No job indication is built or delivered from here on; a worker that
    // is delivering one is waited for. Then a flash worker still writing is
    // waited for: no code of the provider may run once the last cleanup has
    // returned.
    jobindication::close();
    WaitForFlashWorkers();
    bool started = state.initializing || state.initialized;
    if (state.initializing) {
        while (!state.initialized)
            sleep(1);
    }
    if (started) {
        stopPollingLoop();
        cleanupAgent();
        state.initialized = false;
        state.initializing = false;
    }
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider cleanup done *****");
    return CmpiStatus(CMPI_RC_OK);
}

bool Vexlan_CNA_Provider::isUnloadable() const
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("***** Vexlan_CNA_Provider isUnloadable was called *****");
    if (gbFlashUpdateInProgress) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint(
                "***** Vexlan_CNA_Provider Flash update in progress. So, prevent unloading*****");
        return false;
    }
    return true;
}

void Vexlan_CNA_Provider::cleanupAgent()
{
    ProviderLockGuard lock(&ProviderLocks::provider_lock);
    Clear_CNA_List();
    kPollingSteps.Clear_RegisteredProfile_List();
    std::size_t count = 0;
    const ListSequenceRow* rows = listSequence(count);
    for (std::size_t i = 0; i < count; ++i) {
        if (rows[i].supportHdr && g_SUPPORT_HDR == 0)
            continue;
        rows[i].ops->remove();
    }
    ZORAP_UnRegisterAlarmNotificationCallback(kPollingSteps.alarmCallback);
    ZORAP_Uninitialize();
    classtests::forget();
}

// ---- Instance requests -------------------------------------------------------------

CmpiStatus Vexlan_CNA_Provider::enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                                  const CmpiObjectPath& cop)
{
    return dispatchInstanceRequest("enumInstanceNames", rslt, cop,
                                   [&](const ClassOps& ops) { ops.enumInstanceNames(ctx, rslt, cop); });
}

CmpiStatus Vexlan_CNA_Provider::enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                                              const char** properties)
{
    return dispatchInstanceRequest("enumInstances", rslt, cop,
                                   [&](const ClassOps& ops) { ops.enumInstances(ctx, rslt, cop, properties); });
}

CmpiStatus Vexlan_CNA_Provider::getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                                            const char** properties)
{
    return dispatchInstanceRequest("getInstance", rslt, cop,
                                   [&](const ClassOps& ops) { ops.getInstance(ctx, rslt, cop, properties, true); });
}

CmpiStatus Vexlan_CNA_Provider::createInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                               const CmpiInstance&)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_CNA_Provider createInstance was called but NOT SUPPORTED");
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, "Vexlan_CNA_Provider cannot create");
}

CmpiStatus Vexlan_CNA_Provider::setInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                                            const CmpiInstance&, const char**)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_CNA_Provider setInstance was called but NOT SUPPORTED");
    // Waits for any running request and any running backup enumeration.
    {
        ProviderLockGuard outer(&ProviderLocks::provider_lock);
        ProviderLockGuard inner(&ProviderLocks::provider_write_lock);
    }
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, "Vexlan_CNA_Provider cannot set");
}

CmpiStatus Vexlan_CNA_Provider::deleteInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_CNA_Provider deleteInstance was called but NOT SUPPORTED");
    return CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, "Vexlan_CNA_Provider cannot delete");
}

// ---- Methods --------------------------------------------------------------------------

CmpiStatus Vexlan_CNA_Provider::invokeMethod(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& ref,
                                             const char* methodName, const CmpiArgs& in, CmpiArgs& out)
{
    // Up to five rounds of 2 seconds for the first build; the call goes on
    // after them whether it has finished or not.
    for (int round = 0; round < 5; ++round) {
        if (!state.initialized) {
            if (g_EnableDebugPrint)
                Vexlan_FC_Utils_CMPI::DebugPrint("invokeMethod is waiting for the provider to initialize...");
            sleep(2);
        }
    }
    {
        // An exception out of a method passes to the wrapper, which turns it
        // into the status; the guards release both locks on the way.
        ProviderLockGuard outer(&ProviderLocks::provider_lock);
        ProviderLockGuard inner(&ProviderLocks::provider_write_lock);
        CMPIStatus rc;
        const char* className = classNameText(ref, rc);
        if (rc.rc != CMPI_RC_OK) {
            if (g_EnableLogError)
                Vexlan_FC_Utils_CMPI::LogError("Vexlan_CNA_Provider: invokeMethod error getting ClassName\n");
            rslt.returnDone();
            return CmpiStatus(rc);
        }
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("Entering Vexlan_CNA_Provider invokeMethod: classname = %s, MethodName=%s",
                                             className != nullptr ? className : "",
                                             methodName != nullptr ? methodName : "");
        std::size_t count = 0;
        const MethodRoute* routes = methodRoutes(count);
        // Cleared on every way out, exceptions included.
        struct MethodContextScope {
            Vexlan_CNA_Provider& provider;
            MethodContextScope(Vexlan_CNA_Provider& p, const CmpiContext& c) : provider(p) { p.state.methodContext = &c; }
            ~MethodContextScope() { provider.state.methodContext = nullptr; }
        } scope(*this, ctx);
        const PathClassTests classes(ref);
        for (std::size_t i = 0; i < count; ++i) {
            if (classes.isAFixed(routes[i].className)) {
                routes[i].invokeMethod(ctx, rslt, ref, methodName, in, out);
                break;
            }
        }
        rslt.returnDone();
    }
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting  Vexlan_CNA_Provider invokeMethod\n");
    return CmpiStatus(CMPI_RC_OK);
}

// ---- Associations ---------------------------------------------------------------------
// The association dispatch of associations/AssocDispatch.h.

CmpiStatus Vexlan_CNA_Provider::associators(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                            const char* assocClass, const char* resultClass, const char* role,
                                            const char* resultRole, const char** properties)
{
    return assocdispatch::associators(ctx, rslt, op, assocClass, resultClass, role, resultRole, properties);
}

CmpiStatus Vexlan_CNA_Provider::associatorNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                                const char* assocClass, const char* resultClass, const char* role,
                                                const char* resultRole)
{
    return assocdispatch::associatorNames(ctx, rslt, op, assocClass, resultClass, role, resultRole);
}

CmpiStatus Vexlan_CNA_Provider::references(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                           const char* resultClass, const char* role, const char** properties)
{
    return assocdispatch::references(ctx, rslt, op, resultClass, role, properties);
}

CmpiStatus Vexlan_CNA_Provider::referenceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                                               const char* resultClass, const char* role)
{
    return assocdispatch::referenceNames(ctx, rslt, op, resultClass, role);
}

// ---- Indications ------------------------------------------------------------------------
// The subscription gate: one process-wide switch, on while at least one filter
// is active. Every filter is accepted and its query is never looked at.

namespace {
void debugLine(const char* text)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("%s", text);
}
}  // namespace

CmpiStatus Vexlan_CNA_Provider::authorizeFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                                const CmpiObjectPath&, const char*)
{
    debugLine("Entering Vexlan_CNA_Provider authorizeFilter\n");
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus Vexlan_CNA_Provider::mustPoll(const CmpiContext&, const CmpiSelectExp&, const char*,
                                         const CmpiObjectPath&)
{
    debugLine("Entering Vexlan_CNA_Provider mustPoll\n");
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus Vexlan_CNA_Provider::activateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                               const CmpiObjectPath&, CMPIBoolean)
{
    debugLine("Entering Vexlan_CNA_Provider activateFilter\n");
    IndicationGate::m_bIndicationEnabled = true;
    // The count lines are formatted first and written as texts of their own.
    char text[64];
    snprintf(text, sizeof(text), "Number of subscriptions is: %d\n", ++IndicationGate::m_numSubscriptions);
    debugLine(text);
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus Vexlan_CNA_Provider::deActivateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                                 const CmpiObjectPath&, CMPIBoolean)
{
    debugLine("Entering Vexlan_CNA_Provider deActivateFilter\n");
    // Only a count of exactly 0 closes the gate: after an unbalanced
    // deactivation the count goes below 0 and the switch stays as it was.
    const int before = IndicationGate::m_numSubscriptions.fetch_sub(1);
    char text[64];
    snprintf(text, sizeof(text), "Number of subscriptions still available is: %d\n", before);
    debugLine(text);
    if (before - 1 == 0)
        IndicationGate::m_bIndicationEnabled = false;
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus Vexlan_CNA_Provider::enableIndications()
{
    debugLine("Entering Vexlan_CNA_Provider enableIndications\n");
    // Waits for the end of the first build, over which the polling thread
    // holds this mutex.
    {
        ProviderLockGuard lock(&ProviderLocks::linux_enable_indications_mutex);
        IndicationGate::m_bIndicationEnabled = true;
    }
    debugLine("enableIndications: Indication enabled\n");
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus Vexlan_CNA_Provider::disableIndications()
{
    debugLine("Entering Vexlan_CNA_Provider disableIndications\n");
    IndicationGate::m_bIndicationEnabled = false;
    debugLine("disableIndications:Indications disabled\n");
    return CmpiStatus(CMPI_RC_OK);
}

// ---- Operations of the parts on this provider's state ------------------------------------

void Vexlan_CNA_Provider::m_generateIndication(unsigned int deviceNum, int alarmType, int rsltParam,
                                               unsigned char* strParam)
{
    ::m_generateIndication(state.threadArgs, deviceNum, alarmType, rsltParam, strParam);
}

void Vexlan_CNA_Provider::generatePortAlertIndication(int alarmType, _CNAStruc* adapter, _CNAPortStruc* port)
{
    ::generatePortAlertIndication(state.threadArgs, alarmType, adapter, port);
}

bool Vexlan_CNA_Provider::StartFCFlashUpdateThread(_tagZORAPSDMDevice* device, const unsigned char* fileName,
                                                   CmpiObjectPath& jobPath)
{
    return ::StartFCFlashUpdateThread(state, device, fileName, jobPath);
}

bool Vexlan_CNA_Provider::StartNICFlashUpdateThread(_CNAStruc* adapter, const unsigned char* fileName,
                                                    unsigned long long imageSize, CmpiObjectPath& jobPath)
{
    return ::StartNICFlashUpdateThread(state, adapter, fileName, imageSize, jobPath);
}

void Vexlan_CNA_Provider::SerializeConcreteJobInfo()
{
    SerializeConcreteJobToPrefFile();
}

void Vexlan_CNA_Provider::DeserializeConcreteJobInfo()
{
    DeserializeConcreteJobToPrefFile();
}
