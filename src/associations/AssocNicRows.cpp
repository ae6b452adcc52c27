// The association modules of the NIC side: all in the filtering form, all
// answering from m_CNAList at the moment of the request, adapter by adapter
// and, where an end is per port, port by port. A join computes the partner's
// key from the adapter and port records and compares it with the source's
// key, without regard to case.
#include <strings.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "associations/AssocEnds.h"
#include "associations/AssocRows.h"
#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalConnector_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPort_CMPI.h"
#include "classes/Vexlan_NIC_EthernetPort.h"
#include "classes/Vexlan_NIC_PortController.h"
#include "inventory/AdapterFunc.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

#define NIC_ASSOC_DEBUG(...)                               \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)

#define READ_KEY(request, name, var) \
    std::string var;                 \
    if (!(request).key(name, var))   \
        return false;
#define PARTNER(request, item)       \
    if (!(request).partner(item))    \
        return false;

constexpr const char* kComputerSystemClass = "Vexlan_Adapter_ComputerSystem";
constexpr const char* kInstallerName = "CNA_SW_INSTALLER";
// The two NIC software identities of an adapter: its driver and its flash
// firmware.
constexpr int kDriverKind = 2;
constexpr int kFirmwareKind = 3;

bool same(const std::string& a, const std::string& b)
{
    return strcasecmp(a.c_str(), b.c_str()) == 0;
}

const EndItem kOne{};

EndItem adapterItem(_CNAStruc* adapter, int kind = 0)
{
    EndItem item;
    item.adapter = adapter;
    item.kind = kind;
    return item;
}

EndItem portItem(_CNAStruc* adapter, _CNAPortStruc* port)
{
    EndItem item;
    item.adapter = adapter;
    item.port = port;
    return item;
}

// Visits every adapter of m_CNAList; stops when the visit returns false.
template <class Visit>
bool eachAdapter(Visit&& visit)
{
    for (_CNAStruc* a = m_CNAList; a != nullptr; a = a->next)
        if (!visit(a))
            return false;
    return true;
}

// Visits every port of every adapter, in chain order.
template <class Visit>
bool eachPort(Visit&& visit)
{
    return eachAdapter([&](_CNAStruc* a) {
        for (_CNAPortStruc* p = a->portList; p != nullptr; p = p->next)
            if (!visit(a, p))
                return false;
        return true;
    });
}

// ---- the keys that the NIC classes compute -----------------------------------------------

std::string serialOf(_CNAStruc* a)
{
    return nicFieldText(a->serialNumber);
}

std::string controllerIdOf(_CNAStruc* a)
{
    char out[kPortControllerDeviceIdSize] = {};
    return calcDeviceID_PortController(a, out);
}

std::string macOf(_CNAPortStruc* p)
{
    char out[kMacTextSize] = {};
    return macaddrToStr(&p->macAddress, out);
}

std::string ethernetIdOf(_CNAStruc* a, _CNAPortStruc* p)
{
    char out[kMacTextSize] = {};
    return calcDeviceID_EthernetPort(a, p, out);
}

// "<serial>_<port number>": the network port's DeviceID.
std::string networkIdOf(_CNAStruc* a, _CNAPortStruc* p)
{
    char out[256] = {};
    std::snprintf(out, sizeof(out), "%s_%u", serialOf(a).c_str(), static_cast<unsigned>(p->portNumber));
    return out;
}

std::string connectorTagOf(_CNAStruc* a, _CNAPortStruc* p)
{
    char out[256] = {};
    calcTag_PhysicalConnector(a, p, out);
    return out;
}

std::string physicalPortTagOf(_CNAStruc* a, _CNAPortStruc* p)
{
    char out[256] = {};
    calcTag_PhysicalPort(a, p, out);
    return out;
}

std::string packageTagOf(_CNAStruc* a)
{
    char out[256] = {};
    calcTag_PhysicalPackage(a, out);
    return out;
}

// ---- common tests ------------------------------------------------------------------------

// The source is this host's computer system.
bool hostTest(AssocRequest& rq, bool& ok)
{
    READ_KEY(rq, "CreationClassName", creationClass);
    READ_KEY(rq, "Name", name);
    ok = same(creationClass, kComputerSystemClass) && same(name, hostName_ComputerSystem);
    return true;
}

