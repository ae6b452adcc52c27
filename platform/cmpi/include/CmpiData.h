// CmpiData - one typed CMPI value (property, key, argument, array element
// or method result).
//
// Construction picks the CMPI type from the C++ type.  Conversions check
// the type and throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH) on a mismatch:
//   - unsigned char accepts uint8 and boolean; unsigned short accepts
//     uint16 and char16; the other numeric conversions need their own type;
//   - const char* and CmpiString accept string (const char* also chars);
//   - CmpiObjectPath, CmpiInstance, CmpiDateTime need ref, instance,
//     dateTime; CmpiArray needs an array type.
// A null value (isNullValue()) converts to a null handle or nullptr for
// every handle type, and to an empty CmpiArray (size 0), without throwing,
// whatever its type; numeric conversions of a null value still check the
// type.
//
// CmpiData(const char*) copies the text at once, so the caller's buffer may
// be reused right after; its type is CMPI_chars until it reaches the
// broker, which receives it as a CMPI_string.
#ifndef CMPI_CPP_CMPIDATA_H
#define CMPI_CPP_CMPIDATA_H

#include "cmpift.h"

#include <memory>
#include <string>
#include <type_traits>

class CmpiString;
class CmpiObjectPath;
class CmpiInstance;
class CmpiDateTime;
class CmpiArray;

class CmpiData {
public:
    // A null value of type CMPI_null.
    CmpiData();
    explicit CmpiData(const CMPIData& data);

    CmpiData(CMPISint8 d);
    CmpiData(CMPISint16 d);
    CmpiData(CMPISint32 d);
    CmpiData(CMPISint64 d);
    CmpiData(long d);           // as sint64
    CmpiData(CMPIUint8 d);
    CmpiData(CMPIUint16 d);
    CmpiData(CMPIUint32 d);
    CmpiData(CMPIUint64 d);
    CmpiData(unsigned long d);  // as uint64
    CmpiData(CMPIReal32 d);
    CmpiData(CMPIReal64 d);
    // boolean; a template so that only a real bool (not a pointer or an
    // integer) selects it.
    template <class B, typename std::enable_if<std::is_same<B, bool>::value, int>::type = 0>
    CmpiData(B b) { setBoolean(b); }
    // A null pointer gives a null CMPI_chars value.
    CmpiData(const char* d);
    // A CMPI_chars value that points at `d` instead of holding a copy: for a
    // text that outlives every use of the value (a constant, or a field of an
    // entry that stays put while an instance is built from it).
    static CmpiData borrowedChars(const char* d);
    CmpiData(const std::string& d);
    CmpiData(const CmpiString& d);
    CmpiData(const CmpiObjectPath& d);
    CmpiData(const CmpiInstance& d);
    CmpiData(const CmpiDateTime& d);
    // Type is the array's element type | CMPI_ARRAY; a null array gives a
    // null value.
    CmpiData(const CmpiArray& d);

    operator CmpiString() const;
    operator const char*() const;
    operator CmpiDateTime() const;
    operator CmpiObjectPath() const;
    operator CmpiInstance() const;
    operator CmpiArray() const;
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

    CMPIType getType() const { return data_.type; }
    CMPIValueState getState() const { return data_.state; }
    bool isNullValue() const { return (data_.state & CMPI_nullValue) != 0; }
    bool isNotFound() const { return (data_.state & CMPI_notFound) != 0; }
    bool isKey() const { return (data_.state & CMPI_keyValue) != 0; }
    bool isArray() const { return (data_.type & CMPI_ARRAY) != 0; }

    // The raw value.  (A CMPI_chars value is handed to the broker as a
    // CMPIString made by the broker's string factory, so that no broker
    // has to agree on how a CMPI_chars CMPIValue is laid out.)
    const CMPIData& getEnc() const { return data_; }

private:
    friend class CmpiCharData;
    void setBoolean(bool b);
    void set(CMPIType type);
    void typeMismatch() const;

    CMPIData data_;
    std::shared_ptr<const std::string> chars_;
};

// Values that the C++ type alone cannot tell apart from uint8 / uint16.
class CmpiBooleanData : public CmpiData {
public:
    explicit CmpiBooleanData(CMPIBoolean b);
};

class CmpiCharData : public CmpiData {
public:
    explicit CmpiCharData(CMPIChar16 c);
};

extern const CmpiBooleanData CmpiTrue;
extern const CmpiBooleanData CmpiFalse;

#endif
