// The model test's clock, sleep and log, in front of the C library's.
#pragma once

#include <ctime>
#include <functional>
#include <string>
#include <vector>

namespace modeltest {

/// Single-threaded by design: the test plays client and worker in turn.
struct FakeHost {
    static std::time_t now;
    /// Called by `sleep`: what the other worker would do meanwhile.
    static std::function<void()> whileSleeping;
    /// Lines about changes since the last call, addresses replaced by "@", without newlines. All
    /// other lines are dropped unformatted.
    static std::vector<std::string> takeChangeLines();
};

}  // namespace modeltest
