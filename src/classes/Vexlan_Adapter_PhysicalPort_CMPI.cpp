// Vexlan_Adapter_PhysicalPort as a class module: a dense list of one slot per
// physical port of every adapter, a repeated tag dropped; the enumerations
// skip invalid slots.
#include "classes/Vexlan_Adapter_PhysicalPort_CMPI.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "inventory/AdapterFunc_Identity.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

ClassList<PhysicalPortEntry> g_PhysicalPortList = {0, nullptr};

void CreatePhysicalPortTag(char* out, char* adapterSerial, int portNumber)
{
    if (out == nullptr)
        return;
    std::snprintf(out, kPhysicalTagSize, "%s_%d", adapterSerial != nullptr ? adapterSerial : "", portNumber);
}

int ParsePhysicalPortTag(char* tag, char* adapterSerial, int* portNumber)
{
    if (tag == nullptr || adapterSerial == nullptr || portNumber == nullptr)
        return 0;
    char work[256] = {};
    std::snprintf(work, sizeof(work), "%s", tag);
    char* rest = nullptr;
    char* part = strtok_r(work, "_", &rest);
    if (part == nullptr)
        return 0;
    std::snprintf(adapterSerial, kPhysicalTagPartSize, "%s", part);
    part = strtok_r(nullptr, "_", &rest);
    if (part == nullptr)
        return 0;
    *portNumber = static_cast<int>(std::strtol(part, nullptr, 10));
    return 1;
}

namespace {

void portTag(char* out, const _zorap_adapter_t* adapter, const _zorap_phy_port_t* phy)
{
    char adapterSerial[sizeof(adapter->serialNumber) + 1];
    copyFieldText(adapterSerial, adapter->serialNumber);
    CreatePhysicalPortTag(out, adapterSerial, phy->portNumber);
}

}  // namespace

int calcTag_PhysicalPort(_CNAStruc* cna, _CNAPortStruc* port, char* out)
{
    PHYSICAL_DEBUG("Vexlan_NIC_PhysicalPort makeInstance_PhysicalPort was called\n");
    if (out == nullptr)
        return 0;
    out[0] = '\0';
    _zorap_adapter_t* adapter = nullptr;
    _zorap_phy_port_t* phy = nullptr;
    _zorap_protocol_t* protocol = nullptr;
    if (!getZORAPStructs(cna, port, &adapter, &phy, &protocol))
        return 0;
    portTag(out, adapter, phy);
    return 1;
}

void buildPhysicalPortList()
{
    _zorap_adapter_list_t* adapters = ZORAP_GetAdapterList();
    if (adapters == nullptr)
        return;
    int capacity = 0;
    for (_zorap_adapter_t* a = adapters->firstAdapter; a != nullptr; a = a->next)
        if (a->phyPortList != nullptr)
            for (_zorap_phy_port_t* p = a->phyPortList->firstPhyPort; p != nullptr; p = p->next)
                ++capacity;
    ClassList<PhysicalPortEntry>& list = g_PhysicalPortList;
    if (!list.allocate(capacity))
        return;
    list.count = 0;
    for (_zorap_adapter_t* a = adapters->firstAdapter; a != nullptr; a = a->next) {
        if (a->phyPortList == nullptr)
            continue;
        for (_zorap_phy_port_t* p = a->phyPortList->firstPhyPort; p != nullptr && list.count < capacity;
             p = p->next) {
            PHYSICAL_DEBUG("Entering createPhysicalPort, index = %d", list.count);
            char tag[kPhysicalTagSize];
            portTag(tag, a, p);
            int same = -1;
            for (int i = 0; i < list.count && same < 0; ++i)
                if (std::strcmp(list.entries[i].tag, tag) == 0)
                    same = i;
            if (same >= 0) {
                PHYSICAL_DEBUG("Exiting  createPhysicalPort: Current device has the same the serial number as a device "
                               "in the list at index=%d. Skip!\n",
                               same);
                continue;
            }
            PhysicalPortEntry& entry = list.entries[list.count++];
            std::snprintf(entry.tag, sizeof(entry.tag), "%s", tag);
            copyFieldText(entry.serialNumber, a->serialNumber);
            entry.portNumber = p->portNumber;
            entry.valid = 1;
            PHYSICAL_DEBUG("Exiting  createPhysicalPort\n");
        }
    }
    int valid = 0;
    for (int i = 0; i < list.count; ++i)
        if (list.entries[i].valid)
            ++valid;
    list.count = valid;
}

