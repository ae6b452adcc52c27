// The association modules of the FC side and of the physical classes: one
// row each, with the joins that find the partners of a source and the pairs
// that an enumeration answers.
//
// Joins compare texts without regard to case. Tokens are cut at "_": the
// suffix is the text behind the last "_", the prefix the text before the
// first, the second token the text between the first and the second. A key
// without "_" gives an empty token; a list walk keeps the token of the
// previous entry for an entry key without one.
#include <strings.h>

#include <cstdio>
#include <cstring>
#include <vector>

#include "associations/AssocEnds.h"
#include "associations/AssocRows.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalConnector_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPort_CMPI.h"
#include "classes/Vexlan_Adapter_Product_CMPI.h"
#include "classes/Vexlan_FCHBA_Namespace_CMPI.h"
#include "classes/Vexlan_FCHBA_ObjectManager_CMPI.h"
#include "classes/Vexlan_FCHBA_RegisteredSubProfile_CMPI.h"
#include "classes/Vexlan_FCHBA_SoftwareIdentity_CMPI.h"
#include "classes/Vexlan_FC_FCPortStatistics_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "classes/Vexlan_FC_LogicalPortGroup_CMPI.h"
#include "classes/Vexlan_FC_PortController_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointHBA_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointTarget_CMPI.h"
#include "classes/Vexlan_FC_StorageExtent_CMPI.h"
#include "inventory/AdapterFunc_Identity.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "zorap_cna.h"

namespace {

#define FC_ASSOC_DEBUG(...)                                \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)

constexpr const char* kComputerSystemClass = "Vexlan_Adapter_ComputerSystem";
constexpr const char* kInstallerName = "CNA_SW_INSTALLER";

// Reads a key of the source into a local string; ends the search when the
// read fails (checked reads only).
#define READ_KEY(request, name, var) \
    std::string var;                 \
    if (!(request).key(name, var))   \
        return false;
#define PARTNER(request, item)       \
    if (!(request).partner(item))    \
        return false;

EndItem slot(int index)
{
    EndItem item;
    item.index = index;
    return item;
}
const EndItem kOne{};

bool same(const std::string& a, const char* b)
{
    return strcasecmp(a.c_str(), b != nullptr ? b : "") == 0;
}
bool same(const char* a, const char* b)
{
    return strcasecmp(a != nullptr ? a : "", b != nullptr ? b : "") == 0;
}
bool holds(const char* text, const char* part)
{
    return text != nullptr && std::strstr(text, part) != nullptr;
}

// The token of list entry keys in a walk: an entry key without "_" leaves
// the previous entry's token in place.
class TokenWalker {
public:
    const std::string& suffix(const char* key)
    {
        const char* p = key != nullptr ? std::strrchr(key, '_') : nullptr;
        if (p != nullptr)
            token_ = p + 1;
        return token_;
    }
    const std::string& prefix(const char* key)
    {
        const char* p = key != nullptr ? std::strchr(key, '_') : nullptr;
        if (p != nullptr)
            token_.assign(key, static_cast<std::size_t>(p - key));
        return token_;
    }
    const std::string& second(const char* key)
    {
        const char* p = key != nullptr ? std::strchr(key, '_') : nullptr;
        if (p != nullptr)
            token_ = secondToken(key);
        return token_;
    }

private:
    std::string token_;
};

// The back test of a computer system end: the source's SystemName is the
// host and its SystemCreationClassName the computer system's class.
bool backTest(AssocRequest& rq, bool& ok)
{
    READ_KEY(rq, "SystemName", systemName);
    READ_KEY(rq, "SystemCreationClassName", creationClass);
    ok = same(systemName, hostName_ComputerSystem) && same(creationClass, kComputerSystemClass);
    return true;
}

// ---- joins shared by many rows --------------------------------------------------------

// Every slot of a list (the valid ones only, where asked), no key read.
template <auto& List, bool ValidOnly>
bool allSlots(AssocRequest& rq)
{
    for (int i = 0; i < List.count; ++i)
        if (!ValidOnly || List.entries[i].valid)
            PARTNER(rq, slot(i));
    return true;
}

// The singleton partner, no key read.
bool theOne(AssocRequest& rq)
{
    return rq.partner(kOne);
}

// The computer system, when the source passes the back test.
bool backToSystem(AssocRequest& rq)
{
    bool ok = false;
    if (!backTest(rq, ok))
        return false;
    return !ok || rq.partner(kOne);
}

// One pair per slot of a list, the singleton at role 1.
template <auto& List, bool ValidOnly>
void singletonPairs(const PairFn& pair)
{
    for (int i = 0; i < List.count; ++i)
        if (!ValidOnly || List.entries[i].valid)
            pair(kOne, slot(i));
}

void onePair(const PairFn& pair)
{
    pair(kOne, kOne);
}

// ---- software identities ---------------------------------------------------------------

bool isDriver(const SoftwareIdentityEntry& e)
{
    return e.valid && holds(e.instanceId, "_Driver");
}
bool isFlashImage(const SoftwareIdentityEntry& e)
{
    return e.valid && holds(e.instanceId, "_FlashImage");
}

bool driversOfHost(AssocRequest& rq)
{
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i)
        if (isDriver(g_SoftwareIdentityList.entries[i]))
            PARTNER(rq, slot(i));
    return true;
}

bool hostOfDriver(AssocRequest& rq)
{
    READ_KEY(rq, "InstanceID", instanceId);
    if (same(prefixToken(instanceId), hostName_ComputerSystem) && holds(instanceId.c_str(), "_Driver"))
        PARTNER(rq, kOne);
    return true;
}

void driverPairs(const PairFn& pair)
{
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i)
        if (isDriver(g_SoftwareIdentityList.entries[i]))
            pair(kOne, slot(i));
}

// ---- host, interop and installer singletons --------------------------------------------

bool groupsOfHost(AssocRequest& rq)
{
    return allSlots<g_LogicalPortGroupList, false>(rq);
}

