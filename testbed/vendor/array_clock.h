// The time of a running array: it goes with the clock, faster or slower, or stands still.
#pragma once

#include <chrono>

namespace testbed {

/// For one thread. Seconds of the scenario; 0 until it is begun.
class ArrayClock {
public:
    explicit ArrayClock(double speed) : speed_(speed) {}

    /// Lets the time go, unless it goes already.
    void begin() {
        if (hasBegun_) return;
        hasBegun_ = true;
        since_ = Clock::now();
    }
    double now() const { return goes() ? before_ + elapsed() * speed_ : before_; }
    double speed() const { return speed_; }
    bool isPaused() const { return paused_; }

    void setSpeed(double speed) {
        settle();
        speed_ = speed;
    }
    void pause(bool wanted) {
        settle();
        paused_ = wanted;
    }

private:
    using Clock = std::chrono::steady_clock;

    bool goes() const { return hasBegun_ && !paused_; }
    double elapsed() const { return std::chrono::duration<double>(Clock::now() - since_).count(); }
    /// What has passed until now passed at the speed of until now.
    void settle() {
        before_ = now();
        since_ = Clock::now();
    }

    double speed_;
    bool paused_ = false;
    bool hasBegun_ = false;
    double before_ = 0;  // time up to `since_`
    Clock::time_point since_{};
};

}  // namespace testbed
