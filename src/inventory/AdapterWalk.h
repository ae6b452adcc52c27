// Walks over the adapter library's main tree, skipping null list headers.
// The list builds of the class modules and the NIC adapter list share them.
#ifndef VEXLAN_INVENTORY_ADAPTERWALK_H
#define VEXLAN_INVENTORY_ADAPTERWALK_H

#include "zorap_cna.h"

// Every physical port of every adapter of `adapters`: visit(adapter, phy).
template <class Visit>
void forEachPhyPortIn(_zorap_adapter_list_t* adapters, Visit&& visit)
{
    for (_zorap_adapter_t* adapter = adapters->firstAdapter; adapter != nullptr; adapter = adapter->next) {
        if (adapter->phyPortList == nullptr)
            continue;
        for (_zorap_phy_port_t* phy = adapter->phyPortList->firstPhyPort; phy != nullptr; phy = phy->next)
            visit(adapter, phy);
    }
}

// Every protocol of every physical port of every adapter of the library's
// list: visit(adapter, phy, protocol). Returns false when the library gives
// no adapter list.
template <class Visit>
bool forEachProtocol(Visit&& visit)
{
    _zorap_adapter_list_t* adapters = ZORAP_GetAdapterList();
    if (adapters == nullptr)
        return false;
    forEachPhyPortIn(adapters, [&](_zorap_adapter_t* adapter, _zorap_phy_port_t* phy) {
        if (phy->protocolList == nullptr)
            return;
        for (_zorap_protocol_t* protocol = phy->protocolList->firstProtocol; protocol != nullptr;
             protocol = protocol->next)
            visit(adapter, phy, protocol);
    });
    return true;
}

#endif
