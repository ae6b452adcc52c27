// Vexlan_FCHBA_SoftwareInstallationService and its Capabilities: one instance
// each per host, and the service's method "InstallFromURI", which writes an FC
// flash image from a file of this host to the adapter of a
// Vexlan_FCHBA_PortController, while the caller waits or as a job.
#ifndef VEXLAN_CLASSES_VEXLAN_FCHBA_SOFTWAREINSTALLATIONSERVICE_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FCHBA_SOFTWAREINSTALLATIONSERVICE_CMPI_H

#include "classes/ClassModule.h"

VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(SoftwareInstallationService);
VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(SoftwareInstallationServiceCapabilities);

// Return values: 0 written, 1 unknown method, 2 any failure (status OK, the
// reason only in the log), 4096 job started with the output argument "Job".
CmpiStatus invokeMethod_SoftwareInstallationService(const CmpiContext& ctx, CmpiResult& rslt,
                                                    const CmpiObjectPath& ref, const char* methodName,
                                                    const CmpiArgs& in, CmpiArgs& out);

#endif
