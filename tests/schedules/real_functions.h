// The C library's functions behind the interposed ones.
#pragma once

#include <pthread.h>

extern "C" {
int __real_pthread_mutex_lock(pthread_mutex_t* mutex);
int __real_pthread_mutex_unlock(pthread_mutex_t* mutex);
int __real_pthread_cond_wait(pthread_cond_t* condition, pthread_mutex_t* mutex);
int __real_pthread_cond_clockwait(pthread_cond_t* condition, pthread_mutex_t* mutex,
                                  clockid_t clock, const timespec* deadline);
int __real_pthread_cond_signal(pthread_cond_t* condition);
int __real_pthread_cond_broadcast(pthread_cond_t* condition);
int __real_pthread_create(pthread_t* handle, const pthread_attr_t* attributes, void* (*body)(void*),
                          void* argument);
int __real_pthread_clockjoin_np(pthread_t handle, void** result, clockid_t clock,
                                const timespec* deadline);
}

namespace schedules::real {

inline int pthread_mutex_lock(pthread_mutex_t* mutex) {
    return __real_pthread_mutex_lock(mutex);
}
inline int pthread_mutex_unlock(pthread_mutex_t* mutex) {
    return __real_pthread_mutex_unlock(mutex);
}
inline int pthread_create(pthread_t* handle, const pthread_attr_t* attributes, void* (*body)(void*),
                          void* argument) {
    return __real_pthread_create(handle, attributes, body, argument);
}
inline int pthread_join(pthread_t handle, void** result) {
    return ::pthread_join(handle, result);
}

}  // namespace schedules::real
