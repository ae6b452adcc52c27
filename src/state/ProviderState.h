// The state that the provider shares with its parts. The provider object
// holds one and owns its life: it is made with the provider and goes with
// it. Each part takes only what it needs: the locks (state/ProviderLocks.h),
// the subscription gate (state/IndicationGate.h), the polling thread's block
// (state/PollingBlock.h), the job store (state/JobStore.h), or this whole.
#ifndef VEXLAN_STATE_PROVIDERSTATE_H
#define VEXLAN_STATE_PROVIDERSTATE_H

#include <atomic>

#include "CmpiImpl.h"
#include "state/IndicationGate.h"
#include "state/JobStore.h"
#include "state/PollingBlock.h"
#include "state/ProviderLocks.h"

struct ProviderState : ProviderLocks, IndicationGate {
    // Every known update job by id, under jobStoreLock().
    ConcreteJobMap jobMap;
    // The context of the method request being served, set by invokeMethod
    // under provider_lock for the length of the call; the job starts prepare
    // each flash worker's own context from it. Null otherwise.
    const CmpiContext* methodContext = nullptr;

    // Set by the polling thread: initializing as the first build begins,
    // initialized when it has finished. Read without a lock by invokeMethod,
    // cleanup and the alarm hand-off.
    std::atomic<bool> initialized{false};
    std::atomic<bool> initializing{false};
    ThreadArgs threadArgs{};
};

// The state of the provider whose polling thread runs: set by that thread as
// its first act, withdrawn when that provider goes; null before and after.
// The paths that no caller hands the state read it, and tolerate null: the
// adapter library's alarm callback, the installation services' job starts,
// the flash workers, the job file steps and Vexlan_Adapter_ConcreteJob.
extern std::atomic<ProviderState*> g_RunningProviderState;

#endif
