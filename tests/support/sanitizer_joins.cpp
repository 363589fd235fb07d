// This compiler's ThreadSanitizer does not know pthread_clockjoin_np: a thread joined with it stays
// alive in its books and the next thread with the same id ends the process. It knows the join with
// a wall-clock deadline, so the executable under ThreadSanitizer goes that way.
#if defined(__SANITIZE_THREAD__)

#include <pthread.h>
#include <time.h>

namespace {

constexpr long kNanosecondsPerSecond = 1'000'000'000;

/// The moment on the wall clock that is as far away as `deadline` is on `clock`.
timespec onWallClock(clockid_t clock, const timespec& deadline) {
    timespec clockNow, wallNow;
    clock_gettime(clock, &clockNow);
    clock_gettime(CLOCK_REALTIME, &wallNow);
    timespec moment;
    moment.tv_sec = wallNow.tv_sec + deadline.tv_sec - clockNow.tv_sec;
    moment.tv_nsec = wallNow.tv_nsec + deadline.tv_nsec - clockNow.tv_nsec;
    while (moment.tv_nsec < 0) {
        moment.tv_nsec += kNanosecondsPerSecond;
        moment.tv_sec--;
    }
    while (moment.tv_nsec >= kNanosecondsPerSecond) {
        moment.tv_nsec -= kNanosecondsPerSecond;
        moment.tv_sec++;
    }
    return moment;
}

}  // namespace

// Weak: a test program that watches the joins has one of its own, which takes the same way.
extern "C" __attribute__((weak)) int pthread_clockjoin_np(pthread_t thread, void** result,
                                                          clockid_t clock,
                                                          const struct timespec* deadline) {
    const timespec moment = onWallClock(clock, *deadline);
    return pthread_timedjoin_np(thread, result, &moment);
}

#endif
