// The storage of the provider's shared state, and the lock guard.
#include "state/ProviderState.h"

#include <ctime>

#include "state/ModuleOps.h"

pthread_mutex_t ProviderLocks::provider_lock;
pthread_mutex_t ProviderLocks::provider_write_lock;
pthread_mutex_t ProviderLocks::linux_enable_indications_mutex;
pthread_mutex_t ProviderLocks::properties_file_lock;
std::atomic<bool> IndicationGate::m_bIndicationEnabled{false};
std::atomic<int> IndicationGate::m_numSubscriptions{0};

std::atomic<ProviderState*> g_RunningProviderState{nullptr};
const int g_SUPPORT_HDR = 1;
const int g_SupportTRB2xx = 1;

void lockProviderMutex(pthread_mutex_t* mutex)
{
    // Repeated until it succeeds; a failing call (never seen on a sound mutex)
    // is retried after a short pause rather than at full speed.
    while (pthread_mutex_lock(mutex) != 0) {
        struct timespec pause = {0, 1000000};
        nanosleep(&pause, nullptr);
    }
}

ProviderLockGuard::ProviderLockGuard(pthread_mutex_t* mutex) : mutex_(mutex)
{
    lockProviderMutex(mutex_);
}

ProviderLockGuard::~ProviderLockGuard()
{
    pthread_mutex_unlock(mutex_);
}

std::recursive_mutex& jobStoreLock()
{
    static std::recursive_mutex lock;
    return lock;
}
