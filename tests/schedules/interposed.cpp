// What stands in front of the C library's functions: the scheduler's, for threads that are under
// one.
#include <syslog.h>
#include <unistd.h>

#include <ctime>

#include "error_lines.h"
#include "real_functions.h"
#include "scheduler.h"

using schedules::Scheduler;

namespace {

schedules::Nanoseconds toNanoseconds(const timespec& time) {
    return time.tv_sec * schedules::kSecond + time.tv_nsec;
}

[[gnu::format(printf, 2, 0)]] void logged(int priority, const char* format, va_list arguments) {
    if (LOG_PRI(priority) <= LOG_ERR) schedules::noteErrorLine(format, arguments);
    if (Scheduler* scheduler = Scheduler::current()) scheduler->pause();
}

}  // namespace

extern "C" {

int __wrap_pthread_mutex_lock(pthread_mutex_t* mutex) {
    Scheduler* scheduler = Scheduler::current();
    return scheduler != nullptr ? scheduler->lock(mutex) : __real_pthread_mutex_lock(mutex);
}

int __wrap_pthread_mutex_unlock(pthread_mutex_t* mutex) {
    Scheduler* scheduler = Scheduler::current();
    return scheduler != nullptr ? scheduler->unlock(mutex) : __real_pthread_mutex_unlock(mutex);
}

int __wrap_pthread_cond_wait(pthread_cond_t* condition, pthread_mutex_t* mutex) {
    Scheduler* scheduler = Scheduler::current();
    if (scheduler == nullptr) return __real_pthread_cond_wait(condition, mutex);
    return scheduler->wait(condition, mutex, std::nullopt);
}

int __wrap_pthread_cond_clockwait(pthread_cond_t* condition, pthread_mutex_t* mutex,
                                  clockid_t clock, const timespec* deadline) {
    Scheduler* scheduler = Scheduler::current();
    if (scheduler == nullptr) {
        return __real_pthread_cond_clockwait(condition, mutex, clock, deadline);
    }
    return scheduler->wait(condition, mutex, toNanoseconds(*deadline));
}

int __wrap_pthread_cond_signal(pthread_cond_t* condition) {
    Scheduler* scheduler = Scheduler::current();
    return scheduler != nullptr ? scheduler->wake(condition, false)
                                : __real_pthread_cond_signal(condition);
}

int __wrap_pthread_cond_broadcast(pthread_cond_t* condition) {
    Scheduler* scheduler = Scheduler::current();
    return scheduler != nullptr ? scheduler->wake(condition, true)
                                : __real_pthread_cond_broadcast(condition);
}

int __wrap_pthread_create(pthread_t* handle, const pthread_attr_t* attributes, void* (*body)(void*),
                          void* argument) {
    Scheduler* scheduler = Scheduler::current();
    if (scheduler == nullptr) return __real_pthread_create(handle, attributes, body, argument);
    return scheduler->create(handle, attributes, body, argument);
}

int __wrap_pthread_clockjoin_np(pthread_t handle, void** result, clockid_t clock,
                                const timespec* deadline) {
    Scheduler* scheduler = Scheduler::current();
    if (scheduler == nullptr) {
        return __real_pthread_clockjoin_np(handle, result, clock, deadline);
    }
    return scheduler->join(handle, result, toNanoseconds(*deadline));
}

int __wrap_sched_yield() {
    if (Scheduler* scheduler = Scheduler::current()) scheduler->pause();
    return 0;
}

// All sleeps and looks at a clock are the provider's, and outside a schedule there are none.
unsigned int __wrap_sleep(unsigned int seconds) {
    Scheduler* scheduler = Scheduler::current();
    if (scheduler != nullptr) scheduler->sleep(seconds * schedules::kSecond);
    return 0;
}

time_t __wrap_time(time_t* out) {
    Scheduler* scheduler = Scheduler::current();
    const time_t now = scheduler != nullptr ? scheduler->now() / schedules::kSecond : 0;
    if (out != nullptr) *out = now;
    return now;
}

int __wrap_clock_gettime(clockid_t, timespec* now) {
    Scheduler* scheduler = Scheduler::current();
    const schedules::Nanoseconds time = scheduler != nullptr ? scheduler->now() : 0;
    *now = {static_cast<time_t>(time / schedules::kSecond),
            static_cast<long>(time % schedules::kSecond)};
    return 0;
}

[[gnu::format(printf, 2, 3)]] void __wrap_syslog(int priority, const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    logged(priority, format, arguments);
    va_end(arguments);
}

[[gnu::format(printf, 3, 4)]] void __wrap___syslog_chk(int priority, int, const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    logged(priority, format, arguments);
    va_end(arguments);
}

}  // extern "C"
