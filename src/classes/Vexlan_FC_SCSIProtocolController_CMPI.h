// Vexlan_FCHBA_SCSIProtocolController: the SCSI view of one FC function, one
// instance per FC protocol, keyed by the port WWN.
//
// The record and the port-name build here serve the two SCSI endpoint classes
// as well: the HBA endpoint is built exactly like the controller, and the
// target endpoint keeps the same record with "<local WWN>_<target WWN>" names.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_SCSIPROTOCOLCONTROLLER_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_SCSIPROTOCOLCONTROLLER_CMPI_H

#include <cstdint>

#include "classes/ClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"

// One slot of the controller and both endpoint lists.
struct SCSIPortNameEntry {
    unsigned char valid;
    char name[128];   // DeviceID of the controller, Name of the endpoints
};

// Full list of one slot per FC protocol, named by the port WWN; the build of
// the controller and of the HBA endpoint. No debug lines.
void buildSCSIPortNameList(ClassList<SCSIPortNameEntry>& list);

// The target walk of the target endpoint and storage extent builds: every
// target of every FC function as the library links it, with the WWN texts of
// the local port and of the target: visit(device, target, local, remote).
// A visit that returns false ends that function's target chain.
template <class Visit>
bool walkFCTargets(Visit&& visit)
{
    return classmodule::walkProtocols([&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* pr) {
        if (pr->protocolType >= 2)
            return;
        _tagZORAPSDMDevice* device = &pr->fcDevice;
        char local[kFCWWNTextSize];
        FormatWWN(device->portWWN, local, sizeof(local));
        for (_zorap_target_t* target = device->targetList; target != nullptr; target = target->next) {
            char remote[kFCWWNTextSize];
            FormatWWN(target->portWWN, remote, sizeof(remote));
            if (!visit(device, target, static_cast<const char*>(local), static_cast<const char*>(remote)))
                break;
        }
    });
}

// Allocates a full list of `wanted` slots when there are adapters; a sum
// beyond the signed count leaves the list empty. False: no slots.
template <class Entry>
bool allocateCounted(ClassList<Entry>& list, bool haveAdapters, std::uint64_t wanted)
{
    return haveAdapters && wanted <= INT32_MAX && list.allocate(static_cast<int>(wanted));
}

extern ClassList<SCSIPortNameEntry> g_SCSIProtocolControllerList;

void buildSCSIProtocolControllerList();
void removeSCSIProtocolControllerList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(SCSIProtocolController);

// ---------------------------------------------------------------------------
// The property rows of the two SCSI endpoint classes, which differ only in
// their class name and their Role (2 for the HBA, 3 for a target).
// ---------------------------------------------------------------------------
extern const char* const kSCSIEndpointKeys[];   // SystemCreationClassName, SystemName, CreationClassName, Name

template <const char* ClassName, CMPIUint16 Role>
inline const PropertyRow<SCSIPortNameEntry> kSCSIEndpointProperties[] = {
    {"SystemCreationClassName", CMPI_string,
     CLASS_VALUE(SCSIPortNameEntry, entryText("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(ClassName))},
    {"Name", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(e.name))},
    {"ProtocolIFType", CMPI_uint16, CLASS_VALUE(SCSIPortNameEntry, CmpiData(static_cast<CMPIUint16>(56)))},
    {"ConnectionType", CMPI_uint16, CLASS_VALUE(SCSIPortNameEntry, CmpiData(static_cast<CMPIUint16>(2)))},
    {"Role", CMPI_uint16, CLASS_VALUE(SCSIPortNameEntry, CmpiData(Role))},
    {"ElementName", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(e.name))},
    {"OtherTypeDescription", CMPI_string, CLASS_VALUE(SCSIPortNameEntry, entryText(""))},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(SCSIPortNameEntry, uint16Array({2}))},
};


// The module of a SCSI endpoint class: a full list keyed by Name, with the
// endpoint keys and rows.
template <const char* ClassName, CMPIUint16 Role>
ClassModule<SCSIPortNameEntry> scsiEndpointModule(const char* stem, ClassList<SCSIPortNameEntry>& list)
{
    return ClassModule<SCSIPortNameEntry>(stem)
        .list(list, ListKind::Full)
        .key("Name", [](const SCSIPortNameEntry& e) -> const char* { return e.name; })
        .filterKeys(kSCSIEndpointKeys)
        .pathKeys(kSCSIEndpointKeys)
        .properties(kSCSIEndpointProperties<ClassName, Role>);
}

#endif