// The source names this host's computer system as its system.
bool backTest(AssocRequest& rq, bool& ok)
{
    READ_KEY(rq, "SystemName", systemName);
    READ_KEY(rq, "SystemCreationClassName", creationClass);
    ok = same(systemName, hostName_ComputerSystem) && same(creationClass, kComputerSystemClass);
    return true;
}

// A NIC software identity's InstanceID, "<kind>_<serial>": the kind in its
// low 8 bits, 0 and an empty serial when the text has no "_".
struct ParsedIdentity {
    int kind = 0;
    std::string serial;
    bool admits() const { return kind == kDriverKind || kind == kFirmwareKind; }
};

ParsedIdentity parseIdentity(const std::string& instanceId)
{
    ParsedIdentity parsed;
    const std::size_t p = instanceId.find('_');
    if (p == std::string::npos)
        return parsed;
    parsed.kind = static_cast<unsigned char>(std::strtol(instanceId.substr(0, p).c_str(), nullptr, 10));
    parsed.serial = instanceId.substr(p + 1);
    return parsed;
}

// ---- joins -------------------------------------------------------------------------------

// The host first, then every port (or adapter).
bool portsOfHost(AssocRequest& rq)
{
    bool ok = false;
    if (!hostTest(rq, ok))
        return false;
    return !ok || eachPort([&](_CNAStruc* a, _CNAPortStruc* p) { return rq.partner(portItem(a, p)); });
}

bool adaptersOfHost(AssocRequest& rq)
{
    bool ok = false;
    if (!hostTest(rq, ok))
        return false;
    return !ok || eachAdapter([&](_CNAStruc* a) { return rq.partner(adapterItem(a)); });
}

// The computer system on the back test alone: the source's own keys are
// trusted.
bool hostByBackTest(AssocRequest& rq)
{
    bool ok = false;
    if (!backTest(rq, ok))
        return false;
    return !ok || rq.partner(kOne);
}

bool hostOfController(AssocRequest& rq)
{
    bool ok = false;
    if (!backTest(rq, ok))
        return false;
    READ_KEY(rq, "DeviceID", deviceId);
    if (!ok)
        return true;
    return eachAdapter([&](_CNAStruc* a) { return !same(controllerIdOf(a), deviceId) || rq.partner(kOne); });
}

bool hostOfNetworkPort(AssocRequest& rq)
{
    bool ok = false;
    if (!backTest(rq, ok))
        return false;
    READ_KEY(rq, "CreationClassName", creationClass);
    READ_KEY(rq, "DeviceID", deviceId);
    if (!ok)
        return true;
    return eachPort(
        [&](_CNAStruc* a, _CNAPortStruc* p) { return !same(networkIdOf(a, p), deviceId) || rq.partner(kOne); });
}

bool hostOfLanEndpoint(AssocRequest& rq)
{
    bool ok = false;
    if (!backTest(rq, ok))
        return false;
    READ_KEY(rq, "CreationClassName", creationClass);
    READ_KEY(rq, "Name", name);
    if (!ok)
        return true;
    return eachPort([&](_CNAStruc*, _CNAPortStruc* p) { return !same(macOf(p), name) || rq.partner(kOne); });
}

// A source Name of the host's name is enough, whatever its class.
bool ipEndpointsOfHost(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (!same(name, hostName_ComputerSystem))
        return true;
    return eachPort([&](_CNAStruc* a, _CNAPortStruc* p) { return rq.partner(portItem(a, p)); });
}

bool portsOfController(AssocRequest& rq)
{
    READ_KEY(rq, "DeviceID", deviceId);
    return eachAdapter([&](_CNAStruc* a) {
        if (!same(controllerIdOf(a), deviceId))
            return true;
        for (_CNAPortStruc* p = a->portList; p != nullptr; p = p->next)
            if (!rq.partner(portItem(a, p)))
                return false;
        return true;
    });
}

// Source key `Name`d, a port's computed key: each matching port is a partner.
template <std::string (*KeyOf)(_CNAStruc*, _CNAPortStruc*), const char* const* Key>
bool portsByKey(AssocRequest& rq)
{
    READ_KEY(rq, *Key, wanted);
    return eachPort(
        [&](_CNAStruc* a, _CNAPortStruc* p) { return !same(KeyOf(a, p), wanted) || rq.partner(portItem(a, p)); });
}

