// Vexlan_Adapter_PhysicalPackage as a class module: a dense list of one slot
// per adapter serial, built from the FC devices' VPD or from the NIC adapter
// list, whichever protocol of the board the walk meets first.
#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"

#include <cstdio>
#include <cstring>
#include <string>

#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "inventory/AdapterFunc_Identity.h"
#include "inventory/AdapterFunc_VPD.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

ClassList<PhysicalPackageEntry> g_PhysicalPackageList = {0, nullptr};

std::uint32_t AdapterTypeOfKind(std::uint32_t adapterKind)
{
    switch (adapterKind) {
    case 1:
        return 0;
    case 2:
        return 1;
    case 3:
        return 2;
    default:
        return 3;
    }
}

namespace {

// Default text, then the value of every VPD entry of the adapter's first
// port whose keyword is exactly `keyword`; the last one wins.
template <std::size_t M>
char* calcFromVpd(_CNAStruc* cna, char* out, const char (&fallback)[M], const char* keyword)
{
    if (out == nullptr)
        return nullptr;
    out[0] = '\0';
    if (cna == nullptr)
        return out;
    copyBoundedText(out, kPhysicalPackageTextSize, fallback, M);
    const _CNAPortStruc* port = cna->portList;
    if (port == nullptr)
        return out;
    std::uint32_t n = port->portExtra.vpdCount;
    if (n > ZORAP_NIC_VPD_ENTRIES)
        n = ZORAP_NIC_VPD_ENTRIES;
    for (std::uint32_t i = 0; i < n; ++i) {
        const _zorap_vpd_entry_t& vpd = port->portExtra.vpd[i];
        if (strnlen(vpd.keyword, sizeof(vpd.keyword)) == sizeof(vpd.keyword) || std::strcmp(vpd.keyword, keyword) != 0)
            continue;
        copyBoundedText(out, kPhysicalPackageTextSize, vpd.value, sizeof(vpd.value));
    }
    return out;
}

}  // namespace

char* calcTag_PhysicalPackage(_CNAStruc* cna, char* out)
{
    return cna != nullptr ? calcFromVpd(cna, out, cna->serialNumber, "YU") : calcFromVpd(cna, out, "", "YU");
}

char* calcSKU_PhysicalPackage(_CNAStruc* cna, char* out)
{
    return cna != nullptr ? calcFromVpd(cna, out, cna->partNumber, "FN") : calcFromVpd(cna, out, "", "FN");
}

char* calcPartNumber_PhysicalPackage(_CNAStruc* cna, char* out)
{
    return cna != nullptr ? calcFromVpd(cna, out, cna->partNumber, "PN") : calcFromVpd(cna, out, "", "PN");
}

