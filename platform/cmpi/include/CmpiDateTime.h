// CmpiDateTime - a handle on a CMPIDateTime made by the broker.
#ifndef CMPI_CPP_CMPIDATETIME_H
#define CMPI_CPP_CMPIDATETIME_H

#include "CmpiObject.h"
#include "CmpiString.h"

class CmpiDateTime : public CmpiObject {
public:
    // The current time.
    CmpiDateTime();
    explicit CmpiDateTime(const CMPIDateTime* enc) : CmpiObject(enc) {}
    // From CIM datetime text: "yyyymmddhhmmss.mmmmmmsutc" (absolute) or
    // "ddddddddhhmmss.mmmmmm:000" (interval).
    explicit CmpiDateTime(const char* text);
    // From microseconds since 1970-01-01 UTC, or an interval length in
    // microseconds.
    CmpiDateTime(CMPIUint64 binTime, bool interval);

    CMPIDateTime* getEnc() const { return static_cast<CMPIDateTime*>(enc_); }
    bool isInterval() const;
    // Microseconds, as given to the binary constructor.
    CMPIUint64 getDateTime() const;
    CmpiString getStringFormat() const;
};

#endif
