// The provider's locks, one set per process. The provider object initialises
// them when it is made and destroys them when it goes; every part takes them
// through this header.
//
// Locks, always taken in this order when more than one is held:
//   provider_lock                   every request, the first build, every rebuild
//   linux_enable_indications_mutex  held by the polling thread over the first build
//   provider_write_lock             inner lock of invokeMethod and setInstance; the
//                                   polling thread takes it alone around the
//                                   backup enumeration
// properties_file_lock is initialised and destroyed but never locked. The job
// store's lock (state/JobStore.h) is always the innermost.
#ifndef VEXLAN_STATE_PROVIDERLOCKS_H
#define VEXLAN_STATE_PROVIDERLOCKS_H

#include <pthread.h>

#include <ctime>

struct ProviderLocks {
    static pthread_mutex_t provider_lock;
    static pthread_mutex_t provider_write_lock;
    static pthread_mutex_t linux_enable_indications_mutex;
    static pthread_mutex_t properties_file_lock;
};

// Locks with a call repeated until it succeeds; a failing call (never seen on
// a sound mutex) is retried after a short pause rather than at full speed.
// For the places that unlock by hand.
inline void lockProviderMutex(pthread_mutex_t* mutex)
{
    while (pthread_mutex_lock(mutex) != 0) {
        struct timespec pause = {0, 1000000};
        nanosleep(&pause, nullptr);
    }
}

// Locks a pthread mutex for the life of the guard with lockProviderMutex; the
// unlock happens on every way out of the scope.
class ProviderLockGuard {
public:
    explicit ProviderLockGuard(pthread_mutex_t* mutex) : mutex_(mutex) { lockProviderMutex(mutex_); }
    ~ProviderLockGuard() { pthread_mutex_unlock(mutex_); }
    ProviderLockGuard(const ProviderLockGuard&) = delete;
    ProviderLockGuard& operator=(const ProviderLockGuard&) = delete;

private:
    pthread_mutex_t* mutex_;
};

#endif
