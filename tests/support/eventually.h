// Waiting, in real time, for what is to come.
#pragma once

#include <chrono>
#include <thread>

namespace plexortest {

/// What a test waits for something that is to come: long, since the machine may be a slow one,
/// under load, with a sanitizer.
inline constexpr std::chrono::seconds kGenerousLimit{60};

/// Polls until the condition holds; false when it does not within the limit.
template <class Condition>
bool eventually(Condition condition) {
    const auto limit = std::chrono::steady_clock::now() + kGenerousLimit;
    while (!condition()) {
        if (std::chrono::steady_clock::now() > limit) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return true;
}

}  // namespace plexortest