// The adapter of each matching port (its controller).
bool controllerOfEthernetPort(AssocRequest& rq)
{
    READ_KEY(rq, "DeviceID", deviceId);
    return eachPort([&](_CNAStruc* a, _CNAPortStruc* p) {
        return !same(ethernetIdOf(a, p), deviceId) || rq.partner(adapterItem(a));
    });
}

std::string macKey(_CNAStruc*, _CNAPortStruc* p)
{
    return macOf(p);
}

constexpr const char* kDeviceID = "DeviceID";
constexpr const char* kName = "Name";
constexpr const char* kTag = "Tag";
constexpr const char* kInstanceID = "InstanceID";

bool controllerOfPackage(AssocRequest& rq)
{
    READ_KEY(rq, "Tag", tag);
    return eachAdapter([&](_CNAStruc* a) { return !same(packageTagOf(a), tag) || rq.partner(adapterItem(a)); });
}

// The one role 1 search that narrates its steps.
bool packageOfController(AssocRequest& rq)
{
    constexpr const char* head = "Assoc_PhysicalPackagePortController:findMatchedRole1InstancesOrReferences()";
    NIC_ASSOC_DEBUG("%s called with ftype = %d", head, static_cast<int>(rq.funcType()));
    READ_KEY(rq, "DeviceID", deviceId);
    return eachAdapter([&](_CNAStruc* a) {
        NIC_ASSOC_DEBUG("%s Before calcDeviceID_PortController", head);
        const std::string id = controllerIdOf(a);
        NIC_ASSOC_DEBUG("%s Addr = %s", head, id.c_str());
        NIC_ASSOC_DEBUG("%s deviceId = %s", head, deviceId.c_str());
        if (!same(id, deviceId))
            return true;
        static const char* const kBranches[] = {
            "FUNC_ASSOC calling makeInstance_Nic_PhysicalPackage",
            "FUNC_ASSOCNAME calling makePath_Nic_PhysicalPackage",
            "FUNC_REF calling makePath_Nic_PhysicalPackage",
            "FUNC_REFNAME calling makePath_Nic_PhysicalPackage",
        };
        NIC_ASSOC_DEBUG("%s %s", head, kBranches[rq.funcType()]);
        return rq.partner(adapterItem(a));
    });
}

// The two identities of each adapter whose controller is the source.
bool identitiesOfController(AssocRequest& rq)
{
    READ_KEY(rq, "DeviceID", deviceId);
    return eachAdapter([&](_CNAStruc* a) {
        if (!same(controllerIdOf(a), deviceId))
            return true;
        return rq.partner(adapterItem(a, kDriverKind)) && rq.partner(adapterItem(a, kFirmwareKind));
    });
}

bool controllerOfIdentity(AssocRequest& rq)
{
    READ_KEY(rq, "InstanceID", instanceId);
    const ParsedIdentity parsed = parseIdentity(instanceId);
    const std::string wanted = parsed.serial + "_NIC";
    return eachAdapter([&](_CNAStruc* a) {
        return !(same(controllerIdOf(a), wanted) && parsed.admits()) || rq.partner(adapterItem(a));
    });
}

bool identitiesOfHost(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (!same(name, hostName_ComputerSystem))
        return true;
    return eachAdapter([&](_CNAStruc* a) {
        return rq.partner(adapterItem(a, kDriverKind)) && rq.partner(adapterItem(a, kFirmwareKind));
    });
}

// The singleton at role 1 (the computer system) or role 2 (the service) of
// each adapter whose serial the identity names.
bool singletonOfIdentity(AssocRequest& rq)
{
    READ_KEY(rq, "InstanceID", instanceId);
    const ParsedIdentity parsed = parseIdentity(instanceId);
    return eachAdapter(
        [&](_CNAStruc* a) { return !(same(serialOf(a), parsed.serial) && parsed.admits()) || rq.partner(kOne); });
}

bool installerOfHost(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    return !same(name, hostName_ComputerSystem) || rq.partner(kOne);
}

bool hostOfInstaller(AssocRequest& rq)
{
    bool ok = false;
    if (!backTest(rq, ok))
        return false;
    READ_KEY(rq, "Name", name);
    return !(ok && same(name, kInstallerName)) || rq.partner(kOne);
}

bool installerByName(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    return !same(name, kInstallerName) || rq.partner(kOne);
}

