// CmpiStatus, CmpiString, CmpiObject and the shared helpers.
#include "CmpiInternal.h"
#include "CmpiObject.h"
#include "CmpiProviderBase.h"
#include "CmpiStatus.h"
#include "CmpiString.h"

#include <cstring>
#include <strings.h>

namespace cmpi_impl {

const CMPIBroker* requireBroker()
{
    const CMPIBroker* mb = CmpiProviderBase::getBroker();
    if (mb == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_FAILED, "no CMPI broker");
    return mb;
}

void check(const CMPIStatus& st, const char* what)
{
    if (st.rc == CMPI_RC_OK)
        return;
    if (st.msg == nullptr && what != nullptr)
        throw CmpiStatus(st.rc, what);
    throw CmpiStatus(st);
}

CMPIData notFoundData()
{
    CMPIData d;
    d.type = CMPI_null;
    d.state = CMPI_nullValue | CMPI_notFound;
    d.value.uint64 = 0;
    return d;
}

CValue::CValue(const CmpiData& d) : ptr(nullptr), type(d.getType())
{
    value = d.getEnc().value;
    if (type == CMPI_chars) {
        type = CMPI_string;
        if (d.isNullValue())
            return;
        const CMPIBroker* mb = requireBroker();
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        value.string = mb->eft->newString(mb, d.getEnc().value.chars, &rc);
        check(rc);
        if (value.string == nullptr)
            throw CmpiStatus(CMPI_RC_ERR_FAILED, "newString returned no string");
        ptr = &value;
        return;
    }
    if (!d.isNullValue())
        ptr = &value;
}

} // namespace cmpi_impl

// ---- CmpiStatus -----------------------------------------------------------

CmpiStatus::CmpiStatus() : rc_(CMPI_RC_OK), hasMsg_(false) {}

CmpiStatus::CmpiStatus(CMPIrc rc) : rc_(rc), hasMsg_(false) {}

CmpiStatus::CmpiStatus(CMPIrc rc, const char* msg)
    : rc_(rc), hasMsg_(msg != nullptr), msg_(msg != nullptr ? msg : "")
{
}

CmpiStatus::CmpiStatus(CMPIrc rc, const std::string& msg) : rc_(rc), hasMsg_(true), msg_(msg) {}

CmpiStatus::CmpiStatus(const CMPIStatus& st) : rc_(st.rc), hasMsg_(false)
{
    if (st.msg != nullptr && st.msg->ft != nullptr && st.msg->ft->getCharPtr != nullptr) {
        const char* text = st.msg->ft->getCharPtr(st.msg, nullptr);
        if (text != nullptr) {
            msg_ = text;
            hasMsg_ = true;
        }
    }
}

CMPIStatus CmpiStatus::status(const CMPIBroker* mb) const noexcept
{
    CMPIStatus st;
    st.rc = rc_;
    st.msg = nullptr;
    if (hasMsg_ && mb != nullptr && mb->eft != nullptr && mb->eft->newString != nullptr)
        st.msg = mb->eft->newString(mb, msg_.c_str(), nullptr);
    return st;
}

CMPIStatus CmpiStatus::status() const noexcept
{
    return status(CmpiProviderBase::getBroker());
}

// ---- CmpiString -----------------------------------------------------------

const char* CmpiString::charPtr() const
{
    if (enc_ == nullptr)
        return nullptr;
    return enc_->ft->getCharPtr(enc_, nullptr);
}

bool CmpiString::equals(const char* str) const
{
    const char* mine = charPtr();
    return mine != nullptr && str != nullptr && std::strcmp(mine, str) == 0;
}

bool CmpiString::equals(const CmpiString& str) const
{
    return equals(str.charPtr());
}

bool CmpiString::equalsIgnoreCase(const char* str) const
{
    const char* mine = charPtr();
    return mine != nullptr && str != nullptr && strcasecmp(mine, str) == 0;
}

bool CmpiString::equalsIgnoreCase(const CmpiString& str) const
{
    return equalsIgnoreCase(str.charPtr());
}

// ---- CmpiObject -----------------------------------------------------------

void* CmpiObject::requireEnc() const
{
    if (enc_ == nullptr)
        throw CmpiStatus(CMPI_RC_ERR_INVALID_HANDLE, "null CMPI object");
    return enc_;
}
