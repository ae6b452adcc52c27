// Vexlan_FCHBA_StorageExtent: one instance per LUN behind a discovered target
// of an FC function. Unlike the other classes, an instance is made by reading
// through the kept pointers into the adapter library's LUN record, so the
// dispatcher rebuilds the list before every request.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_STORAGEEXTENT_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_STORAGEEXTENT_CMPI_H

#include "classes/ClassModule.h"

struct StorageExtentEntry {
    unsigned char valid;
    char deviceId[128];            // "<local WWN>_<target WWN>_<LUN identifier>_<LUN number>"
    _tagZORAPSDMDevice* device;    // the local FC device
    _zorap_target_t* target;       // the target
    _zorap_lun_t* lun;             // the LUN, read by makeInstance
};

extern ClassList<StorageExtentEntry> g_StorageExtentList;

void buildStorageExtentList();
void removeStorageExtentList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(StorageExtent);

#endif