bool installerByInstanceId(AssocRequest& rq)
{
    READ_KEY(rq, "InstanceID", instanceId);
    return !same(instanceId, kInstallerName) || rq.partner(kOne);
}

bool identitiesOfInstaller(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (!same(name, kInstallerName))
        return true;
    return eachAdapter([&](_CNAStruc* a) {
        return rq.partner(adapterItem(a, kDriverKind)) && rq.partner(adapterItem(a, kFirmwareKind));
    });
}

bool installerOfController(AssocRequest& rq)
{
    READ_KEY(rq, "DeviceID", deviceId);
    return eachAdapter([&](_CNAStruc* a) { return !same(controllerIdOf(a), deviceId) || rq.partner(kOne); });
}

bool controllersOfInstaller(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (!same(name, kInstallerName))
        return true;
    return eachAdapter([&](_CNAStruc* a) { return rq.partner(adapterItem(a)); });
}

// ---- pairs -------------------------------------------------------------------------------

void hostPortPairs(const PairFn& pair)
{
    eachPort([&](_CNAStruc* a, _CNAPortStruc* p) {
        pair(kOne, portItem(a, p));
        return true;
    });
}

void hostAdapterPairs(const PairFn& pair)
{
    eachAdapter([&](_CNAStruc* a) {
        pair(kOne, adapterItem(a));
        return true;
    });
}

// Both ends from the same port's records.
void samePortPairs(const PairFn& pair)
{
    eachPort([&](_CNAStruc* a, _CNAPortStruc* p) {
        pair(portItem(a, p), portItem(a, p));
        return true;
    });
}

void sameAdapterPairs(const PairFn& pair)
{
    eachAdapter([&](_CNAStruc* a) {
        pair(adapterItem(a), adapterItem(a));
        return true;
    });
}

void identityControllerPairs(const PairFn& pair)
{
    eachAdapter([&](_CNAStruc* a) {
        pair(adapterItem(a, kDriverKind), adapterItem(a));
        pair(adapterItem(a, kFirmwareKind), adapterItem(a));
        return true;
    });
}

void hostIdentityPairs(const PairFn& pair)
{
    eachAdapter([&](_CNAStruc* a) {
        pair(kOne, adapterItem(a, kDriverKind));
        pair(kOne, adapterItem(a, kFirmwareKind));
        return true;
    });
}

void identityInstallerPairs(const PairFn& pair)
{
    eachAdapter([&](_CNAStruc* a) {
        pair(adapterItem(a, kDriverKind), kOne);
        pair(adapterItem(a, kFirmwareKind), kOne);
        return true;
    });
}

void controllerInstallerPairs(const PairFn& pair)
{
    eachAdapter([&](_CNAStruc* a) {
        pair(adapterItem(a), kOne);
        return true;
    });
}

void onePair(const PairFn& pair)
{
    pair(kOne, kOne);
}

constexpr ExtraProperty kNoExtra{};

// Every port, no key of the source read.
bool everyPort(AssocRequest& rq)
{
    return eachPort([&](_CNAStruc* a, _CNAPortStruc* p) { return rq.partner(portItem(a, p)); });
}

}  // namespace

#define NIC_ROW(X, cls, file, role1, end1, role2, end2, r2, r1, pairs, check2)                                    \
    const AssocRow k##X = {cls,      #X,      file,    AssocForm::Filtering, {role1, &end1}, {role2, &end2}, r2, r1, \
                           pairs,    kNoExtra, nullptr, check2,               nullptr,        0}

NIC_ROW(AssocComputerSystemEthernetPort, "Vexlan_NIC_ComputerSystemEthernetPort", "Assoc_ComputerSystem_EthernetPort",
        "GroupComponent", kComputerSystemEnd, "PartComponent", kEthernetPortEnd, portsOfHost, hostByBackTest,
        hostPortPairs, nullptr);
NIC_ROW(Nic_AssocComputerSystemPortController, "Vexlan_NIC_ComputerSystemPortController",
        "Assoc_ComputerSystem_PortController", "GroupComponent", kComputerSystemEnd, "PartComponent",
        kNicPortControllerEnd, adaptersOfHost, hostOfController, hostAdapterPairs, nullptr);
