// CmpiProviderBase - the link between a provider library's factories and
// its one provider object.
//
// A provider library holds one CmpiProviderBase at file scope.  Each
// factory asks getBaseMI(); the first finds none, makes the provider
// object, links it with CmpiBaseMI::setProviderBase(&base) and stores it
// with setBaseMI; every factory call then stores the object as its MI's
// handle and calls attachMI(mi) (or, in the classic way, incUseCount()).
// Each MI's cleanup comes through CmpiBaseMI::driveBaseCleanup; the
// cleanup that brings the count to 0 clears the base, calls the
// provider's cleanup and deletes the object, so that factories called
// again later (reload in the same process) start a new object.
//
// attachMI counts each MI structure once per life of the object, however
// often a factory hands it out, and its cleanup counts it down once: a
// library that keeps one MI structure per MI type then needs exactly one
// cleanup per type, which is what both servers give (OpenPegasus cleans up
// every MI it made, one per type; sfcb calls one factory per registered
// class section but cleans up once per library and MI type).
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
    // Counts the MI structure mi once in this life of the provider object:
    // true when it was not counted yet.
    bool attachMI(void* mi);
    // Lowers the count (not below 0) and returns the new count.
    int decUseCount();
    int getUseCount() const;

    // The broker that handle classes use; null until a provider exists.
    static const CMPIBroker* getBroker();
    static void setBroker(const CMPIBroker* mb);

private:
    friend class CmpiBaseMI;
    // One cleanup of the MI structure mi.  An attached MI is counted down
    // once (a further cleanup of it in the same life changes nothing); an
    // MI counted by incUseCount lowers the count like decUseCount.  mi is
    // noted; the cleanup that reaches 0 clears the handle of every MI
    // structure noted in this life, so that none of them reaches the object
    // about to be deleted.  Returns the count, or -1 when the cleanup
    // changed nothing.
    int releaseMI(void* mi);

    mutable std::mutex mutex_;
    CmpiBaseMI* baseMI_;
    int useCount_;
    struct Attached {
        void* mi;
        bool counted;  // attached and not cleaned up since
    };
    std::vector<Attached> attachedMIs_;  // every MI attached in this life
    std::vector<void*> cleanedMIs_;
};

#endif
