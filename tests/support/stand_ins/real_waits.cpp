#include "real_waits.h"

#include <dlfcn.h>
#include <errno.h>
#include <time.h>

#include <atomic>
#include <mutex>
#include <thread>

#include "PlexorProvider.h"

namespace {

using plexortest::HurriedWaits;
using plexortest::LostWakeUps;
using Duration = HurriedWaits::Duration;

constexpr long long kHurry = 1000;
constexpr long long kNanoseconds = 1000000000;

std::atomic<int> hurried = 0;  // bits of HurriedWaits::Which
std::atomic<int> waiting = 0;  // threads in a hurried wait on a condition
std::mutex noteMutex;
std::vector<Duration> notedWorkWaits, notedOtherWaits, notedJoins;  // guarded by noteMutex

std::atomic<bool> counting = false;
std::atomic<int> signalCount = 0, broadcastCount = 0, underMutexCount = 0;

std::atomic<int> losing = 0;  // bits of LostWakeUps::Which
std::atomic<int> lostCount = 0;

template <class Function>
Function* next(const char* name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

long long nanoseconds(const timespec& time) {
    return time.tv_sec * kNanoseconds + time.tv_nsec;
}

timespec toTimespec(long long value) {
    return {static_cast<time_t>(value / kNanoseconds), static_cast<long>(value % kNanoseconds)};
}

/// Time left until the deadline; none when it is past.
long long timeLeft(clockid_t clock, const timespec& deadline) {
    timespec now;
    clock_gettime(clock, &now);
    const long long left = nanoseconds(deadline) - nanoseconds(now);
    return left > 0 ? left : 0;
}

timespec timeIn(clockid_t clock, long long left) {
    timespec now;
    clock_gettime(clock, &now);
    return toTimespec(nanoseconds(now) + left);
}

void note(std::vector<Duration>& waits, long long left) {
    const std::lock_guard lock(noteMutex);
    waits.push_back(std::chrono::round<Duration>(std::chrono::nanoseconds(left)));
}

std::vector<Duration> noted(const std::vector<Duration>& waits) {
    const std::lock_guard lock(noteMutex);
    return waits;
}

void countWakeUp(const pthread_cond_t* cond, std::atomic<int>& count) {
    if (!counting || cond != &PlexorThreadCond) return;
    ++count;
    if (pthread_mutex_trylock(&PlexorThreadMutex) == EBUSY) {
        ++underMutexCount;
    } else {
        pthread_mutex_unlock(&PlexorThreadMutex);
    }
}

/// Whether a wake-up of that kind is to get lost.
bool isLost(const pthread_cond_t* cond, LostWakeUps::Which kind) {
    if ((losing & kind) == 0 || cond != &PlexorThreadCond) return false;
    ++lostCount;
    return true;
}

}  // namespace

extern "C" {

int pthread_cond_clockwait(pthread_cond_t* cond, pthread_mutex_t* mutex, clockid_t clock,
                           const timespec* deadline) {
    static const auto real = next<decltype(pthread_cond_clockwait)>("pthread_cond_clockwait");
    if ((hurried & HurriedWaits::Conditions) == 0) return real(cond, mutex, clock, deadline);
    const long long left = timeLeft(clock, *deadline);
    note(cond == &PlexorThreadCond ? notedWorkWaits : notedOtherWaits, left);
    const timespec sooner = timeIn(clock, left / kHurry);
    ++waiting;
    const int rc = real(cond, mutex, clock, &sooner);
    --waiting;
    return rc;
}

// A thread sanitizer that does not know this function takes the thread for a leaked one; it knows
// the other form.
int pthread_clockjoin_np(pthread_t thread, void** value, clockid_t clock,
                         const timespec* deadline) {
    static const auto real = next<decltype(pthread_timedjoin_np)>("pthread_timedjoin_np");
    long long left = timeLeft(clock, *deadline);
    if ((hurried & HurriedWaits::Joins) != 0) {
        note(notedJoins, left);
        left /= kHurry;
    }
    const timespec realTime = timeIn(CLOCK_REALTIME, left);
    return real(thread, value, &realTime);
}

int pthread_cond_signal(pthread_cond_t* cond) noexcept {
    static const auto real = next<int(pthread_cond_t*)>("pthread_cond_signal");
    countWakeUp(cond, signalCount);
    return isLost(cond, LostWakeUps::Signals) ? 0 : real(cond);
}

int pthread_cond_broadcast(pthread_cond_t* cond) noexcept {
    static const auto real = next<int(pthread_cond_t*)>("pthread_cond_broadcast");
    countWakeUp(cond, broadcastCount);
    return isLost(cond, LostWakeUps::Broadcasts) ? 0 : real(cond);
}

}  // extern "C"

namespace plexortest {

HurriedWaits::HurriedWaits(Which which) {
    const std::lock_guard lock(noteMutex);
    notedWorkWaits.clear();
    notedOtherWaits.clear();
    notedJoins.clear();
    hurried = which;
}

HurriedWaits::~HurriedWaits() {
    hurried = 0;
    while (waiting != 0) std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

std::vector<Duration> HurriedWaits::workWaits() {
    return noted(notedWorkWaits);
}
std::vector<Duration> HurriedWaits::otherWaits() {
    return noted(notedOtherWaits);
}
std::vector<Duration> HurriedWaits::joins() {
    return noted(notedJoins);
}

WakeUpCounter::WakeUpCounter() {
    signalCount = broadcastCount = underMutexCount = 0;
    counting = true;
}

WakeUpCounter::~WakeUpCounter() {
    counting = false;
}

int WakeUpCounter::signals() {
    return signalCount;
}
int WakeUpCounter::broadcasts() {
    return broadcastCount;
}
int WakeUpCounter::underMutex() {
    return underMutexCount;
}

LostWakeUps::LostWakeUps(Which which) {
    lostCount = 0;
    losing = which;
}

LostWakeUps::~LostWakeUps() {
    losing = 0;
}

int LostWakeUps::count() {
    return lostCount;
}

}  // namespace plexortest
