// CmpiObjectPath - a handle on a CMPIObjectPath.
//
// Paths made here (from namespace and class name) come from the process's
// broker (CmpiProviderBase::getBroker).  Every failing broker call throws
// a CmpiStatus with the broker's rc; where the broker gives no message the
// message is the name involved (key or class name).
//
// getKey of a key that the path does not have throws, with the broker's rc
// (CMPI_RC_ERR_NOT_FOUND or CMPI_RC_ERR_NO_SUCH_PROPERTY) and the key name
// as message.  classPathIsA throws when the broker reports a failure.
// getEnc() gives the encapsulated path for calls through its own function
// table, such as getKey with an rc of the caller's own.
#ifndef CMPI_CPP_CMPIOBJECTPATH_H
#define CMPI_CPP_CMPIOBJECTPATH_H

#include "CmpiData.h"
#include "CmpiObject.h"
#include "CmpiString.h"

class CmpiObjectPath : public CmpiObject {
public:
    CmpiObjectPath(const char* ns, const char* cls);
    CmpiObjectPath(const CmpiString& ns, const char* cls);
    explicit CmpiObjectPath(CMPIObjectPath* enc) : CmpiObject(enc) {}
    explicit CmpiObjectPath(const CMPIObjectPath* enc) : CmpiObject(enc) {}

    CMPIObjectPath* getEnc() const { return static_cast<CMPIObjectPath*>(enc_); }

    bool classPathIsA(const char* className) const;

    CmpiString getHostname() const;
    void setHostname(const char* hn);
    CmpiString getNameSpace() const;
    void setNameSpace(const char* ns);
    CmpiString getClassName() const;
    void setClassName(const char* cn);

    unsigned int getKeyCount() const;
    CmpiData getKey(const char* name) const;
    // The index-th key; its name is stored in *name when name is not null.
    CmpiData getKey(int index, CmpiString* name = nullptr) const;
    // Adds or replaces a key.
    void setKey(const char* name, const CmpiData& data);

    CmpiString toString() const;
};

#endif
