/*
 * cmpios.h - operating system bindings of the CMPI 2.0 interface for
 * x86_64 Linux with GCC: thread, mutex and condition handle types used by
 * CMPIBrokerExtFT, and the export macros of provider factory functions.
 */
#ifndef CMPIOS_H
#define CMPIOS_H

#include <stddef.h> /* size_t for CMPIBrokerMemFT */

#ifndef CMPI_PLATFORM_LINUX_GENERIC_GNU
#define CMPI_PLATFORM_LINUX_GENERIC_GNU 1
#endif

/* Opaque handles handed out by the broker's thread services. */
#define CMPI_THREAD_RETURN void *
#define CMPI_THREAD_TYPE void *
#define CMPI_MUTEX_TYPE void *
#define CMPI_COND_TYPE void *
#define CMPI_THREAD_CDECL
#define CMPI_THREAD_KEY_TYPE unsigned long int

/* A provider library exports only its factories; everything else may be
 * hidden.  CMPI_EXPORT gives a symbol default visibility even when the
 * translation unit is compiled with -fvisibility=hidden. */
#if defined(__GNUC__) && (__GNUC__ >= 4)
#define CMPI_EXPORT __attribute__((visibility("default")))
#else
#define CMPI_EXPORT
#endif

#ifdef __cplusplus
#define CMPI_EXTERN_C extern "C" CMPI_EXPORT
#else
#define CMPI_EXTERN_C CMPI_EXPORT
#endif

#endif /* CMPIOS_H */
