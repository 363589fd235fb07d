// The signals that ask a program to end, as something to wait for.
#pragma once

#include <signal.h>

#include "file_descriptor.h"

namespace testbed {

/// From its making on, SIGINT and SIGTERM do not end the process: the descriptor becomes readable
/// instead. To be made before any thread is started, as threads inherit what is blocked.
class StopSignals {
public:
    /// Throws std::runtime_error when the system refuses.
    StopSignals();

    int descriptor() const { return descriptor_.get(); }
    bool arrived() const;
    /// From now on a further signal ends the process: for an orderly end that may take long.
    void letNextOneEnd();

private:
    sigset_t signals_;
    FileDescriptor descriptor_;
};

}  // namespace testbed
