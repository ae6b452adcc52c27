// The flash update workers: one thread per asynchronous update, started by
// StartFCFlashUpdateThread / StartNICFlashUpdateThread.
// A worker writes the image through the adapter library, records the job's
// end in the job map and the job file, and ends. It takes no provider lock.
// Its only broker services are those of the job's lifecycle indications
// (src/indications/Vexlan_Adapter_JobIndications.h): attached with a context
// that the starting request prepared, it sends them while a filter is active
// and the provider is not being cleaned up.
#ifndef VEXLAN_UPDATE_FLASHUPDATE_H
#define VEXLAN_UPDATE_FLASHUPDATE_H

#include "CmpiImpl.h"
#include "zorap_cna.h"

struct ProviderState;
struct _CNAStruc;

// Begin an asynchronous flash write on a worker thread of its own and enter
// its job in the provider's job map; false when no job id is free or the
// thread can't start. The worker's context for its lifecycle indications is
// prepared from the method request the provider is serving. jobPath arrives
// with its name space and class and gets the InstanceID.
bool StartFCFlashUpdateThread(ProviderState& provider, _tagZORAPSDMDevice* device, const unsigned char* fileName,
                              CmpiObjectPath& jobPath);
bool StartNICFlashUpdateThread(ProviderState& provider, _CNAStruc* adapter, const unsigned char* fileName,
                               unsigned long long imageSize, CmpiObjectPath& jobPath);

// The thread procedures; the argument is the worker's own heap copy of its
// Concrete_Job, which the worker deletes.
void* FCFlashUpdateProc(void* job);
void* NICFlashUpdateProc(void* job);

// Joins every worker thread, waiting for those still writing; the provider's
// cleanup calls it first, so no worker runs once the library may go.
void WaitForFlashWorkers();
// True while the worker of job `id` runs (its write not yet ended).
bool FlashWorkerRunsJob(unsigned int id);
// Number of workers not yet joined (running or finished).
int FlashWorkerCount();

#endif