NIC_ROW(AssocComputerSystemNetworkPort, "Vexlan_NIC_ComputerSystemNetworkPort", "Assoc_ComputerSystem_NetworkPort",
        "GroupComponent", kComputerSystemEnd, "PartComponent", kNetworkPortEnd, portsOfHost, hostOfNetworkPort,
        hostPortPairs, nullptr);
NIC_ROW(AssocPortControllerEthernetPort, "Vexlan_NIC_PortControllerEthernetPort", "Assoc_PortController_EthernetPort",
        "Antecedent", kNicPortControllerEnd, "Dependent", kEthernetPortEnd, portsOfController,
        controllerOfEthernetPort, samePortPairs, nullptr);
NIC_ROW(AssocPhysicalConnectorEthernetPort, "Vexlan_NIC_PhysicalConnectorEthernetPort",
        "Assoc_PhysicalConnector_EthernetPort", "Antecedent", kNicPhysicalConnectorEnd, "Dependent", kEthernetPortEnd,
        (portsByKey<connectorTagOf, &kTag>), (portsByKey<ethernetIdOf, &kDeviceID>), samePortPairs, nullptr);
NIC_ROW(AssocPhysicalPortEthernetPort, "Vexlan_NIC_PhysicalPortEthernetPort", "Assoc_PhysicalPort_EthernetPort",
        "Antecedent", kNicPhysicalPortEnd, "Dependent", kEthernetPortEnd, (portsByKey<physicalPortTagOf, &kTag>),
        (portsByKey<ethernetIdOf, &kDeviceID>), samePortPairs, nullptr);
NIC_ROW(Nic_AssocPhysicalPackagePortController, "Vexlan_NIC_PhysicalPackagePortController",
        "Assoc_PhysicalPackagePortController", "Antecedent", kNicPhysicalPackageEnd, "Dependent",
        kNicPortControllerEnd, controllerOfPackage, packageOfController, sameAdapterPairs, nullptr);
NIC_ROW(AssocEthernetPortLANEndPoint, "Vexlan_NIC_EthernetPortLANEndpoint", "Assoc_EthernetPort_LANEndPoint",
        "Antecedent", kEthernetPortEnd, "Dependent", kLANEndPointEnd, (portsByKey<ethernetIdOf, &kDeviceID>),
        (portsByKey<macKey, &kName>), samePortPairs, nullptr);
NIC_ROW(AssocNetworkPortLANEndPoint, "Vexlan_NIC_NetworkPortLANEndpoint", "Assoc_NetworkPort_LANEndPoint",
        "Antecedent", kNetworkPortEnd, "Dependent", kLANEndPointEnd, (portsByKey<networkIdOf, &kDeviceID>),
        (portsByKey<macKey, &kName>), samePortPairs, nullptr);
NIC_ROW(AssocComputerSystemLANEndPoint, "Vexlan_NIC_ComputerSystemLANEndpoint", "Assoc_ComputerSystem_LANEndPoint",
        "Antecedent", kComputerSystemEnd, "Dependent", kLANEndPointEnd, portsOfHost, hostOfLanEndpoint, hostPortPairs,
        getInstance_EthernetPort);
NIC_ROW(AssocComputerSystemIPProtocolEndPoint, "Vexlan_NIC_ComputerSystemIPProtocolEndpoint",
        "Assoc_ComputerSystem_IPProtocolEndPoint", "Antecedent", kComputerSystemEnd, "Dependent",
        kIPProtocolEndPointEnd, ipEndpointsOfHost, hostByBackTest, hostPortPairs, getInstance_EthernetPort);
NIC_ROW(AssocLANEndPointIPProtocolEndPoint, "Vexlan_NIC_LANEndpointIPProtocolEndpoint",
        "Assoc_LANEndPoint_IPProtocolEndPoint", "Antecedent", kLANEndPointEnd, "Dependent", kIPProtocolEndPointEnd,
        (portsByKey<macKey, &kName>), (portsByKey<macKey, &kName>), samePortPairs, nullptr);
NIC_ROW(AssocIPProtocolEndPointCapabilitiesIPProtocolEndPoint,
        "Vexlan_NIC_IPProtocolEndpointCapabilitiesIPProtocolEndpoint",
        "Assoc_IPProtocolEndPointCapabilities_IPProtocolEndPoint", "Capabilities", kIPProtocolEndPointCapabilitiesEnd,
        "ManagedElement", kIPProtocolEndPointEnd, (portsByKey<macKey, &kInstanceID>), (portsByKey<macKey, &kName>),
        samePortPairs, nullptr);
