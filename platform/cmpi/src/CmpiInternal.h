// Helpers shared by the wrapper's sources; not part of the interface.
#ifndef CMPI_CPP_INTERNAL_H
#define CMPI_CPP_INTERNAL_H

#include "CmpiData.h"
#include "CmpiStatus.h"
#include "cmpift.h"

namespace cmpi_impl {

// The process-wide broker; throws CMPI_RC_ERR_FAILED when there is none.
const CMPIBroker* requireBroker();

// Throws the status when it is not CMPI_RC_OK.  When the broker gave no
// message, `what` (a key, property or class name) becomes the message.
void check(const CMPIStatus& st, const char* what = nullptr);

// A CMPIData that stands for "absent": null value, type CMPI_null.
CMPIData notFoundData();

// True for the codes that mean "no such key, property or argument".
inline bool isAbsent(CMPIrc rc)
{
    return rc == CMPI_RC_ERR_NOT_FOUND || rc == CMPI_RC_ERR_NO_SUCH_PROPERTY;
}

// A CmpiData as the arguments (value pointer, type) of a broker call:
// NULL for a null value; CMPI_chars text turned into a CMPIString by the
// process's broker, so the call sees CMPI_string.
struct CValue {
    explicit CValue(const CmpiData& d);
    CMPIValue value;
    const CMPIValue* ptr;
    CMPIType type;
};

} // namespace cmpi_impl

#endif
