/*
 * What depends on the operating system: handles of threads and locks, symbol visibility.
 * Built and checked on Linux; the handles are opaque, so other POSIX systems share them.
 */
#ifndef _CMPIOS_H_
#define _CMPIOS_H_

#include <stdlib.h>

#include "cmpipl.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Opaque handles; only the broker that made one can use it. */
#define CMPI_THREAD_TYPE void*
#define CMPI_THREAD_RETURN void*
#define CMPI_MUTEX_TYPE void*
#define CMPI_COND_TYPE void*
#define CMPI_THREAD_KEY_TYPE unsigned int

/* Calling convention of thread functions: the usual one. */
#define CMPI_THREAD_CDECL

/* Keeps a symbol visible in a library that is built with hidden visibility. */
#if defined(CMPI_PLATFORM_LINUX_GENERIC_GNU) && defined(__GNUC__) && __GNUC__ >= 4
#define CMPI_EXPORT __attribute__((visibility("default")))
#else
#define CMPI_EXPORT
#endif
#define CMPI_IMPORT CMPI_EXPORT

/* In front of a factory: visible, and findable under its plain name. */
#ifdef __cplusplus
#define CMPI_EXTERN_C extern "C" CMPI_EXPORT
#else
#define CMPI_EXTERN_C CMPI_EXPORT
#endif

#ifdef __cplusplus
}
#endif

#endif /* _CMPIOS_H_ */
