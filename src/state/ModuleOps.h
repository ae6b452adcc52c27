// The operations by which the provider's tables and the association engine
// hold a class or association module, and the compile-time switch of the
// module set.
#ifndef VEXLAN_STATE_MODULEOPS_H
#define VEXLAN_STATE_MODULEOPS_H

#include "CmpiImpl.h"

using EnumInstanceNamesOp = CmpiStatus (*)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&);
using EnumInstancesOp = CmpiStatus (*)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char**);
// getInstance_X with its sendInstance argument; the dispatcher passes true.
using GetInstanceOp = CmpiStatus (*)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char**,
                                     bool);
using InvokeMethodOp = CmpiStatus (*)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char*,
                                      const CmpiArgs&, CmpiArgs&);

// The three request operations of one class or association module.
struct ClassOps {
    EnumInstanceNamesOp enumInstanceNames;
    EnumInstancesOp enumInstances;
    GetInstanceOp getInstance;
};
#define CLASS_OPS(X) ClassOps{::enumInstanceNames_##X, ::enumInstances_##X, ::getInstance_##X}

// For a module whose getInstance_X has no sendInstance argument:
//     ClassOps{::enumInstanceNames_X, ::enumInstances_X, withoutSendFlag<::getInstance_X>}
template <CmpiStatus (*Get)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char**)>
CmpiStatus withoutSendFlag(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties, bool)
{
    return Get(ctx, rslt, cop, properties);
}

// Compile-time switch of the SCSI endpoint, target and storage extent
// classes in every route, in the association dispatch and in the build
// sequence.
extern const int g_SUPPORT_HDR;
extern const int g_SupportTRB2xx;

#endif
