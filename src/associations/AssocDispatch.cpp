// The four association operations of the provider: which association modules
// a traversal from a source object runs.
//
// One table names every association class with its module, the CIM parent
// that a client may ask for instead, whether its lists are rebuilt before the
// module runs, whether it exists only with HDR support, and the classes that
// may stand at its ends. m_assocLookupTable (source class, association class)
// and the chain of tests are both read from it: the chain goes over the
// source classes in the order they first appear, and within one over its
// association classes in table order.
#include "associations/AssocDispatch.h"

#include <strings.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "associations/AssocRows.h"
#include "support/ClassTests.h"
#include "support/RequestLists.h"
#include "state/ProviderLocks.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

namespace {

#define DISPATCH_DEBUG(...)                                \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)
#define DISPATCH_ERROR(...)                              \
    do {                                                 \
        if (g_EnableLogError)                            \
            Vexlan_FC_Utils_CMPI::LogError(__VA_ARGS__); \
    } while (0)

struct AssocClassRow {
    const char* assocClass;
    const AssocRow* module;
    const char* alternative;    // the CIM parent accepted as a second name, or null
    bool rebuild;               // the module's remove and build run right before it
    bool hdr;                   // tested only when g_SUPPORT_HDR is not zero
    const char* sources[4];
};

// FC rows stand before NIC rows; the order decides the order of results.
const AssocClassRow kAssociations[] = {
    {"Vexlan_FCHBA_ComputerSystemCommMech", &kAssocComputerSystemCommMech, "CIM_HostedAccessPoint", false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_CIMXMLCommMech"}},
    {"Vexlan_FCHBA_ComputerSystemFCPort", &kAssocComputerSystemFCPort, "CIM_SystemDevice", false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_FCPort"}},
    {"Vexlan_FCHBA_ComputerSystemLogicalPortGroup", &kAssocComputerSystemLogicalPortGroup, "CIM_HostedCollection",
     false, false, {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_LogicalPortGroup"}},
    {"Vexlan_FCHBA_ComputerSystemPortController", &kAssocComputerSystemPortController, "CIM_SystemDevice", false,
     false, {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_PortController"}},
    {"Vexlan_FCHBA_ComputerSystemSCSIProtocolController", &kAssocComputerSystemSCSIProtocolController,
     "CIM_SystemDevice", false, false, {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_SCSIProtocolController"}},
    {"Vexlan_FCHBA_ComputerSystemSCSIProtocolEndpointHBA", &kAssocComputerSystemSCSIProtocolEndpointHBA,
     "CIM_HostedAccessPoint", false, true, {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_SCSIProtocolEndpointHBA"}},
    {"Vexlan_FCHBA_ComputerSystemSCSIProtocolEndpointTarget", &kAssocComputerSystemSCSIProtocolEndpointTarget,
     "CIM_HostedAccessPoint", true, true,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_SCSIProtocolEndpointTarget"}},
    {"Vexlan_FCHBA_ComputerSystemSoftwareIdentity", &kAssocComputerSystemSoftwareIdentity,
     "CIM_InstalledSoftwareIdentity", false, false, {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_SoftwareIdentity"}},
    {"Vexlan_FCHBA_ComputerSystemStorageExtent", &kAssocComputerSystemStorageExtent, "CIM_SystemDevice", true, true,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_StorageExtent"}},
    {"Vexlan_FCHBA_ComputerSystemSoftwareInstallationService", &kAssocComputerSystemSoftwareInstallationService,
     "CIM_HostedService", false, false, {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_SoftwareInstallationService"}},
    {"Vexlan_FCHBA_FCPortFCPortStatistics", &kAssocFCPortFCPortStatistics, "CIM_ElementStatisticalData", true, false,
     {"Vexlan_FCHBA_FCPort", "Vexlan_FCHBA_FCPortStatistics"}},
    {"Vexlan_FCHBA_FCPortSCSIProtocolEndpointHBA", &kAssocFCPortSCSIProtocolEndpointHBA,
     "CIM_DeviceSAPImplementation", true, true, {"Vexlan_FCHBA_FCPort", "Vexlan_FCHBA_SCSIProtocolEndpointHBA"}},
    {"Vexlan_FCHBA_PhysicalConnectorFCPort", &kAssocPhysicalConnectorFCPort, "CIM_Realizes", false, false,
     {"Vexlan_FCHBA_FCPort", "Vexlan_Adapter_PhysicalConnector"}},
    {"Vexlan_FCHBA_PhysicalPortFCPort", &kAssocPhysicalPortFCPort, "CIM_Realizes", false, false,
     {"Vexlan_FCHBA_FCPort", "Vexlan_Adapter_PhysicalPort"}},
    {"Vexlan_FCHBA_LogicalPortGroupFCPort", &kAssocLogicalPortGroupFCPort, "CIM_MemberOfCollection", true, false,
     {"Vexlan_FCHBA_LogicalPortGroup", "Vexlan_FCHBA_FCPort"}},
    {"Vexlan_Adapter_PhysicalPackagePhysicalConnector", &kAssocPhysicalPackagePhysicalConnector, "CIM_Container",
     false, false, {"Vexlan_Adapter_PhysicalPackage", "Vexlan_Adapter_PhysicalConnector"}},
    {"Vexlan_FCHBA_PhysicalPackagePortController", &kAssocPhysicalPackagePortController, "CIM_Realizes", false, false,
     {"Vexlan_Adapter_PhysicalPackage", "Vexlan_FCHBA_PortController"}},
    {"Vexlan_Adapter_PhysicalPackagePhysicalPort", &kAssocPhysicalPackagePhysicalPort, "CIM_Container", false, false,
     {"Vexlan_Adapter_PhysicalPackage", "Vexlan_Adapter_PhysicalPort"}},
    {"Vexlan_FCHBA_PortControllerFCPort", &kAssocPortControllerFCPort, "CIM_ControlledBy", false, false,
     {"Vexlan_FCHBA_PortController", "Vexlan_FCHBA_FCPort"}},
    {"Vexlan_Adapter_ProductPhysicalPackage", &kAssocProductPhysicalPackage, "CIM_ProductPhysicalComponent", false,
     false, {"Vexlan_Adapter_Product", "Vexlan_Adapter_PhysicalPackage"}},
    {"Vexlan_FCHBA_ComputerSystemObjectManager", &kAssocComputerSystemObjectManager, "CIM_HostedService", false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_ObjectManager"}},
    {"Vexlan_FCHBA_ObjectManagerCommMech", &kAssocObjectManagerCommMech, "CIM_CommMechanismForManager", false, false,
     {"Vexlan_FCHBA_ObjectManager", "Vexlan_FCHBA_CIMXMLCommMech"}},
    {"Vexlan_FCHBA_ObjectManagerNamespace", &kAssocObjectManagerNamespace, "CIM_NamespaceInManager", false, false,
     {"Vexlan_FCHBA_ObjectManager", "Vexlan_FCHBA_Namespace"}},
    {"Vexlan_FCHBA_RegisteredProfileObjectManager", &kAssocRegisteredProfileObjectManager, nullptr, false, false,
     {"Vexlan_FCHBA_RegisteredProfile", "Vexlan_FCHBA_ObjectManager"}},
    {"Vexlan_FCHBA_SCSIProtocolControllerFCPort", &kAssocSCSIProtocolControllerFCPort, "CIM_ProtocolControllerForPort",
     true, false, {"Vexlan_FCHBA_SCSIProtocolController", "Vexlan_FCHBA_FCPort"}},
    {"Vexlan_FCHBA_SoftwareIdentityPortController", &kAssocSoftwareIdentityPortController,
     "CIM_ElementSoftwareIdentity", false, false, {"Vexlan_FCHBA_SoftwareIdentity", "Vexlan_FCHBA_PortController"}},
    {"Vexlan_FCHBA_SoftwareIdentitySoftwareInstallationService", &kAssocSoftwareIdentitySoftwareInstallationService,
     "CIM_ServiceAffectsElement", false, false,
     {"Vexlan_FCHBA_SoftwareIdentity", "Vexlan_FCHBA_SoftwareInstallationService"}},
    {"Vexlan_FCHBA_SoftwareInstallationServiceSoftwareInstallationServiceCapabilities",
     &kAssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities, "CIM_ElementCapabilities", false,
     false, {"Vexlan_FCHBA_SoftwareInstallationService", "Vexlan_FCHBA_SoftwareInstallationServiceCapabilities"}},
    {"Vexlan_NIC_PhysicalPortEthernetPort", &kAssocPhysicalPortEthernetPort, nullptr, false, false,
     {"Vexlan_Adapter_PhysicalPort", "Vexlan_NIC_EthernetPort2"}},
    {"Vexlan_FCHBA_PortControllerSoftwareInstallationService", &kAssocPortControllerSoftwareInstallationService,
     "CIM_ServiceAffectsElement", false, false,
     {"Vexlan_FCHBA_PortController", "Vexlan_FCHBA_SoftwareInstallationService"}},
    // The profile associations of the FC side, routed for profile discovery.
    {"Vexlan_FCHBA_RegisteredProfileComputerSystem", &kAssocRegisteredProfileComputerSystem, nullptr, false, false,
     {"Vexlan_FCHBA_RegisteredProfile", "Vexlan_Adapter_ComputerSystem"}},
    {"Vexlan_FCHBA_RegisteredProfileRegisteredSubProfile", &kAssocRegisteredProfileRegisteredSubProfile, nullptr,
     false, false, {"Vexlan_FCHBA_RegisteredProfile", "Vexlan_FCHBA_RegisteredSubProfile"}},
    {"Vexlan_FCHBA_SoftwareIdentityRegisteredProfile", &kAssocSoftwareIdentityRegisteredProfile, nullptr, false,
     false, {"Vexlan_FCHBA_SoftwareIdentity", "Vexlan_FCHBA_RegisteredProfile"}},
    {"Vexlan_FCHBA_SoftwareIdentityRegisteredSubProfile", &kAssocSoftwareIdentityRegisteredSubProfile, nullptr, false,
     false, {"Vexlan_FCHBA_SoftwareIdentity", "Vexlan_FCHBA_RegisteredSubProfile"}},
    {"Vexlan_NIC_ComputerSystemEthernetPort", &kAssocComputerSystemEthernetPort, nullptr, false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_EthernetPort2"}},
    {"Vexlan_NIC_ComputerSystemIPProtocolEndpoint", &kAssocComputerSystemIPProtocolEndPoint, nullptr, false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_IPProtocolEndpoint"}},
    {"Vexlan_NIC_ComputerSystemLANEndpoint", &kAssocComputerSystemLANEndPoint, nullptr, false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_LANEndpoint"}},
    {"Vexlan_NIC_ComputerSystemNetworkPort", &kAssocComputerSystemNetworkPort, nullptr, false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_NetworkPort"}},
    {"Vexlan_NIC_ComputerSystemPortController", &kNic_AssocComputerSystemPortController, nullptr, false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_PortController"}},
    {"Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint", &kAssocComputerSystemRemoteServiceAccessPoint, nullptr,
     false, false, {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_RemoteServiceAccessPoint"}},
    {"Vexlan_NIC_RemoteServiceAccessPointIPProtocolEndpoint", &kAssocRemoteServiceAccessPointIPProtocolEndPoint,
     nullptr, false, false, {"Vexlan_NIC_RemoteServiceAccessPoint", "Vexlan_NIC_IPProtocolEndpoint"}},
    {"Vexlan_NIC_ComputerSystemSoftwareIdentity", &kNic_AssocComputerSystemSoftwareIdentity, nullptr, false, false,
     {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_SoftwareIdentity"}},
    {"Vexlan_NIC_ComputerSystemSoftwareInstallationService", &kNic_AssocComputerSystemSoftwareInstallationService,
     nullptr, false, false, {"Vexlan_Adapter_ComputerSystem", "Vexlan_NIC_SoftwareInstallationService"}},
    {"Vexlan_NIC_IPProtocolEndpointCapabilitiesIPProtocolEndpoint",
     &kAssocIPProtocolEndPointCapabilitiesIPProtocolEndPoint, nullptr, false, false,
     {"Vexlan_NIC_IPProtocolEndpointCapabilities", "Vexlan_NIC_IPProtocolEndpoint"}},
    {"Vexlan_NIC_ElementConformsToRegisteredProfile", &kAssocElementConformsToRegisteredProfile, nullptr, false, false,
     {"Vexlan_NIC_EthernetPort2", "Vexlan_NIC_IPProtocolEndpoint", "Vexlan_NIC_NetworkPort",
      "Vexlan_NIC_RegisteredProfile"}},
    {"Vexlan_NIC_EthernetPortLANEndpoint", &kAssocEthernetPortLANEndPoint, nullptr, false, false,
     {"Vexlan_NIC_EthernetPort2", "Vexlan_NIC_LANEndpoint"}},
    {"Vexlan_NIC_PhysicalConnectorEthernetPort", &kAssocPhysicalConnectorEthernetPort, nullptr, false, false,
     {"Vexlan_NIC_EthernetPort2", "Vexlan_Adapter_PhysicalConnector"}},
    {"Vexlan_NIC_PortControllerEthernetPort", &kAssocPortControllerEthernetPort, nullptr, false, false,
     {"Vexlan_NIC_EthernetPort2", "Vexlan_NIC_PortController"}},
    {"Vexlan_NIC_LANEndpointIPProtocolEndpoint", &kAssocLANEndPointIPProtocolEndPoint, nullptr, false, false,
     {"Vexlan_NIC_IPProtocolEndpoint", "Vexlan_NIC_LANEndpoint"}},
    {"Vexlan_NIC_NetworkPortLANEndpoint", &kAssocNetworkPortLANEndPoint, nullptr, false, false,
     {"Vexlan_NIC_LANEndpoint", "Vexlan_NIC_NetworkPort"}},
    {"Vexlan_NIC_PhysicalPackagePortController", &kNic_AssocPhysicalPackagePortController, nullptr, false, false,
     {"Vexlan_Adapter_PhysicalPackage", "Vexlan_NIC_PortController"}},
    {"Vexlan_NIC_PortControllerSoftwareInstallationService", &kNic_AssocPortControllerSoftwareInstallationService,
     nullptr, false, false, {"Vexlan_NIC_PortController", "Vexlan_NIC_SoftwareInstallationService"}},
    {"Vexlan_NIC_SoftwareIdentityPortController", &kNic_AssocSoftwareIdentityPortController, nullptr, false, false,
     {"Vexlan_NIC_PortController", "Vexlan_NIC_SoftwareIdentity"}},
    {"Vexlan_NIC_SoftwareIdentitySoftwareInstallationService", &kNic_AssocSoftwareIdentitySoftwareInstallationService,
     nullptr, false, false, {"Vexlan_NIC_SoftwareIdentity", "Vexlan_NIC_SoftwareInstallationService"}},
    {"Vexlan_NIC_SoftwareInstallationServiceSoftwareInstallationServiceCapabilities",
     &kNic_AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities, nullptr, false, false,
     {"Vexlan_NIC_SoftwareInstallationService", "Vexlan_NIC_SoftwareInstallationServiceCapabilities"}},
};

// Source classes tested with classPathIsA (so that subclasses count); all
// others by their name.
bool testedByIsA(const char* source)
{
    return std::strcmp(source, "Vexlan_Adapter_PhysicalPort") == 0 ||
           std::strcmp(source, "Vexlan_NIC_EthernetPort2") == 0;
}

// In referenceNames, the two FC port rows of CIM_Realizes are spelled so
// from the FC port's side, and only there.
const char* referenceNamesAlternative(const char* source, const AssocClassRow& row)
{
    if (std::strcmp(source, "Vexlan_FCHBA_FCPort") == 0 &&
        (row.module == &kAssocPhysicalConnectorFCPort || row.module == &kAssocPhysicalPortFCPort))
        return "CIM_Reailizes";
    return row.alternative;
}

struct ChainTest {
    const char* source;
    const AssocClassRow* association;
};

struct Tables {
    std::vector<AssocLookupRow> lookup;
    std::vector<ChainTest> chain;
};

const Tables& tables()
{
    static const Tables t = [] {
        Tables built;
        std::vector<const char*> sources;
        for (const AssocClassRow& row : kAssociations) {
            for (const char* source : row.sources) {
                if (source == nullptr)
                    break;
                built.lookup.push_back({source, row.assocClass});
                bool seen = false;
                for (const char* s : sources)
                    seen = seen || std::strcmp(s, source) == 0;
                if (!seen)
                    sources.push_back(source);
            }
        }
        for (const char* source : sources)
            for (const AssocClassRow& row : kAssociations) {
                if (row.module == nullptr)
                    continue;
                for (const char* s : row.sources)
                    if (s != nullptr && std::strcmp(s, source) == 0)
                        built.chain.push_back({source, &row});
            }
        return built;
    }();
    return t;
}

enum class Op { ReferenceNames, References, AssociatorNames, Associators };

const char* opName(Op op)
{
    switch (op) {
    case Op::ReferenceNames:
        return "referenceNames";
    case Op::References:
        return "references";
    case Op::AssociatorNames:
        return "associatorNames";
    case Op::Associators:
        break;
    }
    return "associators";
}

// The parameters of one request, handed on to each module.
struct Request {
    Op op;
    const CmpiContext& ctx;
    CmpiResult& rslt;
    const CmpiObjectPath& path;
    const PathClassTests& pathClasses;   // the class tests of `path`
    const char* assocParameter;   // resultClass of the reference operations, assocClass of the others
    const char* resultClass;
    const char* role;
    const char* resultRole;
    const char** properties;
};

CmpiStatus callModule(const Request& rq, const AssocRow& module)
{
    switch (rq.op) {
    case Op::ReferenceNames:
        return assocReferenceNames(module, rq.ctx, rq.rslt, rq.path, rq.assocParameter, rq.role);
    case Op::References:
        return assocReferences(module, rq.ctx, rq.rslt, rq.path, rq.assocParameter, rq.role, rq.properties);
    case Op::AssociatorNames:
        return assocAssociatorNames(module, rq.ctx, rq.rslt, rq.path, rq.assocParameter, rq.resultClass, rq.role,
                                    rq.resultRole);
    case Op::Associators:
        break;
    }
    return assocAssociators(module, rq.ctx, rq.rslt, rq.path, rq.assocParameter, rq.resultClass, rq.role,
                            rq.resultRole, rq.properties);
}

// The chain of tests for one round: every module whose source class is the
// request's and whose association class (or CIM parent) is calcResultClass.
CmpiStatus runChain(const Request& rq, const char* sConstCopStr, const char* calcResultClass)
{
    CmpiStatus last(CMPI_RC_OK);
    for (const ChainTest& test : tables().chain) {
        const AssocClassRow& row = *test.association;
        if (row.hdr && g_SUPPORT_HDR == 0)
            continue;
        const bool sourceMatches =
            testedByIsA(test.source) ? rq.pathClasses.isAFixed(test.source) : strcasecmp(sConstCopStr, test.source) == 0;
        if (!sourceMatches)
            continue;
        const char* alternative =
            rq.op == Op::ReferenceNames ? referenceNamesAlternative(test.source, row) : row.alternative;
        if (strcasecmp(calcResultClass, row.assocClass) != 0 &&
            (alternative == nullptr || strcasecmp(calcResultClass, alternative) != 0))
            continue;
        if (row.rebuild) {
            assocRemove(*row.module);
            assocBuild(*row.module);
        }
        last = callModule(rq, *row.module);
    }
    return last;
}

const char* classNameText(const CmpiObjectPath& path, CMPIStatus& rc)
{
    CMPIObjectPath* enc = path.getEnc();
    rc = CMPIStatus{CMPI_RC_OK, nullptr};
    CMPIString* cls = enc->ft->getClassName(enc, &rc);
    if (rc.rc != CMPI_RC_OK || cls == nullptr)
        return nullptr;
    const char* text = cls->ft->getCharPtr(cls, nullptr);
    return text != nullptr ? text : "";
}

// A server may refuse returnDone after a failure; the request's own status
// is what the caller returns.
void returnDoneQuietly(CmpiResult& rslt) noexcept
{
    try {
        rslt.returnDone();
    } catch (...) {
    }
}

// The gate of the associator operations: true if some row of the lookup
// table has the path's class (or a class it derives from) as its source, and
// the asked association class when one is asked for.
bool passesGate(const PathClassTests& path, const char* assocClass)
{
    for (const AssocLookupRow& row : tables().lookup)
        if (path.isAFixed(row.sourceClass) &&
            (assocClass == nullptr || strcasecmp(row.assocClass, assocClass) == 0))
            return true;
    return false;
}

// True when the class named `cls` in the namespace of `path` is
// `ancestor` or derives from it; a class the server doesn't know there is
// neither.
bool classIsA(const CmpiObjectPath& path, const char* cls, const char* ancestor)
{
    try {
        return classtests::classIsA(path.getNameSpace().charPtr(), cls, ancestor);
    } catch (const CmpiStatus&) {
        return false;
    }
}

// Outside the provider's namespace (the interop namespace, where the
// profiles are served with their conformance and sub-profile associations
// only), a round without an association class runs only for the profile
// associations: another class (a software identity's profiles, say) is not
// served there, and its instances would name a class that the namespace
// lacks (sfcb drops the connection).
bool servedInRequestNamespace(const Request& rq, const char* assocClass)
{
    const CmpiString ns = rq.path.getNameSpace();
    const char* text = ns.charPtr();
    if (text == nullptr || strcasecmp(text, kModelNamespace) == 0)
        return true;
    return classIsA(rq.path, assocClass, "CIM_ElementConformsToProfile") ||
           classIsA(rq.path, assocClass, "CIM_ReferencedProfile");
}

// The rounds: one per table row of the request's class, each with that row's
// association class, or a single round with the asked association class.
// Returns the status of the last module called.
CmpiStatus runRounds(const Request& rq)
{
    CmpiStatus last(CMPI_RC_OK);
    const std::string sConstCopStr = rq.path.getClassName().charPtr();
    for (const AssocLookupRow& row : tables().lookup) {
        char calcResultClass[256] = {};
        const bool given = rq.assocParameter != nullptr;
        if (given) {
            std::snprintf(calcResultClass, sizeof(calcResultClass), "%s", rq.assocParameter);
        } else {
            if (strcasecmp(row.sourceClass, sConstCopStr.c_str()) != 0 ||
                !servedInRequestNamespace(rq, row.assocClass))
                continue;
            std::snprintf(calcResultClass, sizeof(calcResultClass), "%s", row.assocClass);
            if (rq.op == Op::ReferenceNames)
                DISPATCH_DEBUG("Copied %s to calcResultClass", calcResultClass);
        }
        if (rq.op == Op::ReferenceNames)
            DISPATCH_DEBUG("sConstCopStr = %s, calcResultClass = %s", sConstCopStr.c_str(), calcResultClass);
        else if (rq.op == Op::Associators)
            DISPATCH_DEBUG("Vexlan_CNA_Provider::associators() assocClass=%s", calcResultClass);
        else if (rq.op == Op::AssociatorNames)
            DISPATCH_DEBUG("Vexlan_CNA_Provider::associatorNames() assocClass=%s", calcResultClass);
        last = runChain(rq, sConstCopStr.c_str(), calcResultClass);
        if (rq.op == Op::Associators)
            DISPATCH_DEBUG("Vexlan_CNA_Provider::associators() assocClass=%s  DONE", calcResultClass);
        if (given)
            break;
    }
    return last;
}

bool isOwnAssociationClass(const char* name)
{
    for (const AssocClassRow& row : kAssociations)
        if (strcasecmp(row.assocClass, name) == 0)
            return true;
    return false;
}

// The provider's association classes that a parent class asked for stands
// for: those derived from it that have the path's class (or one it derives
// from) at an end, in table order. OpenPegasus never hands a provider such a
// class; it calls the provider once for each of these classes instead. sfcb
// hands the client's class over as it is, and the provider then answers for
// each of them as it answers OpenPegasus. Empty when the parameter names one
// of the provider's own classes, or a text that is no class (the CIM parent
// spellings of the dispatch table keep their meaning).
std::vector<const char*> derivedClassesAsked(const Request& rq)
{
    std::vector<const char*> classes;
    if (rq.assocParameter == nullptr || rq.assocParameter[0] == '\0' || isOwnAssociationClass(rq.assocParameter))
        return classes;
    for (const AssocClassRow& row : kAssociations) {
        bool atSource = false;
        for (const char* source : row.sources)
            atSource = atSource || (source != nullptr && rq.pathClasses.isAFixed(source));
        if (atSource && classIsA(rq.path, row.assocClass, rq.assocParameter))
            classes.push_back(row.assocClass);
    }
    return classes;
}

CmpiStatus dispatch(const Request& rq)
{
    const char* name = opName(rq.op);
    const bool associatorOp = rq.op == Op::AssociatorNames || rq.op == Op::Associators;
    CmpiStatus last(CMPI_RC_OK);
    std::string gateClosedFor;
    bool gateClosed = false;
    {
        ProviderLockGuard lock(&ProviderLocks::provider_lock);
        const RequestScope request;
        if (rq.op == Op::Associators)
            DISPATCH_DEBUG("Vexlan_CNA_Provider::associators entered");
        try {
            CMPIStatus rc;
            const char* className = classNameText(rq.path, rc);
            if (rc.rc != CMPI_RC_OK) {
                DISPATCH_ERROR("Vexlan_CNA_Provider %s: Error getting classname, status.rc=%d!", name,
                               static_cast<int>(rc.rc));
                returnDoneQuietly(rq.rslt);
                return CmpiStatus(rc);
            }
            const char* word = associatorOp ? "assocClass" : "resultClass";
            if (rq.assocParameter == nullptr)
                DISPATCH_DEBUG("Entering Vexlan_CNA_Provider %s: classname = %s, %s = NULL", name, className, word);
            else
                DISPATCH_DEBUG("Entering Vexlan_CNA_Provider %s: classname = %s, %s = %s\n", name, className, word,
                               rq.assocParameter);
            const std::vector<AssocLookupRow>& lookup = tables().lookup;
            DISPATCH_DEBUG("m_assocLookupTableSize = %d\n", static_cast<int>(lookup.size()));
            const std::vector<const char*> derived = derivedClassesAsked(rq);
            if (!derived.empty()) {
                // One request of each derived class, as OpenPegasus makes them;
                // the gate passes for each, as the class stands at the source.
                for (const char* cls : derived) {
                    DISPATCH_DEBUG("Vexlan_CNA_Provider %s: %s answers for %s\n", name, cls, rq.assocParameter);
                    Request one = rq;
                    one.assocParameter = cls;
                    if (associatorOp)
                        DISPATCH_DEBUG("Class %s has associators\n", className);
                    last = runRounds(one);
                }
                rq.rslt.returnDone();
            } else if (associatorOp && !passesGate(rq.pathClasses, rq.assocParameter)) {
                rq.rslt.returnDone();
                gateClosedFor = className;   // logged once the lock is given back
                gateClosed = true;
            } else {
                if (associatorOp)
                    DISPATCH_DEBUG("Class %s has associators\n", className);
                last = runRounds(rq);
                rq.rslt.returnDone();
            }
        } catch (const CmpiStatus& st) {
            DISPATCH_ERROR("Vexlan_CNA_Provider %s caught exception status: %d %s", name, static_cast<int>(st.rc()),
                           st.msg() != nullptr ? st.msg() : "");
            returnDoneQuietly(rq.rslt);
            return st;
        } catch (...) {
            DISPATCH_ERROR("Vexlan_CNA_Provider %s detected an unknown exception", name);
            returnDoneQuietly(rq.rslt);
            const std::string text = std::string("Vexlan_CNA_Provider ") + name + " detected an unknown exception";
            return CmpiStatus(CMPI_RC_ERR_FAILED, text.c_str());
        }
    }
    if (gateClosed) {
        DISPATCH_DEBUG(rq.op == Op::Associators ? "Class %s has no associators\n" : "Class %s has no associatorNames\n",
                       gateClosedFor.c_str());
        return CmpiStatus(CMPI_RC_OK);
    }
    DISPATCH_DEBUG("Exiting  Vexlan_CNA_Provider %s\n", name);
    if (rq.op == Op::Associators)
        DISPATCH_DEBUG("Vexlan_CNA_Provider::associators() status=%d, %s", static_cast<int>(last.rc()),
                       last.msg() != nullptr ? last.msg() : "");
    return CmpiStatus(CMPI_RC_OK);
}

}  // namespace

const AssocLookupRow* assocLookupTable(std::size_t& count)
{
    count = tables().lookup.size();
    return tables().lookup.data();
}

namespace assocdispatch {

CmpiStatus associators(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op, const char* assocClass,
                       const char* resultClass, const char* role, const char* resultRole, const char** properties)
{
    const PathClassTests classes(op);
    return dispatch({Op::Associators, ctx, rslt, op, classes, assocClass, resultClass, role, resultRole, properties});
}

CmpiStatus associatorNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                           const char* assocClass, const char* resultClass, const char* role, const char* resultRole)
{
    const PathClassTests classes(op);
    return dispatch({Op::AssociatorNames, ctx, rslt, op, classes, assocClass, resultClass, role, resultRole, nullptr});
}

CmpiStatus references(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op, const char* resultClass,
                      const char* role, const char** properties)
{
    const PathClassTests classes(op);
    return dispatch({Op::References, ctx, rslt, op, classes, resultClass, nullptr, role, nullptr, properties});
}

CmpiStatus referenceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                          const char* resultClass, const char* role)
{
    const PathClassTests classes(op);
    return dispatch({Op::ReferenceNames, ctx, rslt, op, classes, resultClass, nullptr, role, nullptr, nullptr});
}

}  // namespace assocdispatch
