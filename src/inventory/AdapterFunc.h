// The private list of NIC adapters, m_CNAList: one _CNAStruc per adapter with
// NIC functions, each with a chain of _CNAPortStruc, one per NIC function.
//
// The list is a copy of the adapter library's tree that stays readable after
// the tree has gone, with what the library gives only on request: IP
// properties, FCoE linkage and transceiver data. It is built by the polling
// thread after ZORAP_Initialize and after every configuration change, and read
// by the NIC class modules. Every access happens under provider_lock.
#ifndef VEXLAN_INVENTORY_ADAPTERFUNC_H
#define VEXLAN_INVENTORY_ADAPTERFUNC_H

#include <atomic>
#include <cstdint>

#include "inventory/AdapterFunc_Transceiver.h"
#include "zorap_cna.h"

// One NIC function of an adapter. The port info record of the library comes
// first, so that its fields read directly: macAddress, interfaceName,
// portNumber, linkProperties (linkSpeed, linkState), maxTransmissionUnit.
// The three address arrays of ipProperties (ipv6Addresses, dnsServers,
// ipv6Gateways) point to private copies owned by the list, or are null.
struct _CNAPortStruc : _zorap_nic_port_info_t {
    _zorap_nic_port_stats_t portStats;        // copy of nicPortStats
    _zorap_ip_properties_t ipProperties;      // copy of the IP properties record
    _zorap_fcoe_linkage_t* fcoeLinkage;       // private copy of the linkage array, or null
    std::uint32_t fcoeLinkageCount;           // elements of fcoeLinkage
    bool hasTransceiver;                      // the last transceiver read succeeded
    _Nic_SFPFields sfpFields;                 // stale while hasTransceiver is false
    _CNAPortStruc* next;
    _zorap_nic_port_extra_t portExtra;        // copy of nicPortExtra
};

// One adapter with NIC functions. The adapter info record of the library
// comes first (modelName, serialNumber, versionString, partNumber, ...): a copy
// of nicAdapterInfo of the last protocol seen for this adapter.
struct _CNAStruc : _zorap_nic_adapter_info_t {
    std::uint32_t adapterInstance;            // the key: _zorap_protocol_t.adapterInstance
    _CNAPortStruc* portList;
    _CNAStruc* next;
};

// Head of the list; null when empty.
extern _CNAStruc* m_CNAList;

// True while a flash write runs. Polling and unloading wait for its end.
extern std::atomic<bool> gbFlashUpdateInProgress;

// Builds the list from the library's tree, appending to what exists.
void Initialize_CNA_List();
// Fills a new port from library calls: statistics, FCoE linkage, transceiver
// and the port extra data.
void Initialize_CNA_Port(_zorap_protocol_t* protocol, _CNAPortStruc* port);
// Frees every adapter, port and private array; m_CNAList becomes null.
void Clear_CNA_List();
// The adapter with this number, appended at the end when there is none;
// null when memory runs out.
_CNAStruc* GetCNAStruc(int adapterInstance);
// The first adapter whose serial number or NIC port controller device ID
// equals `text`, without regard to case; null if none.
_CNAStruc* FindCNAFromSerialNumber(char const* text);
// NIC images are not examined here: always 0.
int ValidateCNAFlashImage(_CNAStruc* cna, unsigned char const* image, unsigned long long size);
// Writes a NIC flash image synchronously: 0 on success, 2 on any failure.
int UpdateCNAFlashImage(_CNAStruc* cna, unsigned char const* image, unsigned long long size);

#endif