// ---------------------------------------------------------------------------
// The build.
// ---------------------------------------------------------------------------
namespace {

using Serial = char[128];

// The slot below `count` whose serial equals `serial` exactly, or -1.
int slotWithSerial(const ClassList<PhysicalPackageEntry>& list, const char* serial)
{
    for (int i = 0; i < list.count; ++i)
        if (std::strcmp(list.entries[i].serialNumber, serial) == 0)
            return i;
    return -1;
}

// The debug texts of one VPD-derived field: "<line label><line>",
// "<value label><value>", and the line for a missing value.
struct VpdFieldTexts {
    const char* lineLabel;
    const char* valueLabel;
    const char* missing;
};
constexpr VpdFieldTexts kFruTexts = {"createPhysicalPackage: g_fruNumberVersion=", "createPhysicalPackage: fruVersion=",
                                     "createPhysicalPackage: fruVersion is NULL"};
constexpr VpdFieldTexts kPartNumberTexts = {"createPhysicalPackage: g_partNumber=",
                                            "createPhysicalPackage: partNumber=",
                                            "createPhysicalPackage: PartNumber is NULL"};

// The value of a labelled VPD line ("Label:value") into `target`, with the
// debug lines of the field; without a value `target` stays empty.
void vpdValueInto(const char* line, char (&target)[128], const VpdFieldTexts& texts)
{
    const char* colon = nullptr;
    if (line[0] != '\0') {
        PHYSICAL_DEBUG("%s%s", texts.lineLabel, line);
        colon = std::strchr(line, ':');
    }
    if (colon == nullptr) {
        PHYSICAL_DEBUG("%s", texts.missing);
        return;
    }
    PHYSICAL_DEBUG("%s%s", texts.valueLabel, colon + 1);
    safeStrCpy(target, colon + 1, sizeof(target));
}

// The brand, the 11S form of the serial and the name depend on the entry's
// own fields only, so the build settles them once per entry. The 11S test
// trims the text it is given: it reads a copy here, and the instance trims
// the stored serial as it always has.
void settleNameAndBrand(PhysicalPackageEntry& e)
{
    char serial[sizeof(e.serialNumber)];
    std::memcpy(serial, e.serialNumber, sizeof(serial));
    serial[sizeof(serial) - 1] = '\0';
    e.productId11S = IsIBM11SProductId(serial) != 0 ? 1 : 0;
    e.partnerBrand = IsIBMBrandedAdapter(e.model) != 0 || e.productId11S ? 1 : 0;
    // "IBM CNA Adapter <serial>", "Vexlan Fibre Channel Adapter <serial>", ...
    const char* shown = GetSerialNumberFromIBM11SProductId(e.serialNumber);
    JoinFCText(e.name, sizeof(e.name),
               {e.partnerBrand ? "IBM" : "Vexlan", e.isCNA ? " CNA Adapter " : " Fibre Channel Adapter ",
                shown != nullptr ? shown : ""});
}

// One FC protocol. Returns with `index` moved on.
void createFCPackage(ClassList<PhysicalPackageEntry>& list, int capacity, _zorap_adapter_t* adapter,
                     _tagZORAPSDMDevice* device, Serial& serial, int& index)
{
    PHYSICAL_DEBUG("Calling createPhysicalPackage() for FC/FCoE device.");
    PHYSICAL_DEBUG("Entering createPhysicalPackage, index = %d", index);
    std::memset(g_serialNumber, 0, sizeof(g_serialNumber));
    std::memset(g_fruNumberVersion, 0, sizeof(g_fruNumberVersion));
    const int r = GetHBAVPDData(device);
    if (r == 0)
        PHYSICAL_DEBUG("Vexlan_FC_PhysicalPackage: createPhysicalPackage: VPD data retrieved successfully.");
    else
        PHYSICAL_DEBUG("Vexlan_FC_PhysicalPackage: createPhysicalPackage: Unable to retrieve VPD data!");
    TakeFCSerial(device, r, serial, sizeof(Serial));

    const int same = slotWithSerial(list, serial);
    if (same >= 0) {
        PHYSICAL_DEBUG("Exiting  createPhysicalPackage: Current device has the same the serial number as a device in the "
                       "list at index=%d. Skip!\n",
                       same);
        PHYSICAL_DEBUG("Done calling createPhysicalPackage() for FC/FCoE device.");
        ++index;
        return;
    }
    // Devices of one board that name more serials than the tree has adapters
    // find no slot for the extra ones.
    if (list.count >= capacity) {
        PHYSICAL_DEBUG("Done calling createPhysicalPackage() for FC/FCoE device.");
        ++index;
        return;
    }

    PhysicalPackageEntry& entry = list.entries[list.count++];
    if (g_I2CUUID[0] != '\0') {
        PHYSICAL_DEBUG("createPhysicalPackage: I2C uuid=%s", g_I2CUUID);
        safeStrCpy(entry.tag, g_I2CUUID, sizeof(entry.tag));
    } else if (g_UUID[0] != '\0') {
        PHYSICAL_DEBUG("createPhysicalPackage: g_UUID=%s", g_UUID);
        const char* colon = std::strchr(g_UUID, ':');
        if (colon != nullptr)
            PHYSICAL_DEBUG("createPhysicalPackage: uuid=%s", colon + 1);
        if (colon != nullptr && colon[1] != '\0') {
            safeStrCpy(entry.tag, colon + 1, sizeof(entry.tag));
        } else {
            PHYSICAL_DEBUG("createPhysicalPackage: uuid is NULL");
            safeStrCpy(entry.tag, serial, sizeof(entry.tag));
        }
    } else {
        safeStrCpy(entry.tag, serial, sizeof(entry.tag));
    }
    safeStrCpy(entry.serialNumber, serial, sizeof(entry.serialNumber));
    copyFieldText(entry.model, device->modelName);
    entry.adapterType = AdapterTypeOfKind(adapter->adapterKind);
    entry.isCNA = entry.adapterType == 3 ? 1 : 0;
    vpdValueInto(g_fruNumberVersion, entry.sku, kFruTexts);
    vpdValueInto(g_partNumber, entry.partNumber, kPartNumberTexts);
    settleNameAndBrand(entry);
    entry.valid = 1;
    PHYSICAL_DEBUG("Exiting  createPhysicalPackage\n");
    PHYSICAL_DEBUG("Done calling createPhysicalPackage() for FC/FCoE device.");
    ++index;
}

// One NIC protocol: the board as the NIC adapter list knows it, if it does.
void createNicPackage(ClassList<PhysicalPackageEntry>& list, int capacity, _zorap_adapter_t* adapter,
                      const char* adapterSerial, int& index)
{
    _CNAStruc* cna = nullptr;
    for (_CNAStruc* c = m_CNAList; c != nullptr; c = c->next) {
        char cnaSerial[sizeof(c->serialNumber) + 1];
        copyFieldText(cnaSerial, c->serialNumber);
        PHYSICAL_DEBUG("Comparing %s to %s.", cnaSerial, adapterSerial);
        if (std::strcmp(cnaSerial, adapterSerial) == 0) {
            cna = c;
            break;
        }
    }
    if (cna == nullptr || list.count >= capacity)
        return;
    PHYSICAL_DEBUG("Calling createPhysicalPackage() for NIC device.");
    PhysicalPackageEntry& entry = list.entries[list.count++];
    calcTag_PhysicalPackage(cna, entry.tag);
    copyFieldText(entry.serialNumber, cna->serialNumber);
    copyFieldText(entry.model, cna->modelName);
    calcSKU_PhysicalPackage(cna, entry.sku);
    calcPartNumber_PhysicalPackage(cna, entry.partNumber);
    entry.adapterType = AdapterTypeOfKind(adapter->adapterKind);
    entry.isCNA = entry.adapterType == 3 ? 1 : 0;
    settleNameAndBrand(entry);
    entry.valid = 1;
    PHYSICAL_DEBUG("Done calling createPhysicalPackage() for NIC device.");
    ++index;
}

}  // namespace

