#include "fast_clock.h"

#include <atomic>
#include <cstdint>
#include <ctime>

namespace torture {
namespace {

constexpr std::int64_t kNanoseconds = 1'000'000'000;

std::atomic<int> speed = 1;
std::atomic<std::int64_t> shift = 0;  // what `time` shows at `origin`, less `origin`; nanoseconds
std::atomic<std::int64_t> origin = 0;

std::int64_t read(clockid_t clock) {
    timespec now;
    clock_gettime(clock, &now);
    return now.tv_sec * kNanoseconds + now.tv_nsec;
}

std::int64_t fastNow() {
    const std::int64_t real = read(CLOCK_REALTIME);
    return origin + shift + (real - origin) * speed;
}

}  // namespace

void FastClock::setSpeed(int factor) {
    const std::int64_t shown = fastNow();
    origin = read(CLOCK_REALTIME);
    shift = shown - origin;
    speed = factor;
}

void FastClock::skip(std::chrono::seconds amount) {
    shift += amount.count() * kNanoseconds;
}

}  // namespace torture

extern "C" std::time_t time(std::time_t* out) noexcept {
    const std::time_t now = torture::fastNow() / torture::kNanoseconds;
    if (out != nullptr) *out = now;
    return now;
}

extern "C" unsigned int sleep(unsigned int seconds) {
    const std::int64_t length = seconds * torture::kNanoseconds / torture::speed;
    const timespec wait = {length / torture::kNanoseconds, length % torture::kNanoseconds};
    nanosleep(&wait, nullptr);
    return 0;
}
