// CmpiString - a handle on a CMPIString owned by the broker.
#ifndef CMPI_CPP_CMPISTRING_H
#define CMPI_CPP_CMPISTRING_H

#include "cmpift.h"

class CmpiString {
public:
    // A null string: charPtr() is nullptr, equals() is false.
    CmpiString() : enc_(nullptr) {}
    explicit CmpiString(CMPIString* s) : enc_(s) {}

    CMPIString* getEnc() const { return enc_; }
    bool isNull() const { return enc_ == nullptr; }

    // The text, or nullptr for a null string.
    const char* charPtr() const;
    bool equals(const char* str) const;
    bool equals(const CmpiString& str) const;
    bool equalsIgnoreCase(const char* str) const;
    bool equalsIgnoreCase(const CmpiString& str) const;

private:
    CMPIString* enc_;
};

#endif
