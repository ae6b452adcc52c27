// CmpiData, CmpiArray and CmpiArrayIdx.
#include "CmpiArray.h"
#include "CmpiData.h"
#include "CmpiDateTime.h"
#include "CmpiInstance.h"
#include "CmpiInternal.h"
#include "CmpiObjectPath.h"
#include "CmpiStatus.h"
#include "CmpiString.h"

using cmpi_impl::check;

const CmpiBooleanData CmpiTrue(1);
const CmpiBooleanData CmpiFalse(0);

CmpiBooleanData::CmpiBooleanData(CMPIBoolean b) : CmpiData(b != 0) {}

CmpiCharData::CmpiCharData(CMPIChar16 c) : CmpiData(c)
{
    // Same bits as uint16; only the type code differs.
    data_.type = CMPI_char16;
}

// ---- construction ---------------------------------------------------------

CmpiData::CmpiData()
{
    data_.type = CMPI_null;
    data_.state = CMPI_nullValue;
    data_.value.uint64 = 0;
}

CmpiData::CmpiData(const CMPIData& data) : data_(data) {}

void CmpiData::set(CMPIType type)
{
    data_.type = type;
    data_.state = CMPI_goodValue;
}

#define CMPI_DATA_SCALAR_CTOR(CType, member, code)  \
    CmpiData::CmpiData(CType d)                     \
    {                                               \
        data_.value.uint64 = 0;                     \
        data_.value.member = d;                     \
        set(code);                                  \
    }

CMPI_DATA_SCALAR_CTOR(CMPISint8, sint8, CMPI_sint8)
CMPI_DATA_SCALAR_CTOR(CMPISint16, sint16, CMPI_sint16)
CMPI_DATA_SCALAR_CTOR(CMPISint32, sint32, CMPI_sint32)
CMPI_DATA_SCALAR_CTOR(CMPISint64, sint64, CMPI_sint64)
CMPI_DATA_SCALAR_CTOR(long, sint64, CMPI_sint64)
CMPI_DATA_SCALAR_CTOR(CMPIUint8, uint8, CMPI_uint8)
CMPI_DATA_SCALAR_CTOR(CMPIUint16, uint16, CMPI_uint16)
CMPI_DATA_SCALAR_CTOR(CMPIUint32, uint32, CMPI_uint32)
CMPI_DATA_SCALAR_CTOR(CMPIUint64, uint64, CMPI_uint64)
CMPI_DATA_SCALAR_CTOR(unsigned long, uint64, CMPI_uint64)
CMPI_DATA_SCALAR_CTOR(CMPIReal32, real32, CMPI_real32)
CMPI_DATA_SCALAR_CTOR(CMPIReal64, real64, CMPI_real64)

#undef CMPI_DATA_SCALAR_CTOR

void CmpiData::setBoolean(bool b)
{
    data_.value.uint64 = 0;
    data_.value.boolean = b ? 1 : 0;
    set(CMPI_boolean);
}

CmpiData::CmpiData(const char* d)
{
    data_.value.uint64 = 0;
    set(CMPI_chars);
    if (d == nullptr) {
        data_.state = CMPI_nullValue;
        return;
    }
    chars_ = std::make_shared<const std::string>(d);
    data_.value.chars = const_cast<char*>(chars_->c_str());
}

CmpiData CmpiData::borrowedChars(const char* d)
{
    CmpiData data(static_cast<const char*>(nullptr));
    if (d != nullptr) {
        data.data_.state = CMPI_goodValue;
        data.data_.value.chars = const_cast<char*>(d);
    }
    return data;
}

CmpiData::CmpiData(const std::string& d) : CmpiData(d.c_str()) {}

// Handle values: a null handle gives a null value of the same type.
#define CMPI_DATA_HANDLE_CTOR(Class, member, code)                         \
    CmpiData::CmpiData(const Class& d)                                     \
    {                                                                      \
        data_.value.uint64 = 0;                                            \
        data_.value.member = d.getEnc();                                   \
        set(code);                                                         \
        if (d.getEnc() == nullptr)                                         \
            data_.state = CMPI_nullValue;                                  \
    }

