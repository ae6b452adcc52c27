// CmpiArgs - a handle on the CMPIArgs of a method call.
//
// getArg of an argument that was not given returns a null CmpiData marked
// isNotFound() and does not throw; so
//     const char* uri = in.getArg("URI");     // nullptr when absent
//     CmpiArray opts = in.getArg("Options");  // size 0 when absent
// Other broker failures throw.  setArg throws the broker's status.
#ifndef CMPI_CPP_CMPIARGS_H
#define CMPI_CPP_CMPIARGS_H

#include "CmpiData.h"
#include "CmpiObject.h"
#include "CmpiString.h"

class CmpiArgs : public CmpiObject {
public:
    // A new, empty argument list made by the broker.
    CmpiArgs();
    explicit CmpiArgs(CMPIArgs* enc) : CmpiObject(enc) {}
    explicit CmpiArgs(const CMPIArgs* enc) : CmpiObject(enc) {}

    CMPIArgs* getEnc() const { return static_cast<CMPIArgs*>(enc_); }

    unsigned int getArgCount() const;
    CmpiData getArg(const char* name) const;
    CmpiData getArg(int index, CmpiString* name = nullptr) const;
    void setArg(const char* name, const CmpiData& data);
};

#endif
