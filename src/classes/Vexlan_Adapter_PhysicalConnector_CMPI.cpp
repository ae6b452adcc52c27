// Vexlan_Adapter_PhysicalConnector as a class module: a dense list in which a
// repeated tag is dropped; the enumerations skip invalid slots.
#include "classes/Vexlan_Adapter_PhysicalConnector_CMPI.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/ossimpl.h"

ClassList<PhysicalConnectorEntry> g_PhysicalConnectorList = {0, nullptr};

void CreatePhysicalConnectorTag(char* out, char* transceiverSerial, char* adapterSerial, int portNumber)
{
    if (out == nullptr)
        return;
    std::snprintf(out, kPhysicalTagSize, "%s_%s_%d", transceiverSerial != nullptr ? transceiverSerial : "",
                  adapterSerial != nullptr ? adapterSerial : "", portNumber);
}

int SplitPhysicalTag(const char* tag, char* const* texts, int textCount, int* portNumber)
{
    char work[256] = {};
    std::snprintf(work, sizeof(work), "%s", tag);
    char* rest = nullptr;
    char* part = strtok_r(work, "_", &rest);
    for (int i = 0; i < textCount; ++i) {
        if (part == nullptr)
            return 0;
        std::snprintf(texts[i], kPhysicalTagPartSize, "%s", part);
        part = strtok_r(nullptr, "_", &rest);
    }
    if (part == nullptr)
        return 0;
    *portNumber = static_cast<int>(std::strtol(part, nullptr, 10));
    return 1;
}

int ParsePhysicalConnectorTag(char* tag, char* transceiverSerial, char* adapterSerial, int* portNumber)
{
    if (tag == nullptr || transceiverSerial == nullptr || adapterSerial == nullptr || portNumber == nullptr)
        return 0;
    char* const texts[] = {transceiverSerial, adapterSerial};
    return SplitPhysicalTag(tag, texts, 2, portNumber);
}

int getZORAPStructs(_CNAStruc*, _CNAPortStruc* port, _zorap_adapter_t** adapter, _zorap_phy_port_t** phyPort,
                    _zorap_protocol_t** protocol)
{
    if (port == nullptr)
        return 0;
    int found = 0;
    classmodule::walkProtocols([&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
        if (found || pr->protocolType != 2)
            return;
        // The MAC sits in an 8-byte field; all eight bytes are compared.
        if (std::memcmp(&pr->nicPortInfo.macAddress, &port->macAddress, 8) != 0)
            return;
        found = 1;
        if (adapter != nullptr)
            *adapter = a;
        if (phyPort != nullptr)
            *phyPort = p;
        if (protocol != nullptr)
            *protocol = pr;
    });
    return found;
}

namespace {

// The tag of a NIC port's transceiver on a library adapter and port.
void nicConnectorTag(char* out, const _CNAPortStruc* port, const _zorap_adapter_t* adapter,
                     const _zorap_phy_port_t* phy)
{
    char transceiverSerial[sizeof(port->sfpFields.SerialNumber) + 1];
    char adapterSerial[sizeof(adapter->serialNumber) + 1];
    copyFieldText(transceiverSerial, port->sfpFields.SerialNumber);
    copyFieldText(adapterSerial, adapter->serialNumber);
    CreatePhysicalConnectorTag(out, transceiverSerial, adapterSerial, phy->portNumber);
}

}  // namespace

int calcNicTag(_CNAStruc* cna, _CNAPortStruc* port, char* out, NicTagFunction tagOf)
{
    if (out == nullptr)
        return 0;
    out[0] = '\0';
    _zorap_adapter_t* adapter = nullptr;
    _zorap_phy_port_t* phy = nullptr;
    _zorap_protocol_t* protocol = nullptr;
    if (!getZORAPStructs(cna, port, &adapter, &phy, &protocol))
        return 0;
    tagOf(out, port, adapter, phy);
    return 1;
}

int calcTag_PhysicalConnector(_CNAStruc* cna, _CNAPortStruc* port, char* out)
{
    PHYSICAL_DEBUG("Vexlan_NIC_PhysicalConnector makeInstance_PhysicalConnector was called\n");
    return calcNicTag(cna, port, out, nicConnectorTag);
}

