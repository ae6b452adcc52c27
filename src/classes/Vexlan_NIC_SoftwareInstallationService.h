// Vexlan_NIC_SoftwareInstallationService and its Capabilities: one instance
// each per host, and the service's methods: "InstallFromURI" and
// "InstallFromByteStream" write a NIC flash image to the adapter of a
// Vexlan_NIC_PortController; "InstallFromSoftwareIdentity" and
// "CheckSoftwareIdentity" check their arguments and do nothing else.
#ifndef VEXLAN_CLASSES_VEXLAN_NIC_SOFTWAREINSTALLATIONSERVICE_H
#define VEXLAN_CLASSES_VEXLAN_NIC_SOFTWAREINSTALLATIONSERVICE_H

#include "classes/ClassModule.h"

VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(Nic_SoftwareInstallationService);
VEXLAN_DECLARE_SINGLE_CLASS_OPERATIONS(Nic_SoftwareInstallationServiceCapabilities);

// Return values: 0 written, 1 unknown method, 2 any failure (status OK, the
// reason only in the log), 4096 job started with the output argument "Job".
CmpiStatus invokeMethod_Nic_SoftwareInstallationService(const CmpiContext& ctx, CmpiResult& rslt,
                                                        const CmpiObjectPath& ref, const char* methodName,
                                                        const CmpiArgs& in, CmpiArgs& out);

// Copies the file name into `localFile` (kFlashFileNameSize bytes, cut when
// longer) and gives the file's size (0 when it can't be examined).
unsigned long long GetFlashImageFromURI(const char* uri, char* localFile);

#endif
