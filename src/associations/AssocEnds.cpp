// The end classes of the associations over the class modules' operations.
#include "associations/AssocEnds.h"

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalConnector_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPort_CMPI.h"
#include "classes/Vexlan_Adapter_Product_CMPI.h"
#include "classes/Vexlan_FCHBA_CIMXMLCommMech_CMPI.h"
#include "classes/Vexlan_FCHBA_Namespace_CMPI.h"
#include "classes/Vexlan_FCHBA_ObjectManager_CMPI.h"
#include "classes/Vexlan_FCHBA_RegisteredProfile_CMPI.h"
#include "classes/Vexlan_FCHBA_RegisteredSubProfile_CMPI.h"
#include "classes/Vexlan_FCHBA_SoftwareIdentity_CMPI.h"
#include "classes/Vexlan_FCHBA_SoftwareInstallationService_CMPI.h"
#include "classes/Vexlan_FC_FCPortStatistics_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "classes/Vexlan_FC_LogicalPortGroup_CMPI.h"
#include "classes/Vexlan_FC_PortController_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointHBA_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointTarget_CMPI.h"
#include "classes/Vexlan_FC_StorageExtent_CMPI.h"
#include "classes/Vexlan_NIC_EthernetPort.h"
#include "classes/Vexlan_NIC_IPProtocolEndPoint.h"
#include "classes/Vexlan_NIC_IPProtocolEndPointCapabilities.h"
#include "classes/Vexlan_NIC_LANEndPoint.h"
#include "classes/Vexlan_NIC_NetworkPort.h"
#include "classes/Vexlan_NIC_PortController.h"
#include "classes/Vexlan_NIC_RegisteredProfile.h"
#include "classes/Vexlan_NIC_RemoteServiceAccessPoint.h"
#include "classes/Vexlan_NIC_SoftwareIdentity.h"
#include "classes/Vexlan_NIC_SoftwareInstallationService.h"

namespace {
void noList() {}
}  // namespace

