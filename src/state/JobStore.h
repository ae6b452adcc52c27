// The update jobs' store: the record of one asynchronous flash update, the
// map of all jobs that the provider keeps (ProviderState::jobMap), and the
// one lock over the map and the job file.
//
// Request threads (the installation services, Vexlan_Adapter_ConcreteJob),
// the flash workers and the polling thread (which reads the job file back)
// all take `jobStoreLock()` around every use of the map or the file. It is
// always the innermost lock: nothing that holds it takes provider_lock.
#ifndef VEXLAN_STATE_JOBSTORE_H
#define VEXLAN_STATE_JOBSTORE_H

#include <pthread.h>

#include <map>
#include <mutex>
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

// The lock over every job map and the job file.
std::recursive_mutex& jobStoreLock();

#endif
