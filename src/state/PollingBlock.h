// The polling thread's block: what the thread and the adapter library's alarm
// hand-off share, and the broker and the attached context with which the
// polling thread (and the indications it sends) call the broker.
#ifndef VEXLAN_STATE_POLLINGBLOCK_H
#define VEXLAN_STATE_POLLINGBLOCK_H

#include <pthread.h>

#include "CmpiImpl.h"

struct ProviderState;

struct ThreadArgs {
    CmpiBroker* broker;              // the broker of the provider's CmpiBaseMI part
    CmpiContext* context;            // prepared with prepareAttachThread, owned by the provider
    ProviderState* provider;         // the state of the provider that runs the thread
    pthread_t threadId;
    pthread_mutex_t mutex;           // guards threadExited and stopRequested
    pthread_cond_t changed;          // signalled when either of them is set, and when
                                     // an adapter alarm is handed to the thread
    bool threadExited;               // set by the thread as its last act
    bool stopRequested;              // set by stopPollingLoop
};

#endif
