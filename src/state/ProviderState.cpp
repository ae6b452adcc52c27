// The storage of the provider's shared state.
#include "state/ProviderState.h"

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

std::recursive_mutex& jobStoreLock()
{
    static std::recursive_mutex lock;
    return lock;
}