// ---------------------------------------------------------------------------
// The build.
// ---------------------------------------------------------------------------
namespace {

void logSameTag(int slot)
{
    PHYSICAL_DEBUG("Exiting  createPhysicalConnector: Current device has the same the serial number as a device in the "
                   "list at index=%d. Skip!\n",
                   slot);
}

// A NIC function: the transceiver that the NIC adapter list read for the
// port with this MAC address on an adapter of this serial.
void createNicConnector(_zorap_adapter_t* adapter, _zorap_phy_port_t* phy, _zorap_protocol_t* protocol, int& n)
{
    char adapterSerial[sizeof(adapter->serialNumber) + 1];
    copyFieldText(adapterSerial, adapter->serialNumber);
    const _CNAPortStruc* found = nullptr;
    for (_CNAStruc* cna = m_CNAList; cna != nullptr && found == nullptr; cna = cna->next) {
        char cnaSerial[sizeof(cna->serialNumber) + 1];
        copyFieldText(cnaSerial, cna->serialNumber);
        if (std::strcmp(cnaSerial, adapterSerial) != 0)
            continue;
        for (const _CNAPortStruc* port = cna->portList; port != nullptr; port = port->next)
            if (port->hasTransceiver &&
                std::memcmp(&port->macAddress, &protocol->nicPortInfo.macAddress, 8) == 0) {
                found = port;
                break;
            }
    }
    if (found == nullptr)
        return;
    char tag[kPhysicalTagSize];
    nicConnectorTag(tag, found, adapter, phy);
    const int same = classmodule::slotWithTag(g_PhysicalConnectorList, tag);
    if (same >= 0) {
        logSameTag(same);
        return;
    }
    PhysicalConnectorEntry& entry = g_PhysicalConnectorList.entries[g_PhysicalConnectorList.count++];
    copyFieldText(entry.sfp.Name, found->sfpFields.Name);
    copyFieldText(entry.sfp.Manufacturer, found->sfpFields.Manufacturer);
    copyFieldText(entry.sfp.SerialNumber, found->sfpFields.SerialNumber);
    copyFieldText(entry.sfp.PartNumber, found->sfpFields.PartNumber);
    std::memset(entry.sfp.RawData, 0, sizeof(entry.sfp.RawData));
    std::snprintf(entry.tag, sizeof(entry.tag), "%s", tag);
    entry.sfp.SFPStatus = 1;
    entry.valid = 1;
    ++n;
}

struct CoreBlock {
    void operator()(unsigned char* block) const { CoreFree(block); }
};

// An FC function with a transceiver cage: the module's data as the library
// reads it, when a module with a serial sits in the cage.
void createFCConnector(_zorap_adapter_t* adapter, _zorap_phy_port_t* phy, _tagZORAPSDMDevice* device, int& n)
{
    PHYSICAL_DEBUG("Entering createPhysicalConnector, index = %d", n);
    // The data block is released on every way out.
    std::unique_ptr<unsigned char, CoreBlock> buffer(static_cast<unsigned char*>(CoreZMalloc(kSFPDataSize)));
    if (!buffer) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("createPhysicalConnector: Unable to allocate memory for the DMI buffer\n");
        return;
    }
    if (ZORAP_GetSFPData(device, buffer.get()) != 0) {
        PHYSICAL_DEBUG("No Transceiver on DeviceNumber %u\n", device->portIndex);
        return;
    }
    _SFPFields fields;
    std::memset(&fields, 0, sizeof(fields));
    parseSFPFields(device, buffer.get(), kSFPDataSize, &fields);
    if (fields.SerialNumber[0] == '\0') {
        PHYSICAL_DEBUG("Empty SerialNumber for the Transceiver on DeviceNumber %u\n", device->portIndex);
        return;
    }
    char adapterSerial[sizeof(adapter->serialNumber) + 1];
    copyFieldText(adapterSerial, adapter->serialNumber);
    char tag[kPhysicalTagSize];
    CreatePhysicalConnectorTag(tag, fields.SerialNumber, adapterSerial, phy->portNumber);
    const int same = classmodule::slotWithTag(g_PhysicalConnectorList, tag);
    if (same >= 0) {
        logSameTag(same);
        return;
    }
    PhysicalConnectorEntry& entry = g_PhysicalConnectorList.entries[g_PhysicalConnectorList.count++];
    entry.sfp = fields;
    std::snprintf(entry.tag, sizeof(entry.tag), "%s", tag);
    entry.valid = 1;
    PHYSICAL_DEBUG("Exiting  createPhysicalConnector\n");
    ++n;
}

}  // namespace

