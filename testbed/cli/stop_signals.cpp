// Blocking SIGINT and SIGTERM, and reading them from a descriptor.
#include "stop_signals.h"

#include <poll.h>
#include <sys/signalfd.h>

#include <stdexcept>

namespace testbed {

StopSignals::StopSignals() {
    sigemptyset(&signals_);
    sigaddset(&signals_, SIGINT);
    sigaddset(&signals_, SIGTERM);
    pthread_sigmask(SIG_BLOCK, &signals_, nullptr);
    descriptor_ = FileDescriptor(signalfd(-1, &signals_, SFD_CLOEXEC | SFD_NONBLOCK));
    if (!descriptor_.isOpen()) throw std::runtime_error("cannot wait for signals");
}

bool StopSignals::arrived() const {
    pollfd source = {descriptor(), POLLIN, 0};
    return poll(&source, 1, 0) > 0;
}

void StopSignals::letNextOneEnd() {
    signalfd_siginfo taken = {};
    while (read(descriptor(), &taken, sizeof taken) > 0) {
    }
    pthread_sigmask(SIG_UNBLOCK, &signals_, nullptr);
}

}  // namespace testbed