void buildPhysicalPackageList()
{
    ClassList<PhysicalPackageEntry>& list = g_PhysicalPackageList;
    int capacity = 0;
    _zorap_adapter_list_t* adapters = classmodule::startBuild(list, classmodule::SlotPer::Adapter, capacity);
    if (adapters == nullptr)
        return;

    int index = 0;
    Serial serial = {};   // kept from device to device, as the FC serial rule needs
    for (_zorap_adapter_t* adapter = adapters->firstAdapter; adapter != nullptr; adapter = adapter->next) {
        PHYSICAL_DEBUG("buildPhysicalPackageList(): Processing an adapter entry.");
        if (adapter->phyPortList == nullptr)
            continue;
        char adapterSerial[sizeof(adapter->serialNumber) + 1];
        copyFieldText(adapterSerial, adapter->serialNumber);
        for (_zorap_phy_port_t* phy = adapter->phyPortList->firstPhyPort; phy != nullptr; phy = phy->next) {
            PHYSICAL_DEBUG("buildPhysicalPackageList(): Processing an phyport entry.");
            if (phy->protocolList == nullptr)
                continue;
            for (_zorap_protocol_t* protocol = phy->protocolList->firstProtocol; protocol != nullptr;
                 protocol = protocol->next) {
                PHYSICAL_DEBUG("buildPhysicalPackageList(): Processing an protocol entry.");
                if (protocol->protocolType > 2)
                    continue;
                const int same = slotWithSerial(list, adapterSerial);
                if (same >= 0) {
                    PHYSICAL_DEBUG("Exiting  createPhysicalPackage: Current device has the same the serial number as a "
                                   "device in the list at index=%d. Skip %s!\n",
                                   same, adapterSerial);
                    continue;
                }
                if (protocol->protocolType < 2)
                    createFCPackage(list, capacity, adapter, &protocol->fcDevice, serial, index);
                else
                    createNicPackage(list, capacity, adapter, adapterSerial, index);
            }
        }
    }
}

void removePhysicalPackageList()
{
    g_PhysicalPackageList.remove();
}