void removePhysicalPortList()
{
    g_PhysicalPortList.remove();
}

namespace {

const char kClassName[] = "Vexlan_Adapter_PhysicalPort";

// The 11S test trims the stored serial in place, as it always has; the slots
// live in the list's own writable block.
PropertyValue manufacturer(const PhysicalPortEntry& e)
{
    const bool is11S = IsIBM11SProductId(const_cast<char*>(e.serialNumber)) != 0;
    return CmpiData(is11S ? "IBM" : "Vexlan Corporation");
}

const PropertyRow<PhysicalPortEntry> kProperties[] = {
    {"CreationClassName", CMPI_string, CLASS_VALUE(PhysicalPortEntry, CmpiData(kClassName))},
    {"Tag", CMPI_string, CLASS_VALUE(PhysicalPortEntry, CmpiData(e.tag))},
    {"Name", CMPI_string, CLASS_VALUE(PhysicalPortEntry, CmpiData(kClassName))},
    {"ElementName", CMPI_string, CLASS_VALUE(PhysicalPortEntry, CmpiData("Physical Port"))},
    {"ConnectorLayout", CMPI_uint16, CLASS_VALUE(PhysicalPortEntry, CmpiData(static_cast<CMPIUint16>(1)))},
    {"ConnectorDescription", CMPI_string, CLASS_VALUE(PhysicalPortEntry, CmpiData("Physical Port"))},
    {"Manufacturer", CMPI_string, manufacturer},
    {"SerialNumber", CMPI_string, CLASS_VALUE(PhysicalPortEntry, CmpiData(e.serialNumber))},
    {"PortNumber", CMPI_uint16, CLASS_VALUE(PhysicalPortEntry, CmpiData(static_cast<CMPIUint16>(e.portNumber)))},
};

// The property filter keeps Tag alone, while the path also carries
// CreationClassName.
const char* const kFilterKeys[] = {"Tag", nullptr};
const char* const kPathKeys[] = {"CreationClassName", "Tag", nullptr};

const ClassModule<PhysicalPortEntry> kPhysicalPort =
    ClassModule<PhysicalPortEntry>("PhysicalPort")
        .list(g_PhysicalPortList, ListKind::Dense)
        .key("Tag", [](const PhysicalPortEntry& e) -> const char* { return e.tag; })
        .filterKeys(kFilterKeys)
        .pathKeys(kPathKeys)
        .properties(kProperties)
        .enumerationsTestValid();

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(PhysicalPort, kPhysicalPort)

int findSlot_Nic_PhysicalPort(_CNAStruc* cna, _CNAPortStruc* port)
{
    for (int i = 0; i < g_PhysicalPortList.count; ++i) {
        char tag[kPhysicalTagSize];
        calcTag_PhysicalPort(cna, port, tag);
        if (std::strcmp(tag, g_PhysicalPortList.entries[i].tag) == 0)
            return i;
    }
    return -1;
}

CmpiObjectPath makePath_Nic_PhysicalPort(const char* className, const char* nameSpace, _CNAStruc* cna,
                                         _CNAPortStruc* port)
{
    PHYSICAL_DEBUG("Vexlan_NIC_PhysicalPort makePath_PhysicalPort was called\n");
    const int slot = findSlot_Nic_PhysicalPort(cna, port);
    if (slot < 0)
        return CmpiObjectPath(static_cast<CMPIObjectPath*>(nullptr));
    return makePath_PhysicalPort(className, nameSpace, slot);
}

CmpiInstance makeInstance_Nic_PhysicalPort(const char* className, const char* nameSpace, const char** properties,
                                           _CNAStruc* cna, _CNAPortStruc* port)
{
    const int slot = findSlot_Nic_PhysicalPort(cna, port);
    if (slot < 0)
        return CmpiInstance(static_cast<CMPIInstance*>(nullptr));
    return makeInstance_PhysicalPort(className, nameSpace, properties, slot);
}