// A class with a list: items are slots.
#define LIST_END(X, className, removeFn, buildFn)                                                               \
    const EndClass k##X##End = {                                                                                \
        className,                                                                                              \
        [](const char* c, const char* ns, const EndItem& i) { return makePath_##X(c, ns, i.index); },          \
        [](const char* c, const char* ns, const char** p, const EndItem& i) {                                   \
            return makeInstance_##X(c, ns, p, i.index);                                                         \
        },                                                                                                      \
        getInstance_##X, ListOps{removeFn, buildFn}}

// A class of one instance.
#define SINGLE_END(X, className, removeFn, buildFn)                                                                  \
    const EndClass k##X##End = {                                                                                     \
        className, [](const char* c, const char* ns, const EndItem&) { return makePath_##X(c, ns); },               \
        [](const char* c, const char* ns, const char** p, const EndItem&) { return makeInstance_##X(c, ns, p); },    \
        getInstance_##X, ListOps{removeFn, buildFn}}

// A NIC class; ARGS are the items' fields its operations take.
#define NIC_END(Name, X, className, ...)                                                                             \
    const EndClass k##Name##End = {                                                                                  \
        className,                                                                                                   \
        [](const char* c, const char* ns, const EndItem& i) { return makePath_##X(c, ns, __VA_ARGS__); },           \
        [](const char* c, const char* ns, const char** p, const EndItem& i) {                                        \
            return makeInstance_##X(c, ns, p, __VA_ARGS__);                                                          \
        },                                                                                                           \
        getInstance_##X, ListOps{noList, noList}}

SINGLE_END(ComputerSystem, "Vexlan_Adapter_ComputerSystem", removeComputerSystem, buildComputerSystem);
SINGLE_END(CIMXMLCommMech, "Vexlan_FCHBA_CIMXMLCommMech", removeCIMXMLCommMech, buildCIMXMLCommMech);
SINGLE_END(ObjectManager, "Vexlan_FCHBA_ObjectManager", removeObjectManager, buildObjectManager);
LIST_END(Namespace, "Vexlan_FCHBA_Namespace", removeNamespaceList, buildNamespaceList);
LIST_END(FCPort, "Vexlan_FCHBA_FCPort", removeFCPortList, buildFCPortList);
LIST_END(PortController, "Vexlan_FCHBA_PortController", removePortControllerList, buildPortControllerList);
LIST_END(LogicalPortGroup, "Vexlan_FCHBA_LogicalPortGroup", removeLogicalPortGroupList, buildLogicalPortGroupList);
LIST_END(FCPortStatistics, "Vexlan_FCHBA_FCPortStatistics", removeFCPortStatisticsList, buildFCPortStatisticsList);
LIST_END(SCSIProtocolController, "Vexlan_FCHBA_SCSIProtocolController", removeSCSIProtocolControllerList,
         buildSCSIProtocolControllerList);
LIST_END(SCSIProtocolEndpointHBA, "Vexlan_FCHBA_SCSIProtocolEndpointHBA", removeSCSIProtocolEndpointHBAList,
         buildSCSIProtocolEndpointHBAList);
LIST_END(SCSIProtocolEndpointTarget, "Vexlan_FCHBA_SCSIProtocolEndpointTarget", removeSCSIProtocolEndpointTargetList,
         buildSCSIProtocolEndpointTargetList);
LIST_END(StorageExtent, "Vexlan_FCHBA_StorageExtent", removeStorageExtentList, buildStorageExtentList);
LIST_END(SoftwareIdentity, "Vexlan_FCHBA_SoftwareIdentity", removeSoftwareIdentityList, buildSoftwareIdentityList);
SINGLE_END(SoftwareInstallationService, "Vexlan_FCHBA_SoftwareInstallationService", noList, noList);
SINGLE_END(SoftwareInstallationServiceCapabilities, "Vexlan_FCHBA_SoftwareInstallationServiceCapabilities", noList,
           noList);
LIST_END(PhysicalPackage, "Vexlan_Adapter_PhysicalPackage", removePhysicalPackageList, buildPhysicalPackageList);
LIST_END(PhysicalConnector, "Vexlan_Adapter_PhysicalConnector", removePhysicalConnectorList,
         buildPhysicalConnectorList);
LIST_END(PhysicalPort, "Vexlan_Adapter_PhysicalPort", removePhysicalPortList, buildPhysicalPortList);
LIST_END(Product, "Vexlan_Adapter_Product", removeProductList, buildProductList);
LIST_END(RegisteredProfile, "Vexlan_FCHBA_RegisteredProfile", removeRegisteredProfileList,
         buildRegisteredProfileList);
LIST_END(RegisteredSubProfile, "Vexlan_FCHBA_RegisteredSubProfile", removeRegisteredSubProfileList,
         buildRegisteredSubProfileList);

NIC_END(EthernetPort, EthernetPort, "Vexlan_NIC_EthernetPort2", i.adapter, i.port);
NIC_END(NicPortController, Nic_PortController, "Vexlan_NIC_PortController", i.adapter);
NIC_END(NetworkPort, NetworkPort, "Vexlan_NIC_NetworkPort", i.adapter, i.port);
NIC_END(LANEndPoint, LANEndPoint, "Vexlan_NIC_LANEndpoint", i.port);
NIC_END(IPProtocolEndPoint, IPProtocolEndPoint, "Vexlan_NIC_IPProtocolEndpoint", i.port);
NIC_END(IPProtocolEndPointCapabilities, IPProtocolEndPointCapabilities, "Vexlan_NIC_IPProtocolEndpointCapabilities",
        i.port);
NIC_END(NicSoftwareIdentity, Nic_SoftwareIdentity, "Vexlan_NIC_SoftwareIdentity", i.adapter, i.kind);
NIC_END(NicRegisteredProfile, Nic_RegisteredProfile, "Vexlan_NIC_RegisteredProfile", i.profile);
NIC_END(RemoteServiceAccessPoint, RemoteServiceAccessPoint, "Vexlan_NIC_RemoteServiceAccessPoint", i.port);

const EndClass kNicSoftwareInstallationServiceEnd = {
    "Vexlan_NIC_SoftwareInstallationService",
    [](const char* c, const char* ns, const EndItem&) { return makePath_Nic_SoftwareInstallationService(c, ns); },
    [](const char* c, const char* ns, const char** p, const EndItem&) {
        return makeInstance_Nic_SoftwareInstallationService(c, ns, p);
    },
    getInstance_Nic_SoftwareInstallationService, ListOps{noList, noList}};

const EndClass kNicSoftwareInstallationServiceCapabilitiesEnd = {
    "Vexlan_NIC_SoftwareInstallationServiceCapabilities",
    [](const char* c, const char* ns, const EndItem&) {
        return makePath_Nic_SoftwareInstallationServiceCapabilities(c, ns);
    },
    [](const char* c, const char* ns, const char** p, const EndItem&) {
        return makeInstance_Nic_SoftwareInstallationServiceCapabilities(c, ns, p);
    },
    getInstance_Nic_SoftwareInstallationServiceCapabilities, ListOps{noList, noList}};

// The physical classes from the NIC records; their existence is proven by
// the FC side's class operations.
const EndClass kNicPhysicalPackageEnd = {
    "Vexlan_Adapter_PhysicalPackage",
    [](const char* c, const char* ns, const EndItem& i) { return makePath_Nic_PhysicalPackage(c, ns, i.adapter); },
    [](const char* c, const char* ns, const char** p, const EndItem& i) {
        return makeInstance_Nic_PhysicalPackage(c, ns, p, i.adapter);
    },
    getInstance_PhysicalPackage, ListOps{noList, noList}};

const EndClass kNicPhysicalConnectorEnd = {
    "Vexlan_Adapter_PhysicalConnector",
    [](const char* c, const char* ns, const EndItem& i) {
        return makePath_Nic_PhysicalConnector(c, ns, i.adapter, i.port);
    },
    [](const char* c, const char* ns, const char** p, const EndItem& i) {
        return makeInstance_Nic_PhysicalConnector(c, ns, p, i.adapter, i.port);
    },
    getInstance_PhysicalConnector, ListOps{noList, noList}};

const EndClass kNicPhysicalPortEnd = {
    "Vexlan_Adapter_PhysicalPort",
    [](const char* c, const char* ns, const EndItem& i) { return makePath_Nic_PhysicalPort(c, ns, i.adapter, i.port); },
    [](const char* c, const char* ns, const char** p, const EndItem& i) {
        return makeInstance_Nic_PhysicalPort(c, ns, p, i.adapter, i.port);
    },
    getInstance_PhysicalPort, ListOps{noList, noList}};
