#include "virtual_clock.h"

#include <unistd.h>

#include <atomic>
#include <chrono>
#include <mutex>

namespace plexortest {
namespace {

std::atomic<std::time_t> currentTime{1'000'000'000};
std::mutex sleepsMutex;
std::vector<VirtualClock::Sleep> recordedSleeps;  // guarded by sleepsMutex

}  // namespace

void VirtualClock::set(std::time_t now) { currentTime = now; }
std::time_t VirtualClock::now() { return currentTime; }
void VirtualClock::advance(std::time_t seconds) { currentTime += seconds; }

std::vector<VirtualClock::Sleep> VirtualClock::sleeps() {
    std::lock_guard lock(sleepsMutex);
    return recordedSleeps;
}

void VirtualClock::clearSleeps() {
    std::lock_guard lock(sleepsMutex);
    recordedSleeps.clear();
}

}  // namespace plexortest

extern "C" std::time_t time(std::time_t* out) noexcept {
    const std::time_t now = plexortest::VirtualClock::now();
    if (out != nullptr) *out = now;
    return now;
}

extern "C" unsigned int sleep(unsigned int seconds) {
    {
        std::lock_guard lock(plexortest::sleepsMutex);
        plexortest::recordedSleeps.push_back({std::this_thread::get_id(), seconds});
    }
    plexortest::VirtualClock::advance(seconds);
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
    return 0;
}
