// The adapter polling thread: it brings the adapter library up, builds every
// list for the first time under provider_lock, then wakes once a second; when
// the poll interval has passed it asks the library whether the configuration
// changed, rebuilds everything if so, and runs the link watch.
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <ctime>

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "indications/Vexlan_CNA_HBAProviderIndications_CMPI.h"
#include "inventory/AdapterFunc.h"
#include "provider/Vexlan_CNA_Provider_CMPI.h"
#include "provider/Vexlan_CNA_Provider_Tables.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Properties.h"
#include "support/ossimpl-CIM.h"
#include "zorap_cna.h"

namespace vexlan {
extern const char kProviderVersion[];
}

int gNeedRefresh = 0;

namespace {

void debug(const char* text)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("%s", text);
}

int pollingInterval()
{
    return Vexlan_NIC_Properties::instance()->linkStatusPollIntervalSeconds;
}

bool hdrRowSkipped(const ListSequenceRow& row)
{
    return row.supportHdr && g_SUPPORT_HDR == 0;
}

// The build sequence: every list in table order.
void buildAllLists()
{
    std::size_t count = 0;
    const ListSequenceRow* rows = listSequence(count);
    for (std::size_t i = 0; i < count; ++i)
        if (!hdrRowSkipped(rows[i]))
            rows[i].ops->build();
}

void removeAllLists()
{
    std::size_t count = 0;
    const ListSequenceRow* rows = listSequence(count);
    for (std::size_t i = 0; i < count; ++i)
        if (!hdrRowSkipped(rows[i]))
            rows[i].ops->remove();
}

// The first build, with provider_lock and linux_enable_indications_mutex held.
void firstBuild(ProviderState& provider)
{
    ProviderLockGuard lock(&ProviderLocks::provider_lock);
    // The indication mutex is never held across a request, so there is no
    // earlier holding to clear: an unlock of a mutex that this thread does not
    // hold is not made, and the line is the one such an unlock reports on a
    // default mutex. Then the mutex is taken for the whole build.
    debug("Indication Mutex was locked and has been unlocked ...");
    ProviderLockGuard indications(&ProviderLocks::linux_enable_indications_mutex);

    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan CNA CMPI provider, version: %s", vexlan::kProviderVersion);
    provider.initializing = true;

    time_t start = time(nullptr);
    GetHostName(hostName_ComputerSystem, &hostNameType_ComputerSystem, sizeof(hostName_ComputerSystem));
    ZORAP_Initialize(g_EnableZORAPLog ? 0x1f : 0, 0);
    debug("After ZORAP_Initialize");
    ZORAP_RegisterAlarmNotificationCallback(kPollingSteps.alarmCallback);
    debug("After ZORAP_RegisterAlarmNotificationCallback");
    kPollingSteps.DeserializeConcreteJobToPrefFile();
    debug("After DeserializeConcreteJobToPrefFile");
    Initialize_CNA_List();
    debug("After Initialize_CNA_List");
    buildAllLists();
    kPollingSteps.InitializeRegisteredProfileList();
    time_t end = time(nullptr);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_CNA_Provider::time taken to initialize devices: %.0f seconds.",
                                         difftime(end, start));
    provider.initialized = true;
}

// The rebuild after a configuration change. The slow enumeration runs outside
// provider_lock, so requests keep being answered from the old lists.
void rebuild()
{
    debug("gNeedRefresh flag is ON");
    {
        ProviderLockGuard write(&ProviderLocks::provider_write_lock);
        debug("About to call ZORAP_UpdateBackupAdapterList()");
        ZORAP_UpdateBackupAdapterList();
        debug("After the call to ZORAP_UpdateBackupAdapterList()");
    }
    {
        ProviderLockGuard lock(&ProviderLocks::provider_lock);
        debug("About to call ZORAP_SwapBackupToMainAdapterList()");
        ZORAP_SwapBackupToMainAdapterList();
        debug("After the call to ZORAP_SwapBackupToMainAdapterList()");
        Clear_CNA_List();
        kPollingSteps.Clear_RegisteredProfile_List();
        removeAllLists();
        buildAllLists();
        kPollingSteps.DeserializeConcreteJobToPrefFile();
        Initialize_CNA_List();
        kPollingSteps.InitializeRegisteredProfileList();
        debug("After the call to buildFCPortList()");
    }
    gNeedRefresh = 0;
}

// One round of the main loop: a poll when the interval has passed and no
// flash write runs.
void pollRound(ThreadArgs& args, time_t& lastPoll)
{
    time_t now = time(nullptr);
    if (difftime(now, lastPoll) > pollingInterval() && !gbFlashUpdateInProgress) {
        gNeedRefresh = ZORAP_DidConfigChange();
        ZORAP_ResetConfigChange();
        if (gNeedRefresh != 0)
            rebuild();
        {
            ProviderLockGuard lock(&ProviderLocks::provider_lock);
            kPollingSteps.Update_CNA_List(args);
        }
        lastPoll = now;
    }
}