bool hostOfGroup(AssocRequest& rq)
{
    READ_KEY(rq, "InstanceID", instanceId);
    if (same(prefixToken(instanceId), hostName_ComputerSystem))
        PARTNER(rq, kOne);
    return true;
}

bool hostOfObjectManager(AssocRequest& rq)
{
    READ_KEY(rq, "SystemCreationClassName", creationClass);
    if (same(creationClass, kComputerSystemClass))
        PARTNER(rq, kOne);
    return true;
}

bool bySystemName(AssocRequest& rq)
{
    READ_KEY(rq, "SystemName", systemName);
    if (same(systemName, hostName_ObjectManager))
        PARTNER(rq, kOne);
    return true;
}

bool namespacesOfManager(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (same(name, name_ObjectManager))
        for (int i = 0; i < kNamespaceRows; ++i)
            PARTNER(rq, slot(i));
    return true;
}

bool managerOfNamespace(AssocRequest& rq)
{
    READ_KEY(rq, "ObjectManagerName", name);
    if (same(name, name_ObjectManager))
        PARTNER(rq, kOne);
    return true;
}

void namespacePairs(const PairFn& pair)
{
    for (int i = 0; i < kNamespaceRows; ++i)
        pair(kOne, slot(i));
}

bool installerByName(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (same(name, kInstallerName))
        PARTNER(rq, kOne);
    return true;
}

bool installerByInstanceId(AssocRequest& rq)
{
    READ_KEY(rq, "InstanceID", instanceId);
    if (same(instanceId, kInstallerName))
        PARTNER(rq, kOne);
    return true;
}

bool installerOfHost(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (same(name, hostName_ComputerSystem))
        PARTNER(rq, kOne);
    return true;
}

bool hostOfInstaller(AssocRequest& rq)
{
    READ_KEY(rq, "SystemName", systemName);
    READ_KEY(rq, "SystemCreationClassName", creationClass);
    READ_KEY(rq, "Name", name);
    if (same(systemName, hostName_ComputerSystem) && same(creationClass, kComputerSystemClass) &&
        same(name, kInstallerName))
        PARTNER(rq, kOne);
    return true;
}

// The service of an identity: the one service, when some valid identity has
// that InstanceID. Identities of a multi-port adapter share their InstanceID;
// the walk stops at the first, so the singleton is answered once.
bool installerOfIdentity(AssocRequest& rq)
{
    READ_KEY(rq, "InstanceID", instanceId);
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i) {
        const SoftwareIdentityEntry& e = g_SoftwareIdentityList.entries[i];
        if (e.valid && same(instanceId, e.instanceId))
            return rq.partner(kOne);
    }
    return true;
}

// The flash images that the service lists back.
bool flashImagesOfInstaller(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (!same(name, kInstallerName))
        return true;
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i)
        if (isFlashImage(g_SoftwareIdentityList.entries[i]))
            PARTNER(rq, slot(i));
    return true;
}

void flashImagePairs(const PairFn& pair)
{
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i)
        if (isFlashImage(g_SoftwareIdentityList.entries[i]))
            pair(slot(i), kOne);
}

bool installerOfController(AssocRequest& rq)
{
    READ_KEY(rq, "DeviceID", deviceId);
    for (int i = 0; i < g_PortControllerList.count; ++i)
        if (same(deviceId, g_PortControllerList.entries[i].deviceId))
            PARTNER(rq, kOne);
    return true;
}

bool controllersOfInstaller(AssocRequest& rq)
{
    READ_KEY(rq, "Name", name);
    if (same(name, kInstallerName))
        for (int i = 0; i < g_PortControllerList.count; ++i)
            PARTNER(rq, slot(i));
    return true;
}

void controllerInstallerPairs(const PairFn& pair)
{
    for (int i = 0; i < g_PortControllerList.count; ++i)
        pair(slot(i), kOne);
}

// ---- joins of two lists ------------------------------------------------------------------

// How a source key and a list entry key are compared.
enum class Cut { Whole, Suffix, Prefix, Second };

std::string cutSource(Cut cut, const std::string& key)
{
    switch (cut) {
    case Cut::Suffix:
        return suffixToken(key);
    case Cut::Prefix:
        return prefixToken(key);
    case Cut::Second:
        return secondToken(key);
    case Cut::Whole:
        break;
    }
    return key;
}

const char* cutEntry(Cut cut, TokenWalker& walker, const char* key)
{
    switch (cut) {
    case Cut::Suffix:
        return walker.suffix(key).c_str();
    case Cut::Prefix:
        return walker.prefix(key).c_str();
    case Cut::Second:
        return walker.second(key).c_str();
    case Cut::Whole:
        break;
    }
    return key;
}

// One side of a two-list join: the list, the key of its entries, and how
// that key is cut.
template <auto& List, auto Field, Cut C, bool ValidOnly = false>
struct JoinSide {
    static int count() { return List.count; }
    static bool admitted(int i) { return !ValidOnly || List.entries[i].valid; }
    static const char* key(int i) { return List.entries[i].*Field; }
    static constexpr Cut cut = C;
};

// Source of role A, partners in the list of side B: the source's key `K`,
// cut as side A cuts its own keys, against each entry of B, cut as B cuts.
template <const char* const* K, Cut SourceCut, class B>
bool listJoin(AssocRequest& rq)
{
    READ_KEY(rq, *K, key);
    const std::string wanted = cutSource(SourceCut, key);
    TokenWalker walker;
    for (int i = 0; i < B::count(); ++i) {
        if (!B::admitted(i))
            continue;
        if (same(wanted.c_str(), cutEntry(B::cut, walker, B::key(i))))
            PARTNER(rq, slot(i));
    }
    return true;
}

// Every pair of two lists whose cut keys agree, `Outer` walked outside. The
// pair hands role 1 first.
template <class Outer, class Inner, bool OuterIsRole1>
void listPairs(const PairFn& pair)
{
    TokenWalker outerWalker;
    for (int o = 0; o < Outer::count(); ++o) {
        if (!Outer::admitted(o))
            continue;
        const std::string outerKey = cutEntry(Outer::cut, outerWalker, Outer::key(o));
        TokenWalker innerWalker;
        for (int i = 0; i < Inner::count(); ++i) {
            if (!Inner::admitted(i))
                continue;
            if (!same(outerKey.c_str(), cutEntry(Inner::cut, innerWalker, Inner::key(i))))
                continue;
            if (OuterIsRole1)
                pair(slot(o), slot(i));
            else
                pair(slot(i), slot(o));
        }
    }
}

