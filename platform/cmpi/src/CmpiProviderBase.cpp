// CmpiProviderBase: the shared provider object, its use count, and the
// process-wide broker.
#include "CmpiProviderBase.h"

#include <algorithm>
#include <atomic>

namespace {
std::atomic<const CMPIBroker*> g_broker{nullptr};
}

CmpiProviderBase::CmpiProviderBase() : baseMI_(nullptr), useCount_(0) {}

// The provider object is owned through the use count: only the last
// cleanup deletes it.  A library unloaded without cleanups leaves it be.
CmpiProviderBase::~CmpiProviderBase() = default;

CmpiBaseMI* CmpiProviderBase::getBaseMI()
{
    std::lock_guard<std::mutex> lock(mutex_);
    return baseMI_;
}

void CmpiProviderBase::setBaseMI(CmpiBaseMI* baseMI)
{
    std::lock_guard<std::mutex> lock(mutex_);
    baseMI_ = baseMI;
}

void CmpiProviderBase::incUseCount()
{
    std::lock_guard<std::mutex> lock(mutex_);
    ++useCount_;
}

bool CmpiProviderBase::attachMI(void* mi)
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto it = std::find_if(attachedMIs_.begin(), attachedMIs_.end(), [mi](const Attached& a) { return a.mi == mi; });
    if (it == attachedMIs_.end())
        it = attachedMIs_.insert(attachedMIs_.end(), Attached{mi, false});
    if (it->counted)
        return false;
    it->counted = true;
    ++useCount_;
    return true;
}

int CmpiProviderBase::decUseCount()
{
    std::lock_guard<std::mutex> lock(mutex_);
    if (useCount_ > 0)
        --useCount_;
    return useCount_;
}

int CmpiProviderBase::releaseMI(void* mi)
{
    std::lock_guard<std::mutex> lock(mutex_);
    auto it = std::find_if(attachedMIs_.begin(), attachedMIs_.end(), [mi](const Attached& a) { return a.mi == mi; });
    if (it != attachedMIs_.end()) {
        if (!it->counted)
            return -1;  // cleaned up already in this life
        it->counted = false;
    }
    if (useCount_ > 0)
        --useCount_;
    if (std::find(cleanedMIs_.begin(), cleanedMIs_.end(), mi) == cleanedMIs_.end())
        cleanedMIs_.push_back(mi);
    if (useCount_ == 0) {
        // Every MI structure starts with its handle (CMPIInstanceMI's is a
        // const void*, the others' a void*).
        for (void* m : cleanedMIs_)
            *static_cast<const void**>(m) = nullptr;
        cleanedMIs_.clear();
        attachedMIs_.clear();
    }
    return useCount_;
}

int CmpiProviderBase::getUseCount() const
{
    std::lock_guard<std::mutex> lock(mutex_);
    return useCount_;
}

const CMPIBroker* CmpiProviderBase::getBroker()
{
    return g_broker.load(std::memory_order_acquire);
}

void CmpiProviderBase::setBroker(const CMPIBroker* mb)
{
    g_broker.store(mb, std::memory_order_release);
}
