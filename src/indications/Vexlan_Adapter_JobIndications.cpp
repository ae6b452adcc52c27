// Lifecycle indications of the update jobs, sent by the flash workers.
#include "indications/Vexlan_Adapter_JobIndications.h"

#include <atomic>
#include <cstdio>
#include <mutex>

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_Adapter_ConcreteJob_CMPI.h"
#include "indications/Vexlan_CNA_HBAProviderIndications_CMPI.h"
#include "state/IndicationGate.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

using indication::debug;

namespace {

const char kCreationClass[] = "CIM_InstCreation";
const char kModificationClass[] = "CIM_InstModification";
const char kJobClass[] = "Vexlan_Adapter_ConcreteJob";

// PerceivedSeverity: 2 "Information" for a job that starts or completes, 3
// "Degraded/Warning" for one that ends in the exception state (the adapter
// refused the image and keeps the one it had).
constexpr CMPIUint16 kSeverityInformation = 2;
constexpr CMPIUint16 kSeverityWarning = 3;

// Guards `sendingOpen` and every build and delivery, so that close() waits
// for the one in flight.
std::mutex sendMutex;
bool sendingOpen = false;

// IndicationIdentifier "Vexlan:<n>" of the lifecycle indications, counted
// from 1 in each load of the library, apart from the alerts' plain numbers.
std::atomic<unsigned> lastIdentifier{0};

std::string nextIdentifier()
{
    char text[32];
    std::snprintf(text, sizeof(text), "Vexlan:%u", ++lastIdentifier);
    return text;
}

CmpiInstance jobInstance(const Concrete_Job& job)
{
    return makeInstance_ConcreteJob(kJobClass, indication::kIndicationNamespace, nullptr, job.id, job);
}

// "root/vexlan_cmpi:Vexlan_Adapter_ConcreteJob.InstanceID=\"<id>\"".
std::string modelPath(const Concrete_Job& job)
{
    char text[128];
    std::snprintf(text, sizeof(text), "%s:%s.InstanceID=\"%u\"", indication::kIndicationNamespace, kJobClass, job.id);
    return text;
}

// Builds with `fill` and delivers on the worker's attached thread, under
// sendMutex and only while sending is open and a filter is active.
template <class Fill>
std::string send(const jobindication::Channel& channel, const char* className, const Concrete_Job& job, Fill&& fill)
{
    if (!IndicationGate::m_bIndicationEnabled || !channel.usable())
        return std::string();
    std::lock_guard<std::mutex> guard(sendMutex);
    if (!sendingOpen) {
        debug("Job %u: %s not sent, the provider is being cleaned up", job.id, className);
        return std::string();
    }
    std::string identifier;
    try {
        indication::BrokerMark mark(channel.broker);
        CmpiInstance ind{CmpiObjectPath(indication::kIndicationNamespace, className)};
        identifier = nextIdentifier();
        ind.setProperty("IndicationIdentifier", CmpiData(identifier.c_str()));
        ind.setProperty("IndicationTime", CmpiData(CmpiDateTime()));
        fill(ind);
        const std::string path = modelPath(job);
        ind.setProperty("SourceInstanceModelPath", CmpiData(path.c_str()));
        ind.setProperty("SourceInstanceHost", CmpiData(hostName_ComputerSystem));
        debug("Job %u: delivering %s %s", job.id, className, identifier.c_str());
        channel.broker->deliverIndication(CmpiContext(channel.context), indication::kDeliveryNamespace, ind);
        debug("Job %u: delivered %s %s", job.id, className, identifier.c_str());
    } catch (...) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Job %u: error delivering %s", job.id, className);
        return std::string();
    }
    return identifier;
}

}  // namespace

namespace jobindication {

void open()
{
    std::lock_guard<std::mutex> guard(sendMutex);
    sendingOpen = true;
}

void close()
{
    std::lock_guard<std::mutex> guard(sendMutex);
    sendingOpen = false;
}

std::string sendCreation(const Channel& channel, const Concrete_Job& job)
{
    return send(channel, kCreationClass, job, [&](CmpiInstance& ind) {
        ind.setProperty("PerceivedSeverity", CmpiData(kSeverityInformation));
        ind.setProperty("SourceInstance", CmpiData(jobInstance(job)));
    });
}

std::string sendModification(const Channel& channel, const Concrete_Job& previous, const Concrete_Job& now,
                             const std::string& creationIdentifier)
{
    return send(channel, kModificationClass, now, [&](CmpiInstance& ind) {
        // The creation of the same job, when it was sent.
        if (!creationIdentifier.empty())
            ind.setProperty("CorrelatedIndications", stringArray({creationIdentifier.c_str()}));
        ind.setProperty("PerceivedSeverity",
                        CmpiData(JobStateOfStatus(now.status) == 10 ? kSeverityWarning : kSeverityInformation));
        ind.setProperty("SourceInstance", CmpiData(jobInstance(now)));
        ind.setProperty("PreviousInstance", CmpiData(jobInstance(previous)));
    });
}

}  // namespace jobindication
