// Waits with a limit, on the clock that nobody sets.
#pragma once

#include <pthread.h>
#include <time.h>

#include "PlexorProviderThreadSafety.h"

/// A moment on the monotonic clock.
class Deadline {
public:
    /// That many seconds from now.
    static Deadline In(time_t seconds) {
        Deadline deadline;
        clock_gettime(CLOCK_MONOTONIC, &deadline.moment_);
        deadline.moment_.tv_sec += seconds;
        return deadline;
    }
    static Deadline Now() { return In(0); }

    /// The moment that many seconds later.
    Deadline Plus(time_t seconds) const {
        Deadline later = *this;
        later.moment_.tv_sec += seconds;
        return later;
    }
    bool Passed() const { return !Now().IsBefore(*this); }
    bool IsBefore(const Deadline& other) const {
        if (moment_.tv_sec != other.moment_.tv_sec) return moment_.tv_sec < other.moment_.tv_sec;
        return moment_.tv_nsec < other.moment_.tv_nsec;
    }
    /// Whole seconds since then; negative before it.
    time_t SecondsAgo() const { return Now().moment_.tv_sec - moment_.tv_sec; }

    const timespec& Moment() const { return moment_; }

private:
    timespec moment_ = {};
};

/// Waits for a signal. False when the deadline came first.
inline bool WaitUntil(pthread_cond_t& cond, pthread_mutex_t& mutex, const Deadline& deadline)
    PLEXOR_HOLDS(mutex) {
    return pthread_cond_clockwait(&cond, &mutex, CLOCK_MONOTONIC, &deadline.Moment()) == 0;
}
