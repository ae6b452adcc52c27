// The flash update workers and the two start functions.
#include "update/FlashUpdate.h"

#include <pthread.h>
#include <time.h>

#include <cstdio>
#include <cstring>
#include <list>
#include <mutex>
#include <new>
#include <string>
#include <utility>

#include "indications/Vexlan_Adapter_JobIndications.h"
#include "inventory/AdapterFunc.h"
#include "state/ProviderState.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "update/ConcreteJob.h"
#include "update/JobPersistence.h"

namespace {

#define FLASH_DEBUG(...)                                   \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)
#define FLASH_ERROR(...)                                 \
    do {                                                 \
        if (g_EnableLogError)                            \
            Vexlan_FC_Utils_CMPI::LogError(__VA_ARGS__); \
    } while (0)

// The worker threads not yet joined. A worker marks itself finished as its
// last act; finished ones are joined when the next job starts, all of them
// (waiting for the running ones) when the provider is cleaned up. `channel`
// is what the worker sends its job's lifecycle indications through: the
// provider's broker and a context prepared for the worker by the request
// that started it, which the worker attaches with and detaches (the broker
// then frees it).
struct Worker {
    pthread_t thread;
    bool finished;
    unsigned int jobId;
    jobindication::Channel channel;
};
std::mutex workersLock;
// Made in storage of its own and never destroyed: the library's unload code
// cleans a provider up (and so joins its workers) while the library's other
// objects are being destroyed, in an order that nothing fixes. Empty once the
// workers are joined, so it holds nothing then.
alignas(std::list<Worker>) unsigned char workersStorage[sizeof(std::list<Worker>)];
std::list<Worker>& workers = *new (workersStorage) std::list<Worker>;

void markFinished()
{
    std::lock_guard<std::mutex> guard(workersLock);
    for (Worker& w : workers)
        if (pthread_equal(w.thread, pthread_self()))
            w.finished = true;
}

// The channel of the calling worker, handed over to it: the record keeps
// none, so nothing else uses the context the worker detaches.
jobindication::Channel takeChannel()
{
    std::lock_guard<std::mutex> guard(workersLock);
    jobindication::Channel channel;
    for (Worker& w : workers)
        if (pthread_equal(w.thread, pthread_self()))
            std::swap(channel, w.channel);
    return channel;
}

// A context for a new worker, prepared from the method request that starts
// it; none when the start comes from elsewhere or the broker gives none.
jobindication::Channel prepareChannel(ProviderState& provider)
{
    jobindication::Channel channel;
    if (provider.threadArgs.broker == nullptr || provider.methodContext == nullptr)
        return channel;
    try {
        channel.context = provider.threadArgs.broker->prepareAttachThread(*provider.methodContext).getEnc();
        channel.broker = provider.threadArgs.broker;
    } catch (...) {
        FLASH_ERROR("Flash update job: no thread context for its lifecycle indications");
    }
    return channel;
}

// A worker's own side of its channel: attached while it runs.
class AttachedWorker {
public:
    AttachedWorker() : channel_(takeChannel())
    {
        if (!channel_.usable())
            return;
        try {
            channel_.broker->attachThread(CmpiContext(channel_.context));
        } catch (...) {
            FLASH_ERROR("Flash update job: attachThread failed, no lifecycle indications");
            channel_ = jobindication::Channel();
        }
    }
    ~AttachedWorker()
    {
        if (!channel_.usable())
            return;
        try {
            channel_.broker->detachThread(CmpiContext(channel_.context));
        } catch (...) {
            FLASH_ERROR("Flash update job: detachThread failed");
        }
    }
    AttachedWorker(const AttachedWorker&) = delete;
    AttachedWorker& operator=(const AttachedWorker&) = delete;
    const jobindication::Channel& channel() const { return channel_; }

private:
    jobindication::Channel channel_;
};

// Joins the workers that are done (all of them with `all`, waiting for the
// rest). Never called by a worker.
void joinWorkers(bool all)
{
    std::list<Worker> toJoin;
    {
        std::lock_guard<std::mutex> guard(workersLock);
        for (auto it = workers.begin(); it != workers.end();) {
            if (all || it->finished) {
                toJoin.push_back(*it);
                it = workers.erase(it);
            } else {
                ++it;
            }
        }
    }
    for (const Worker& w : toJoin)
        pthread_join(w.thread, nullptr);
}

// "%s %s flash update with %s at %s." of the serial, the image and the local
// time (ctime's text without its newline), cut to the 1024 bytes of the
// description.
std::string jobDescription(const char* side, const std::string& serial, const unsigned char* fileName)
{
    time_t now = time(nullptr);
    char when[64] = {};
    ctime_r(&now, when);
    const std::size_t n = std::strlen(when);
    if (n > 0)
        when[n - 1] = '\0';
    char text[1024] = {};
    std::snprintf(text, sizeof(text), "%s %s flash update with %s at %s.", serial.c_str(), side,
                  fileName != nullptr ? reinterpret_cast<const char*>(fileName) : "", when);
    return text;
}

// Enters the job, starts its worker, saves the jobs and names the job in
// `jobPath`. False, with the job taken back out, when no id is free or the
// thread can't start.
bool startJob(ProviderState& provider, Concrete_Job& job, void* (*proc)(void*), CmpiObjectPath& jobPath)
{
    joinWorkers(false);
    std::lock_guard<std::recursive_mutex> guard(jobStoreLock());
    job.id = PickNextJobIdIn(provider.jobMap);
    if (job.id == kNoJobId) {
        FLASH_ERROR("Flash update refused: every job id (0 to 65534) is taken.");
        return false;
    }
    job.timeOfLastStateChange = JobTimeNow();
    auto* heapJob = new (std::nothrow) Concrete_Job(job);
    if (heapJob == nullptr)
        return false;
    // The worker's own copy is complete before it starts, and the map's entry
    // stands before the worker can reach the map (it waits for this lock).
    provider.jobMap.insert({job.id, job});
    const jobindication::Channel channel = prepareChannel(provider);
    pthread_t thread;
    {
        std::lock_guard<std::mutex> workersGuard(workersLock);
        pthread_attr_t attr;
        pthread_attr_init(&attr);
        const int rc = pthread_create(&thread, &attr, proc, heapJob);
        pthread_attr_destroy(&attr);
        if (rc != 0) {
            FLASH_ERROR("Error %d creating the flash update job thread", rc);
            provider.jobMap.erase(job.id);
            delete heapJob;
            if (channel.usable()) {
                try {
                    channel.broker->detachThread(CmpiContext(channel.context));
                } catch (...) {
                }
            }
            return false;
        }
        workers.push_back(Worker{thread, false, job.id, channel});
    }
    provider.jobMap[job.id].threadId = thread;
    SerializeConcreteJobToPrefFile();
    char id[256] = {};
    std::snprintf(id, sizeof(id), "%u", job.id);
    jobPath.setKey("InstanceID", CmpiData(id));
    return true;
}

// The end of a worker: the job's final state in the map (twice, the second
// time with the end time), the flag cleared, the jobs saved, the change of
// JobState sent, the copy freed.
void finishJob(Concrete_Job* job, unsigned int result, const AttachedWorker& attached,
               const std::string& creationIdentifier)
{
    const Concrete_Job previous = *job;
    job->status = result == 0 ? 2 : 1;
    job->result = result;
    gbFlashUpdateInProgress = false;
    ProviderState* provider = g_RunningProviderState.load();
    {
        std::lock_guard<std::recursive_mutex> guard(jobStoreLock());
        if (provider != nullptr)
            provider->jobMap[job->id] = *job;
        job->timeOfLastStateChange = JobTimeNow();
        if (provider != nullptr) {
            provider->jobMap[job->id] = *job;
            SerializeConcreteJobToPrefFile();
        }
    }
    jobindication::sendModification(attached.channel(), previous, *job, creationIdentifier);
    delete job;
}

// A worker started without its job (or with the other side's) ends at once.
bool refuseWithoutJob(Concrete_Job* job, bool nic)
{
    if (job != nullptr && job->isNic == nic)
        return false;
    FLASH_ERROR(nic ? "**** Error: Thread context not established for NIC flash update thread"
                    : "**** Error: Thread context not established for FC flash update thread");
    gbFlashUpdateInProgress = false;
    { AttachedWorker releasesItsContext; }
    markFinished();
    return true;
}

const unsigned char* bytesOf(const std::string& s)
{
    return reinterpret_cast<const unsigned char*>(s.c_str());
}

// The life of a worker with its job: attached to the broker, the creation
// sent, the write, the end of the job with its modification, detached, and
// marked finished last.
template <class Write>
void runWorker(Concrete_Job* job, Write&& write)
{
    {
        AttachedWorker attached;
        const std::string creation = jobindication::sendCreation(attached.channel(), *job);
        const unsigned result = write(*job);
        finishJob(job, result, attached, creation);
    }
    markFinished();
}

}  // namespace

