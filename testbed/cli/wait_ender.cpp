// The thread that waits for the signal and then ends the faults' waits.
#include "wait_ender.h"

#include <poll.h>
#include <sys/eventfd.h>
#include <unistd.h>

#include <cstdint>
#include <iterator>

namespace testbed {

WaitEnder::WaitEnder(const StopSignals& signals)
    : wake_(eventfd(0, EFD_CLOEXEC)), thread_([this, &signals] { run(signals); }) {}

WaitEnder::~WaitEnder() {
    const std::uint64_t one = 1;
    // The counter of an eventfd has room for it.
    [[maybe_unused]] const ssize_t size = write(wake_.get(), &one, sizeof one);
    thread_.join();
}

void WaitEnder::watch(Faults* faults) {
    const std::lock_guard lock(mutex_);
    faults_ = faults;
    if (hasArrived_ && faults_) faults_->endWaits();
}

void WaitEnder::run(const StopSignals& signals) {
    pollfd sources[] = {{wake_.get(), POLLIN, 0}, {signals.descriptor(), POLLIN, 0}};
    while (poll(sources, std::size(sources), -1) < 0) {
    }
    if (sources[1].revents == 0) return;
    const std::lock_guard lock(mutex_);
    hasArrived_ = true;
    if (faults_) faults_->endWaits();
}

}  // namespace testbed
