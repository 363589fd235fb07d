#include "quick_sleep.h"

#include <unistd.h>

#include <atomic>
#include <chrono>
#include <thread>

namespace {

std::atomic<bool> quick = false;
std::atomic<int> callCount = 0;

}  // namespace

namespace loadtest {

QuickSleep::QuickSleep() {
    callCount = 0;
    quick = true;
}

QuickSleep::~QuickSleep() {
    quick = false;
}

int QuickSleep::calls() const {
    return callCount;
}

}  // namespace loadtest

extern "C" unsigned int sleep(unsigned int seconds) {
    ++callCount;
    const std::chrono::milliseconds second{quick ? 10 : 1000};
    std::this_thread::sleep_for(seconds * second);
    return 0;
}
