// What the two installation services share.
#include "classes/InstallationServiceModule.h"

#include <strings.h>

#include <string>

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "state/ProviderState.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

namespace installservice {

const ServiceSlot kSlot = {1};
const char kServiceName[] = "CNA_SW_INSTALLER";
const char* const kServiceKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name", nullptr};
const char* const kCapabilitiesKeys[] = {"InstanceID", nullptr};

const char* textOf(CMPIString* s)
{
    return s != nullptr && s->ft != nullptr ? s->ft->getCharPtr(s, nullptr) : nullptr;
}

CmpiStatus getInstanceOfService(const ServiceKeyTexts& texts, CmpiResult& rslt, const CmpiObjectPath& path,
                                const char** properties, bool sendInstance,
                                CmpiInstance (*make)(const char*, const char*, const char**))
{
    const std::string operation = texts.operation;
    std::string keys[2];
    const char* names[2] = {"Name", "SystemName"};
    const char* readErrors[2] = {texts.nameKeyError, texts.systemNameKeyError};
    CMPIObjectPath* enc = path.getEnc();
    for (int k = 0; k < 2; ++k) {
        if (readErrors[k] == nullptr) {
            classmodule::KeyRead key = classmodule::readStringKey(path, names[k], operation);
            if (!key.found)
                return key.status;
            keys[k] = key.text;
            continue;
        }
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        CMPIData data = enc->ft->getKey(enc, names[k], &rc);
        if (rc.rc != CMPI_RC_OK) {
            if (g_EnableLogError)
                Vexlan_FC_Utils_CMPI::LogError("%s", readErrors[k]);
            return CmpiStatus(rc);
        }
        if (data.type != CMPI_string) {
            if (g_EnableLogError)
                Vexlan_FC_Utils_CMPI::LogError("%s(%d)", texts.keyTypeError, static_cast<int>(data.type));
            return CmpiStatus(rc);
        }
        const char* text = (data.state & CMPI_nullValue) ? nullptr : textOf(data.value.string);
        keys[k] = text != nullptr ? text : "";
    }
    if (strcasecmp(keys[0].c_str(), kServiceName) != 0 || strcasecmp(keys[1].c_str(), hostName_ComputerSystem) != 0) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("%s: Error no matching instance found,                KeyValue=%s, "
                                           "MatchingElement=%s, KeyValue2=%s, MatchingElement2=%s!",
                                           operation.c_str(), keys[0].c_str(), kServiceName, keys[1].c_str(),
                                           hostName_ComputerSystem);
        throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, keys[0].c_str());
    }
    if (!sendInstance)
        return CmpiStatus(CMPI_RC_OK);
    classmodule::PathNames pathNames;
    CmpiStatus st = classmodule::readPathNames(path, operation, pathNames);
    if (st.rc() != CMPI_RC_OK)
        return st;
    rslt.returnData(make(pathNames.className, pathNames.nameSpace, properties));
    return CmpiStatus(CMPI_RC_OK);
}

bool readServiceNameSpace(const CmpiObjectPath& ref, const char*& nameSpace, CmpiStatus& failure)
{
    CMPIObjectPath* self = ref.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    const auto failed = [&](const char* what) {
        if (rc.rc == CMPI_RC_OK)
            return false;
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Vexlan_NIC_SoftwareInstallationService: Error getting %s, status.rc=%d!",
                                           what, static_cast<int>(rc.rc));
        failure = CmpiStatus(rc);
        return true;
    };
    self->ft->getClassName(self, &rc);
    if (failed("classname"))
        return false;
    nameSpace = textOf(self->ft->getNameSpace(self, &rc));
    return !failed("namespace");
}

bool startJob(const char* nameSpace, CmpiArgs& out,
              const std::function<bool(ProviderState& provider, CmpiObjectPath& jobPath)>& start)
{
    CmpiObjectPath jobPath(nameSpace, "Vexlan_Adapter_ConcreteJob");
    ProviderState* provider = g_RunningProviderState.load();
    if (provider == nullptr || !start(*provider, jobPath))
        return false;
    out.setArg("Job", CmpiData(jobPath));
    return true;
}

}  // namespace installservice
