// The process's clock and sleep, in front of the C library's: they can run faster than real time.
//
// A provider that waits whole seconds is put through hours of its life in minutes. Waits with a
// deadline on the monotonic clock are not changed.
#pragma once

#include <chrono>

namespace torture {

/// Set the speed before other threads read the clock.
struct FastClock {
    /// From now on `time` runs `factor` times as fast, and `sleep` takes that fraction.
    static void setSpeed(int factor);
    /// Moves `time` forward at once.
    static void skip(std::chrono::seconds amount);
};

}  // namespace torture