// ---------------------------------------------------------------------------
// The instance.
// ---------------------------------------------------------------------------
namespace {

const char kClassName[] = "Vexlan_Adapter_PhysicalPackage";

// The stored texts are handed to the identity tests, which take writable
// text: the 11S test trims the stored serial in place, as it always has. The
// slots live in the list's own block, so they are writable.
char* writable(const char* text)
{
    return const_cast<char*>(text);
}

// The stored serial trimmed in place, as the 11S test has always left it.
bool is11S(const PhysicalPackageEntry& e)
{
    Trim(writable(e.serialNumber));
    return e.productId11S != 0;
}

PropertyValue serialNumber(const PhysicalPackageEntry& e)
{
    if (is11S(e))
        return CmpiData(GetSerialNumberFromIBM11SProductId(e.serialNumber));
    return entryText(e.serialNumber);
}

PropertyValue partNumber(const PhysicalPackageEntry& e)
{
    if (e.productId11S) {
        const char* part = GetPartNumberFromIBM11SProductId(writable(e.serialNumber));
        return part != nullptr ? PropertyValue(CmpiData(part)) : std::nullopt;
    }
    if (e.partNumber[0] == '\0')
        return std::nullopt;
    return entryText(e.partNumber);
}

const PropertyRow<PhysicalPackageEntry> kProperties[] = {
    {"Tag", CMPI_string, CLASS_VALUE(PhysicalPackageEntry, entryText(e.tag))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(PhysicalPackageEntry, entryText(kClassName))},
    {"Model", CMPI_string, CLASS_VALUE(PhysicalPackageEntry, entryText(e.model))},
    {"Manufacturer", CMPI_string, CLASS_VALUE(PhysicalPackageEntry, entryText(e.partnerBrand ? "IBM" : "Vexlan Corporation"))},
    {"SerialNumber", CMPI_string, serialNumber},
    {"PartNumber", CMPI_string, partNumber},
    {"SKU", CMPI_string,
     [](const PhysicalPackageEntry& e) -> PropertyValue {
         return e.sku[0] != '\0' ? PropertyValue(entryText(e.sku)) : std::nullopt;
     }},
    {"PackageType", CMPI_uint16, CLASS_VALUE(PhysicalPackageEntry, CmpiData(static_cast<CMPIUint16>(9)))},
    {"Name", CMPI_string, CLASS_VALUE(PhysicalPackageEntry, entryText(e.name))},
    {"Description", CMPI_string, CLASS_VALUE(PhysicalPackageEntry, entryText(e.name))},
    {"AdapterType", CMPI_uint32, CLASS_VALUE(PhysicalPackageEntry, CmpiData(static_cast<CMPIUint32>(e.adapterType)))},
};

const char* const kKeys[] = {"Tag", "CreationClassName", nullptr};

const ClassModule<PhysicalPackageEntry> kPhysicalPackage =
    ClassModule<PhysicalPackageEntry>("PhysicalPackage")
        .list(g_PhysicalPackageList, ListKind::Dense)
        .key("Tag", [](const PhysicalPackageEntry& e) -> const char* { return e.tag; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties);

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(PhysicalPackage, kPhysicalPackage)

// ---------------------------------------------------------------------------
// The NIC side's way in.
// ---------------------------------------------------------------------------
int findSlot_Nic_PhysicalPackage(_CNAStruc* cna)
{
    if (cna == nullptr)
        return -1;
    char serial[sizeof(cna->serialNumber) + 1];
    copyFieldText(serial, cna->serialNumber);
    for (int i = 0; i < g_PhysicalPackageList.count; ++i)
        if (strcasecmp(g_PhysicalPackageList.entries[i].serialNumber, serial) == 0)
            return i;
    return -1;
}

CmpiObjectPath makePath_Nic_PhysicalPackage(const char* className, const char* nameSpace, _CNAStruc* cna)
{
    PHYSICAL_DEBUG("Vexlan_NIC_PhysicalPackage makePath_PhysicalPackage was called");
    return classmodule::pathOfSlot(makePath_PhysicalPackage, findSlot_Nic_PhysicalPackage(cna), className, nameSpace);
}

CmpiInstance makeInstance_Nic_PhysicalPackage(const char* className, const char* nameSpace, const char** properties,
                                              _CNAStruc* cna)
{
    PHYSICAL_DEBUG("Vexlan_NIC_PhysicalPackage makeInstance_PhysicalPackage was called");
    return classmodule::instanceOfSlot(makeInstance_PhysicalPackage, findSlot_Nic_PhysicalPackage(cna), className, nameSpace,
                                       properties);
}