CMPI_DATA_HANDLE_CTOR(CmpiString, string, CMPI_string)
CMPI_DATA_HANDLE_CTOR(CmpiObjectPath, ref, CMPI_ref)
CMPI_DATA_HANDLE_CTOR(CmpiInstance, inst, CMPI_instance)
CMPI_DATA_HANDLE_CTOR(CmpiDateTime, dateTime, CMPI_dateTime)

#undef CMPI_DATA_HANDLE_CTOR

CmpiData::CmpiData(const CmpiArray& d)
{
    data_.value.uint64 = 0;
    data_.value.array = d.getEnc();
    if (d.getEnc() == nullptr) {
        data_.type = CMPI_ARRAY;
        data_.state = CMPI_nullValue;
        return;
    }
    set(static_cast<CMPIType>(d.getType() | CMPI_ARRAY));
}

// ---- conversion -----------------------------------------------------------

void CmpiData::typeMismatch() const
{
    throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
}

// Handle values: a null value gives a wrapper of no handle, another type a
// type mismatch.
#define CMPI_DATA_HANDLE_CONV(Class, member, code)                          \
    CmpiData::operator Class() const                                        \
    {                                                                       \
        if (isNullValue())                                                  \
            return Class(static_cast<decltype(data_.value.member)>(nullptr)); \
        if (data_.type != (code))                                           \
            typeMismatch();                                                 \
        return Class(data_.value.member);                                   \
    }

CMPI_DATA_HANDLE_CONV(CmpiString, string, CMPI_string)
CMPI_DATA_HANDLE_CONV(CmpiDateTime, dateTime, CMPI_dateTime)
CMPI_DATA_HANDLE_CONV(CmpiObjectPath, ref, CMPI_ref)
CMPI_DATA_HANDLE_CONV(CmpiInstance, inst, CMPI_instance)

#undef CMPI_DATA_HANDLE_CONV

CmpiData::operator const char*() const
{
    if (isNullValue())
        return nullptr;
    if (data_.type == CMPI_chars)
        return data_.value.chars;
    if (data_.type != CMPI_string)
        typeMismatch();
    return CmpiString(data_.value.string).charPtr();
}

CmpiData::operator CmpiArray() const
{
    if (isNullValue())
        return CmpiArray();
    if ((data_.type & CMPI_ARRAY) == 0)
        typeMismatch();
    return CmpiArray(data_.value.array);
}

#define CMPI_DATA_SCALAR_CONV(CType, member, code) \
    CmpiData::operator CType() const               \
    {                                              \
        if (data_.type != (code))                  \
            typeMismatch();                        \
        return data_.value.member;                 \
    }

CMPI_DATA_SCALAR_CONV(CMPISint8, sint8, CMPI_sint8)
CMPI_DATA_SCALAR_CONV(CMPISint16, sint16, CMPI_sint16)
CMPI_DATA_SCALAR_CONV(CMPISint32, sint32, CMPI_sint32)
CMPI_DATA_SCALAR_CONV(CMPISint64, sint64, CMPI_sint64)
CMPI_DATA_SCALAR_CONV(CMPIUint32, uint32, CMPI_uint32)
CMPI_DATA_SCALAR_CONV(CMPIUint64, uint64, CMPI_uint64)
CMPI_DATA_SCALAR_CONV(CMPIReal32, real32, CMPI_real32)
CMPI_DATA_SCALAR_CONV(CMPIReal64, real64, CMPI_real64)

#undef CMPI_DATA_SCALAR_CONV

CmpiData::operator unsigned char() const
{
    if (data_.type == CMPI_uint8)
        return data_.value.uint8;
    if (data_.type == CMPI_boolean)
        return data_.value.boolean;
    typeMismatch();
    return 0;
}

