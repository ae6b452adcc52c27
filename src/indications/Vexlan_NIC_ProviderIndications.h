// Port alert indications: Vexlan_NIC_IndicationEthernetPortLinkUp and
// ...LinkDown of a NIC port whose link state the link watch found changed.
#ifndef VEXLAN_INDICATIONS_VEXLAN_NIC_PROVIDERINDICATIONS_H
#define VEXLAN_INDICATIONS_VEXLAN_NIC_PROVIDERINDICATIONS_H

struct ThreadArgs;
struct _CNAStruc;
struct _CNAPortStruc;

// On the polling thread under provider_lock, with the thread's block: alarm
// type 1 sends a link up alert, 2 a link down alert, while a filter is active.
void generatePortAlertIndication(ThreadArgs& args, int alarmType, _CNAStruc* adapter, _CNAPortStruc* port);

#endif
