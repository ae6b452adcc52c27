// CmpiBroker - a handle on the server's CMPIBroker.  Each up-call throws
// the broker's status on failure; prepareAttachThread throws
// CMPI_RC_ERR_FAILED when the broker returns no context.
#ifndef CMPI_CPP_CMPIBROKER_H
#define CMPI_CPP_CMPIBROKER_H

#include "CmpiContext.h"
#include "CmpiInstance.h"
#include "CmpiObject.h"
#include "CmpiString.h"

class CmpiBroker : public CmpiObject {
public:
    explicit CmpiBroker(const CMPIBroker* mb) : CmpiObject(mb) {}

    const CMPIBroker* getEnc() const { return static_cast<const CMPIBroker*>(enc_); }

    // A context for a thread of the provider's own; hand it to
    // attachThread on that thread.
    CmpiContext prepareAttachThread(const CmpiContext& ctx);
    void attachThread(const CmpiContext& ctx);
    void detachThread(const CmpiContext& ctx);
    void deliverIndication(const CmpiContext& ctx, const char* ns, const CmpiInstance& ind);

    // Factories.
    CmpiString newString(const char* text) const;
    CmpiObjectPath newObjectPath(const char* ns, const char* cls) const;
    CmpiInstance newInstance(const CmpiObjectPath& op) const;
    bool classPathIsA(const CmpiObjectPath& op, const char* className) const;
};

#endif
