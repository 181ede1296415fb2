/* cmpios.h: operating-system binding of the CMPI 2.0 interface (Linux, POSIX threads).
 * Thread, mutex and condition handles as the broker's extended services pass them around. */
#ifndef _CMPIOS_H_
#define _CMPIOS_H_

#include <pthread.h>
#include <stdint.h>
#include <time.h>

#define CMPI_PLATFORM_LINUX_GENERIC_GNU 1

/* Thread function and handle types of CMPIBrokerExtFT. */
#define CMPI_THREAD_RETURN   void*
#define CMPI_THREAD_TYPE     void*
#define CMPI_THREAD_CDECL
#define CMPI_THREAD_KEY_TYPE pthread_key_t
#define CMPI_MUTEX_TYPE      void*
#define CMPI_COND_TYPE       void*

#ifdef __cplusplus
#  define CMPI_EXTERN_C extern "C"
#else
#  define CMPI_EXTERN_C
#endif

/* MI factory functions must stay visible even when a module hides its symbols. */
#define CMPI_EXPORT __attribute__((visibility("default")))
#define CMPI_IMPORT
#define CMPI_INLINE inline

#endif /* _CMPIOS_H_ */