void* FCFlashUpdateProc(void* arg)
{
    auto* job = static_cast<Concrete_Job*>(arg);
    if (refuseWithoutJob(job, false))
        return nullptr;
    runWorker(job, [](Concrete_Job& j) {
        FLASH_DEBUG("FCFlashUpdateProc: Will do asynchronous update on adapter with serial number = %s, with flash file = %s.",
                    j.serialNumber.c_str(), j.imageFile.c_str());
        const ZORAP_STATUS result = ZORAP_doOptionROMUpdate(j.device, bytesOf(j.imageFile), 0);
        FLASH_DEBUG("FCFlashUpdateProc: ZORAP_UpdateFlash returns %u", static_cast<unsigned>(result));
        return static_cast<unsigned>(result);
    });
    return nullptr;
}

void* NICFlashUpdateProc(void* arg)
{
    auto* job = static_cast<Concrete_Job*>(arg);
    if (refuseWithoutJob(job, true))
        return nullptr;
    runWorker(job, [](Concrete_Job& j) {
        FLASH_DEBUG("NICFlashUpdateProc: Will do asynchronous update on adapter with serial number = %s, index = %u, "
                    "with flash file = %s.",
                    j.serialNumber.c_str(), j.adapterInstance, j.imageFile.c_str());
        const ZORAP_STATUS result = ZORAP_UpdateFlash(j.adapterInstance, bytesOf(j.imageFile), 0);
        FLASH_DEBUG("NICFlashUpdateProc: ZORAP_UpdateFlash returns %u", static_cast<unsigned>(result));
        return static_cast<unsigned>(result);
    });
    return nullptr;
}

