// Every association module of the provider, as a row of the association
// engine: the FC side and the physical classes (plain and filtering rows),
// the NIC side (filtering rows), and the irregular modules that bring their
// own operations.
#ifndef VEXLAN_ASSOCIATIONS_ASSOCROWS_H
#define VEXLAN_ASSOCIATIONS_ASSOCROWS_H

#include "associations/AssocModule.h"

// X(module) for every module that the dispatcher reaches, FC rows first.
#define VEXLAN_FC_ASSOC_ROWS(X)                                                  \
    X(AssocComputerSystemCommMech)                                               \
    X(AssocComputerSystemFCPort)                                                 \
    X(AssocComputerSystemLogicalPortGroup)                                       \
    X(AssocComputerSystemObjectManager)                                          \
    X(AssocComputerSystemPortController)                                         \
    X(AssocComputerSystemSCSIProtocolController)                                 \
    X(AssocComputerSystemSCSIProtocolEndpointHBA)                                \
    X(AssocComputerSystemSCSIProtocolEndpointTarget)                             \
    X(AssocComputerSystemSoftwareIdentity)                                       \
    X(AssocComputerSystemStorageExtent)                                          \
    X(AssocFCPortFCPortStatistics)                                               \
    X(AssocFCPortSCSIProtocolEndpointHBA)                                        \
    X(AssocLogicalPortGroupFCPort)                                               \
    X(AssocObjectManagerCommMech)                                                \
    X(AssocObjectManagerNamespace)                                               \
    X(AssocPhysicalPackagePortController)                                        \
    X(AssocPhysicalConnectorFCPort)                                              \
    X(AssocPhysicalPortFCPort)                                                   \
    X(AssocPortControllerFCPort)                                                 \
    X(AssocSCSIProtocolControllerFCPort)                                         \
    X(AssocPhysicalPackagePhysicalConnector)                                     \
    X(AssocPhysicalPackagePhysicalPort)                                          \
    X(AssocProductPhysicalPackage)                                               \
    X(AssocSoftwareIdentityPortController)                                       \
    X(AssocSoftwareIdentitySoftwareInstallationService)                          \
    X(AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities)   \
    X(AssocComputerSystemSoftwareInstallationService)                            \
    X(AssocPortControllerSoftwareInstallationService)

#define VEXLAN_NIC_ASSOC_ROWS(X)                                                     \
    X(AssocComputerSystemEthernetPort)                                               \
    X(Nic_AssocComputerSystemPortController)                                         \
    X(AssocComputerSystemNetworkPort)                                                \
    X(AssocPortControllerEthernetPort)                                               \
    X(AssocPhysicalConnectorEthernetPort)                                            \
    X(AssocPhysicalPortEthernetPort)                                                 \
    X(Nic_AssocPhysicalPackagePortController)                                        \
    X(AssocEthernetPortLANEndPoint)                                                  \
    X(AssocNetworkPortLANEndPoint)                                                   \
    X(AssocComputerSystemLANEndPoint)                                                \
    X(AssocComputerSystemIPProtocolEndPoint)                                         \
    X(AssocLANEndPointIPProtocolEndPoint)                                            \
    X(AssocIPProtocolEndPointCapabilitiesIPProtocolEndPoint)                         \
    X(Nic_AssocSoftwareIdentityPortController)                                       \
    X(Nic_AssocComputerSystemSoftwareIdentity)                                       \
    X(Nic_AssocComputerSystemSoftwareInstallationService)                            \
    X(Nic_AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities)   \
    X(Nic_AssocSoftwareIdentitySoftwareInstallationService)                          \
    X(Nic_AssocPortControllerSoftwareInstallationService)

// The profile associations of the FC side and the remote service access
// point's two, routed so that clients find the FC profiles' central
// instances and can follow every class they name.
#define VEXLAN_PROFILE_ASSOC_ROWS(X)                 \
    X(AssocRegisteredProfileComputerSystem)          \
    X(AssocRegisteredProfileObjectManager)           \
    X(AssocRegisteredProfileRegisteredSubProfile)    \
    X(AssocSoftwareIdentityRegisteredProfile)        \
    X(AssocSoftwareIdentityRegisteredSubProfile)     \
    X(AssocComputerSystemRemoteServiceAccessPoint)   \
    X(AssocRemoteServiceAccessPointIPProtocolEndPoint)

// The irregular module of profile conformance: one end of three classes.
// The three-ended HBA, target and LUN frame has no relation to serve and no
// association class, and is not written.
#define VEXLAN_IRREGULAR_ASSOC_ROWS(X) X(AssocElementConformsToRegisteredProfile)

#define VEXLAN_DECLARE_ASSOC_ROW(X) extern const AssocRow k##X;
VEXLAN_FC_ASSOC_ROWS(VEXLAN_DECLARE_ASSOC_ROW)
VEXLAN_NIC_ASSOC_ROWS(VEXLAN_DECLARE_ASSOC_ROW)
VEXLAN_IRREGULAR_ASSOC_ROWS(VEXLAN_DECLARE_ASSOC_ROW)
VEXLAN_PROFILE_ASSOC_ROWS(VEXLAN_DECLARE_ASSOC_ROW)
#undef VEXLAN_DECLARE_ASSOC_ROW

#endif