constexpr const char* kDeviceID = "DeviceID";
constexpr const char* kInstanceID = "InstanceID";
constexpr const char* kName = "Name";
constexpr const char* kIdentifyingNumber = "IdentifyingNumber";

using PortsBySuffix = JoinSide<g_FCPortList, &FCPortEntry::deviceId, Cut::Suffix>;
using PortsByPrefix = JoinSide<g_FCPortList, &FCPortEntry::deviceId, Cut::Prefix>;
using StatsBySuffix = JoinSide<g_FCPortStatisticsList, &FCPortStatisticsEntry::instanceId, Cut::Suffix>;
using EndpointsByName = JoinSide<g_SCSIProtocolEndpointHBAList, &SCSIPortNameEntry::name, Cut::Whole>;
using GroupsBySuffix = JoinSide<g_LogicalPortGroupList, &LogicalPortGroupEntry::instanceId, Cut::Suffix>;
using ControllersById = JoinSide<g_PortControllerList, &PortControllerEntry::deviceId, Cut::Whole>;
using ScsiControllersByName = JoinSide<g_SCSIProtocolControllerList, &SCSIPortNameEntry::name, Cut::Whole>;
using IdentitiesBySecond = JoinSide<g_SoftwareIdentityList, &SoftwareIdentityEntry::instanceId, Cut::Second, true>;
using PackagesBySerial = JoinSide<g_PhysicalPackageList, &PhysicalPackageEntry::serialNumber, Cut::Whole>;
using ProductsByNumber = JoinSide<g_ProductList, &ProductEntry::identifyingNumber, Cut::Whole>;

// ---- physical package joins --------------------------------------------------------------

// The first package whose Tag is the source's; -1 (with the debug line) when
// there is none.
int packageOfTag(const std::string& tag)
{
    for (int i = 0; i < g_PhysicalPackageList.count; ++i) {
        FC_ASSOC_DEBUG("PHYSICALPACKAGE_SerialNumber(%d) = %s", i, g_PhysicalPackageList.entries[i].serialNumber);
        if (same(tag, g_PhysicalPackageList.entries[i].tag))
            return i;
    }
    FC_ASSOC_DEBUG("Exiting  findMatchedRole1InstancesOrReferences: PhysicalPackage not found.");
    return -1;
}

const char* packageSerial(int index)
{
    return g_PhysicalPackageList.entries[index].serialNumber;
}

bool controllersOfPackage(AssocRequest& rq)
{
    READ_KEY(rq, "Tag", tag);
    const int p = packageOfTag(tag);
    if (p < 0)
        return true;
    for (int i = 0; i < g_PortControllerList.count; ++i)
        if (same(g_PortControllerList.entries[i].deviceId, packageSerial(p)))
            PARTNER(rq, slot(i));
    return true;
}

bool packagesOfController(AssocRequest& rq)
{
    READ_KEY(rq, kDeviceID, deviceId);
    for (int i = 0; i < g_PhysicalPackageList.count; ++i) {
        FC_ASSOC_DEBUG("findMatchedRole1InstancesOrReferences: Comparing %s to %s",
                       GetSerialNumberFromIBM11SProductId(packageSerial(i)), deviceId.c_str());
        if (same(deviceId, packageSerial(i)))
            PARTNER(rq, slot(i));
    }
    return true;
}

// enumInstances and enumInstanceNames log their comparisons under their own
// names; both walk the same pairs.
void packageControllerPairs(const PairFn& pair)
{
    for (int p = 0; p < g_PhysicalPackageList.count; ++p) {
        for (int c = 0; c < g_PortControllerList.count; ++c) {
            FC_ASSOC_DEBUG("enumInstances_AssocPhysicalPackagePortController: Comparing %s to %s",
                           GetSerialNumberFromIBM11SProductId(packageSerial(p)),
                           g_PortControllerList.entries[c].deviceId);
            if (same(packageSerial(p), g_PortControllerList.entries[c].deviceId))
                pair(slot(p), slot(c));
        }
    }
}

// The adapter serial of a connector or physical port Tag, parsed from a
// zeroed copy.
std::string connectorSerial(const char* tag)
{
    char work[256] = {};
    char transceiver[kPhysicalTagPartSize] = {};
    char serial[kPhysicalTagPartSize] = {};
    int port = 0;
    std::snprintf(work, sizeof(work), "%s", tag != nullptr ? tag : "");
    ParsePhysicalConnectorTag(work, transceiver, serial, &port);
    return serial;
}

std::string physicalPortSerial(const char* tag)
{
    char work[256] = {};
    char serial[kPhysicalTagPartSize] = {};
    int port = 0;
    std::snprintf(work, sizeof(work), "%s", tag != nullptr ? tag : "");
    ParsePhysicalPortTag(work, serial, &port);
    return serial;
}

template <auto& List, std::string (*Serial)(const char*), const char* Label>
bool partsOfPackage(AssocRequest& rq)
{
    READ_KEY(rq, "Tag", tag);
    const int p = packageOfTag(tag);
    if (p < 0)
        return true;
    for (int i = 0; i < List.count; ++i) {
        FC_ASSOC_DEBUG("%s(%d) = %s", Label, i, List.entries[i].tag);
        if (same(Serial(List.entries[i].tag).c_str(), packageSerial(p)))
            PARTNER(rq, slot(i));
    }
    return true;
}

template <std::string (*Serial)(const char*)>
bool packagesOfPart(AssocRequest& rq)
{
    READ_KEY(rq, "Tag", tag);
    const std::string serial = Serial(tag.c_str());
    FC_ASSOC_DEBUG("serialNumber = %s", serial.c_str());
    for (int i = 0; i < g_PhysicalPackageList.count; ++i)
        if (same(serial.c_str(), packageSerial(i)))
            PARTNER(rq, slot(i));
    return true;
}

