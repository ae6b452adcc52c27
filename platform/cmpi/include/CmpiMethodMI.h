// CmpiMethodMI - extrinsic method provider operation.  The default returns
// CMPI_RC_ERR_NOT_SUPPORTED.
#ifndef CMPI_CPP_CMPIMETHODMI_H
#define CMPI_CPP_CMPIMETHODMI_H

#include "CmpiArgs.h"
#include "CmpiBaseMI.h"
#include "CmpiContext.h"
#include "CmpiObjectPath.h"
#include "CmpiResult.h"
#include "CmpiStatus.h"

class CmpiMethodMI : virtual public CmpiBaseMI {
public:
    CmpiMethodMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    static CMPIStatus driveInvokeMethod(CMPIMethodMI* mi, const CMPIContext* eCtx,
                                        const CMPIResult* eRslt, const CMPIObjectPath* eCop,
                                        const char* methodName, const CMPIArgs* eIn,
                                        CMPIArgs* eOut);

    virtual CmpiStatus invokeMethod(const CmpiContext& ctx, CmpiResult& rslt,
                                    const CmpiObjectPath& ref, const char* methodName,
                                    const CmpiArgs& in, CmpiArgs& out);
};

// The CMPI 2.0 function table of a method MI named miName: cleanup and every
// operation go to the drivers above.  A provider library defines its table
// with it, e.g. `CMPIMethodMIFT ft = cmpiMethodMIFT("...");`.
constexpr CMPIMethodMIFT cmpiMethodMIFT(const char* miName)
{
    return {200, 200, miName, CmpiBaseMI::driveBaseCleanup,
            CmpiMethodMI::driveInvokeMethod};
}

#endif
