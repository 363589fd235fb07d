#include "watched_calls.h"

#include <stdlib.h>

#include "PlexorProvider.h"

namespace {

/// What the watches of one thread want to know.
struct Watches {
    plexortest::FreeWatch::Hook atFree;
    const pthread_mutex_t* heldMutex = nullptr;
    std::function<void()> atEndOfHold;
    bool notesDestroyed = false;
    std::vector<const void*> destroyed;
    bool declinesUpdates = false;
    std::vector<plexortest::UpdatesDeclined::Question> questions;
};

/// Null on threads that watch nothing, so that nothing is constructed on them.
thread_local Watches* watches = nullptr;

Watches& ownWatches() {
    if (watches == nullptr) watches = new Watches;
    return *watches;
}

/// Once the thread's last watch has gone.
void forgetOwnWatches() {
    if (watches->atFree || watches->heldMutex != nullptr || watches->notesDestroyed ||
        watches->declinesUpdates) {
        return;
    }
    delete watches;
    watches = nullptr;
}

/// Calls a hook; what the hook itself does is not watched.
template <class Hook, class... Arguments>
void callUnwatched(const Hook& hook, Arguments... arguments) {
    Watches* const own = std::exchange(watches, nullptr);
    hook(arguments...);
    watches = own;
}

void noteDestroyed(const void* object) {
    if (watches != nullptr && watches->notesDestroyed) watches->destroyed.push_back(object);
}

}  // namespace

extern "C" {

void __real_free(void* block);
void __wrap_free(void* block) {
    if (watches != nullptr && watches->atFree) {
        callUnwatched(watches->atFree, static_cast<const void*>(block));
    }
    __real_free(block);
}

int __real_pthread_mutex_unlock(pthread_mutex_t* mutex);
int __wrap_pthread_mutex_unlock(pthread_mutex_t* mutex) {
    if (watches != nullptr && watches->heldMutex == mutex) callUnwatched(watches->atEndOfHold);
    return __real_pthread_mutex_unlock(mutex);
}

int __real_pthread_mutex_destroy(pthread_mutex_t* mutex);
int __wrap_pthread_mutex_destroy(pthread_mutex_t* mutex) {
    noteDestroyed(mutex);
    return __real_pthread_mutex_destroy(mutex);
}

int __real_pthread_attr_destroy(pthread_attr_t* attributes);
int __wrap_pthread_attr_destroy(pthread_attr_t* attributes) {
    noteDestroyed(attributes);
    return __real_pthread_attr_destroy(attributes);
}

int __real_NeedUpdate(time_t lastUpdateTime, unsigned char updateEnabled);
int __wrap_NeedUpdate(time_t lastUpdateTime, unsigned char updateEnabled) {
    if (watches == nullptr || !watches->declinesUpdates) {
        return __real_NeedUpdate(lastUpdateTime, updateEnabled);
    }
    watches->questions.push_back({lastUpdateTime, updateEnabled});
    return 0;
}

}  // extern "C"

namespace plexortest {

FreeWatch::FreeWatch(Hook hook) {
    ownWatches().atFree = std::move(hook);
}
FreeWatch::~FreeWatch() {
    ownWatches().atFree = nullptr;
    forgetOwnWatches();
}

HoldWatch::HoldWatch(const pthread_mutex_t& mutex, std::function<void()> atEnd) {
    ownWatches().heldMutex = &mutex;
    ownWatches().atEndOfHold = std::move(atEnd);
}
HoldWatch::~HoldWatch() {
    ownWatches().heldMutex = nullptr;
    forgetOwnWatches();
}

DestroyWatch::DestroyWatch() {
    ownWatches().notesDestroyed = true;
    ownWatches().destroyed.clear();
}
DestroyWatch::~DestroyWatch() {
    ownWatches().notesDestroyed = false;
    forgetOwnWatches();
}
std::vector<const void*> DestroyWatch::destroyed() {
    return ownWatches().destroyed;
}

UpdatesDeclined::UpdatesDeclined() {
    ownWatches().declinesUpdates = true;
    ownWatches().questions.clear();
}
UpdatesDeclined::~UpdatesDeclined() {
    ownWatches().declinesUpdates = false;
    forgetOwnWatches();
}
std::vector<UpdatesDeclined::Question> UpdatesDeclined::questions() {
    return ownWatches().questions;
}

}  // namespace plexortest
