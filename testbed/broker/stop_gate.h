// What becomes of up-calls while the manager stops.
#pragma once

#include <condition_variable>
#include <mutex>

#include "broker_options.h"

namespace testbed {

/// Open unless the manager stops. Thread-safe.
class StopGate {
public:
    /// The manager begins to stop.
    void close();
    /// The manager has given up waiting: whoever still waits gets a refusal.
    void open();
    /// Whether an up-call is answered; waits as long as the manager says nothing.
    bool admits(WhileStopping behaviour);

private:
    std::mutex mutex_;
    std::condition_variable opened_;
    bool closed_ = false;  // guarded by mutex_
};

}  // namespace testbed
