// The link watch of the polling thread (AdapterFunc_LinkWatch.h).
#include "inventory/AdapterFunc_LinkWatch.h"

#include "inventory/AdapterFunc.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

void Read_CNA_Port_Transceiver(const char* interfaceName, _CNAPortStruc* port)
{
    unsigned char buffer[ZORAP_DMI_BUFFER_SIZE];
    std::uint32_t length = sizeof(buffer);
    if (ZORAP_GetTransceiverDMIData(interfaceName, &length, buffer) != 0) {
        port->hasTransceiver = false;
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("No Transceiver on portID %u", port->portNumber);
        return;
    }
    port->hasTransceiver = true;
    if (length > sizeof(buffer))
        length = sizeof(buffer);
    parseSFPFields(buffer, length, &port->sfpFields);
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Transceiver on portID %u", port->portNumber);
}

void Update_CNA_List(ThreadArgs& args, PortAlertFn alert)
{
    if (m_CNAList == nullptr)
        return;
    for (_CNAStruc* adapter = m_CNAList; adapter != nullptr; adapter = adapter->next) {
        for (_CNAPortStruc* port = m_CNAList->portList; port != nullptr; port = port->next) {
            const std::uint8_t* mac = port->macAddress.octet;
            if (g_EnableDebugPrint)
                Vexlan_FC_Utils_CMPI::DebugPrint(
                    "Update_CNA_List looking at port %lu %2.2x-%2.2x-%2.2x-%2.2x-%2.2x-%2.2x\n",
                    static_cast<unsigned long>(port->portNumber), mac[0], mac[1], mac[2], mac[3], mac[4], mac[5]);
            _zorap_link_properties_t fresh{};
            ZORAP_STATUS rc = ZORAP_GetLinkProperties(port->interfaceName, &fresh);
            if (rc != 0) {
                if (g_EnableLogError)
                    Vexlan_FC_Utils_CMPI::LogError("Get Link Properties Failed (%d)", static_cast<int>(rc));
            } else if (fresh.linkState != port->linkProperties.linkState ||
                       fresh.linkStateReserved != port->linkProperties.linkStateReserved) {
                // Only the state word counts: a new speed with the same state
                // is not stored.
                port->linkProperties = fresh;
                const bool up = fresh.linkState == ZORAP_LINK_UP && fresh.linkStateReserved == 0;
                if (g_EnableDebugPrint)
                    Vexlan_FC_Utils_CMPI::DebugPrint(up ? "Generate LINK_UP event" : "Generate LINK_DOWN event");
                alert(args, up ? 1 : 2, adapter, port);
            }
            Read_CNA_Port_Transceiver(port->interfaceName, port);
        }
    }
}
