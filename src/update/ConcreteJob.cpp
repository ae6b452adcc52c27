// The job record's helpers, the job store's lock and the choice of job ids.
#include "update/ConcreteJob.h"

#include <time.h>

#include <cstdlib>

#include "state/ProviderState.h"
#include "update/FlashUpdate.h"

namespace {
// Ids are 0 to 65534, so at most this many jobs can stand in the map.
constexpr std::size_t kJobIdCount = 0xFFFF;
}  // namespace

unsigned short JobStateOfStatus(unsigned int status)
{
    switch (status) {
    case 1:
        return 10;
    case 2:
        return 7;
    default:
        return 4;
    }
}

std::optional<unsigned short> JobPercentComplete(const Concrete_Job& job)
{
    if (job.status == 2)
        return 100;
    if (job.status == 0 && FlashWorkerRunsJob(job.id))
        return 0;
    return std::nullopt;
}

unsigned PickNextJobIdIn(const ConcreteJobMap& jobs)
{
    // With every id taken no draw can succeed: the job is refused instead of
    // drawing for ever.
    if (jobs.size() >= kJobIdCount)
        return kNoJobId;
    for (;;) {
        const unsigned id = static_cast<unsigned>(std::rand() % 0xFFFF);
        if (jobs.find(id) == jobs.end())
            return id;
    }
}

unsigned PickNextJobId()
{
    ProviderState* provider = g_RunningProviderState.load();
    std::lock_guard<std::recursive_mutex> guard(jobStoreLock());
    if (provider == nullptr)
        return PickNextJobIdIn(ConcreteJobMap());
    return PickNextJobIdIn(provider->jobMap);
}

unsigned long long JobTimeNow()
{
    struct timespec now {};
    clock_gettime(CLOCK_REALTIME, &now);
    return static_cast<unsigned long long>(now.tv_sec) * 1000000ULL +
           static_cast<unsigned long long>(now.tv_nsec) / 1000ULL;
}
