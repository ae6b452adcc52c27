// Vexlan_Adapter_PhysicalPort: a port of an adapter board, with or without a
// transceiver; one instance per physical port, Tag
// "<adapter serial>_<physical port number>". No protocol is looked at, so a
// board keeps its ports whichever functions it has.
#ifndef VEXLAN_CLASSES_VEXLAN_ADAPTER_PHYSICALPORT_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_ADAPTER_PHYSICALPORT_CMPI_H

#include <cstdint>

#include "classes/Vexlan_Adapter_PhysicalConnector_CMPI.h"

struct PhysicalPortEntry {
    unsigned char valid;
    char tag[128];
    char serialNumber[128];     // the adapter's, an 11S ID unshortened
    std::uint16_t portNumber;
};

extern ClassList<PhysicalPortEntry> g_PhysicalPortList;

// "%s_%d" of adapter serial and port number; `out` holds kPhysicalTagSize.
void CreatePhysicalPortTag(char* out, char* adapterSerial, int portNumber);
// Splits such a tag at "_" (parts of kPhysicalTagPartSize): 1 when two parts
// were found.
int ParsePhysicalPortTag(char* tag, char* adapterSerial, int* portNumber);

// The physical port tag of a NIC port: 1 on success, else 0 with `out` empty.
int calcTag_PhysicalPort(_CNAStruc* cna, _CNAPortStruc* port, char* out);

void buildPhysicalPortList();
void removePhysicalPortList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(PhysicalPort);

// findSlot_Nic_PhysicalPort and the NIC-side operations on its slot.
VEXLAN_DECLARE_PHYSICAL_NIC_OPERATIONS(PhysicalPort);

#endif
