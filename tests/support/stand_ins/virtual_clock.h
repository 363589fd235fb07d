// The clock that the provider sees: `time` and `sleep` of the test executable.
#pragma once

#include <time.h>

#include <functional>
#include <thread>
#include <vector>

namespace plexortest {

/// One call of sleep.
struct Sleep {
    std::thread::id thread;
    unsigned int seconds;
};

/// Thread-safe. sleep(n) runs the hook, moves the clock by n, and really waits about a millisecond
/// so that other threads get on.
class VirtualClock {
public:
    static void set(time_t now);
    static time_t now();
    static void advance(time_t seconds);

    /// From now on every reading of the clock moves it by that afterwards; 0 ends this.
    static void stepAtEachReading(time_t seconds);

    /// Every sleep since the last `reset`, in order.
    static std::vector<Sleep> sleeps();
    /// Called in each sleep on the sleeping thread, before the clock moves; empty for none.
    static void onSleep(std::function<void(unsigned int seconds)> hook);
    /// Back to `now`, without sleeps, hook and steps.
    static void reset(time_t now);
};

}  // namespace plexortest
