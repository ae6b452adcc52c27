// Update jobs: the record of one asynchronous flash update, the map of all
// jobs that the provider object keeps (`Vexlan_CNA_Provider::jobMap`), the
// choice of a free job id, and the one lock over the map and the job file.
//
// Request threads (the installation services, Vexlan_Adapter_ConcreteJob),
// the flash workers and the polling thread (which reads the job file back)
// all take `jobStoreLock()` around every use of the map or the file. It is
// always the innermost lock: nothing that holds it takes provider_lock.
#ifndef VEXLAN_UPDATE_CONCRETEJOB_H
#define VEXLAN_UPDATE_CONCRETEJOB_H

#include <pthread.h>

#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <string>

#include "zorap_cna.h"

struct _CNAStruc;

// One update job, held by value in the map. Only id, description,
// timeOfLastStateChange, status and result are saved to the job file; a job
// read back from it has the other fields empty and can't be continued.
struct Concrete_Job {
    unsigned int id = 0;                         // 0 to 65534: map key and InstanceID
    std::string description;                     // shown as Name
    unsigned long long timeOfLastStateChange = 0;  // microseconds since the Epoch
    pthread_t threadId{};                        // the worker
    unsigned int status = 0;                     // 0 running, 1 failed, 2 succeeded
    unsigned int result = 0;                     // the adapter library's result code
    bool isNic = false;
    _CNAStruc* adapter = nullptr;                // NIC jobs; not owned
    std::string imageFile;                       // the image's path
    _tagZORAPSDMDevice* device = nullptr;        // FC jobs; not owned
    // What the worker logs, copied when the job starts, so that it never
    // reads the library's tree or the NIC list, which a rebuild may replace.
    std::string serialNumber;
    unsigned int adapterInstance = 0;            // NIC jobs: the adapter number of the write
};

using ConcreteJobMap = std::map<unsigned int, Concrete_Job>;

// `status` as the JobState of Vexlan_Adapter_ConcreteJob: 1 gives 10
// (Exception), 2 gives 7 (Completed), any other value 4 (Running).
unsigned short JobStateOfStatus(unsigned int status);

// PercentComplete of a job, where the job can know it. The adapter library's
// write reports nothing until it returns, so a job is at 0 while its worker
// writes in this provider and at 100 once it completed; a failed job, and a
// job that the job file shows running with no worker of this provider behind
// it, can't tell (nullopt: the property stays unset).
std::optional<unsigned short> JobPercentComplete(const Concrete_Job& job);

// The lock over every job map and the job file.
std::recursive_mutex& jobStoreLock();

// A free job id below 65535, drawn from rand() as a job's id always was; the
// map of the running provider (g_Vexlan_CNA_Provider) is searched. kNoJobId
// when every id is taken.
constexpr unsigned int kNoJobId = 0xFFFFFFFFu;
unsigned PickNextJobId();
unsigned PickNextJobIdIn(const ConcreteJobMap& jobs);

// The present time in microseconds since the Epoch, as CmpiDateTime gives it,
// read without the broker (the workers may not call it).
unsigned long long JobTimeNow();

#endif
