/*
 * cmpios.h - operating-system bindings used by the CMPI function tables:
 * the opaque thread, mutex, condition and thread-key types handed out by the
 * broker's extended services, the calling convention of thread procedures,
 * and the symbol export macros for the MI factory functions.
 */
#ifndef _CMPIOS_H_
#define _CMPIOS_H_

#include <stdlib.h> /* size_t */
#include "cmpipl.h"

/* Thread procedures return this. */
#if defined(CMPI_PLATFORM_WIN32_IX86_MSVC)
#define CMPI_THREAD_RETURN unsigned
#else
#define CMPI_THREAD_RETURN void*
#endif

/* Opaque handles created and interpreted by the broker only. */
#define CMPI_THREAD_TYPE void*
#define CMPI_MUTEX_TYPE void*
#define CMPI_COND_TYPE void*

/* Calling convention of thread procedures. */
#if defined(CMPI_PLATFORM_WIN32_IX86_MSVC)
#define CMPI_THREAD_CDECL __stdcall
#elif defined(CMPI_PLATFORM_ZOS_ZSERIES_IBM) && defined(__cplusplus)
#define CMPI_THREAD_CDECL __cdecl
#else
#define CMPI_THREAD_CDECL
#endif

/* Key of a thread-specific data slot. */
#if defined(CMPI_PLATFORM_ZOS_ZSERIES_IBM)
#include <pthread.h>
#define CMPI_THREAD_KEY_TYPE pthread_key_t
#else
#define CMPI_THREAD_KEY_TYPE unsigned int
#endif

/* Visibility of the exported MI factory functions. */
#if defined(CMPI_PLATFORM_WIN32_IX86_MSVC)
#define CMPI_EXPORT __declspec(dllexport)
#define CMPI_IMPORT __declspec(dllimport)
#elif defined(CMPI_PLATFORM_LINUX_GENERIC_GNU) && (__GNUC__ >= 4)
#define CMPI_EXPORT __attribute__((visibility("default")))
#define CMPI_IMPORT __attribute__((visibility("default")))
#else
#define CMPI_EXPORT /* empty */
#define CMPI_IMPORT /* empty */
#endif

#ifdef __cplusplus
#define CMPI_EXTERN_C extern "C" CMPI_EXPORT
#else
#define CMPI_EXTERN_C CMPI_EXPORT
#endif

#if defined(CMPI_PLATFORM_WIN32_IX86_MSVC) && !defined(HAVE_STRUCT_TIMESPEC)
#define HAVE_STRUCT_TIMESPEC
struct timespec {
    long tv_sec;
    long tv_nsec;
};
#endif

#endif /* _CMPIOS_H_ */
