// A vendor whose answers take long, and can be let go earlier.
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>

#include "broker.h"

namespace bench {

/// Delays every query of a broker from its construction on. Must outlive the provider's workers.
class HeldVendor {
public:
    HeldVendor(testbed::Broker& broker, std::chrono::milliseconds answerTime);

    /// Lets the queries that are waiting now have their answers. How many there were.
    int letThrough();
    /// True as soon as a query is waiting, false when none comes in time.
    bool waitForQuery(std::chrono::milliseconds limit);
    /// From now on its answers take that time; 0 is at once.
    void answerIn(std::chrono::milliseconds answerTime);
    /// Answers everything at once from now on, what waits as well.
    void release();

private:
    void hold();

    std::mutex mutex_;
    std::condition_variable changed_;
    std::chrono::milliseconds answerTime_;  // guarded by mutex_
    int waiting_ = 0;                       // guarded by mutex_
    std::uint64_t passed_ = 0;              // calls of letThrough; guarded by mutex_
    bool released_ = false;                 // guarded by mutex_; nothing waits
};

}  // namespace bench
