// What the two installation services (Vexlan_FCHBA_SoftwareInstallationService
// and Vexlan_NIC_SoftwareInstallationService) share: the one instance of the
// service and of its capabilities, both named "CNA_SW_INSTALLER"; the
// service's getInstance by Name and SystemName; and the steps of
// "InstallFromURI" that are the same on both sides, the read of the service's
// own class and name space and the start of a job in the running provider.
#ifndef VEXLAN_CLASSES_INSTALLATIONSERVICEMODULE_H
#define VEXLAN_CLASSES_INSTALLATIONSERVICEMODULE_H

#include <cstddef>
#include <functional>

#include "classes/ClassModule.h"

struct ProviderState;

namespace installservice {

struct ServiceSlot {
    unsigned char valid;
};
extern const ServiceSlot kSlot;
// Name of the service and InstanceID of its capabilities.
extern const char kServiceName[];
extern const char* const kServiceKeys[];
extern const char* const kCapabilitiesKeys[];

// The module of a service (key "Name", kServiceKeys) or of its capabilities
// (key "InstanceID", kCapabilitiesKeys), with the rows of its class; the key
// is always kServiceName.
template <std::size_t N>
ClassModule<ServiceSlot> serviceModule(const char* stem, const char* key, const char* const* keys,
                                       const PropertyRow<ServiceSlot> (&rows)[N])
{
    return ClassModule<ServiceSlot>(stem)
        .single(kSlot)
        .key(key, [](const ServiceSlot&) { return kServiceName; })
        .filterKeys(keys)
        .pathKeys(keys)
        .properties(rows);
}

// The text of a CMPI string, or null.
const char* textOf(CMPIString* s);

// The getInstance of both services: Name and SystemName compared with the
// service's, without regard to case. The log texts differ per service.
struct ServiceKeyTexts {
    const char* operation;        // prefix of the standard key error lines
    const char* nameKeyError;     // null: the standard lines
    const char* systemNameKeyError;
    const char* keyTypeError;     // "...(%d)" form, with the type
};
CmpiStatus getInstanceOfService(const ServiceKeyTexts& texts, CmpiResult& rslt, const CmpiObjectPath& path,
                                const char** properties, bool sendInstance,
                                CmpiInstance (*make)(const char*, const char*, const char**));

// The class and then the name space of the method's own path. A failed read
// is logged ("Vexlan_NIC_SoftwareInstallationService: Error getting
// classname, status.rc=%d!", or "namespace"), and the method returns
// `failure` as its status.
bool readServiceNameSpace(const CmpiObjectPath& ref, const char*& nameSpace, CmpiStatus& failure);

// An asynchronous update: `start` begins the job in the running provider, on
// a path of "Vexlan_Adapter_ConcreteJob" in `nameSpace`; once it has, the
// path goes to the output argument "Job". False when no provider runs or the
// start failed.
bool startJob(const char* nameSpace, CmpiArgs& out,
              const std::function<bool(ProviderState& provider, CmpiObjectPath& jobPath)>& start);

}  // namespace installservice

// makePath_X, makeInstance_X, enumInstances_X, enumInstanceNames_X and
// getInstance_X of a service, its getInstance by getInstanceOfService with
// the service's log texts.
#define VEXLAN_INSTALLATION_SERVICE_OPERATIONS(X, module, keyTexts)                                  \
    VEXLAN_SINGLE_CLASS_MAKERS(X, module)                                                            \
    VEXLAN_CLASS_ENUMERATIONS(X, module)                                                             \
    CmpiStatus getInstance_##X(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,     \
                               const char** properties, bool sendInstance)                           \
    {                                                                                                \
        return installservice::getInstanceOfService(keyTexts, rslt, path, properties, sendInstance, \
                                                    makeInstance_##X);                               \
    }

#endif
