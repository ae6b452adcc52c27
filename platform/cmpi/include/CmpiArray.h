// CmpiArray - a handle on a CMPIArray; CmpiArrayIdx - one element of it.
//
//   CmpiArray a(2, CMPI_uint16);
//   a[0] = CmpiData(CMPIUint16(5));
//   CMPIUint16 v = a[0];
//
// Assigning an element checks that the value's type is the array's element
// type (a CMPI_chars value is accepted by a string array) and throws
// CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH) otherwise.  A negative index throws
// CMPI_RC_ERR_INVALID_PARAMETER; an index past the end throws the broker's
// status.  A null array (default-constructed, or converted from a null
// value) has size 0.
#ifndef CMPI_CPP_CMPIARRAY_H
#define CMPI_CPP_CMPIARRAY_H

#include "CmpiData.h"
#include "CmpiObject.h"
#include "CmpiString.h"

class CmpiArray;

class CmpiArrayIdx {
public:
    CmpiArrayIdx& operator=(const CmpiData& value);
    CmpiData getData() const;

    operator CmpiString() const;
    operator const char*() const;
    operator CmpiDateTime() const;
    operator CmpiInstance() const;
    operator CmpiObjectPath() const;
    operator CMPISint8() const;
    operator CMPISint16() const;
    operator CMPISint32() const;
    operator CMPISint64() const;
    operator unsigned char() const;
    operator unsigned short() const;
    operator CMPIUint32() const;
    operator CMPIUint64() const;
    operator CMPIReal32() const;
    operator CMPIReal64() const;

private:
    friend class CmpiArray;
    CmpiArrayIdx(CMPIArray* arr, int idx) : arr_(arr), idx_(idx) {}
    CMPIArray* arr_;
    int idx_;
};

class CmpiArray : public CmpiObject {
public:
    // A null array.
    CmpiArray() {}
    // A new array of max elements of the given element type (the array
    // flag may be given or not), made by the broker.
    CmpiArray(CMPICount max, CMPIType type);
    explicit CmpiArray(CMPIArray* arr) : CmpiObject(arr) {}

    CMPIArray* getEnc() const { return static_cast<CMPIArray*>(enc_); }
    // Number of elements; 0 for a null array.
    CMPICount size() const;
    // Element type, without the array flag.
    CMPIType getType() const;
    CmpiArrayIdx operator[](int idx) const;
    // Sets elements 0..count-1 of a uint8 array from `bytes`, as element by
    // element assignment would, with the element type checked once.
    void setUint8Elements(const CMPIUint8* bytes, CMPICount count);
};

#endif
