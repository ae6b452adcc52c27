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

// The keys of the two tag classes (PhysicalConnector, PhysicalPort): the
// property filter keeps Tag alone, while the path also carries
// CreationClassName.
inline const char* const kPhysicalTagFilterKeys[] = {"Tag", nullptr};
inline const char* const kPhysicalTagPathKeys[] = {"CreationClassName", "Tag", nullptr};

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

// A NIC port's tag by `tagOf` from the library records of the port
// (getZORAPStructs): 1 on success, else 0 with `out` empty.
using NicTagFunction = void (*)(char* out, const _CNAPortStruc* port, const _zorap_adapter_t* adapter,
                                const _zorap_phy_port_t* phy);
int calcNicTag(_CNAStruc* cna, _CNAPortStruc* port, char* out, NicTagFunction tagOf);

// The connector tag of a NIC port: 1 on success, else 0 with `out` empty.
int calcTag_PhysicalConnector(_CNAStruc* cna, _CNAPortStruc* port, char* out);

void buildPhysicalConnectorList();
void removePhysicalConnectorList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(PhysicalConnector);

// The NIC side's way into the tag list of X (PhysicalConnector,
// PhysicalPort): findSlot_Nic_X, the first slot whose tag is that of the NIC
// port (worked out anew for each slot) or -1, and the indexed operations on
// that slot; with none, a null handle (isNull()).
#define VEXLAN_DECLARE_PHYSICAL_NIC_OPERATIONS(X)                                                          \
    int findSlot_Nic_##X(_CNAStruc* cna, _CNAPortStruc* port);                                            \
    CmpiObjectPath makePath_Nic_##X(const char* className, const char* nameSpace, _CNAStruc* cna,        \
                                    _CNAPortStruc* port);                                                 \
    CmpiInstance makeInstance_Nic_##X(const char* className, const char* nameSpace, const char** properties, \
                                      _CNAStruc* cna, _CNAPortStruc* port)

// Their definitions, from g_XList, calcTag_X, makePath_X and makeInstance_X.
#define VEXLAN_PHYSICAL_NIC_OPERATIONS(X)                                                                  \
    int findSlot_Nic_##X(_CNAStruc* cna, _CNAPortStruc* port)                                             \
    {                                                                                                     \
        return findNicTagSlot(g_##X##List, calcTag_##X, cna, port);                                       \
    }                                                                                                     \
    CmpiObjectPath makePath_Nic_##X(const char* className, const char* nameSpace, _CNAStruc* cna,        \
                                    _CNAPortStruc* port)                                                  \
    {                                                                                                     \
        PHYSICAL_DEBUG("Vexlan_NIC_" #X " makePath_" #X " was called\n");                                \
        return classmodule::pathOfSlot(makePath_##X, findSlot_Nic_##X(cna, port), className, nameSpace);  \
    }                                                                                                     \
    CmpiInstance makeInstance_Nic_##X(const char* className, const char* nameSpace, const char** properties, \
                                      _CNAStruc* cna, _CNAPortStruc* port)                                \
    {                                                                                                     \
        return classmodule::instanceOfSlot(makeInstance_##X, findSlot_Nic_##X(cna, port), className,      \
                                           nameSpace, properties);                                        \
    }

VEXLAN_DECLARE_PHYSICAL_NIC_OPERATIONS(PhysicalConnector);

#endif
