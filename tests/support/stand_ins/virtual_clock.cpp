#include "virtual_clock.h"

#include <unistd.h>

#include <atomic>
#include <chrono>
#include <mutex>

namespace plexortest {
namespace {

// Relaxed, so that reading the clock orders nothing between the threads under test.
std::atomic<time_t> currentTime{0};
std::atomic<time_t> step{0};  // added by each reading
std::mutex sleepMutex;
std::vector<Sleep> recorded;                  // guarded by sleepMutex
std::function<void(unsigned int)> sleepHook;  // guarded by sleepMutex

void sleepVirtually(unsigned int seconds) {
    std::function<void(unsigned int)> hook;
    {
        std::lock_guard lock(sleepMutex);
        recorded.push_back({std::this_thread::get_id(), seconds});
        hook = sleepHook;
    }
    if (hook) hook(seconds);
    VirtualClock::advance(seconds);
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

}  // namespace

void VirtualClock::set(time_t now) {
    currentTime.store(now, std::memory_order_relaxed);
}

time_t VirtualClock::now() {
    return currentTime.load(std::memory_order_relaxed);
}

void VirtualClock::advance(time_t seconds) {
    currentTime.fetch_add(seconds, std::memory_order_relaxed);
}

void VirtualClock::stepAtEachReading(time_t seconds) {
    step.store(seconds, std::memory_order_relaxed);
}

std::vector<Sleep> VirtualClock::sleeps() {
    std::lock_guard lock(sleepMutex);
    return recorded;
}

void VirtualClock::onSleep(std::function<void(unsigned int)> hook) {
    std::lock_guard lock(sleepMutex);
    sleepHook = std::move(hook);
}

void VirtualClock::reset(time_t now) {
    set(now);
    stepAtEachReading(0);
    std::lock_guard lock(sleepMutex);
    recorded.clear();
    sleepHook = nullptr;
}

}  // namespace plexortest

extern "C" time_t time(time_t* out) noexcept {
    const time_t now = plexortest::currentTime.fetch_add(
        plexortest::step.load(std::memory_order_relaxed), std::memory_order_relaxed);
    if (out != nullptr) *out = now;
    return now;
}

extern "C" unsigned int sleep(unsigned int seconds) {
    plexortest::sleepVirtually(seconds);
    return 0;
}
