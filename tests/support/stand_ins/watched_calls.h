// Calls that the provider's objects make into the C library, and one that they make into each
// other, seen by a test.
//
// The linker puts the functions in front of the real ones.
// Each watch works on the thread that made it, as long as it lives; one of a kind at a time.
#pragma once

#include <pthread.h>

#include <functional>
#include <utility>
#include <vector>

namespace plexortest {

/// Calls a hook with each block before it is freed.
class FreeWatch {
public:
    using Hook = std::function<void(const void* block)>;

    explicit FreeWatch(Hook hook);
    ~FreeWatch();
    FreeWatch(const FreeWatch&) = delete;
    FreeWatch& operator=(const FreeWatch&) = delete;
};

/// Calls a hook at the end of each hold of a mutex, while it is still held.
class HoldWatch {
public:
    HoldWatch(const pthread_mutex_t& mutex, std::function<void()> atEnd);
    ~HoldWatch();
    HoldWatch(const HoldWatch&) = delete;
    HoldWatch& operator=(const HoldWatch&) = delete;
};

/// Notes which mutexes and thread attributes are destroyed, in order.
class DestroyWatch {
public:
    DestroyWatch();
    ~DestroyWatch();
    DestroyWatch(const DestroyWatch&) = delete;
    DestroyWatch& operator=(const DestroyWatch&) = delete;

    static std::vector<const void*> destroyed();
};

/// Lets NeedUpdate decline.
class UpdatesDeclined {
public:
    UpdatesDeclined();
    ~UpdatesDeclined();
    UpdatesDeclined(const UpdatesDeclined&) = delete;
    UpdatesDeclined& operator=(const UpdatesDeclined&) = delete;

    /// With which time and flag it was asked.
    using Question = std::pair<time_t, unsigned char>;
    static std::vector<Question> questions();
};

}  // namespace plexortest