void WaitForFlashWorkers()
{
    joinWorkers(true);
}

bool FlashWorkerRunsJob(unsigned int id)
{
    std::lock_guard<std::mutex> guard(workersLock);
    for (const Worker& w : workers)
        if (w.jobId == id && !w.finished)
            return true;
    return false;
}

int FlashWorkerCount()
{
    std::lock_guard<std::mutex> guard(workersLock);
    return static_cast<int>(workers.size());
}

bool StartFCFlashUpdateThread(ProviderState& provider, _tagZORAPSDMDevice* device, const unsigned char* fileName,
                              CmpiObjectPath& jobPath)
{
    Concrete_Job job;
    job.isNic = false;
    job.device = device;
    job.imageFile = fileName != nullptr ? reinterpret_cast<const char*>(fileName) : "";
    if (device != nullptr)
        job.serialNumber.assign(device->deviceSerial, strnlen(device->deviceSerial, sizeof(device->deviceSerial)));
    job.description = jobDescription("FC", job.serialNumber, fileName);
    return startJob(provider, job, FCFlashUpdateProc, jobPath);
}

bool StartNICFlashUpdateThread(ProviderState& provider, _CNAStruc* adapter, const unsigned char* fileName,
                               unsigned long long, CmpiObjectPath& jobPath)
{
    Concrete_Job job;
    job.isNic = true;
    job.adapter = adapter;
    job.imageFile = fileName != nullptr ? reinterpret_cast<const char*>(fileName) : "";
    if (adapter != nullptr) {
        job.serialNumber.assign(adapter->serialNumber, strnlen(adapter->serialNumber, sizeof(adapter->serialNumber)));
        job.adapterInstance = adapter->adapterInstance;
    }
    job.description = jobDescription("NIC", job.serialNumber, fileName);
    return startJob(provider, job, NICFlashUpdateProc, jobPath);
}
