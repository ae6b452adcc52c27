// The classes at the ends of the associations, as the association engine
// takes them: one EndClass each, over the class modules' operations.
#ifndef VEXLAN_ASSOCIATIONS_ASSOCENDS_H
#define VEXLAN_ASSOCIATIONS_ASSOCENDS_H

#include "associations/AssocModule.h"

// FC side, host and interop classes: items are list slots (index), or the one
// instance of a class without a list.
extern const EndClass kComputerSystemEnd;
extern const EndClass kCIMXMLCommMechEnd;
extern const EndClass kObjectManagerEnd;
extern const EndClass kNamespaceEnd;
extern const EndClass kFCPortEnd;
extern const EndClass kPortControllerEnd;
extern const EndClass kLogicalPortGroupEnd;
extern const EndClass kFCPortStatisticsEnd;
extern const EndClass kSCSIProtocolControllerEnd;
extern const EndClass kSCSIProtocolEndpointHBAEnd;
extern const EndClass kSCSIProtocolEndpointTargetEnd;
extern const EndClass kStorageExtentEnd;
extern const EndClass kSoftwareIdentityEnd;
extern const EndClass kSoftwareInstallationServiceEnd;
extern const EndClass kSoftwareInstallationServiceCapabilitiesEnd;
extern const EndClass kPhysicalPackageEnd;
extern const EndClass kPhysicalConnectorEnd;
extern const EndClass kPhysicalPortEnd;
extern const EndClass kProductEnd;
extern const EndClass kRegisteredProfileEnd;
extern const EndClass kRegisteredSubProfileEnd;

// NIC side: items are adapters (adapter), ports (adapter and port), software
// identities (adapter and kind) or profiles of m_RegisteredProfileList.
extern const EndClass kEthernetPortEnd;
extern const EndClass kNicPortControllerEnd;
extern const EndClass kNetworkPortEnd;
extern const EndClass kLANEndPointEnd;
extern const EndClass kIPProtocolEndPointEnd;
extern const EndClass kIPProtocolEndPointCapabilitiesEnd;
extern const EndClass kNicSoftwareIdentityEnd;
extern const EndClass kNicSoftwareInstallationServiceEnd;
extern const EndClass kNicSoftwareInstallationServiceCapabilitiesEnd;
extern const EndClass kNicRegisteredProfileEnd;
extern const EndClass kRemoteServiceAccessPointEnd;
// The physical classes as the NIC side makes them, from an adapter (and port).
extern const EndClass kNicPhysicalPackageEnd;
extern const EndClass kNicPhysicalConnectorEnd;
extern const EndClass kNicPhysicalPortEnd;

#endif
