// CmpiInstance - a handle on a CMPIInstance.
//
// getProperty of a property that the instance does not have returns a null
// CmpiData marked isNotFound(), without throwing; other broker failures
// throw.  setProperty throws the broker's status on failure.
// setPropertyFilter(properties, keys): properties null means all; keys
// null is taken as an empty list.
#ifndef CMPI_CPP_CMPIINSTANCE_H
#define CMPI_CPP_CMPIINSTANCE_H

#include "CmpiData.h"
#include "CmpiObject.h"
#include "CmpiObjectPath.h"
#include "CmpiString.h"

class CmpiInstance : public CmpiObject {
public:
    // A new instance of the path's class, made by the broker.
    explicit CmpiInstance(const CmpiObjectPath& op);
    explicit CmpiInstance(CMPIInstance* enc) : CmpiObject(enc) {}
    explicit CmpiInstance(const CMPIInstance* enc) : CmpiObject(enc) {}

    CMPIInstance* getEnc() const { return static_cast<CMPIInstance*>(enc_); }

    unsigned int getPropertyCount() const;
    CmpiData getProperty(const char* name) const;
    CmpiData getProperty(int index, CmpiString* name = nullptr) const;
    void setProperty(const char* name, const CmpiData& data);
    void setPropertyFilter(const char** properties, const char** keys);
    CmpiObjectPath getObjectPath() const;
};

#endif
