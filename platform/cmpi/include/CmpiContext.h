// CmpiContext - a handle on a CMPIContext.
#ifndef CMPI_CPP_CMPICONTEXT_H
#define CMPI_CPP_CMPICONTEXT_H

#include "CmpiData.h"
#include "CmpiObject.h"

class CmpiContext : public CmpiObject {
public:
    CmpiContext() {}
    explicit CmpiContext(CMPIContext* enc) : CmpiObject(enc) {}
    explicit CmpiContext(const CMPIContext* enc) : CmpiObject(enc) {}

    CMPIContext* getEnc() const { return static_cast<CMPIContext*>(enc_); }

    // The entry, or a null CmpiData marked isNotFound() when absent.
    CmpiData getEntry(const char* name) const;

    static const char* const invocationFlags;
};

#endif
