// CmpiInstanceMI - instance provider operations.  Every default operation
// returns CMPI_RC_ERR_NOT_SUPPORTED.  The drivers are the entries of a
// CMPIInstanceMIFT, in table order; the MI's handle is the CmpiBaseMI*.
#ifndef CMPI_CPP_CMPIINSTANCEMI_H
#define CMPI_CPP_CMPIINSTANCEMI_H

#include "CmpiBaseMI.h"
#include "CmpiContext.h"
#include "CmpiInstance.h"
#include "CmpiObjectPath.h"
#include "CmpiResult.h"
#include "CmpiStatus.h"

class CmpiInstanceMI : virtual public CmpiBaseMI {
public:
    CmpiInstanceMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    static CMPIStatus driveEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                             const CMPIResult* eRslt, const CMPIObjectPath* eCop);
    static CMPIStatus driveEnumInstances(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                         const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                         const char** properties);
    static CMPIStatus driveGetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                       const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                       const char** properties);
    static CMPIStatus driveCreateInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                          const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                          const CMPIInstance* eInst);
    static CMPIStatus driveSetInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                       const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                       const CMPIInstance* eInst, const char** properties);
    static CMPIStatus driveDeleteInstance(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                          const CMPIResult* eRslt, const CMPIObjectPath* eCop);
    static CMPIStatus driveExecQuery(CMPIInstanceMI* mi, const CMPIContext* eCtx,
                                     const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                     const char* query, const char* language);

    virtual CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                         const CmpiObjectPath& cop);
    virtual CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt,
                                     const CmpiObjectPath& cop, const char** properties);
    virtual CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                   const CmpiObjectPath& cop, const char** properties);
    virtual CmpiStatus createInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                      const CmpiObjectPath& cop, const CmpiInstance& inst);
    virtual CmpiStatus setInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                   const CmpiObjectPath& cop, const CmpiInstance& inst,
                                   const char** properties);
    virtual CmpiStatus deleteInstance(const CmpiContext& ctx, CmpiResult& rslt,
                                      const CmpiObjectPath& cop);
    // Arguments in the order of the C table: query text, then language.
    virtual CmpiStatus execQuery(const CmpiContext& ctx, CmpiResult& rslt,
                                 const CmpiObjectPath& cop, const char* query,
                                 const char* language);
};

// The CMPI 2.0 function table of an instance MI named miName: cleanup and every
// operation go to the drivers above.  A provider library defines its table
// with it, e.g. `CMPIInstanceMIFT ft = cmpiInstanceMIFT("...");`.
constexpr CMPIInstanceMIFT cmpiInstanceMIFT(const char* miName)
{
    return {200, 200, miName, CmpiBaseMI::driveBaseCleanup,
            CmpiInstanceMI::driveEnumInstanceNames,
            CmpiInstanceMI::driveEnumInstances,
            CmpiInstanceMI::driveGetInstance,
            CmpiInstanceMI::driveCreateInstance,
            CmpiInstanceMI::driveSetInstance,
            CmpiInstanceMI::driveDeleteInstance,
            CmpiInstanceMI::driveExecQuery};
}

#endif
