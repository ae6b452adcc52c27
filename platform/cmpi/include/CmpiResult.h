// CmpiResult - a handle on the CMPIResult of a request.  Each call throws
// the broker's status on failure.
#ifndef CMPI_CPP_CMPIRESULT_H
#define CMPI_CPP_CMPIRESULT_H

#include "CmpiData.h"
#include "CmpiInstance.h"
#include "CmpiObject.h"
#include "CmpiObjectPath.h"

class CmpiResult : public CmpiObject {
public:
    explicit CmpiResult(CMPIResult* enc) : CmpiObject(enc) {}
    explicit CmpiResult(const CMPIResult* enc) : CmpiObject(enc) {}

    CMPIResult* getEnc() const { return static_cast<CMPIResult*>(enc_); }

    // A value, such as the return value of a method.
    void returnData(const CmpiData& d);
    void returnData(const CmpiInstance& inst);
    void returnData(const CmpiObjectPath& op);
    void returnDone();
};

#endif
