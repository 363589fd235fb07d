// The test program's own `time` and `sleep`, in front of the C library's.
#pragma once

#include <ctime>
#include <thread>
#include <vector>

namespace plexortest {

/// A clock that only tests move. `sleep` moves it too, and really waits a millisecond so that other
/// threads get on. Thread-safe.
class VirtualClock {
public:
    static void set(std::time_t now);
    static std::time_t now();
    static void advance(std::time_t seconds);

    struct Sleep {
        std::thread::id thread;
        unsigned int seconds;
    };
    /// Every sleep since the last `clearSleeps`, in order.
    static std::vector<Sleep> sleeps();
    static void clearSleeps();
};

}  // namespace plexortest
