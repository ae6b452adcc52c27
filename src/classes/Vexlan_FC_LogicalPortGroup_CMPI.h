// Vexlan_FCHBA_LogicalPortGroup: the FC ports that share one node WWN, one
// instance per node WWN. InstanceID is "<host>_<serial>_<node WWN>_<port WWN>"
// with the WWN of the group's first port; the associations cut it at its last
// "_" to find that port.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_LOGICALPORTGROUP_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_LOGICALPORTGROUP_CMPI_H

#include <cstdint>

#include "classes/ClassModule.h"

struct LogicalPortGroupEntry {
    std::uint8_t valid;
    char instanceId[128];   // InstanceID
    char nodeWWN[128];      // 16 hex digits
};

// The slot of a group is the ordinal of its first FC function among all FC
// functions, while count only grows by the groups created; the duplicate test
// looks below count. So once a function was dropped as a duplicate, slots and
// count part: with two dual-port adapters count is 3, slot 1 stays unfilled
// (valid 0, empty texts) and slot 3 lies beyond count. The associations walk
// the same slots.
extern ClassList<LogicalPortGroupEntry> g_LogicalPortGroupList;

void buildLogicalPortGroupList();
void removeLogicalPortGroupList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(LogicalPortGroup);

#endif
