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
    char* const texts[] = {adapterSerial};
    return SplitPhysicalTag(tag, texts, 1, portNumber);
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
    return calcNicTag(cna, port, out, [](char* tag, const _CNAPortStruc*, const _zorap_adapter_t* adapter,
                                         const _zorap_phy_port_t* phy) { portTag(tag, adapter, phy); });
}

void buildPhysicalPortList()
{
    ClassList<PhysicalPortEntry>& list = g_PhysicalPortList;
    int capacity = 0;
    _zorap_adapter_list_t* adapters = classmodule::startBuild(list, classmodule::SlotPer::PhyPort, capacity);
    if (adapters == nullptr)
        return;
    forEachPhyPortIn(adapters, [&](_zorap_adapter_t* a, _zorap_phy_port_t* p) {
        if (list.count >= capacity)
            return;
        PHYSICAL_DEBUG("Entering createPhysicalPort, index = %d", list.count);
        char tag[kPhysicalTagSize];
        portTag(tag, a, p);
        const int same = classmodule::slotWithTag(list, tag);
        if (same >= 0) {
            PHYSICAL_DEBUG("Exiting  createPhysicalPort: Current device has the same the serial number as a device "
                           "in the list at index=%d. Skip!\n",
                           same);
            return;
        }
        PhysicalPortEntry& entry = list.entries[list.count++];
        std::snprintf(entry.tag, sizeof(entry.tag), "%s", tag);
        copyFieldText(entry.serialNumber, a->serialNumber);
        entry.portNumber = p->portNumber;
        entry.valid = 1;
        PHYSICAL_DEBUG("Exiting  createPhysicalPort\n");
    });
    classmodule::countValid(list);
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
    {"CreationClassName", CMPI_string, CLASS_VALUE(PhysicalPortEntry, entryText(kClassName))},
    {"Tag", CMPI_string, CLASS_VALUE(PhysicalPortEntry, entryText(e.tag))},
    {"Name", CMPI_string, CLASS_VALUE(PhysicalPortEntry, entryText(kClassName))},
    {"ElementName", CMPI_string, CLASS_VALUE(PhysicalPortEntry, entryText("Physical Port"))},
    {"ConnectorLayout", CMPI_uint16, CLASS_VALUE(PhysicalPortEntry, CmpiData(static_cast<CMPIUint16>(1)))},
    {"ConnectorDescription", CMPI_string, CLASS_VALUE(PhysicalPortEntry, entryText("Physical Port"))},
    {"Manufacturer", CMPI_string, manufacturer},
    {"SerialNumber", CMPI_string, CLASS_VALUE(PhysicalPortEntry, entryText(e.serialNumber))},
    {"PortNumber", CMPI_uint16, CLASS_VALUE(PhysicalPortEntry, CmpiData(static_cast<CMPIUint16>(e.portNumber)))},
};

const ClassModule<PhysicalPortEntry> kPhysicalPort =
    ClassModule<PhysicalPortEntry>("PhysicalPort")
        .list(g_PhysicalPortList, ListKind::Dense)
        .key("Tag", [](const PhysicalPortEntry& e) -> const char* { return e.tag; })
        .filterKeys(kPhysicalTagFilterKeys)
        .pathKeys(kPhysicalTagPathKeys)
        .properties(kProperties)
        .enumerationsTestValid();

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(PhysicalPort, kPhysicalPort)

VEXLAN_PHYSICAL_NIC_OPERATIONS(PhysicalPort)
