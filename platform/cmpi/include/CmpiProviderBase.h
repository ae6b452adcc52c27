// CmpiProviderBase - the link between a provider library's factories and
// its one provider object.
//
// A provider library holds one CmpiProviderBase at file scope.  Each
// factory asks getBaseMI(); the first finds none, makes the provider
// object, links it with CmpiBaseMI::setProviderBase(&base) and stores it
// with setBaseMI; every factory call then stores the object as its MI's
// handle and calls incUseCount().  Each MI's cleanup comes through
// CmpiBaseMI::driveBaseCleanup, which calls decUseCount(); the cleanup
// that brings the count to 0 clears the base, calls the provider's
// cleanup and deletes the object, so that factories called again later
// (reload in the same process) start a new object.
//
// The class also holds the process-wide broker that handle classes use to
// make new objects (CmpiObjectPath(ns, cls), CmpiArray(n, t), ...).  It is
// set when a provider object is made and when it is linked to a base.
//
// All operations are safe to call from any thread.
#ifndef CMPI_CPP_CMPIPROVIDERBASE_H
#define CMPI_CPP_CMPIPROVIDERBASE_H

#include "cmpift.h"

#include <mutex>
#include <vector>

class CmpiBaseMI;

class CmpiProviderBase {
public:
    CmpiProviderBase();
    ~CmpiProviderBase();
    CmpiProviderBase(const CmpiProviderBase&) = delete;
    CmpiProviderBase& operator=(const CmpiProviderBase&) = delete;

    CmpiBaseMI* getBaseMI();
    void setBaseMI(CmpiBaseMI* baseMI);
    void incUseCount();
    // Lowers the count (not below 0) and returns the new count.
    int decUseCount();
    int getUseCount() const;

    // The broker that handle classes use; null until a provider exists.
    static const CMPIBroker* getBroker();
    static void setBroker(const CMPIBroker* mb);

private:
    friend class CmpiBaseMI;
    // One cleanup of the MI structure mi: lowers the count like
    // decUseCount and notes mi; the cleanup that reaches 0 clears the
    // handle of every MI structure noted in this life, so that none of
    // them reaches the object about to be deleted.
    int releaseMI(void* mi);

    mutable std::mutex mutex_;
    CmpiBaseMI* baseMI_;
    int useCount_;
    std::vector<void*> cleanedMIs_;
};

#endif