// Waits up to a second for a stop request; true when one was made. An
// adapter alarm handed to the thread ends the wait at once.
bool waitForStop(ThreadArgs& args)
{
    ProviderLockGuard lock(&args.mutex);
    if (!args.stopRequested) {
        struct timespec until;
        clock_gettime(CLOCK_REALTIME, &until);
        until.tv_sec += 1;
        while (!args.stopRequested && !alarmsPending()) {
            if (pthread_cond_timedwait(&args.changed, &args.mutex, &until) == ETIMEDOUT)
                break;
        }
    }
    return args.stopRequested;
}

}  // namespace

void* AdapterPollingLoop(void* rawArgs)
{
    debug("AdapterPollingLoop() starting");
    auto* args = static_cast<ThreadArgs*>(rawArgs);
    if (args == nullptr || args->broker == nullptr || args->context == nullptr || args->provider == nullptr) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("**** Error: Thread context not established for poll thread");
        exit(1);
    }
    ProviderState& provider = *args->provider;
    g_RunningProviderState = args->provider;

    try {
        args->broker->attachThread(*args->context);
    } catch (const CmpiStatus& st) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("AdapterPollingLoop() attachThread failed, status.rc=%d!",
                                           static_cast<int>(st.rc()));
    }
    // From here on the thread receives the adapter library's alarms.
    startAlarmHandOff(*args);

    // A failure inside a build must not end the process: it is logged, and
    // the thread goes on with what was built.
    try {
        firstBuild(provider);
    } catch (...) {
        provider.initialized = true;
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("AdapterPollingLoop() detected an exception during the first build");
    }
    debug("FCPort & PortController classes initialized...");

    time_t lastPoll = time(nullptr);
    for (;;) {
        try {
            runPendingAlarms(*args);
            pollRound(*args, lastPoll);
        } catch (...) {
            if (g_EnableLogError)
                Vexlan_FC_Utils_CMPI::LogError("AdapterPollingLoop() detected an exception during a poll");
        }
        if (waitForStop(*args))
            break;
    }

    stopAlarmHandOff();
    debug("AdapterPollingLoop() thread has been killed");
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("AdapterPollingLoop() calling detachThread(%p)",
                                         static_cast<void*>(args->context));
    try {
        args->broker->detachThread(*args->context);
    } catch (const CmpiStatus& st) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("AdapterPollingLoop() detachThread failed, status.rc=%d!",
                                           static_cast<int>(st.rc()));
    }
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("AdapterPollingLoop() returned from detachThread(%p)",
                                         static_cast<void*>(args->context));
    {
        ProviderLockGuard lock(&args->mutex);
        args->threadExited = true;
        pthread_cond_broadcast(&args->changed);
    }
    debug("AdapterPollingLoop() ending...\n");
    return nullptr;
}

int Vexlan_CNA_Provider::GetPollingInterval()
{
    return pollingInterval();
}

void Vexlan_CNA_Provider::startPollingLoop(const CmpiContext& ctx)
{
    debug("Start Polling Loop");
    if (pollingEnabled) {
        debug("  Polling already enabled");
        return;
    }
    state.threadArgs.broker = broker;
    state.threadArgs.context = prepareThreadContext(ctx);
    state.threadArgs.provider = &state;
    state.threadArgs.stopRequested = false;
    state.threadArgs.threadExited = false;

    // The block's mutex and condition exist before the thread that uses them.
    int rc = pthread_mutex_init(&state.threadArgs.mutex, nullptr);
    if (rc != 0) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Error %d Initializing provider_lock mutex", rc);
        exit(1);
    }
    pthread_cond_init(&state.threadArgs.changed, nullptr);

    rc = pthread_create(&state.threadArgs.threadId, nullptr, AdapterPollingLoop, &state.threadArgs);
    if (rc != 0) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Error %d creating the polling thread", rc);
        pthread_cond_destroy(&state.threadArgs.changed);
        pthread_mutex_destroy(&state.threadArgs.mutex);
        return;
    }
    pollingEnabled = true;
    debug("Polling Loop Started");
}

void Vexlan_CNA_Provider::stopPollingLoop()
{
    debug("Stop Polling Loop");
    if (!pollingEnabled) {
        debug("  Polling already disabled");
        return;
    }
    {
        ProviderLockGuard lock(&state.threadArgs.mutex);
        state.threadArgs.stopRequested = true;
        pthread_cond_broadcast(&state.threadArgs.changed);
        while (!state.threadArgs.threadExited) {
            struct timespec until;
            clock_gettime(CLOCK_REALTIME, &until);
            until.tv_sec += 1;
            pthread_cond_timedwait(&state.threadArgs.changed, &state.threadArgs.mutex, &until);
        }
    }
    debug("stopPollingLoop() calling pthread_join");
    int rc = pthread_join(state.threadArgs.threadId, nullptr);
    if (rc != 0) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("stopPollingLoop() called to pthread_join failed with %d", rc);
    } else {
        debug("stopPollingLoop() completed pthread_join");
    }
    pthread_cond_destroy(&state.threadArgs.changed);
    pthread_mutex_destroy(&state.threadArgs.mutex);
    pollingEnabled = false;
}
