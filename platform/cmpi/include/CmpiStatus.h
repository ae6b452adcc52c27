// CmpiStatus - the outcome of a CMPI operation, as a value and as the
// exception that provider code throws to end a request.
//
// The message is kept as text of our own: a status can be made and thrown
// on any thread, with or without a broker.  Only when a driver hands the
// status back to the server is the text turned into a CMPIString, through
// the broker's string factory (see status()).
#ifndef CMPI_CPP_CMPISTATUS_H
#define CMPI_CPP_CMPISTATUS_H

#include "cmpift.h"

#include <string>

class CmpiStatus {
public:
    // CMPI_RC_OK without a message.
    CmpiStatus();
    CmpiStatus(CMPIrc rc);
    // A null msg is the same as no message.  (A CmpiData of string type
    // converts to const char*, so a key value can be given directly.)
    CmpiStatus(CMPIrc rc, const char* msg);
    CmpiStatus(CMPIrc rc, const std::string& msg);
    // Copies rc and the text of st.msg (if any).
    CmpiStatus(const CMPIStatus& st);

    CMPIrc rc() const { return rc_; }
    // The message text; "" when the status has none (hasMsg() tells the
    // two apart), so that it can always be printed.
    const char* msg() const { return msg_.c_str(); }
    bool hasMsg() const { return hasMsg_; }

    // The C form for the server.  The message is created with mb's
    // newString; with mb null (or a failing factory) msg is NULL.  Never
    // throws.
    CMPIStatus status(const CMPIBroker* mb) const noexcept;
    // The same through the process-wide broker (CmpiProviderBase::getBroker).
    CMPIStatus status() const noexcept;

private:
    CMPIrc rc_;
    bool hasMsg_;
    std::string msg_;
};

#endif