template <auto& List, std::string (*Serial)(const char*), const char* Label>
void packagePartPairs(const PairFn& pair)
{
    for (int p = 0; p < g_PhysicalPackageList.count; ++p) {
        for (int i = 0; i < List.count; ++i) {
            FC_ASSOC_DEBUG("%s(%d) = %s", Label, i, List.entries[i].tag);
            const std::string serial = Serial(List.entries[i].tag);
            FC_ASSOC_DEBUG("tmp_buf = %s", serial.c_str());
            if (same(serial.c_str(), packageSerial(p)))
                pair(slot(p), slot(i));
        }
    }
}

constexpr char kConnectorLabel[] = "PHYSICALCONNECTOR_Tag";
constexpr char kPhysicalPortLabel[] = "PHYSICALPORT_Tag";

// Products of a package: the first package of the source's Tag, then each
// product of the package's serial.
bool productsOfPackage(AssocRequest& rq)
{
    READ_KEY(rq, "Tag", tag);
    const int p = packageOfTag(tag);
    if (p < 0)
        return true;
    for (int i = 0; i < g_ProductList.count; ++i)
        if (same(g_ProductList.entries[i].identifyingNumber, packageSerial(p)))
            PARTNER(rq, slot(i));
    return true;
}

// ---- library-backed joins of connectors and physical ports with FC ports ---------------

bool sameWWNs(const _tagZORAPSDMDevice* device, const _zorap_protocol_t* protocol)
{
    return device != nullptr && std::memcmp(device->portWWN, protocol->fcDevice.portWWN, 8) == 0 &&
           std::memcmp(device->nodeWWN, protocol->fcDevice.nodeWWN, 8) == 0;
}

std::string adapterSerialText(const _zorap_adapter_t* adapter)
{
    return std::string(adapter->serialNumber, strnlen(adapter->serialNumber, sizeof(adapter->serialNumber)));
}

// getZORAPStructs of the FC port slots for the pairs of one join: the adapter,
// physical port and FC protocol of the library's tree that have the port and
// node WWN of the slot's device (found 1), or none (found 0). A join asks for
// the same slots again for every slot of the other end, and a walk of the tree
// per question made the join from one port grow with the square of the host,
// so each slot's records are found by one walk. The adapter list is still
// asked of the library at every question; the records found are kept while it
// gives the same list.
class FcPortRecords {
public:
    struct Records {
        int found = 0;
        _zorap_adapter_t* adapter = nullptr;
        _zorap_phy_port_t* port = nullptr;
        _zorap_protocol_t* protocol = nullptr;
    };

    const Records& getZORAPStructs(int slot)
    {
        _zorap_adapter_list_t* list = ZORAP_GetAdapterList();
        if (list != list_ || static_cast<std::size_t>(g_FCPortList.count) != known_.size()) {
            list_ = list;
            known_.assign(static_cast<std::size_t>(g_FCPortList.count > 0 ? g_FCPortList.count : 0), Unknown());
        }
        Known& k = known_[static_cast<std::size_t>(slot)];
        if (!k.asked) {
            k.asked = true;
            k.records.found = walkTree(list, g_FCPortList.entries[slot].device, k.records);
        }
        return k.records;
    }

private:
    struct Known {
        bool asked;
        Records records;
    };
    static Known Unknown() { return Known{false, Records{}}; }

    static int walkTree(_zorap_adapter_list_t* list, const _tagZORAPSDMDevice* device, Records& r)
    {
        if (list == nullptr || list->firstAdapter == nullptr || device == nullptr)
            return 0;
        for (_zorap_adapter_t* a = list->firstAdapter; a != nullptr; a = a->next) {
            for (_zorap_phy_port_t* p = a->phyPortList != nullptr ? a->phyPortList->firstPhyPort : nullptr;
                 p != nullptr; p = p->next) {
                for (_zorap_protocol_t* pr = p->protocolList != nullptr ? p->protocolList->firstProtocol : nullptr;
                     pr != nullptr; pr = pr->next) {
                    if (pr->protocolType >= 2 || !sameWWNs(device, pr))
                        continue;
                    r.adapter = a;
                    r.port = p;
                    r.protocol = pr;
                    return 1;
                }
            }
        }
        return 0;
    }

    _zorap_adapter_list_t* list_ = nullptr;
    std::vector<Known> known_;
};

// What tells the two library-backed rows apart: the end's list and how its
// Tag is parsed and composed.
struct ConnectorSide {
    static ClassList<PhysicalConnectorEntry>& list() { return g_PhysicalConnectorList; }
    static bool parse(const std::string& tag, std::string& serial, int& number)
    {
        char work[256] = {};
        char transceiver[kPhysicalTagPartSize] = {};
        char adapterSerial[kPhysicalTagPartSize] = {};
        std::snprintf(work, sizeof(work), "%s", tag.c_str());
        const int ok = ParsePhysicalConnectorTag(work, transceiver, adapterSerial, &number);
        serial = adapterSerial;
        return ok != 0;
    }
    static std::string compose(int index, const _zorap_adapter_t* adapter, const _zorap_phy_port_t* port)
    {
        const PhysicalConnectorEntry& e = g_PhysicalConnectorList.entries[index];
        const std::string transceiver(e.sfp.SerialNumber, strnlen(e.sfp.SerialNumber, sizeof(e.sfp.SerialNumber)));
        char buf[256] = {};
        std::snprintf(buf, sizeof(buf), "%s_%s_%d", transceiver.c_str(), adapterSerialText(adapter).c_str(),
                      static_cast<int>(port->portNumber));
        return buf;
    }
};

