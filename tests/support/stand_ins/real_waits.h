// The provider's waits in real time, which the virtual clock does not move: watched, and hurried.
#pragma once

#include <pthread.h>

#include <chrono>
#include <vector>

namespace plexortest {

/// While one lives, a wait with a deadline lasts a thousandth of what was asked for:
/// pthread_cond_clockwait and pthread_clockjoin_np. Its end waits for the hurried waits on
/// conditions to end. Not to be nested.
class HurriedWaits {
public:
    enum Which { Conditions = 1, Joins = 2, All = 3 };

    explicit HurriedWaits(Which which = All);
    ~HurriedWaits();
    HurriedWaits(const HurriedWaits&) = delete;
    HurriedWaits& operator=(const HurriedWaits&) = delete;

    using Duration = std::chrono::milliseconds;
    /// What the waits for work, all other waits on a condition, and the joins asked for, rounded.
    static std::vector<Duration> workWaits();
    static std::vector<Duration> otherWaits();
    static std::vector<Duration> joins();
};

/// While one lives, counts how the workers' condition is woken. Not to be nested.
class WakeUpCounter {
public:
    WakeUpCounter();
    ~WakeUpCounter();
    WakeUpCounter(const WakeUpCounter&) = delete;
    WakeUpCounter& operator=(const WakeUpCounter&) = delete;

    static int signals();
    static int broadcasts();
    /// How many of them were made while somebody held the workers' mutex.
    static int underMutex();
};

/// While one lives, wake-ups of the workers' condition get lost, as those do that come between a
/// worker's look into the queue, or the end of a wait, and its next wait. Not to be nested.
class LostWakeUps {
public:
    enum Which { Signals = 1, Broadcasts = 2 };

    explicit LostWakeUps(Which which);
    ~LostWakeUps();
    LostWakeUps(const LostWakeUps&) = delete;
    LostWakeUps& operator=(const LostWakeUps&) = delete;

    /// How many were lost since it was made.
    static int count();
};

}  // namespace plexortest