void buildPhysicalConnectorList()
{
    int wanted = 0;
    bool haveAdapters = classmodule::walkProtocols([&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* pr) {
        if (pr->protocolType < 3)
            ++wanted;
    });
    ClassList<PhysicalConnectorEntry>& list = g_PhysicalConnectorList;
    if (!haveAdapters || !list.allocate(wanted))
        return;
    const int capacity = wanted;
    list.count = 0;
    int n = 0;
    classmodule::walkProtocols([&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
        // A tree that grew between the two walks finds no slot.
        if (list.count >= capacity)
            return;
        if (pr->protocolType == 2)
            createNicConnector(a, p, pr, n);
        else if (pr->protocolType < 2 && pr->fcDevice.transceiverSupport == 1)
            createFCConnector(a, p, &pr->fcDevice, n);
    });
    classmodule::countValid(list);
}

void removePhysicalConnectorList()
{
    g_PhysicalConnectorList.remove();
}

// ---------------------------------------------------------------------------
// The instance.
// ---------------------------------------------------------------------------
namespace {

const char kClassName[] = "Vexlan_Adapter_PhysicalConnector";

template <std::size_t N>
PropertyValue sfpText(const char (&field)[N])
{
    return CmpiData(std::string(field, strnlen(field, N)));
}

const PropertyRow<PhysicalConnectorEntry> kProperties[] = {
    {"CreationClassName", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, entryText(kClassName))},
    {"Tag", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, entryText(e.tag))},
    {"Name", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, entryText(kClassName))},
    {"ElementName", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, entryText("Physical Port Connector"))},
    {"ConnectorLayout", CMPI_uint16, CLASS_VALUE(PhysicalConnectorEntry, CmpiData(static_cast<CMPIUint16>(1)))},
    {"ConnectorDescription", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, entryText("SFP"))},
    {"Manufacturer", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, sfpText(e.sfp.Manufacturer))},
    {"SerialNumber", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, sfpText(e.sfp.SerialNumber))},
    {"PartNumber", CMPI_string, CLASS_VALUE(PhysicalConnectorEntry, sfpText(e.sfp.PartNumber))},
    {"SFPDataA0", CMPI_uint8A, CLASS_VALUE(PhysicalConnectorEntry, uint8Array(e.sfp.RawData, 256))},
    {"SFPDataA2", CMPI_uint8A, CLASS_VALUE(PhysicalConnectorEntry, uint8Array(e.sfp.RawData + 256, 256))},
    {"SFPStatus", CMPI_uint16, CLASS_VALUE(PhysicalConnectorEntry, CmpiData(static_cast<CMPIUint16>(e.sfp.SFPStatus)))},
};

const ClassModule<PhysicalConnectorEntry> kPhysicalConnector =
    ClassModule<PhysicalConnectorEntry>("PhysicalConnector")
        .list(g_PhysicalConnectorList, ListKind::Dense)
        .key("Tag", [](const PhysicalConnectorEntry& e) -> const char* { return e.tag; })
        .filterKeys(kPhysicalTagFilterKeys)
        .pathKeys(kPhysicalTagPathKeys)
        .properties(kProperties)
        .enumerationsTestValid();

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(PhysicalConnector, kPhysicalConnector)

// ---------------------------------------------------------------------------
// The NIC side's way in: the slot whose tag is the port's, the library's
// records looked up anew for each slot.
// ---------------------------------------------------------------------------
VEXLAN_PHYSICAL_NIC_OPERATIONS(PhysicalConnector)