struct PhysicalPortSide {
    static ClassList<PhysicalPortEntry>& list() { return g_PhysicalPortList; }
    static bool parse(const std::string& tag, std::string& serial, int& number)
    {
        char work[256] = {};
        char adapterSerial[kPhysicalTagPartSize] = {};
        std::snprintf(work, sizeof(work), "%s", tag.c_str());
        const int ok = ParsePhysicalPortTag(work, adapterSerial, &number);
        serial = adapterSerial;
        return ok != 0;
    }
    static std::string compose(int, const _zorap_adapter_t* adapter, const _zorap_phy_port_t* port)
    {
        char buf[256] = {};
        std::snprintf(buf, sizeof(buf), "%s_%d", adapterSerialText(adapter).c_str(),
                      static_cast<int>(port->portNumber));
        return buf;
    }
};

// Source a connector or physical port: the FC ports of the first physical
// port of that number on each adapter of the Tag's serial.
template <class Side>
bool fcPortsOfTag(AssocRequest& rq)
{
    READ_KEY(rq, "Tag", tag);
    std::string serial;
    int number = 0;
    Side::parse(tag, serial, number);
    _zorap_adapter_list_t* list = ZORAP_GetAdapterList();
    if (list == nullptr || list->firstAdapter == nullptr)
        return true;
    for (_zorap_adapter_t* a = list->firstAdapter; a != nullptr; a = a->next) {
        if (!same(adapterSerialText(a).c_str(), serial.c_str()))
            continue;
        for (_zorap_phy_port_t* p = a->phyPortList != nullptr ? a->phyPortList->firstPhyPort : nullptr; p != nullptr;
             p = p->next) {
            if (p->portNumber != number)
                continue;
            for (_zorap_protocol_t* pr = p->protocolList != nullptr ? p->protocolList->firstProtocol : nullptr;
                 pr != nullptr; pr = pr->next) {
                if (pr->protocolType >= 2)
                    continue;
                for (int i = 0; i < g_FCPortList.count; ++i)
                    if (sameWWNs(g_FCPortList.entries[i].device, pr))
                        PARTNER(rq, slot(i));
            }
            break;
        }
    }
    return true;
}

// Source an FC port: the first slot of the end's list whose Tag is the one
// composed from the library records of the port; at most one partner.
template <class Side>
bool tagOfFcPort(AssocRequest& rq)
{
    READ_KEY(rq, kDeviceID, deviceId);
    auto& list = Side::list();
    // The FC port slots of that DeviceID, the same for every slot of the end.
    std::vector<int> ports;
    for (int i = 0; i < g_FCPortList.count; ++i)
        if (same(deviceId, g_FCPortList.entries[i].deviceId))
            ports.push_back(i);
    FcPortRecords records;
    int found = -1;
    for (int o = 0; o < list.count && found < 0; ++o) {
        for (int i : ports) {
            const FcPortRecords::Records& r = records.getZORAPStructs(i);
            if (!r.found)
                continue;
            if (same(Side::compose(o, r.adapter, r.port).c_str(), list.entries[o].tag)) {
                found = o;
                break;
            }
        }
    }
    if (found >= 0)
        PARTNER(rq, slot(found));
    return true;
}

template <class Side>
void tagFcPortPairs(const PairFn& pair)
{
    auto& list = Side::list();
    FcPortRecords records;
    for (int o = 0; o < list.count; ++o) {
        for (int i = 0; i < g_FCPortList.count; ++i) {
            const FcPortRecords::Records& r = records.getZORAPStructs(i);
            if (!r.found) {
                FC_ASSOC_DEBUG("Failed to find ZORAP structs");
                continue;
            }
            if (same(Side::compose(o, r.adapter, r.port).c_str(), list.entries[o].tag))
                pair(slot(o), slot(i));
        }
    }
}

// ---- profiles of the FC side -----------------------------------------------------------------
// A profile's InstanceID ends with the host it describes, "_" before it.

bool validProfile(const RegisteredProfileEntry& e, const char* registeredName)
{
    return e.valid && (registeredName == nullptr || same(e.registeredName, registeredName));
}

// Source a profile whose InstanceID ends with the host name: the computer
// system (every FC profile does).
bool systemOfProfile(AssocRequest& rq)
{
    READ_KEY(rq, kInstanceID, instanceId);
    if (same(suffixToken(instanceId), hostName_ComputerSystem))
        PARTNER(rq, kOne);
    return true;
}

// The profiles of a registered name, each one a partner.
template <const char* Name>
bool profilesNamed(AssocRequest& rq)
{
    for (int i = 0; i < g_RegisteredProfileList.count; ++i)
        if (validProfile(g_RegisteredProfileList.entries[i], Name))
            PARTNER(rq, slot(i));
    return true;
}

constexpr char kFcHbaProfileName[] = "FC HBA";
constexpr char kServerProfileName[] = "Server";

// The pairs both ways agree on: each profile of the name whose InstanceID
// ends with `host`, with the singleton.
template <const char* Name, const char* const* Host>
void namedProfilePairs(const PairFn& pair)
{
    for (int i = 0; i < g_RegisteredProfileList.count; ++i) {
        const RegisteredProfileEntry& e = g_RegisteredProfileList.entries[i];
        if (validProfile(e, Name) && same(suffixToken(e.instanceId), *Host))
            pair(slot(i), kOne);
    }
}

// Source the Server profile of the object manager's host: the object manager.
bool managerOfProfile(AssocRequest& rq)
{
    READ_KEY(rq, kInstanceID, instanceId);
    if (same(suffixToken(instanceId), hostName_ObjectManager) && holds(instanceId.c_str(), "ServerProfile"))
        PARTNER(rq, kOne);
    return true;
}

// Source an object manager: the Server profiles of its SystemName.
bool serverProfilesOfManager(AssocRequest& rq)
{
    READ_KEY(rq, "SystemName", systemName);
    for (int i = 0; i < g_RegisteredProfileList.count; ++i) {
        const RegisteredProfileEntry& e = g_RegisteredProfileList.entries[i];
        if (validProfile(e, kServerProfileName) && same(suffixToken(e.instanceId), systemName.c_str()))
            PARTNER(rq, slot(i));
    }
    return true;
}

const char* const kSystemHost = hostName_ComputerSystem;
const char* const kManagerHost = hostName_ObjectManager;

