// The link watch: at each poll the link state and the transceiver of the NIC
// ports of m_CNAList are read afresh; a changed link state is stored in the
// port and sent as a link up or link down alert.
#ifndef VEXLAN_INVENTORY_ADAPTERFUNC_LINKWATCH_H
#define VEXLAN_INVENTORY_ADAPTERFUNC_LINKWATCH_H

struct ThreadArgs;
struct _CNAStruc;
struct _CNAPortStruc;

// What the watch calls for a port whose link state changed, with the block it
// was handed: alarm type 1 for link up, 2 for link down.
using PortAlertFn = void (*)(ThreadArgs& args, int alarmType, _CNAStruc* adapter, _CNAPortStruc* port);

// One round of the watch, by the polling thread under provider_lock. As it
// has always done, each round of the adapter chain visits the ports of the
// first adapter (the alert names the adapter of the round with that port);
// ports of later adapters are not watched. A changed link calls `alert`.
void Update_CNA_List(ThreadArgs& args, PortAlertFn alert);

// Reads the port's transceiver through its interface: hasTransceiver and
// sfpFields, with the "Transceiver on portID %u" / "No Transceiver on portID
// %u" line.
void Read_CNA_Port_Transceiver(const char* interfaceName, _CNAPortStruc* port);

#endif