NIC_ROW(Nic_AssocSoftwareIdentityPortController, "Vexlan_NIC_SoftwareIdentityPortController",
        "Assoc_SoftwareIdentity_PortController", "Antecedent", kNicSoftwareIdentityEnd, "Dependent",
        kNicPortControllerEnd, controllerOfIdentity, identitiesOfController, identityControllerPairs, nullptr);
NIC_ROW(Nic_AssocComputerSystemSoftwareIdentity, "Vexlan_NIC_ComputerSystemSoftwareIdentity",
        "Assoc_ComputerSystem_SoftwareIdentity", "System", kComputerSystemEnd, "InstalledSoftware",
        kNicSoftwareIdentityEnd, identitiesOfHost, singletonOfIdentity, hostIdentityPairs, nullptr);
NIC_ROW(Nic_AssocComputerSystemSoftwareInstallationService, "Vexlan_NIC_ComputerSystemSoftwareInstallationService",
        "Assoc_ComputerSystem_SoftwareInstallationService", "Antecedent", kComputerSystemEnd, "Dependent",
        kNicSoftwareInstallationServiceEnd, installerOfHost, hostOfInstaller, onePair, getInstance_EthernetPort);
NIC_ROW(Nic_AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities,
        "Vexlan_NIC_SoftwareInstallationServiceSoftwareInstallationServiceCapabilities",
        "Assoc_SoftwareInstallationService_Capabilities", "ManagedElement", kNicSoftwareInstallationServiceEnd,
        "Capabilities", kNicSoftwareInstallationServiceCapabilitiesEnd, installerByName, installerByInstanceId,
        onePair, nullptr);
NIC_ROW(Nic_AssocSoftwareIdentitySoftwareInstallationService, "Vexlan_NIC_SoftwareIdentitySoftwareInstallationService",
        "Assoc_SoftwareIdentity_SoftwareInstallationService", "AffectedElement", kNicSoftwareIdentityEnd,
        "AffectingElement", kNicSoftwareInstallationServiceEnd, singletonOfIdentity, identitiesOfInstaller,
        identityInstallerPairs, nullptr);
NIC_ROW(Nic_AssocPortControllerSoftwareInstallationService, "Vexlan_NIC_PortControllerSoftwareInstallationService",
        "Assoc_PortController_SoftwareInstallationService", "AffectedElement", kNicPortControllerEnd,
        "AffectingElement", kNicSoftwareInstallationServiceEnd, installerOfController, controllersOfInstaller,
        controllerInstallerPairs, nullptr);

// The remote service access point's two: plain in style (the source known by
// its class, the computer system also as CIM_System and CIM_ComputerSystem;
// role and resultClass not tested), with the keys read and checked as the
// other NIC rows read them.
const AssocRow kAssocComputerSystemRemoteServiceAccessPoint = {
    "Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint",
    "AssocComputerSystemRemoteServiceAccessPoint",
    "Assoc_ComputerSystem_RemoteServiceAccessPoint",
    AssocForm::PlainNoBuild,
    {"Antecedent", &kComputerSystemEnd},
    {"Dependent", &kRemoteServiceAccessPointEnd},
    (portsByKey<macKey, &kName>),
    hostByBackTest,
    hostPortPairs,
    kNoExtra,
    nullptr,
    getInstance_EthernetPort,
    nullptr,
    kAssocCheckedKeys};

const AssocRow kAssocRemoteServiceAccessPointIPProtocolEndPoint = {
    "Vexlan_NIC_RemoteServiceAccessPointIPProtocolEndpoint",
    "AssocRemoteServiceAccessPointIPProtocolEndPoint",
    "Assoc_RemoteServiceAccessPoint_IPProtocolEndPoint",
    AssocForm::PlainNoBuild,
    {"Antecedent", &kRemoteServiceAccessPointEnd},
    {"Dependent", &kIPProtocolEndPointEnd},
    everyPort,
    (portsByKey<macKey, &kName>),
    samePortPairs,
    kNoExtra,
    getInstance_ComputerSystem,
    getInstance_EthernetPort,
    nullptr,
    kAssocCheckedKeys};