// Source the FC HBA profile: every sub-profile.
bool subProfilesOfProfile(AssocRequest& rq)
{
    READ_KEY(rq, kInstanceID, instanceId);
    if (!holds(instanceId.c_str(), "FCHBA"))
        return true;
    for (int i = 0; i < g_RegisteredSubProfileList.count; ++i)
        if (g_RegisteredSubProfileList.entries[i].valid)
            PARTNER(rq, slot(i));
    return true;
}

// Source one of the two sub-profiles: the FC HBA profile.
bool profileOfSubProfile(AssocRequest& rq)
{
    READ_KEY(rq, kInstanceID, instanceId);
    if (holds(instanceId.c_str(), "FCInitiator") || holds(instanceId.c_str(), "Indication"))
        return profilesNamed<kFcHbaProfileName>(rq);
    return true;
}

void subProfilePairs(const PairFn& pair)
{
    for (int i = 0; i < g_RegisteredProfileList.count; ++i) {
        const RegisteredProfileEntry& e = g_RegisteredProfileList.entries[i];
        if (!e.valid || !holds(e.instanceId, "FCHBA"))
            continue;
        for (int k = 0; k < g_RegisteredSubProfileList.count; ++k)
            if (g_RegisteredSubProfileList.entries[k].valid)
                pair(slot(i), slot(k));
    }
}

// Identities and the profiles of their host: the prefix of the identity's
// InstanceID is the suffix of the profile's.
template <auto& Profiles>
bool profilesOfIdentity(AssocRequest& rq)
{
    READ_KEY(rq, kInstanceID, instanceId);
    const std::string host = prefixToken(instanceId);
    TokenWalker walker;
    for (int i = 0; i < Profiles.count; ++i)
        if (Profiles.entries[i].valid && same(walker.suffix(Profiles.entries[i].instanceId), host.c_str()))
            PARTNER(rq, slot(i));
    return true;
}

template <auto& Profiles>
bool identitiesOfProfile(AssocRequest& rq)
{
    READ_KEY(rq, kInstanceID, instanceId);
    const std::string host = suffixToken(instanceId);
    TokenWalker walker;
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i) {
        const SoftwareIdentityEntry& e = g_SoftwareIdentityList.entries[i];
        if (e.valid && same(walker.prefix(e.instanceId), host.c_str()))
            PARTNER(rq, slot(i));
    }
    return true;
}

template <auto& Profiles>
void identityProfilePairs(const PairFn& pair)
{
    TokenWalker identities;
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i) {
        const SoftwareIdentityEntry& e = g_SoftwareIdentityList.entries[i];
        if (!e.valid)
            continue;
        const std::string host = identities.prefix(e.instanceId);
        TokenWalker profiles;
        for (int k = 0; k < Profiles.count; ++k)
            if (Profiles.entries[k].valid && same(profiles.suffix(Profiles.entries[k].instanceId), host.c_str()))
                pair(slot(i), slot(k));
    }
}

// ---- row helpers ---------------------------------------------------------------------------

constexpr ExtraProperty kNoExtra{};
constexpr ExtraProperty kAccessModeBoth{"AccessMode", 2, true, true};
constexpr ExtraProperty kAccessModeReferences{"AccessMode", 2, true, false};
constexpr ExtraProperty kUpgradeCondition{"UpgradeCondition", 3, true, true};

}  // namespace

// Plain row with both ends' build and remove.
#define PLAIN(X, cls, role1, end1, role2, end2, r2, r1, pairs, extra, flags)                                      \
    const AssocRow k##X = {cls,     #X,   "",      AssocForm::Plain, {role1, &end1}, {role2, &end2}, r2, r1, pairs, \
                           extra, nullptr, nullptr, nullptr,        flags}
#define FILTERING(X, cls, file, role1, end1, role2, end2, r2, r1, pairs)                                         \
    const AssocRow k##X = {cls,       #X,      file,    AssocForm::Filtering, {role1, &end1}, {role2, &end2}, r2, r1, \
                           pairs,     kNoExtra, nullptr, nullptr,            nullptr,        0}

PLAIN(AssocComputerSystemCommMech, "Vexlan_FCHBA_ComputerSystemCommMech", "Antecedent", kComputerSystemEnd,
      "Dependent", kCIMXMLCommMechEnd, theOne, backToSystem, onePair, kNoExtra,
      kAssocNamespaceLog | kAssocUnsupportedClassLog);
PLAIN(AssocComputerSystemFCPort, "Vexlan_FCHBA_ComputerSystemFCPort", "GroupComponent", kComputerSystemEnd,
      "PartComponent", kFCPortEnd, (allSlots<g_FCPortList, false>), backToSystem,
      (singletonPairs<g_FCPortList, false>), kNoExtra, 0);
PLAIN(AssocComputerSystemLogicalPortGroup, "Vexlan_FCHBA_ComputerSystemLogicalPortGroup", "Antecedent",
      kComputerSystemEnd, "Dependent", kLogicalPortGroupEnd, groupsOfHost, hostOfGroup,
      (singletonPairs<g_LogicalPortGroupList, false>), kNoExtra, 0);
PLAIN(AssocComputerSystemObjectManager, "Vexlan_FCHBA_ComputerSystemObjectManager", "Antecedent", kComputerSystemEnd,
      "Dependent", kObjectManagerEnd, theOne, hostOfObjectManager, onePair, kNoExtra, 0);
PLAIN(AssocComputerSystemPortController, "Vexlan_FCHBA_ComputerSystemPortController", "GroupComponent",
      kComputerSystemEnd, "PartComponent", kPortControllerEnd, (allSlots<g_PortControllerList, false>), backToSystem,
      (singletonPairs<g_PortControllerList, false>), kNoExtra, 0);
PLAIN(AssocComputerSystemSCSIProtocolController, "Vexlan_FCHBA_ComputerSystemSCSIProtocolController",
      "GroupComponent", kComputerSystemEnd, "PartComponent", kSCSIProtocolControllerEnd,
      (allSlots<g_SCSIProtocolControllerList, false>), backToSystem,
      (singletonPairs<g_SCSIProtocolControllerList, false>), kNoExtra, 0);
