// CmpiAssociationMI - association provider operations.  Every default
// operation returns CMPI_RC_ERR_NOT_SUPPORTED.
#ifndef CMPI_CPP_CMPIASSOCIATIONMI_H
#define CMPI_CPP_CMPIASSOCIATIONMI_H

#include "CmpiBaseMI.h"
#include "CmpiContext.h"
#include "CmpiObjectPath.h"
#include "CmpiResult.h"
#include "CmpiStatus.h"

class CmpiAssociationMI : virtual public CmpiBaseMI {
public:
    CmpiAssociationMI(const CmpiBroker& mbp, const CmpiContext& ctx);

    static CMPIStatus driveAssociators(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                       const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                       const char* assocClass, const char* resultClass,
                                       const char* role, const char* resultRole,
                                       const char** properties);
    static CMPIStatus driveAssociatorNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                           const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                           const char* assocClass, const char* resultClass,
                                           const char* role, const char* resultRole);
    static CMPIStatus driveReferences(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                      const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                      const char* resultClass, const char* role,
                                      const char** properties);
    static CMPIStatus driveReferenceNames(CMPIAssociationMI* mi, const CMPIContext* eCtx,
                                          const CMPIResult* eRslt, const CMPIObjectPath* eOp,
                                          const char* resultClass, const char* role);

    virtual CmpiStatus associators(const CmpiContext& ctx, CmpiResult& rslt,
                                   const CmpiObjectPath& op, const char* assocClass,
                                   const char* resultClass, const char* role,
                                   const char* resultRole, const char** properties);
    virtual CmpiStatus associatorNames(const CmpiContext& ctx, CmpiResult& rslt,
                                       const CmpiObjectPath& op, const char* assocClass,
                                       const char* resultClass, const char* role,
                                       const char* resultRole);
    virtual CmpiStatus references(const CmpiContext& ctx, CmpiResult& rslt,
                                  const CmpiObjectPath& op, const char* resultClass,
                                  const char* role, const char** properties);
    virtual CmpiStatus referenceNames(const CmpiContext& ctx, CmpiResult& rslt,
                                      const CmpiObjectPath& op, const char* resultClass,
                                      const char* role);
};

// The CMPI 2.0 function table of an association MI named miName: cleanup and every
// operation go to the drivers above.  A provider library defines its table
// with it, e.g. `CMPIAssociationMIFT ft = cmpiAssociationMIFT("...");`.
constexpr CMPIAssociationMIFT cmpiAssociationMIFT(const char* miName)
{
    return {200, 200, miName, CmpiBaseMI::driveBaseCleanup,
            CmpiAssociationMI::driveAssociators,
            CmpiAssociationMI::driveAssociatorNames,
            CmpiAssociationMI::driveReferences,
            CmpiAssociationMI::driveReferenceNames};
}

#endif
