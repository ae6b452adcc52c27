// CmpiSelectExp - a handle on the CMPISelectExp of an indication filter.
#ifndef CMPI_CPP_CMPISELECTEXP_H
#define CMPI_CPP_CMPISELECTEXP_H

#include "CmpiObject.h"
#include "CmpiString.h"

class CmpiSelectExp : public CmpiObject {
public:
    explicit CmpiSelectExp(const CMPISelectExp* enc) : CmpiObject(enc) {}

    CMPISelectExp* getEnc() const { return static_cast<CMPISelectExp*>(enc_); }
    // The query text.
    CmpiString getString() const;
};

#endif