PLAIN(AssocComputerSystemSCSIProtocolEndpointHBA, "Vexlan_FCHBA_ComputerSystemSCSIProtocolEndpointHBA", "Antecedent",
      kComputerSystemEnd, "Dependent", kSCSIProtocolEndpointHBAEnd, (allSlots<g_SCSIProtocolEndpointHBAList, false>),
      backToSystem, (singletonPairs<g_SCSIProtocolEndpointHBAList, false>), kNoExtra, 0);
PLAIN(AssocComputerSystemSCSIProtocolEndpointTarget, "Vexlan_FCHBA_ComputerSystemSCSIProtocolEndpointTarget",
      "Antecedent", kComputerSystemEnd, "Dependent", kSCSIProtocolEndpointTargetEnd,
      (allSlots<g_SCSIProtocolEndpointTargetList, false>), backToSystem,
      (singletonPairs<g_SCSIProtocolEndpointTargetList, false>), kNoExtra, 0);
PLAIN(AssocComputerSystemSoftwareIdentity, "Vexlan_FCHBA_ComputerSystemSoftwareIdentity", "System",
      kComputerSystemEnd, "InstalledSoftware", kSoftwareIdentityEnd, driversOfHost, hostOfDriver, driverPairs,
      kNoExtra, 0);
PLAIN(AssocComputerSystemStorageExtent, "Vexlan_FCHBA_ComputerSystemStorageExtent", "GroupComponent",
      kComputerSystemEnd, "PartComponent", kStorageExtentEnd, (allSlots<g_StorageExtentList, true>), backToSystem,
      (singletonPairs<g_StorageExtentList, true>), kNoExtra, 0);
PLAIN(AssocFCPortFCPortStatistics, "Vexlan_FCHBA_FCPortFCPortStatistics", "ManagedElement", kFCPortEnd, "Stats",
      kFCPortStatisticsEnd, (listJoin<&kDeviceID, Cut::Suffix, StatsBySuffix>),
      (listJoin<&kInstanceID, Cut::Suffix, PortsBySuffix>), (listPairs<PortsBySuffix, StatsBySuffix, true>),
      kNoExtra, 0);
PLAIN(AssocFCPortSCSIProtocolEndpointHBA, "Vexlan_FCHBA_FCPortSCSIProtocolEndpointHBA", "Antecedent", kFCPortEnd,
      "Dependent", kSCSIProtocolEndpointHBAEnd, (listJoin<&kDeviceID, Cut::Suffix, EndpointsByName>),
      (listJoin<&kName, Cut::Whole, PortsBySuffix>), (listPairs<PortsBySuffix, EndpointsByName, true>), kNoExtra,
      0);
PLAIN(AssocLogicalPortGroupFCPort, "Vexlan_FCHBA_LogicalPortGroupFCPort", "Collection", kLogicalPortGroupEnd,
      "Member", kFCPortEnd, (listJoin<&kInstanceID, Cut::Suffix, PortsBySuffix>),
      (listJoin<&kDeviceID, Cut::Suffix, GroupsBySuffix>), (listPairs<GroupsBySuffix, PortsBySuffix, true>),
      kNoExtra, 0);
PLAIN(AssocObjectManagerCommMech, "Vexlan_FCHBA_ObjectManagerCommMech", "Antecedent", kObjectManagerEnd, "Dependent",
      kCIMXMLCommMechEnd, bySystemName, bySystemName, onePair, kNoExtra, kAssocNamespaceLog);
PLAIN(AssocObjectManagerNamespace, "Vexlan_FCHBA_ObjectManagerNamespace", "Antecedent", kObjectManagerEnd,
      "Dependent", kNamespaceEnd, namespacesOfManager, managerOfNamespace, namespacePairs, kNoExtra, 0);
PLAIN(AssocPhysicalPackagePortController, "Vexlan_FCHBA_PhysicalPackagePortController", "Antecedent",
      kPhysicalPackageEnd, "Dependent", kPortControllerEnd, controllersOfPackage, packagesOfController,
      packageControllerPairs, kNoExtra, 0);
PLAIN(AssocPhysicalConnectorFCPort, "Vexlan_FCHBA_PhysicalConnectorFCPort", "Antecedent", kPhysicalConnectorEnd,
      "Dependent", kFCPortEnd, fcPortsOfTag<ConnectorSide>, tagOfFcPort<ConnectorSide>, tagFcPortPairs<ConnectorSide>,
      kNoExtra, 0);
PLAIN(AssocPhysicalPortFCPort, "Vexlan_FCHBA_PhysicalPortFCPort", "Antecedent", kPhysicalPortEnd, "Dependent",
      kFCPortEnd, fcPortsOfTag<PhysicalPortSide>, tagOfFcPort<PhysicalPortSide>, tagFcPortPairs<PhysicalPortSide>,
      kNoExtra, 0);
PLAIN(AssocPortControllerFCPort, "Vexlan_FCHBA_PortControllerFCPort", "Antecedent", kPortControllerEnd, "Dependent",
      kFCPortEnd, (listJoin<&kDeviceID, Cut::Whole, PortsByPrefix>),
      (listJoin<&kDeviceID, Cut::Prefix, ControllersById>), (listPairs<ControllersById, PortsByPrefix, true>),
      kAccessModeBoth, 0);
PLAIN(AssocSCSIProtocolControllerFCPort, "Vexlan_FCHBA_SCSIProtocolControllerFCPort", "Antecedent",
      kSCSIProtocolControllerEnd, "Dependent", kFCPortEnd, (listJoin<&kDeviceID, Cut::Whole, PortsBySuffix>),
      (listJoin<&kDeviceID, Cut::Suffix, ScsiControllersByName>),
      (listPairs<ScsiControllersByName, PortsBySuffix, true>), kAccessModeReferences, 0);
PLAIN(AssocPhysicalPackagePhysicalConnector, "Vexlan_Adapter_PhysicalPackagePhysicalConnector", "GroupComponent",
      kPhysicalPackageEnd, "PartComponent", kPhysicalConnectorEnd,
      (partsOfPackage<g_PhysicalConnectorList, connectorSerial, kConnectorLabel>), packagesOfPart<connectorSerial>,
      (packagePartPairs<g_PhysicalConnectorList, connectorSerial, kConnectorLabel>), kNoExtra, 0);
