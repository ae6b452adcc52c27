// The adapter list m_CNAList: built from the adapter library's tree, freed as
// a whole. See AdapterFunc.h.
#include "inventory/AdapterFunc.h"

#include <cstdlib>
#include <cstring>

#include "inventory/AdapterFunc_LinkWatch.h"
#include "inventory/AdapterWalk.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

_CNAStruc* m_CNAList = nullptr;
std::atomic<bool> gbFlashUpdateInProgress{false};

namespace {

// Private copy of one of the IP properties' address arrays: `count` records
// from `source`, or null when the count is 0, the source is missing or memory
// runs out. The count in the record stays as the library gave it; readers
// test the pointer.
_zorap_ipaddr* copyAddressArray(std::uint32_t count, _zorap_ipaddr const* source)
{
    if (count == 0 || source == nullptr)
        return nullptr;
    auto* copy = static_cast<_zorap_ipaddr*>(std::malloc(sizeof(_zorap_ipaddr) * count));
    if (copy != nullptr)
        std::memcpy(copy, source, sizeof(_zorap_ipaddr) * count);
    return copy;
}

// IP properties of the port's interface, copied into the port with private
// address arrays. A failure leaves the port without IP data.
void copyIPProperties(_CNAPortStruc* port)
{
    void* record = nullptr;
    if (ZORAP_GetIPProperties(port->interfaceName, &record) != 0) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Error getting port IP Info\n");
        return;
    }
    if (record == nullptr)
        return;
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("About to copy IPProperties\n");
    auto const* source = static_cast<_zorap_ip_properties_t const*>(record);
    std::memcpy(&port->ipProperties, source, sizeof(port->ipProperties));
    port->ipProperties.ipv6Addresses = copyAddressArray(source->ipv6AddressCount, source->ipv6Addresses);
    port->ipProperties.dnsServers = copyAddressArray(source->dnsServerCount, source->dnsServers);
    port->ipProperties.ipv6Gateways = copyAddressArray(source->ipv6GatewayCount, source->ipv6Gateways);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Finished copying IPProperties\n");
    ZORAP_FreeMem(record);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("After ZORAP_FreeMem");
}

// The port chain is kept in the order of the tree: a new port goes last.
void appendPort(_CNAStruc* cna, _CNAPortStruc* port)
{
    _CNAPortStruc** link = &cna->portList;
    while (*link != nullptr)
        link = &(*link)->next;
    *link = port;
}

void addNicProtocol(_zorap_protocol_t* protocol)
{
    _CNAStruc* cna = GetCNAStruc(protocol->adapterInstance);
    if (cna == nullptr)
        return;
    static_cast<_zorap_nic_adapter_info_t&>(*cna) = protocol->nicAdapterInfo;

    auto* port = static_cast<_CNAPortStruc*>(std::malloc(sizeof(_CNAPortStruc)));
    if (port == nullptr)
        return;
    std::memset(port, 0, sizeof(*port));
    static_cast<_zorap_nic_port_info_t&>(*port) = protocol->nicPortInfo;
    Initialize_CNA_Port(protocol, port);

    // The interface name of the copy is terminated within its field, whatever
    // the library put there.
    port->interfaceName[sizeof(port->interfaceName) - 1] = '\0';
    if (std::strlen(port->interfaceName) > 1)
        copyIPProperties(port);
    appendPort(cna, port);
}

}  // namespace

void Initialize_CNA_List()
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Entered Initialize_CNA_List()");
    forEachProtocol([](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol) {
        if (protocol->protocolType == ZORAP_PROTOCOL_NIC)
            addNicProtocol(protocol);
    });
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting Initialize_CNA_List()");
}

void Initialize_CNA_Port(_zorap_protocol_t* protocol, _CNAPortStruc* port)
{
    port->portStats = protocol->nicPortStats;

    // The calls by name use the library record's own interface name, held to
    // its field.
    char interfaceName[sizeof(protocol->nicPortInfo.interfaceName)];
    std::memcpy(interfaceName, protocol->nicPortInfo.interfaceName, sizeof(interfaceName));
    interfaceName[sizeof(interfaceName) - 1] = '\0';

    void* linkage = nullptr;
    std::uint32_t count = 0;
    if (ZORAP_GetFCoELinkage(interfaceName, &linkage, &count) == 0 && linkage != nullptr && count != 0) {
        auto* copy = static_cast<_zorap_fcoe_linkage_t*>(std::malloc(sizeof(_zorap_fcoe_linkage_t) * count));
        if (copy != nullptr) {
            std::memcpy(copy, linkage, sizeof(_zorap_fcoe_linkage_t) * count);
            port->fcoeLinkage = copy;
            port->fcoeLinkageCount = count;
        } else if (g_EnableLogError) {
            Vexlan_FC_Utils_CMPI::LogError("Memory allocation for FCoE linkage failed!");
        }
        ZORAP_FreeMem(linkage);
    } else if (linkage != nullptr) {
        ZORAP_FreeMem(linkage);
    }

    Read_CNA_Port_Transceiver(interfaceName, port);

    port->portExtra = protocol->nicPortExtra;
}

_CNAStruc* GetCNAStruc(int adapterInstance)
{
    _CNAStruc** link = &m_CNAList;
    for (; *link != nullptr; link = &(*link)->next) {
        if ((*link)->adapterInstance == static_cast<std::uint32_t>(adapterInstance))
            return *link;
    }
    auto* cna = static_cast<_CNAStruc*>(std::malloc(sizeof(_CNAStruc)));
    if (cna == nullptr) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Allocating memory for new adapter failed\n");
        return nullptr;
    }
    std::memset(cna, 0, sizeof(*cna));
    cna->adapterInstance = static_cast<std::uint32_t>(adapterInstance);
    *link = cna;
    return cna;
}

void Clear_CNA_List()
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Entering Clear_CNA_List()");
    _CNAStruc* cna = m_CNAList;
    while (cna != nullptr) {
        _CNAPortStruc* port = cna->portList;
        while (port != nullptr) {
            _CNAPortStruc* nextPort = port->next;
            std::free(port->fcoeLinkage);
            std::free(port->ipProperties.ipv6Addresses);
            std::free(port->ipProperties.dnsServers);
            std::free(port->ipProperties.ipv6Gateways);
            std::free(port);
            port = nextPort;
        }
        _CNAStruc* nextCna = cna->next;
        std::free(cna);
        cna = nextCna;
    }
    m_CNAList = nullptr;
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting Clear_CNA_List()");
}

int ValidateCNAFlashImage(_CNAStruc*, unsigned char const*, unsigned long long)
{
    return 0;
}

int UpdateCNAFlashImage(_CNAStruc* cna, unsigned char const* image, unsigned long long size)
{
    if (cna == nullptr || image == nullptr || size == 0)
        return 2;
    gbFlashUpdateInProgress = true;
    ZORAP_STATUS result = ZORAP_UpdateFlash(cna->adapterInstance, image, 0);
    gbFlashUpdateInProgress = false;
    if (result == 0)
        return 0;
    if (g_EnableLogError)
        Vexlan_FC_Utils_CMPI::LogError("Vexlan_NIC_Provider update flash error (%d): Undefined error = %u\n",
                                       static_cast<int>(cna->adapterInstance), result);
    return 2;
}
