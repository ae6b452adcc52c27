// Vexlan_Adapter_ConcreteJob: each update job of the running provider's job
// map as an instance; a copy of the map is taken under the job store's lock,
// so a worker finishing meanwhile never changes a job while it is shown.
#include "classes/Vexlan_Adapter_ConcreteJob_CMPI.h"

#include <cstdio>
#include <string>

#include "state/ProviderState.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

namespace {

const char kClassName[] = "Vexlan_Adapter_ConcreteJob";

struct JobRow {
    unsigned int id;
    const Concrete_Job* job;
};

std::string idText(unsigned int id)
{
    char text[32];
    std::snprintf(text, sizeof(text), "%u", id);
    return text;
}

const PropertyRow<JobRow> kProperties[] = {
    {"InstanceID", CMPI_string, CLASS_VALUE(JobRow, CmpiData(idText(e.id)))},
    {"Name", CMPI_string, CLASS_VALUE(JobRow, CmpiData(e.job->description))},
    {"JobState", CMPI_uint16, CLASS_VALUE(JobRow, CmpiData(static_cast<CMPIUint16>(JobStateOfStatus(e.job->status))))},
    {"TimeOfLastStateChange", CMPI_dateTime,
     CLASS_VALUE(JobRow, CmpiData(CmpiDateTime(e.job->timeOfLastStateChange, false)))},
    {"TimeBeforeRemoval", CMPI_dateTime, CLASS_VALUE(JobRow, CmpiData(CmpiDateTime("00000000003000.000000:000")))},
    // Last, so that the properties before it keep their order; unset when
    // the job can't know it.
    {"PercentComplete", CMPI_uint16, [](const JobRow& e) -> PropertyValue {
         const std::optional<unsigned short> percent = JobPercentComplete(*e.job);
         if (!percent)
             return std::nullopt;
         return CmpiData(static_cast<CMPIUint16>(*percent));
     }},
};
const char* const kKeys[] = {"InstanceID", nullptr};
const auto kKeyRows = classmodule::rowsOfKeys(kKeys, kProperties, 1);

// The jobs as they stand now, in ascending id.
ConcreteJobMap jobsNow()
{
    ProviderState* provider = g_RunningProviderState.load();
    std::lock_guard<std::recursive_mutex> guard(jobStoreLock());
    return provider != nullptr ? provider->jobMap : ConcreteJobMap();
}

template <class Deliver>
CmpiStatus enumerate(const char* operation, const CmpiObjectPath& path, Deliver&& deliver)
{
    classmodule::debugLine("Entering ", operation);
    classmodule::PathNames names;
    CmpiStatus st = classmodule::readPathNames(path, operation, names);
    if (st.rc() != CMPI_RC_OK)
        return st;
    for (const auto& entry : jobsNow())
        deliver(names, entry.first, entry.second);
    classmodule::debugLine("Exiting  ", operation);
    return CmpiStatus(CMPI_RC_OK);
}

const char* textOf(CMPIString* s)
{
    return s != nullptr && s->ft != nullptr ? s->ft->getCharPtr(s, nullptr) : nullptr;
}

}  // namespace

CmpiObjectPath makePath_ConcreteJob(const char*, const char* nameSpace, unsigned int id, const Concrete_Job& job)
{
    return classmodule::pathFromRows(kClassName, nameSpace, kKeyRows, JobRow{id, &job});
}

CmpiInstance makeInstance_ConcreteJob(const char*, const char* nameSpace, const char** properties, unsigned int id,
                                      const Concrete_Job& job)
{
    return classmodule::instanceFromRows(kClassName, nameSpace, properties, kKeys, kProperties,
                                         sizeof(kProperties) / sizeof(kProperties[0]), JobRow{id, &job});
}

CmpiStatus enumInstances_ConcreteJob(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                                     const char** properties)
{
    return enumerate("enumInstances_ConcreteJob", path,
                     [&](const classmodule::PathNames& n, unsigned int id, const Concrete_Job& job) {
                         rslt.returnData(makeInstance_ConcreteJob(n.className, n.nameSpace, properties, id, job));
                     });
}

CmpiStatus enumInstanceNames_ConcreteJob(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path)
{
    return enumerate("enumInstanceNames_ConcreteJob", path,
                     [&](const classmodule::PathNames& n, unsigned int id, const Concrete_Job& job) {
                         rslt.returnData(makePath_ConcreteJob(n.className, n.nameSpace, id, job));
                     });
}

CmpiStatus getInstance_ConcreteJob(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                                   const char** properties, bool sendInstance)
{
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData key = enc->ft->getKey(enc, "InstanceID", &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("getInstance_ConcreteJob: Error getting key data, status.rc=%d!",
                                           static_cast<int>(rc.rc));
        return CmpiStatus(rc);
    }
    const CmpiStatus notFound(CMPI_RC_ERR_NOT_FOUND);
    if (key.type != CMPI_string) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("getInstance_ConcreteJob: Error invalid key data type, keyData.type=%d!",
                                           static_cast<int>(key.type));
        return notFound;
    }
    const char* value = (key.state & CMPI_nullValue) ? nullptr : textOf(key.value.string);
    const char* text = value != nullptr ? value : "";
    unsigned int id = 0;
    if (std::sscanf(text, "%u", &id) != 1) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("getInstance_ConcreteJob: Error invalid key InstanceID for ConcreteJob =%s!",
                                           text);
        return notFound;
    }
    const ConcreteJobMap jobs = jobsNow();
    const auto found = jobs.find(id);
    if (found == jobs.end()) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("getInstance_ConcreteJob - could not find the ConcreteJob with InstanceID = %u",
                                             id);
        return notFound;
    }
    if (!sendInstance)
        return CmpiStatus(CMPI_RC_OK);
    CMPIString* cls = enc->ft->getClassName(enc, &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("getInstance_ComputerSystem: Error getting classname, status.rc=%d!",
                                           static_cast<int>(rc.rc));
        return notFound;
    }
    CMPIString* ns = enc->ft->getNameSpace(enc, &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("getInstance_ComputerSystem: Error getting namespace, status.rc=%d!",
                                           static_cast<int>(rc.rc));
        return notFound;
    }
    rslt.returnData(makeInstance_ConcreteJob(textOf(cls), textOf(ns), properties, id, found->second));
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting  getInstance_ComputerSystem");
    return CmpiStatus(CMPI_RC_OK);
}
