#include "watch.h"

#include <cstdlib>
#include <iostream>
#include <string>

#include "PlexorProviderLock.h"
#include "PlexorProviderUtil.h"

namespace torture {
namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds kPatience{30};
constexpr std::chrono::milliseconds kSampleInterval{1};
constexpr unsigned kQueueLimit = 20;

[[noreturn]] void giveUp(std::uint64_t completed) {
    // Without locks: somebody may be holding them for ever.
    std::cerr << "no request completed for " << kPatience.count() << " seconds, after " << completed
              << " requests; queue length " << __atomic_load_n(&__FIFO.List.Size, __ATOMIC_RELAXED)
              << ", active workers " << __atomic_load_n(&ActiveThreads, __ATOMIC_RELAXED)
              << std::endl;
    std::abort();
}

}  // namespace

Watch::Watch(Failures& failures, std::function<std::uint64_t()> completed)
    : failures_(failures), completed_(std::move(completed)), thread_([this] { run(); }) {}

Watch::~Watch() {
    stop_ = true;
    thread_.join();
}

void Watch::run() {
    std::uint64_t last = completed_();
    auto lastProgress = Clock::now();
    while (!stop_) {
        sampleQueue();
        const std::uint64_t completed = completed_();
        if (completed != last) lastProgress = Clock::now();
        if (Clock::now() - lastProgress > kPatience) giveUp(completed);
        last = completed;
        std::this_thread::sleep_for(kSampleInterval);
    }
}

void Watch::sampleQueue() {
    MutexGuard lock(__FIFO.Mutex);
    const unsigned length = __FIFO.List.Size;
    lock.Unlock();
    if (length > kQueueLimit) failures_.add("the queue holds " + std::to_string(length) + " items");
    if (length > longestQueue_) longestQueue_ = length;
}

}  // namespace torture
