// The tables that drive the provider: the routes of the instance and method
// requests by class name, the sequence in which the polling thread builds and
// removes the lists, and the steps of other subsystems that the polling
// thread and cleanupAgent call. Vexlan_CNA_Provider_Tables.cpp holds them and
// the one section that lists the modules not built yet.
#ifndef VEXLAN_PROVIDER_VEXLAN_CNA_PROVIDER_TABLES_H
#define VEXLAN_PROVIDER_VEXLAN_CNA_PROVIDER_TABLES_H

#include <cstddef>

#include "CmpiImpl.h"
#include "zorap_cna.h"
#include "state/ModuleOps.h"
#include "state/PollingBlock.h"
#include "support/RequestLists.h"

// The three groups of routes, walked in this order; a match ends its group,
// not the request.
enum class RouteGroup {
    Always,      // group 1
    SupportHdr,  // group 2, walked only when g_SUPPORT_HDR is not zero
    Nic,         // group 3
};

// One row of the instance routes: a request whose path's class is (or
// derives from) `className` calls `ops`; with `rebuild` set, the list is
// removed and built again right before, so that the request sees fresh data.
struct InstanceRoute {
    const char* className;
    ClassOps ops;
    const ListOps* rebuild;
    RouteGroup group;
};

struct MethodRoute {
    const char* className;
    InvokeMethodOp invokeMethod;
};

// One row of the polling thread's build sequence; the remove sequence is the
// same order. Rows marked supportHdr count only when g_SUPPORT_HDR is not zero.
struct ListSequenceRow {
    const char* name;
    const ListOps* ops;
    bool supportHdr;
};

// The operations of other subsystems that the polling thread and
// cleanupAgent call around the build sequence.
struct PollingSteps {
    void (*InitializeRegisteredProfileList)();
    void (*Clear_RegisteredProfile_List)();
    void (*DeserializeConcreteJobToPrefFile)();
    void (*Update_CNA_List)(ThreadArgs& args);
    ZORAP_ALARM_CALLBACK alarmCallback;   // OSSGenerateHostNotificationAlarm
};

const InstanceRoute* instanceRoutes(std::size_t& count);
const MethodRoute* methodRoutes(std::size_t& count);
const ListSequenceRow* listSequence(std::size_t& count);
extern const PollingSteps kPollingSteps;


#endif
