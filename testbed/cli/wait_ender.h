// Ends what faults keep waiting as soon as a signal asks the program to end, whatever its other
// threads are waiting for: the provider's start, for one, may hang in the simulated vendor.
#pragma once

#include <mutex>
#include <thread>

#include "faults.h"
#include "file_descriptor.h"
#include "stop_signals.h"

namespace testbed {

class WaitEnder {
public:
    /// `signals` must outlive the object.
    explicit WaitEnder(const StopSignals& signals);
    ~WaitEnder();
    WaitEnder(const WaitEnder&) = delete;
    WaitEnder& operator=(const WaitEnder&) = delete;

    /// From now on these faults' waits end; NULL: none. Also when the signal has come already.
    void watch(Faults* faults);

private:
    void run(const StopSignals& signals);

    std::mutex mutex_;
    Faults* faults_ = nullptr;  // guarded by mutex_
    bool hasArrived_ = false;   // guarded by mutex_
    FileDescriptor wake_;       // readable when the thread is to end
    std::thread thread_;
};

}  // namespace testbed