CmpiData::operator unsigned short() const
{
    if (data_.type == CMPI_uint16)
        return data_.value.uint16;
    if (data_.type == CMPI_char16)
        return data_.value.char16;
    typeMismatch();
    return 0;
}

// ---- CmpiArray ------------------------------------------------------------

CmpiArray::CmpiArray(CMPICount max, CMPIType type)
{
    const CMPIBroker* mb = cmpi_impl::requireBroker();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIArray* arr = mb->eft->newArray(mb, max, static_cast<CMPIType>(type & ~CMPI_ARRAY), &rc);
    check(rc);
    if (arr == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_FAILED, "newArray returned no array");
    enc_ = arr;
}

CMPICount CmpiArray::size() const
{
    if (enc_ == nullptr)
        return 0;
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPICount n = getEnc()->ft->getSize(getEnc(), &rc);
    check(rc);
    return n;
}

CMPIType CmpiArray::getType() const
{
    CMPIArray* arr = static_cast<CMPIArray*>(requireEnc());
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIType t = arr->ft->getSimpleType(arr, &rc);
    check(rc);
    return static_cast<CMPIType>(t & ~CMPI_ARRAY);
}

void CmpiArray::setUint8Elements(const CMPIUint8* bytes, CMPICount count)
{
    CMPIArray* arr = static_cast<CMPIArray*>(requireEnc());
    if (count > 0 && getType() != CMPI_uint8)
        throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
    for (CMPICount i = 0; i < count; ++i) {
        CMPIValue v;
        v.uint64 = 0;
        v.uint8 = bytes[i];
        check(arr->ft->setElementAt(arr, i, &v, CMPI_uint8));
    }
}

CmpiArrayIdx CmpiArray::operator[](int idx) const
{
    return CmpiArrayIdx(static_cast<CMPIArray*>(requireEnc()), idx);
}

CmpiArrayIdx& CmpiArrayIdx::operator=(const CmpiData& value)
{
    if (idx_ < 0)
        throw CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, "negative array index");
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIType element = static_cast<CMPIType>(arr_->ft->getSimpleType(arr_, &rc) & ~CMPI_ARRAY);
    check(rc);
    CMPIType given = value.getType();
    bool fits = given == element || (element == CMPI_string && given == CMPI_chars);
    if (!fits)
        throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH);
    cmpi_impl::CValue c(value);
    check(arr_->ft->setElementAt(arr_, static_cast<CMPICount>(idx_), c.ptr, c.type));
    return *this;
}

CmpiData CmpiArrayIdx::getData() const
{
    if (idx_ < 0)
        throw CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, "negative array index");
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData d = arr_->ft->getElementAt(arr_, static_cast<CMPICount>(idx_), &rc);
    check(rc);
    return CmpiData(d);
}

#define CMPI_ARRAYIDX_CONV(Type)          \
    CmpiArrayIdx::operator Type() const   \
    {                                     \
        return getData();                 \
    }

CMPI_ARRAYIDX_CONV(CmpiString)
CMPI_ARRAYIDX_CONV(CmpiDateTime)
CMPI_ARRAYIDX_CONV(CmpiInstance)
CMPI_ARRAYIDX_CONV(CmpiObjectPath)
CMPI_ARRAYIDX_CONV(CMPISint8)
CMPI_ARRAYIDX_CONV(CMPISint16)
CMPI_ARRAYIDX_CONV(CMPISint32)
CMPI_ARRAYIDX_CONV(CMPISint64)
CMPI_ARRAYIDX_CONV(unsigned char)
CMPI_ARRAYIDX_CONV(unsigned short)
CMPI_ARRAYIDX_CONV(CMPIUint32)
CMPI_ARRAYIDX_CONV(CMPIUint64)
CMPI_ARRAYIDX_CONV(CMPIReal32)
CMPI_ARRAYIDX_CONV(CMPIReal64)

#undef CMPI_ARRAYIDX_CONV

CmpiArrayIdx::operator const char*() const
{
    // The text lives in the broker's array element, not in the temporary.
    return getData();
}
