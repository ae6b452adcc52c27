// The provider's tables: which module serves which class, and in which order
// the polling thread builds and removes the lists.
//
// The order of every table is the behaviour: a request walks the routes from
// the top, group by group; the polling thread walks the list sequence from
// the top (and removes in the same order).
#include "provider/Vexlan_CNA_Provider_Tables.h"

#include "associations/AssocRows.h"

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FCHBA_CIMXMLCommMech_CMPI.h"
#include "classes/Vexlan_FCHBA_Namespace_CMPI.h"
#include "classes/Vexlan_FCHBA_ObjectManager_CMPI.h"
#include "classes/Vexlan_FCHBA_RegisteredProfile_CMPI.h"
#include "classes/Vexlan_FCHBA_RegisteredSubProfile_CMPI.h"
#include "classes/Vexlan_NIC_EthernetPort.h"
#include "classes/Vexlan_NIC_IPProtocolEndPoint.h"
#include "classes/Vexlan_NIC_IPProtocolEndPointCapabilities.h"
#include "classes/Vexlan_NIC_LANEndPoint.h"
#include "classes/Vexlan_NIC_NetworkPort.h"
#include "classes/Vexlan_NIC_PortController.h"
#include "classes/Vexlan_NIC_RegisteredProfile.h"
#include "classes/Vexlan_NIC_RemoteServiceAccessPoint.h"
#include "classes/Vexlan_FC_FCPortStatistics_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "classes/Vexlan_FC_LogicalPortGroup_CMPI.h"
#include "classes/Vexlan_FC_PortController_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointHBA_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointTarget_CMPI.h"
#include "classes/Vexlan_FC_StorageExtent_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "classes/Vexlan_Adapter_Product_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalConnector_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPort_CMPI.h"
#include "indications/Vexlan_CNA_HBAProviderIndications_CMPI.h"
#include "indications/Vexlan_NIC_ProviderIndications.h"
#include "inventory/AdapterFunc_LinkWatch.h"
#include "classes/Vexlan_Adapter_ConcreteJob_CMPI.h"
#include "classes/Vexlan_FCHBA_SoftwareIdentity_CMPI.h"
#include "classes/Vexlan_FCHBA_SoftwareInstallationService_CMPI.h"
#include "classes/Vexlan_NIC_SoftwareIdentity.h"
#include "classes/Vexlan_NIC_SoftwareInstallationService.h"
#include "update/JobPersistence.h"

