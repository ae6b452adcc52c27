// Vexlan_Adapter_ConcreteJob: the update jobs of the provider's job map, one
// instance per job in ascending id.
#ifndef VEXLAN_CLASSES_VEXLAN_ADAPTER_CONCRETEJOB_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_ADAPTER_CONCRETEJOB_CMPI_H

#include "classes/ClassModule.h"
#include "update/ConcreteJob.h"

// Both build the path with the class "Vexlan_Adapter_ConcreteJob", whatever
// class name is passed.
CmpiObjectPath makePath_ConcreteJob(const char* className, const char* nameSpace, unsigned int id,
                                    const Concrete_Job& job);
CmpiInstance makeInstance_ConcreteJob(const char* className, const char* nameSpace, const char** properties,
                                      unsigned int id, const Concrete_Job& job);
VEXLAN_DECLARE_CLASS_REQUESTS(ConcreteJob);

#endif
