// CmpiObject - common part of the handle classes: the encapsulated CMPI
// object.  Handles are shallow: copying one copies the pointer, and the
// object itself belongs to the broker.
#ifndef CMPI_CPP_CMPIOBJECT_H
#define CMPI_CPP_CMPIOBJECT_H

#include "cmpift.h"

class CmpiObject {
public:
    bool isNull() const { return enc_ == nullptr; }

protected:
    CmpiObject() : enc_(nullptr) {}
    explicit CmpiObject(const void* enc) : enc_(const_cast<void*>(enc)) {}
    // Throws CmpiStatus(CMPI_RC_ERR_INVALID_HANDLE) for a null handle.
    void* requireEnc() const;

    void* enc_;
};

typedef CMPIBoolean CmpiBoolean;

#endif
