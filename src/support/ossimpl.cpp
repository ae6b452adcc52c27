#include "support/ossimpl.h"

#include "support/ProviderFiles.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>

char g_hostSystemType[256];
pthread_mutex_t* g_ossCriticalSection = nullptr;

void* CoreZMalloc(std::size_t size) { return std::calloc(1, size); }

void CoreFree(void* block) { std::free(block); }

void GetLinuxDistributionType() {
    // The release files are opened without blocking and read only as regular
    // files of a few kB (a FIFO in their place would hold the load).
    constexpr std::size_t kReleaseFileMax = 64 * 1024;
    bounded_file::Result read = ReadProviderFile("release file", "/etc/SuSE-release", kReleaseFileMax);
    if (read.outcome != bounded_file::Outcome::Taken)
        read = ReadProviderFile("release file", "/etc/redhat-release", kReleaseFileMax);
    if (read.outcome != bounded_file::Outcome::Taken || read.text.empty()) return;

    // The first line, at most 126 characters of it, as fgets gives it.
    char line[127];
    std::snprintf(line, sizeof line, "%.*s", static_cast<int>(std::min<std::size_t>(read.text.size(), 126)),
                  read.text.c_str());
    line[std::strcspn(line, "\n(")] = '\0';
    std::snprintf(g_hostSystemType, sizeof g_hostSystemType, "Linux - %s", line);
}

int OSSInitCriticalSection() {
    if (g_ossCriticalSection != nullptr) return 0;  // already set up

    auto* mutex = static_cast<pthread_mutex_t*>(CoreZMalloc(sizeof(pthread_mutex_t)));
    if (mutex == nullptr) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("OSSInitCriticalSection: Unable to allocate memory for mutex");
        return -1;
    }
    // An error-checking mutex, so that relocking by the owner and unlocking by
    // another thread are reported instead of hanging or corrupting the lock.
    pthread_mutexattr_t attributes;
    int result = pthread_mutexattr_init(&attributes);
    if (result == 0) {
        pthread_mutexattr_settype(&attributes, PTHREAD_MUTEX_ERRORCHECK);
        result = pthread_mutex_init(mutex, &attributes);
        pthread_mutexattr_destroy(&attributes);
    }
    if (result != 0) {
        CoreFree(mutex);
        return -1;
    }
    g_ossCriticalSection = mutex;
    return 0;
}

int OSSEnterCriticalSection() {
    int result = g_ossCriticalSection != nullptr ? pthread_mutex_lock(g_ossCriticalSection) : EINVAL;
    if (result == 0) return 0;
    if (g_EnableDebugPrint) {
        if (result == EINVAL)
            Vexlan_FC_Utils_CMPI::DebugPrint("OSSEnterCriticalSection: The mutex has not been properly initialized!");
        else if (result == EDEADLK)
            Vexlan_FC_Utils_CMPI::DebugPrint("OSSEnterCriticalSection: The mutex is already locked by the caller!");
    }
    return -1;
}

int OSSLeaveCriticalSection() {
    int result = g_ossCriticalSection != nullptr ? pthread_mutex_unlock(g_ossCriticalSection) : EINVAL;
    if (result == 0) return 0;
    if (g_EnableDebugPrint) {
        if (result == EINVAL)
            Vexlan_FC_Utils_CMPI::DebugPrint("OSSLeaveCriticalSection: The mutex has not been properly initialized!");
        else if (result == EPERM)
            Vexlan_FC_Utils_CMPI::DebugPrint("OSSLeaveCriticalSection: The caller does not own the mutex!");
    }
    return -1;
}

int OSSDeleteCriticalSection() {
    if (g_ossCriticalSection == nullptr) return -1;
    int result = pthread_mutex_destroy(g_ossCriticalSection);
    if (result != 0) {
        if (result == EBUSY && g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("OSSDeleteCriticalSection: The mutex is currently locked!");
        return -1;
    }
    CoreFree(g_ossCriticalSection);
    g_ossCriticalSection = nullptr;
    return 0;
}

int OSSRebootHost() { return -1; }

int OSSSleep(unsigned int seconds) {
    sleep(seconds);
    return 0;
}

int OSSPreInitializeDevices() {
    sigset_t set;
    sigemptyset(&set);
    sigaddset(&set, SIGINT);
    sigaddset(&set, SIGHUP);
    sigaddset(&set, SIGTERM);
    sigaddset(&set, SIGPIPE);
    int result = pthread_sigmask(SIG_BLOCK, &set, nullptr);
    if (result == 0) return 0;
    if (result == EFAULT && g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("pthread_sigmask failed (%d) (mask points to invalid address)", result);
    return -1;
}

int OSSPostInitializeDevices() { return 0; }

int OSSUpdateCoreDevices() { return 0; }

int IsESX5OrAbove() { return 0; }
