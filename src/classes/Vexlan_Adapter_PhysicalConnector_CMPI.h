// Vexlan_Adapter_PhysicalConnector: the pluggable transceiver of a port with
// its raw EEPROM data, for FC and NIC functions alike. Tag
// "<transceiver serial>_<adapter serial>_<physical port number>"; a port with
// an FC and a NIC function and one transceiver gives one connector.
#ifndef VEXLAN_CLASSES_VEXLAN_ADAPTER_PHYSICALCONNECTOR_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_ADAPTER_PHYSICALCONNECTOR_CMPI_H

#include <cstddef>
#include <cstring>

#include "classes/ClassModule.h"
#include "inventory/AdapterFunc.h"
#include "inventory/AdapterFunc_Transceiver.h"

struct PhysicalConnectorEntry {
    unsigned char valid;
    char tag[128];
    _SFPFields sfp;   // Manufacturer, SerialNumber, PartNumber, raw data, SFPStatus
};

extern ClassList<PhysicalConnectorEntry> g_PhysicalConnectorList;

// Size of the tag texts that the Create and calcTag functions write (`out`
// must hold it), and of each part that the Parse functions write.
constexpr std::size_t kPhysicalTagSize = 128;
constexpr std::size_t kPhysicalTagPartSize = 256;

// Splits a tag at "_" into `textCount` texts (each of kPhysicalTagPartSize)
// and a final port number: 1 when all parts were found.
int SplitPhysicalTag(const char* tag, char* const* texts, int textCount, int* portNumber);

// "%s_%s_%d" of transceiver serial, adapter serial and port number.
void CreatePhysicalConnectorTag(char* out, char* transceiverSerial, char* adapterSerial, int portNumber);
// Splits such a tag at "_": 1 when three parts were found. A serial that holds
// "_" itself is split wrongly; the tags of this form only are meant.
int ParsePhysicalConnectorTag(char* tag, char* transceiverSerial, char* adapterSerial, int* portNumber);

// The adapter, physical port and protocol of the library's tree whose NIC
// function has the port's MAC address (all eight bytes of the field
// compared). 1 on success, else 0 with the outputs untouched.
int getZORAPStructs(_CNAStruc* cna, _CNAPortStruc* port, _zorap_adapter_t** adapter, _zorap_phy_port_t** phyPort,
                    _zorap_protocol_t** protocol);

// The first slot of a tag list whose tag is the one `calcTag` gives for the
// NIC port (worked out anew for each slot), or -1.
template <class Entry>
int findNicTagSlot(const ClassList<Entry>& list, int (*calcTag)(_CNAStruc*, _CNAPortStruc*, char*), _CNAStruc* cna,
                   _CNAPortStruc* port)
{
    for (int i = 0; i < list.count; ++i) {
        char tag[kPhysicalTagSize];
        calcTag(cna, port, tag);
        if (std::strcmp(tag, list.entries[i].tag) == 0)
            return i;
    }
    return -1;
}

// The connector tag of a NIC port: 1 on success, else 0 with `out` empty.
int calcTag_PhysicalConnector(_CNAStruc* cna, _CNAPortStruc* port, char* out);

void buildPhysicalConnectorList();
void removePhysicalConnectorList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(PhysicalConnector);

// The first slot whose tag is that of the NIC port, or -1.
int findSlot_Nic_PhysicalConnector(_CNAStruc* cna, _CNAPortStruc* port);
// The indexed operations on that slot; with none, a null handle (isNull()).
CmpiObjectPath makePath_Nic_PhysicalConnector(const char* className, const char* nameSpace, _CNAStruc* cna,
                                              _CNAPortStruc* port);
CmpiInstance makeInstance_Nic_PhysicalConnector(const char* className, const char* nameSpace,
                                                const char** properties, _CNAStruc* cna, _CNAPortStruc* port);

#endif
