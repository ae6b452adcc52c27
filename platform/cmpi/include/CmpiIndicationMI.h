// CmpiIndicationMI - indication provider operations, drivers in the order
// of CMPIIndicationMIFT.  The four filter operations default to
// CMPI_RC_ERR_NOT_SUPPORTED; enableIndications and disableIndications
// default to success, as servers call them without looking at the result.
#ifndef CMPI_CPP_CMPIINDICATIONMI_H
#define CMPI_CPP_CMPIINDICATIONMI_H

#include "CmpiBaseMI.h"
#include "CmpiContext.h"
#include "CmpiObjectPath.h"
#include "CmpiSelectExp.h"
#include "CmpiStatus.h"

class CmpiIndicationMI : virtual public CmpiBaseMI {
public:
    CmpiIndicationMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    static CMPIStatus driveAuthorizeFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                           const CMPISelectExp* se, const char* className,
                                           const CMPIObjectPath* op, const char* owner);
    static CMPIStatus driveMustPoll(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                    const CMPISelectExp* se, const char* className,
                                    const CMPIObjectPath* op);
    static CMPIStatus driveActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                          const CMPISelectExp* se, const char* className,
                                          const CMPIObjectPath* op, CMPIBoolean first);
    static CMPIStatus driveDeActivateFilter(CMPIIndicationMI* mi, const CMPIContext* eCtx,
                                            const CMPISelectExp* se, const char* className,
                                            const CMPIObjectPath* op, CMPIBoolean last);
    static CMPIStatus driveEnableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx);
    static CMPIStatus driveDisableIndications(CMPIIndicationMI* mi, const CMPIContext* eCtx);

    virtual CmpiStatus authorizeFilter(const CmpiContext& ctx, const CmpiSelectExp& se,
                                       const char* className, const CmpiObjectPath& op,
                                       const char* owner);
    virtual CmpiStatus mustPoll(const CmpiContext& ctx, const CmpiSelectExp& se,
                                const char* className, const CmpiObjectPath& op);
    virtual CmpiStatus activateFilter(const CmpiContext& ctx, const CmpiSelectExp& se,
                                      const char* className, const CmpiObjectPath& op,
                                      CMPIBoolean first);
    virtual CmpiStatus deActivateFilter(const CmpiContext& ctx, const CmpiSelectExp& se,
                                        const char* className, const CmpiObjectPath& op,
                                        CMPIBoolean last);
    virtual CmpiStatus enableIndications(const CmpiContext& ctx);
    virtual CmpiStatus disableIndications(const CmpiContext& ctx);
};

// The CMPI 2.0 function table of an indication MI named miName: cleanup and every
// operation go to the drivers above.  A provider library defines its table
// with it, e.g. `CMPIIndicationMIFT ft = cmpiIndicationMIFT("...");`.
constexpr CMPIIndicationMIFT cmpiIndicationMIFT(const char* miName)
{
    return {200, 200, miName, CmpiBaseMI::driveBaseCleanup,
            CmpiIndicationMI::driveAuthorizeFilter,
            CmpiIndicationMI::driveMustPoll,
            CmpiIndicationMI::driveActivateFilter,
            CmpiIndicationMI::driveDeActivateFilter,
            CmpiIndicationMI::driveEnableIndications,
            CmpiIndicationMI::driveDisableIndications};
}

#endif
