/*
 * cmpios.h - operating-system types used by the CMPI broker's thread, mutex
 * and condition services, and the symbol-export macros for provider factories.
 *
 * On Linux the broker's services are thin wrappers over pthreads: threads,
 * mutexes and conditions travel as opaque pointers, and a thread-specific
 * data key is a pthread_key_t (4 bytes with glibc), exactly as sfcb passes it.
 */
#ifndef CMPIOS_H
#define CMPIOS_H

#include "cmpipl.h"

#include <pthread.h>

/* What a thread start routine returns. */
#define CMPI_THREAD_RETURN void*
/* Opaque handles for a thread, a mutex and a condition variable. */
#define CMPI_THREAD_TYPE void*
#define CMPI_MUTEX_TYPE void*
#define CMPI_COND_TYPE void*
/* Key of thread-specific data; must stay 4 bytes to match the broker. */
#define CMPI_THREAD_KEY_TYPE pthread_key_t
/* Calling convention of thread start routines: the platform default. */
#define CMPI_THREAD_CDECL

/*
 * Export macros. The project builds with hidden symbol visibility, so a
 * provider's factory functions must be exported explicitly:
 *
 *   CMPI_EXTERN_C CMPIInstanceMI* Foo_Create_InstanceMI(const CMPIBroker*,
 *                                                       const CMPIContext*,
 *                                                       CMPIStatus*);
 *
 * CMPI_EXTERN_C gives C linkage when compiled as C++ and default visibility
 * in both languages, so the broker finds the symbol with dlsym().
 */
#if defined(__GNUC__)
#  define CMPI_EXPORT __attribute__((visibility("default")))
#else
#  define CMPI_EXPORT
#endif
#define CMPI_IMPORT CMPI_EXPORT

#if defined(__cplusplus)
#  define CMPI_EXTERN_C extern "C" CMPI_EXPORT
#else
#  define CMPI_EXTERN_C CMPI_EXPORT
#endif

#endif /* CMPIOS_H */
