// Lifecycle indications of the update jobs: CIM_InstCreation when a job
// starts, CIM_InstModification when its JobState changes (which is when it
// ends), each with the job as Vexlan_Adapter_ConcreteJob embedded in it.
//
// Threads. They are sent by the job's flash worker, which attaches to the
// broker with a context prepared for it by the method request that started
// the job. Like the alerts they are built only while the subscription gate
// (IndicationGate::m_bIndicationEnabled) is open. A provider life opens
// the sending when it is initialised and closes it first thing in cleanup:
// closing waits for a delivery in flight, and after it no worker builds or
// delivers anything, so a job that ends while cleanup waits for it is not
// reported, and no worker of a library being unloaded touches the broker to
// send.
#ifndef VEXLAN_INDICATIONS_VEXLAN_ADAPTER_JOBINDICATIONS_H
#define VEXLAN_INDICATIONS_VEXLAN_ADAPTER_JOBINDICATIONS_H

#include <string>

#include "CmpiImpl.h"
#include "update/ConcreteJob.h"

namespace jobindication {

// Sending is possible from open() (a provider life begins) to close() (its
// cleanup begins). close() returns once no delivery is in flight.
void open();
void close();

// The broker and the prepared context of one worker; both null when the
// worker has none (no request context to prepare it from).
struct Channel {
    CmpiBroker* broker = nullptr;
    CMPIContext* context = nullptr;
    bool usable() const { return broker != nullptr && context != nullptr; }
};

// On a flash worker that attached with channel.context. Each builds and
// delivers only while the gate is open and sending is open; the identifier
// of the indication sent, or an empty text when none was.
std::string sendCreation(const Channel& channel, const Concrete_Job& job);
std::string sendModification(const Channel& channel, const Concrete_Job& previous, const Concrete_Job& now,
                             const std::string& creationIdentifier);

}  // namespace jobindication

#endif
