// CmpiBaseMI - the part that every provider object has once, whatever MI
// types it serves (the MI classes derive from it virtually).  It carries
// the broker and the link to the library's CmpiProviderBase.
//
// driveBaseCleanup is the cleanup entry of every MI function table; it is
// overloaded for the four table types so that the plain name fits each.
// Its rules:
//   - An MI whose handle is null (never made, or the object already gone)
//     gets CMPI_RC_OK and nothing happens.
//   - terminating false and isUnloadable() false: CMPI_RC_DO_NOT_UNLOAD,
//     nothing else changes.  With terminating true the cleanup goes on.
//   - Otherwise the use count of the provider base goes down by one: once
//     per MI structure attached with CmpiProviderBase::attachMI (a further
//     cleanup of it in the same life changes nothing), and for every
//     cleanup of an MI counted with incUseCount.  When the count
//     reaches 0 the base and the handles of all MI structures cleaned up
//     are cleared, cleanup(ctx) runs, the provider object is deleted and
//     cleanup's status is returned.
//   - A provider object that was never linked to a base is left alone.
// No exception leaves a driver: a thrown CmpiStatus becomes the returned
// status (its message made by the broker's string factory), anything else
// becomes CMPI_RC_ERR_FAILED (with what() as message for std::exception).
#ifndef CMPI_CPP_CMPIBASEMI_H
#define CMPI_CPP_CMPIBASEMI_H

#include "CmpiBroker.h"
#include "CmpiContext.h"
#include "CmpiProviderBase.h"
#include "CmpiStatus.h"
#include "cmpift.h"

class CmpiBaseMI {
public:
    CmpiBaseMI(const CmpiBroker& mbp, const CmpiContext& ctx);
    virtual ~CmpiBaseMI();
    CmpiBaseMI(const CmpiBaseMI&) = delete;
    CmpiBaseMI& operator=(const CmpiBaseMI&) = delete;

    void setProviderBase(CmpiProviderBase* base);
    CmpiProviderBase* getProviderBase() const { return providerBase; }
    CmpiBroker* getBroker() const { return broker; }

    static CMPIStatus driveBaseCleanup(CMPIInstanceMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating);
    static CMPIStatus driveBaseCleanup(CMPIAssociationMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating);
    static CMPIStatus driveBaseCleanup(CMPIMethodMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating);
    static CMPIStatus driveBaseCleanup(CMPIIndicationMI* mi, const CMPIContext* eCtx, CMPIBoolean terminating);

    // Default: success.
    virtual CmpiStatus initialize(const CmpiContext& ctx);
    // Default: success.
    virtual CmpiStatus cleanup(CmpiContext& ctx);
    // Default: true.
    virtual bool isUnloadable() const;

protected:
    CmpiBroker* broker;

private:
    static CMPIStatus cleanupMI(void* mi, const void* hdl, const CMPIContext* eCtx,
                                CMPIBoolean terminating) noexcept;

    CmpiProviderBase* providerBase;
};

#endif