PLAIN(AssocPhysicalPackagePhysicalPort, "Vexlan_Adapter_PhysicalPackagePhysicalPort", "GroupComponent",
      kPhysicalPackageEnd, "PartComponent", kPhysicalPortEnd,
      (partsOfPackage<g_PhysicalPortList, physicalPortSerial, kPhysicalPortLabel>),
      packagesOfPart<physicalPortSerial>,
      (packagePartPairs<g_PhysicalPortList, physicalPortSerial, kPhysicalPortLabel>), kNoExtra, 0);
PLAIN(AssocProductPhysicalPackage, "Vexlan_Adapter_ProductPhysicalPackage", "GroupComponent", kProductEnd,
      "PartComponent", kPhysicalPackageEnd, (listJoin<&kIdentifyingNumber, Cut::Whole, PackagesBySerial>),
      productsOfPackage, (listPairs<ProductsByNumber, PackagesBySerial, true>), kNoExtra, 0);
PLAIN(AssocSoftwareIdentityPortController, "Vexlan_FCHBA_SoftwareIdentityPortController", "Antecedent",
      kSoftwareIdentityEnd, "Dependent", kPortControllerEnd, (listJoin<&kInstanceID, Cut::Second, ControllersById>),
      (listJoin<&kDeviceID, Cut::Whole, IdentitiesBySecond>), (listPairs<IdentitiesBySecond, ControllersById, true>),
      kUpgradeCondition, 0);

// Plain in its style, without the build and remove pair, with its keys read
// and checked as the filtering rows do.
const AssocRow kAssocSoftwareIdentitySoftwareInstallationService = {
    "Vexlan_FCHBA_SoftwareIdentitySoftwareInstallationService",
    "AssocSoftwareIdentitySoftwareInstallationService",
    "Assoc_SoftwareIdentity_SoftwareInstallationService",
    AssocForm::PlainNoBuild,
    {"AffectedElement", &kSoftwareIdentityEnd},
    {"AffectingElement", &kSoftwareInstallationServiceEnd},
    installerOfIdentity,
    flashImagesOfInstaller,
    flashImagePairs,
    kNoExtra,
    nullptr,
    nullptr,
    nullptr,
    kAssocCheckedKeys};

FILTERING(AssocSoftwareInstallationServiceSoftwareInstallationServiceCapabilities,
          "Vexlan_FCHBA_SoftwareInstallationServiceSoftwareInstallationServiceCapabilities",
          "Assoc_SoftwareInstallationService_Capabilities", "ManagedElement", kSoftwareInstallationServiceEnd,
          "Capabilities", kSoftwareInstallationServiceCapabilitiesEnd, installerByName, installerByInstanceId,
          onePair);
FILTERING(AssocComputerSystemSoftwareInstallationService, "Vexlan_FCHBA_ComputerSystemSoftwareInstallationService",
          "Assoc_ComputerSystem_SoftwareInstallationService", "Antecedent", kComputerSystemEnd, "Dependent",
          kSoftwareInstallationServiceEnd, installerOfHost, hostOfInstaller, onePair);
FILTERING(AssocPortControllerSoftwareInstallationService, "Vexlan_FCHBA_PortControllerSoftwareInstallationService",
          "Assoc_PortController_SoftwareInstallationService", "AffectedElement", kPortControllerEnd,
          "AffectingElement", kSoftwareInstallationServiceEnd, installerOfController, controllersOfInstaller,
          controllerInstallerPairs);

// The profile associations of the FC side: plain in style, without the build
// and remove pair (their lists are constants of the build sequence).
#define PROFILE_ROW(X, cls, role1, end1, role2, end2, r2, r1, pairs)                                                \
    const AssocRow k##X = {cls,   #X,     "",      AssocForm::PlainNoBuild, {role1, &end1}, {role2, &end2}, r2, r1, \
                           pairs, kNoExtra, nullptr, nullptr,                nullptr,        0}

PROFILE_ROW(AssocRegisteredProfileComputerSystem, "Vexlan_FCHBA_RegisteredProfileComputerSystem", "ConformantStandard",
            kRegisteredProfileEnd, "ManagedElement", kComputerSystemEnd, systemOfProfile,
            profilesNamed<kFcHbaProfileName>, (namedProfilePairs<kFcHbaProfileName, &kSystemHost>));
PROFILE_ROW(AssocRegisteredProfileObjectManager, "Vexlan_FCHBA_RegisteredProfileObjectManager", "ConformantStandard",
            kRegisteredProfileEnd, "ManagedElement", kObjectManagerEnd, managerOfProfile, serverProfilesOfManager,
            (namedProfilePairs<kServerProfileName, &kManagerHost>));
PROFILE_ROW(AssocRegisteredProfileRegisteredSubProfile, "Vexlan_FCHBA_RegisteredProfileRegisteredSubProfile",
            "Antecedent", kRegisteredProfileEnd, "Dependent", kRegisteredSubProfileEnd, subProfilesOfProfile,
            profileOfSubProfile, subProfilePairs);
PROFILE_ROW(AssocSoftwareIdentityRegisteredProfile, "Vexlan_FCHBA_SoftwareIdentityRegisteredProfile", "Antecedent",
            kSoftwareIdentityEnd, "Dependent", kRegisteredProfileEnd, profilesOfIdentity<g_RegisteredProfileList>,
            identitiesOfProfile<g_RegisteredProfileList>, identityProfilePairs<g_RegisteredProfileList>);
PROFILE_ROW(AssocSoftwareIdentityRegisteredSubProfile, "Vexlan_FCHBA_SoftwareIdentityRegisteredSubProfile",
            "Antecedent", kSoftwareIdentityEnd, "Dependent", kRegisteredSubProfileEnd,
            profilesOfIdentity<g_RegisteredSubProfileList>, identitiesOfProfile<g_RegisteredSubProfileList>,
            identityProfilePairs<g_RegisteredSubProfileList>);
