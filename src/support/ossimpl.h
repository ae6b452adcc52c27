// Host service layer: memory, the distribution's name, one critical section,
// sleeping and the signal mask of threads.
#ifndef VEXLAN_SUPPORT_OSSIMPL_H
#define VEXLAN_SUPPORT_OSSIMPL_H

#include <pthread.h>
#include <cstddef>

// "Linux - " and the first line of the distribution's release file.
extern char g_hostSystemType[256];

// The one mutex of OSSEnterCriticalSection and OSSLeaveCriticalSection.
extern pthread_mutex_t* g_ossCriticalSection;

// Zeroed heap block, null when out of memory; released with CoreFree.
void* CoreZMalloc(std::size_t size);
void CoreFree(void* block);

// Sets g_hostSystemType from /etc/SuSE-release or else /etc/redhat-release;
// with neither, it stays as it is.
void GetLinuxDistributionType();

// The critical section. Each returns 0, or -1 on any failure with a log line
// for the known error codes. The mutex reports relocking by its owner
// (EDEADLK) and unlocking by another thread (EPERM) instead of hanging.
// Init must come before and Delete after every other use.
int OSSInitCriticalSection();
int OSSEnterCriticalSection();
int OSSLeaveCriticalSection();
int OSSDeleteCriticalSection();

int OSSRebootHost();                  // always -1: no reboot exists
int OSSSleep(unsigned int seconds);   // 0
int OSSPreInitializeDevices();        // blocks SIGINT, SIGHUP, SIGTERM, SIGPIPE in this thread; 0 or -1
int OSSPostInitializeDevices();       // 0
int OSSUpdateCoreDevices();           // 0
int IsESX5OrAbove();                  // 0

#endif
