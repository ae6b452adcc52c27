// Update jobs: the record and the map live in the job store
// (state/JobStore.h); here are the job's JobState and PercentComplete, the
// choice of a free job id, and the time of a job's changes.
#ifndef VEXLAN_UPDATE_CONCRETEJOB_H
#define VEXLAN_UPDATE_CONCRETEJOB_H

#include <optional>

#include "state/JobStore.h"

// `status` as the JobState of Vexlan_Adapter_ConcreteJob: 1 gives 10
// (Exception), 2 gives 7 (Completed), any other value 4 (Running).
unsigned short JobStateOfStatus(unsigned int status);

// PercentComplete of a job, where the job can know it. The adapter library's
// write reports nothing until it returns, so a job is at 0 while its worker
// writes in this provider and at 100 once it completed; a failed job, and a
// job that the job file shows running with no worker of this provider behind
// it, can't tell (nullopt: the property stays unset).
std::optional<unsigned short> JobPercentComplete(const Concrete_Job& job);

// A free job id below 65535, drawn from rand() as a job's id always was; the
// map of the running provider (g_RunningProviderState) is searched. kNoJobId
// when every id is taken.
constexpr unsigned int kNoJobId = 0xFFFFFFFFu;
unsigned PickNextJobId();
unsigned PickNextJobIdIn(const ConcreteJobMap& jobs);

// The present time in microseconds since the Epoch, as CmpiDateTime gives it,
// read without the broker (the workers may not call it).
unsigned long long JobTimeNow();

#endif