namespace {

// ---- Modules built -----------------------------------------------------------
namespace ops {
constexpr ClassOps ComputerSystem = CLASS_OPS(ComputerSystem);
constexpr ClassOps ObjectManager = CLASS_OPS(ObjectManager);
constexpr ClassOps CIMXMLCommMech = CLASS_OPS(CIMXMLCommMech);
constexpr ClassOps Namespace = CLASS_OPS(Namespace);
constexpr ClassOps EthernetPort = CLASS_OPS(EthernetPort);
constexpr ClassOps Nic_PortController = CLASS_OPS(Nic_PortController);
constexpr ClassOps LANEndPoint = CLASS_OPS(LANEndPoint);
constexpr ClassOps Nic_RegisteredProfile = CLASS_OPS(Nic_RegisteredProfile);
constexpr ClassOps NetworkPort = CLASS_OPS(NetworkPort);
constexpr ClassOps IPProtocolEndPointCapabilities = CLASS_OPS(IPProtocolEndPointCapabilities);
constexpr ClassOps IPProtocolEndPoint = CLASS_OPS(IPProtocolEndPoint);
constexpr ClassOps FCPort = CLASS_OPS(FCPort);
constexpr ClassOps PortController = CLASS_OPS(PortController);
constexpr ClassOps FCPortStatistics = CLASS_OPS(FCPortStatistics);
constexpr ClassOps LogicalPortGroup = CLASS_OPS(LogicalPortGroup);
constexpr ClassOps PhysicalPackage = CLASS_OPS(PhysicalPackage);
constexpr ClassOps Product = CLASS_OPS(Product);
constexpr ClassOps SCSIProtocolController = CLASS_OPS(SCSIProtocolController);
constexpr ClassOps PhysicalConnector = CLASS_OPS(PhysicalConnector);
constexpr ClassOps PhysicalPort = CLASS_OPS(PhysicalPort);
constexpr ClassOps StorageExtent = CLASS_OPS(StorageExtent);
constexpr ClassOps SCSIProtocolEndpointHBA = CLASS_OPS(SCSIProtocolEndpointHBA);
constexpr ClassOps SCSIProtocolEndpointTarget = CLASS_OPS(SCSIProtocolEndpointTarget);
constexpr ClassOps SoftwareIdentity = CLASS_OPS(SoftwareIdentity);
constexpr ClassOps SoftwareInstallationService = CLASS_OPS(SoftwareInstallationService);
constexpr ClassOps SoftwareInstallationServiceCapabilities = CLASS_OPS(SoftwareInstallationServiceCapabilities);
constexpr ClassOps ConcreteJob = CLASS_OPS(ConcreteJob);
constexpr ClassOps Nic_SoftwareIdentity = CLASS_OPS(Nic_SoftwareIdentity);
constexpr ClassOps Nic_SoftwareInstallationService = CLASS_OPS(Nic_SoftwareInstallationService);
constexpr ClassOps Nic_SoftwareInstallationServiceCapabilities = CLASS_OPS(Nic_SoftwareInstallationServiceCapabilities);
constexpr ClassOps RegisteredProfile = CLASS_OPS(RegisteredProfile);
constexpr ClassOps RegisteredSubProfile = CLASS_OPS(RegisteredSubProfile);
constexpr ClassOps RemoteServiceAccessPoint = CLASS_OPS(RemoteServiceAccessPoint);
}  // namespace ops

namespace lists {
constexpr ListOps ComputerSystem = {::removeComputerSystem, ::buildComputerSystem};
constexpr ListOps NamespaceList = {::removeNamespaceList, ::buildNamespaceList};
constexpr ListOps ObjectManager = {::removeObjectManager, ::buildObjectManager};
constexpr ListOps CIMXMLCommMech = {::removeCIMXMLCommMech, ::buildCIMXMLCommMech};
constexpr ListOps RegisteredProfileList = {::removeRegisteredProfileList, ::buildRegisteredProfileList};
constexpr ListOps RegisteredSubProfileList = {::removeRegisteredSubProfileList, ::buildRegisteredSubProfileList};
constexpr ListOps FCPortStatisticsList = {::removeFCPortStatisticsList, ::buildFCPortStatisticsList};
constexpr ListOps LogicalPortGroupList = {::removeLogicalPortGroupList, ::buildLogicalPortGroupList};
constexpr ListOps FCPortList = {::removeFCPortList, ::buildFCPortList};
constexpr ListOps PortControllerList = {::removePortControllerList, ::buildPortControllerList};
constexpr ListOps PhysicalPackageList = {::removePhysicalPackageList, ::buildPhysicalPackageList};
constexpr ListOps ProductList = {::removeProductList, ::buildProductList};
constexpr ListOps SCSIProtocolControllerList = {::removeSCSIProtocolControllerList, ::buildSCSIProtocolControllerList};
constexpr ListOps PhysicalConnectorList = {::removePhysicalConnectorList, ::buildPhysicalConnectorList};
constexpr ListOps PhysicalPortList = {::removePhysicalPortList, ::buildPhysicalPortList};
constexpr ListOps SCSIProtocolEndpointHBAList = {::removeSCSIProtocolEndpointHBAList, ::buildSCSIProtocolEndpointHBAList};
constexpr ListOps SCSIProtocolEndpointTargetList = {::removeSCSIProtocolEndpointTargetList, ::buildSCSIProtocolEndpointTargetList};
constexpr ListOps StorageExtentList = {::removeStorageExtentList, ::buildStorageExtentList};
constexpr ListOps SoftwareIdentityList = {::removeSoftwareIdentityList, ::buildSoftwareIdentityList};
}  // namespace lists

// ---- Association modules ------------------------------------------------------
// The instance routes of the association classes, and the lists that the
// routes marked for it rebuild: both ends' lists of the module's row.
namespace ops {
constexpr ClassOps AssocComputerSystemPortController = ASSOC_CLASS_OPS(kAssocComputerSystemPortController);
constexpr ClassOps AssocComputerSystemSCSIProtocolController = ASSOC_CLASS_OPS(kAssocComputerSystemSCSIProtocolController);
constexpr ClassOps AssocComputerSystemFCPort = ASSOC_CLASS_OPS(kAssocComputerSystemFCPort);
constexpr ClassOps AssocComputerSystemLogicalPortGroup = ASSOC_CLASS_OPS(kAssocComputerSystemLogicalPortGroup);
constexpr ClassOps AssocComputerSystemSoftwareIdentity = ASSOC_CLASS_OPS(kAssocComputerSystemSoftwareIdentity);
constexpr ClassOps AssocSoftwareIdentityPortController = ASSOC_CLASS_OPS(kAssocSoftwareIdentityPortController);
constexpr ClassOps AssocPhysicalPackagePortController = ASSOC_CLASS_OPS(kAssocPhysicalPackagePortController);
constexpr ClassOps AssocPhysicalConnectorFCPort = ASSOC_CLASS_OPS(kAssocPhysicalConnectorFCPort);
constexpr ClassOps AssocPhysicalPortFCPort = ASSOC_CLASS_OPS(kAssocPhysicalPortFCPort);
constexpr ClassOps AssocPortControllerFCPort = ASSOC_CLASS_OPS(kAssocPortControllerFCPort);
constexpr ClassOps AssocPortControllerSoftwareInstallationService = ASSOC_CLASS_OPS(kAssocPortControllerSoftwareInstallationService);
constexpr ClassOps AssocLogicalPortGroupFCPort = ASSOC_CLASS_OPS(kAssocLogicalPortGroupFCPort);
constexpr ClassOps AssocFCPortFCPortStatistics = ASSOC_CLASS_OPS(kAssocFCPortFCPortStatistics);
constexpr ClassOps AssocProductPhysicalPackage = ASSOC_CLASS_OPS(kAssocProductPhysicalPackage);
constexpr ClassOps AssocSCSIProtocolControllerFCPort = ASSOC_CLASS_OPS(kAssocSCSIProtocolControllerFCPort);
constexpr ClassOps AssocComputerSystemObjectManager = ASSOC_CLASS_OPS(kAssocComputerSystemObjectManager);
constexpr ClassOps AssocObjectManagerCommMech = ASSOC_CLASS_OPS(kAssocObjectManagerCommMech);
constexpr ClassOps AssocComputerSystemCommMech = ASSOC_CLASS_OPS(kAssocComputerSystemCommMech);
constexpr ClassOps AssocObjectManagerNamespace = ASSOC_CLASS_OPS(kAssocObjectManagerNamespace);
constexpr ClassOps AssocPhysicalPackagePhysicalConnector = ASSOC_CLASS_OPS(kAssocPhysicalPackagePhysicalConnector);
constexpr ClassOps AssocPhysicalPackagePhysicalPort = ASSOC_CLASS_OPS(kAssocPhysicalPackagePhysicalPort);
constexpr ClassOps AssocSoftwareIdentitySoftwareInstallationService = ASSOC_CLASS_OPS(kAssocSoftwareIdentitySoftwareInstallationService);
constexpr ClassOps AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities = ASSOC_CLASS_OPS(kAssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities);
constexpr ClassOps AssocComputerSystemSoftwareInstallationService = ASSOC_CLASS_OPS(kAssocComputerSystemSoftwareInstallationService);
constexpr ClassOps AssocComputerSystemSCSIProtocolEndpointHBA = ASSOC_CLASS_OPS(kAssocComputerSystemSCSIProtocolEndpointHBA);
constexpr ClassOps AssocComputerSystemSCSIProtocolEndpointTarget = ASSOC_CLASS_OPS(kAssocComputerSystemSCSIProtocolEndpointTarget);
constexpr ClassOps AssocComputerSystemStorageExtent = ASSOC_CLASS_OPS(kAssocComputerSystemStorageExtent);
constexpr ClassOps AssocFCPortSCSIProtocolEndpointHBA = ASSOC_CLASS_OPS(kAssocFCPortSCSIProtocolEndpointHBA);
constexpr ClassOps Nic_AssocComputerSystemPortController = ASSOC_CLASS_OPS(kNic_AssocComputerSystemPortController);
constexpr ClassOps AssocComputerSystemEthernetPort = ASSOC_CLASS_OPS(kAssocComputerSystemEthernetPort);
constexpr ClassOps AssocPortControllerEthernetPort = ASSOC_CLASS_OPS(kAssocPortControllerEthernetPort);
constexpr ClassOps AssocPhysicalConnectorEthernetPort = ASSOC_CLASS_OPS(kAssocPhysicalConnectorEthernetPort);
constexpr ClassOps AssocPhysicalPortEthernetPort = ASSOC_CLASS_OPS(kAssocPhysicalPortEthernetPort);
constexpr ClassOps Nic_AssocPhysicalPackagePortController = ASSOC_CLASS_OPS(kNic_AssocPhysicalPackagePortController);
constexpr ClassOps AssocEthernetPortLANEndPoint = ASSOC_CLASS_OPS(kAssocEthernetPortLANEndPoint);
constexpr ClassOps AssocComputerSystemLANEndPoint = ASSOC_CLASS_OPS(kAssocComputerSystemLANEndPoint);
constexpr ClassOps AssocElementConformsToRegisteredProfile = ASSOC_CLASS_OPS(kAssocElementConformsToRegisteredProfile);
constexpr ClassOps Nic_AssocSoftwareIdentityPortController = ASSOC_CLASS_OPS(kNic_AssocSoftwareIdentityPortController);
constexpr ClassOps AssocComputerSystemNetworkPort = ASSOC_CLASS_OPS(kAssocComputerSystemNetworkPort);
constexpr ClassOps AssocNetworkPortLANEndPoint = ASSOC_CLASS_OPS(kAssocNetworkPortLANEndPoint);
constexpr ClassOps AssocIPProtocolEndPointCapabilitiesIPProtocolEndPoint = ASSOC_CLASS_OPS(kAssocIPProtocolEndPointCapabilitiesIPProtocolEndPoint);
constexpr ClassOps Nic_AssocComputerSystemSoftwareInstallationService = ASSOC_CLASS_OPS(kNic_AssocComputerSystemSoftwareInstallationService);
constexpr ClassOps Nic_AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities = ASSOC_CLASS_OPS(kNic_AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities);
constexpr ClassOps Nic_AssocSoftwareIdentitySoftwareInstallationService = ASSOC_CLASS_OPS(kNic_AssocSoftwareIdentitySoftwareInstallationService);
constexpr ClassOps Nic_AssocPortControllerSoftwareInstallationService = ASSOC_CLASS_OPS(kNic_AssocPortControllerSoftwareInstallationService);
constexpr ClassOps AssocComputerSystemIPProtocolEndPoint = ASSOC_CLASS_OPS(kAssocComputerSystemIPProtocolEndPoint);
constexpr ClassOps AssocLANEndPointIPProtocolEndPoint = ASSOC_CLASS_OPS(kAssocLANEndPointIPProtocolEndPoint);
constexpr ClassOps Nic_AssocComputerSystemSoftwareIdentity = ASSOC_CLASS_OPS(kNic_AssocComputerSystemSoftwareIdentity);
constexpr ClassOps AssocRegisteredProfileComputerSystem = ASSOC_CLASS_OPS(kAssocRegisteredProfileComputerSystem);
constexpr ClassOps AssocRegisteredProfileObjectManager = ASSOC_CLASS_OPS(kAssocRegisteredProfileObjectManager);
constexpr ClassOps AssocRegisteredProfileRegisteredSubProfile = ASSOC_CLASS_OPS(kAssocRegisteredProfileRegisteredSubProfile);
constexpr ClassOps AssocSoftwareIdentityRegisteredProfile = ASSOC_CLASS_OPS(kAssocSoftwareIdentityRegisteredProfile);
constexpr ClassOps AssocSoftwareIdentityRegisteredSubProfile = ASSOC_CLASS_OPS(kAssocSoftwareIdentityRegisteredSubProfile);
constexpr ClassOps AssocComputerSystemRemoteServiceAccessPoint = ASSOC_CLASS_OPS(kAssocComputerSystemRemoteServiceAccessPoint);
constexpr ClassOps AssocRemoteServiceAccessPointIPProtocolEndPoint = ASSOC_CLASS_OPS(kAssocRemoteServiceAccessPointIPProtocolEndPoint);
}  // namespace ops

namespace lists {
constexpr ListOps AssocFCPortFCPortStatistics = ASSOC_LIST_OPS(kAssocFCPortFCPortStatistics);
constexpr ListOps AssocComputerSystemSCSIProtocolEndpointTarget = ASSOC_LIST_OPS(kAssocComputerSystemSCSIProtocolEndpointTarget);
constexpr ListOps AssocComputerSystemStorageExtent = ASSOC_LIST_OPS(kAssocComputerSystemStorageExtent);
constexpr ListOps AssocFCPortSCSIProtocolEndpointHBA = ASSOC_LIST_OPS(kAssocFCPortSCSIProtocolEndpointHBA);
}  // namespace lists



namespace steps {
constexpr void (*InitializeRegisteredProfileList)() = ::InitializeRegisteredProfileList;
constexpr void (*Clear_RegisteredProfile_List)() = ::Clear_RegisteredProfile_List;
constexpr void (*DeserializeConcreteJobToPrefFile)() = ::DeserializeConcreteJobToPrefFile;
// The link watch, with the Ethernet link alerts for the links it finds changed.
void Update_CNA_List(ThreadArgs& args)
{
    ::Update_CNA_List(args, ::generatePortAlertIndication);
}
constexpr ZORAP_ALARM_CALLBACK OSSGenerateHostNotificationAlarm = ::OSSGenerateHostNotificationAlarm;
}  // namespace steps

// ---- Instance routes -----------------------------------------------------------
// getInstance walks the same rows: the three NIC rows that it would test in
// another order (PortControllerEthernetPort, ComputerSystemLANEndpoint,
// EthernetPortLANEndpoint) name unrelated classes, so one order serves.
constexpr InstanceRoute kInstanceRoutes[] = {
    // Group 1, always walked
    {"Vexlan_Adapter_ComputerSystem", ops::ComputerSystem, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_FCPort", ops::FCPort, &lists::FCPortList, RouteGroup::Always},
    {"Vexlan_FCHBA_PortController", ops::PortController, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_FCPortStatistics", ops::FCPortStatistics, &lists::FCPortStatisticsList, RouteGroup::Always},
    {"Vexlan_FCHBA_LogicalPortGroup", ops::LogicalPortGroup, nullptr, RouteGroup::Always},
    {"Vexlan_Adapter_PhysicalPackage", ops::PhysicalPackage, nullptr, RouteGroup::Always},
    {"Vexlan_Adapter_Product", ops::Product, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SCSIProtocolController", ops::SCSIProtocolController, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareIdentity", ops::SoftwareIdentity, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemPortController", ops::AssocComputerSystemPortController, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemSCSIProtocolController", ops::AssocComputerSystemSCSIProtocolController, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemFCPort", ops::AssocComputerSystemFCPort, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemLogicalPortGroup", ops::AssocComputerSystemLogicalPortGroup, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemSoftwareIdentity", ops::AssocComputerSystemSoftwareIdentity, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareIdentityPortController", ops::AssocSoftwareIdentityPortController, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_PhysicalPackagePortController", ops::AssocPhysicalPackagePortController, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_PhysicalConnectorFCPort", ops::AssocPhysicalConnectorFCPort, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_PhysicalPortFCPort", ops::AssocPhysicalPortFCPort, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_PortControllerFCPort", ops::AssocPortControllerFCPort, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_PortControllerSoftwareInstallationService", ops::AssocPortControllerSoftwareInstallationService, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_LogicalPortGroupFCPort", ops::AssocLogicalPortGroupFCPort, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_FCPortFCPortStatistics", ops::AssocFCPortFCPortStatistics, &lists::AssocFCPortFCPortStatistics, RouteGroup::Always},
    {"Vexlan_Adapter_ProductPhysicalPackage", ops::AssocProductPhysicalPackage, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SCSIProtocolControllerFCPort", ops::AssocSCSIProtocolControllerFCPort, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ObjectManager", ops::ObjectManager, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_CIMXMLCommMech", ops::CIMXMLCommMech, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemObjectManager", ops::AssocComputerSystemObjectManager, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ObjectManagerCommMech", ops::AssocObjectManagerCommMech, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemCommMech", ops::AssocComputerSystemCommMech, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_Namespace", ops::Namespace, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ObjectManagerNamespace", ops::AssocObjectManagerNamespace, nullptr, RouteGroup::Always},
    {"Vexlan_Adapter_PhysicalConnector", ops::PhysicalConnector, nullptr, RouteGroup::Always},
    {"Vexlan_Adapter_PhysicalPort", ops::PhysicalPort, nullptr, RouteGroup::Always},
    {"Vexlan_Adapter_PhysicalPackagePhysicalConnector", ops::AssocPhysicalPackagePhysicalConnector, nullptr, RouteGroup::Always},
    {"Vexlan_Adapter_PhysicalPackagePhysicalPort", ops::AssocPhysicalPackagePhysicalPort, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareInstallationService", ops::SoftwareInstallationService, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareInstallationServiceCapabilities", ops::SoftwareInstallationServiceCapabilities, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareIdentitySoftwareInstallationService", ops::AssocSoftwareIdentitySoftwareInstallationService, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareInstallationServiceSoftwareInstallationServiceCapabilities", ops::AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_ComputerSystemSoftwareInstallationService", ops::AssocComputerSystemSoftwareInstallationService, nullptr, RouteGroup::Always},
    {"Vexlan_Adapter_ConcreteJob", ops::ConcreteJob, nullptr, RouteGroup::Always},
    // The FC profiles and their associations, routed for profile discovery.
    {"Vexlan_FCHBA_RegisteredProfile", ops::RegisteredProfile, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_RegisteredSubProfile", ops::RegisteredSubProfile, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_RegisteredProfileComputerSystem", ops::AssocRegisteredProfileComputerSystem, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_RegisteredProfileObjectManager", ops::AssocRegisteredProfileObjectManager, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_RegisteredProfileRegisteredSubProfile", ops::AssocRegisteredProfileRegisteredSubProfile, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareIdentityRegisteredProfile", ops::AssocSoftwareIdentityRegisteredProfile, nullptr, RouteGroup::Always},
    {"Vexlan_FCHBA_SoftwareIdentityRegisteredSubProfile", ops::AssocSoftwareIdentityRegisteredSubProfile, nullptr, RouteGroup::Always},
    // Group 2, walked only when g_SUPPORT_HDR is not zero
    {"Vexlan_FCHBA_StorageExtent", ops::StorageExtent, &lists::StorageExtentList, RouteGroup::SupportHdr},
    {"Vexlan_FCHBA_SCSIProtocolEndpointHBA", ops::SCSIProtocolEndpointHBA, nullptr, RouteGroup::SupportHdr},
    {"Vexlan_FCHBA_SCSIProtocolEndpointTarget", ops::SCSIProtocolEndpointTarget, &lists::SCSIProtocolEndpointTargetList, RouteGroup::SupportHdr},
    {"Vexlan_FCHBA_ComputerSystemSCSIProtocolEndpointHBA", ops::AssocComputerSystemSCSIProtocolEndpointHBA, nullptr, RouteGroup::SupportHdr},
    {"Vexlan_FCHBA_ComputerSystemSCSIProtocolEndpointTarget", ops::AssocComputerSystemSCSIProtocolEndpointTarget, &lists::AssocComputerSystemSCSIProtocolEndpointTarget, RouteGroup::SupportHdr},
    {"Vexlan_FCHBA_ComputerSystemStorageExtent", ops::AssocComputerSystemStorageExtent, &lists::AssocComputerSystemStorageExtent, RouteGroup::SupportHdr},
    {"Vexlan_FCHBA_FCPortSCSIProtocolEndpointHBA", ops::AssocFCPortSCSIProtocolEndpointHBA, &lists::AssocFCPortSCSIProtocolEndpointHBA, RouteGroup::SupportHdr},
    // Group 3, always walked
    {"Vexlan_NIC_EthernetPort2", ops::EthernetPort, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_PortController", ops::Nic_PortController, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_LANEndpoint", ops::LANEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_RegisteredProfile", ops::Nic_RegisteredProfile, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_SoftwareIdentity", ops::Nic_SoftwareIdentity, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_NetworkPort", ops::NetworkPort, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_IPProtocolEndpointCapabilities", ops::IPProtocolEndPointCapabilities, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_SoftwareInstallationService", ops::Nic_SoftwareInstallationService, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_SoftwareInstallationServiceCapabilities", ops::Nic_SoftwareInstallationServiceCapabilities, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_IPProtocolEndpoint", ops::IPProtocolEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemPortController", ops::Nic_AssocComputerSystemPortController, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemEthernetPort", ops::AssocComputerSystemEthernetPort, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_PortControllerEthernetPort", ops::AssocPortControllerEthernetPort, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_PhysicalConnectorEthernetPort", ops::AssocPhysicalConnectorEthernetPort, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_PhysicalPortEthernetPort", ops::AssocPhysicalPortEthernetPort, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_PhysicalPackagePortController", ops::Nic_AssocPhysicalPackagePortController, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_EthernetPortLANEndpoint", ops::AssocEthernetPortLANEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemLANEndpoint", ops::AssocComputerSystemLANEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ElementConformsToRegisteredProfile", ops::AssocElementConformsToRegisteredProfile, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_SoftwareIdentityPortController", ops::Nic_AssocSoftwareIdentityPortController, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemNetworkPort", ops::AssocComputerSystemNetworkPort, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_NetworkPortLANEndpoint", ops::AssocNetworkPortLANEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_IPProtocolEndpointCapabilitiesIPProtocolEndpoint", ops::AssocIPProtocolEndPointCapabilitiesIPProtocolEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemSoftwareInstallationService", ops::Nic_AssocComputerSystemSoftwareInstallationService, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_SoftwareInstallationServiceSoftwareInstallationServiceCapabilities", ops::Nic_AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_SoftwareIdentitySoftwareInstallationService", ops::Nic_AssocSoftwareIdentitySoftwareInstallationService, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_PortControllerSoftwareInstallationService", ops::Nic_AssocPortControllerSoftwareInstallationService, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemIPProtocolEndpoint", ops::AssocComputerSystemIPProtocolEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_LANEndpointIPProtocolEndpoint", ops::AssocLANEndPointIPProtocolEndPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemSoftwareIdentity", ops::Nic_AssocComputerSystemSoftwareIdentity, nullptr, RouteGroup::Nic},
    // The remote service access point and its two associations.
    {"Vexlan_NIC_RemoteServiceAccessPoint", ops::RemoteServiceAccessPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint", ops::AssocComputerSystemRemoteServiceAccessPoint, nullptr, RouteGroup::Nic},
    {"Vexlan_NIC_RemoteServiceAccessPointIPProtocolEndpoint", ops::AssocRemoteServiceAccessPointIPProtocolEndPoint, nullptr, RouteGroup::Nic},
};

// ---- Build sequence ------------------------------------------------------------------
// Built in this order; removed in this order too (after the NIC adapter list
// and the NIC profile chain).
constexpr ListSequenceRow kListSequence[] = {
    {"Namespace", &lists::NamespaceList, false},
    {"ComputerSystem", &lists::ComputerSystem, false},
    {"ObjectManager", &lists::ObjectManager, false},
    {"FCPortStatistics", &lists::FCPortStatisticsList, false},
    {"LogicalPortGroup", &lists::LogicalPortGroupList, false},
    {"PhysicalPackage", &lists::PhysicalPackageList, false},
    {"Product", &lists::ProductList, false},
    {"CIMXMLCommMech", &lists::CIMXMLCommMech, false},
    {"RegisteredProfile", &lists::RegisteredProfileList, false},
    {"RegisteredSubProfile", &lists::RegisteredSubProfileList, false},
    {"SCSIProtocolController", &lists::SCSIProtocolControllerList, false},
    {"SoftwareIdentity", &lists::SoftwareIdentityList, false},
    {"PhysicalConnector", &lists::PhysicalConnectorList, false},
    {"PhysicalPort", &lists::PhysicalPortList, false},
    {"SCSIProtocolEndpointHBA", &lists::SCSIProtocolEndpointHBAList, true},
    {"SCSIProtocolEndpointTarget", &lists::SCSIProtocolEndpointTargetList, true},
    {"StorageExtent", &lists::StorageExtentList, true},
    {"FCPort", &lists::FCPortList, false},
    {"PortController", &lists::PortControllerList, false},
};

// ---- Method routes ---------------------------------------------------------------
constexpr MethodRoute kMethodRoutes[] = {
    {"Vexlan_FCHBA_SoftwareInstallationService", ::invokeMethod_SoftwareInstallationService},
    {"Vexlan_NIC_SoftwareInstallationService", ::invokeMethod_Nic_SoftwareInstallationService},
};

}  // namespace

const PollingSteps kPollingSteps = {
    steps::InitializeRegisteredProfileList,
    steps::Clear_RegisteredProfile_List,
    steps::DeserializeConcreteJobToPrefFile,
    steps::Update_CNA_List,
    steps::OSSGenerateHostNotificationAlarm,
};

const InstanceRoute* instanceRoutes(std::size_t& count)
{
    count = sizeof(kInstanceRoutes) / sizeof(kInstanceRoutes[0]);
    return kInstanceRoutes;
}

const MethodRoute* methodRoutes(std::size_t& count)
{
    count = sizeof(kMethodRoutes) / sizeof(kMethodRoutes[0]);
    return kMethodRoutes;
}

const ListSequenceRow* listSequence(std::size_t& count)
{
    count = sizeof(kListSequence) / sizeof(kListSequence[0]);
    return kListSequence;
}

