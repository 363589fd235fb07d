// Closing and opening the gate, and whether an up-call passes, fails or waits before it.
#include "stop_gate.h"

namespace testbed {

void StopGate::close() {
    const std::lock_guard lock(mutex_);
    closed_ = true;
}

void StopGate::open() {
    const std::lock_guard lock(mutex_);
    closed_ = false;
    opened_.notify_all();
}

bool StopGate::admits(WhileStopping behaviour) {
    if (behaviour == WhileStopping::Answer) return true;
    std::unique_lock lock(mutex_);
    if (!closed_) return true;
    if (behaviour == WhileStopping::Silent) opened_.wait(lock, [&] { return !closed_; });
    return false;
}

}  // namespace testbed
