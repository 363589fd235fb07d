// Requests, factory calls and cleanups that meet.
#include "PlexorProviderIfcTurns.h"

#include <atomic>

#include "PlexorProviderCfg.h"
#include "PlexorProviderIfc.h"
#include "PlexorProviderLock.h"

namespace {

constexpr time_t kTurnLimitSeconds = 30;  // what a factory call waits for its turn

pthread_mutex_t __TurnMutex = PTHREAD_MUTEX_INITIALIZER;
pthread_cond_t __TurnChanged = PTHREAD_COND_INITIALIZER;  // with __TurnMutex

// Written under __TurnMutex; requests read them without it.
std::atomic<bool> __Initialising = false;
std::atomic<bool> __CleaningUp = false;
std::atomic<unsigned int> __Requests = 0;  // in flight; counted without the mutex

// Guarded by __TurnMutex.
pthread_t __Initialiser;       // meaningful while __Initialising
unsigned int __InitTurns = 0;  // turns given so far; the latest one's number
unsigned int __CleanupsBegun = 0;
unsigned int __CleanupsEnded = 0;
unsigned int __CleanupsWaiting = 0;  // for another one's end
unsigned int __FactoryCalls = 0;     // in flight, begun after the latest cleanup began
unsigned int __OldFactoryCalls = 0;  // in flight, begun before it

void Announce() {
    pthread_cond_broadcast(&__TurnChanged);
}

/// Waits until `quiet` or the deadline; the caller holds __TurnMutex.
template <typename Condition>
bool Await(const Deadline& deadline, Condition quiet) {
    while (!quiet()) {
        if (!WaitUntil(__TurnChanged, __TurnMutex, deadline)) return quiet();
    }
    return true;
}

bool NoRequests() {
    return __Requests == 0;
}

bool CalledFromTheSearch() {
    return __Initialising && pthread_equal(__Initialiser, pthread_self());
}

}  // namespace

RequestInFlight::RequestInFlight() {
    // First counted, then the look whether controllers may be walked; those who close them do it
    // the other way round, so that one of the two sees the other.
    __Requests++;
}

RequestInFlight::~RequestInFlight() {
    if (--__Requests != 0 || !(__CleaningUp || __Initialising)) return;
    MutexGuard lock(__TurnMutex);
    Announce();
}

const List_Entry_t* RequestInFlight::FirstController() {
    if (__Initialising || __CleaningUp) return nullptr;
    return RaidControllerList->Head;
}

FactoryCall::FactoryCall() {
    MutexGuard lock(__TurnMutex);
    cleanupsBefore_ = __CleanupsBegun;
    __FactoryCalls++;
}

FactoryCall::~FactoryCall() {
    EndTurn();
    MutexGuard lock(__TurnMutex);
    if (cleanupsBefore_ == __CleanupsBegun) {
        __FactoryCalls--;
    } else {
        __OldFactoryCalls--;
    }
    Announce();
}

bool FactoryCall::TakeTurn() {
    MutexGuard lock(__TurnMutex);
    if (CalledFromTheSearch()) return false;
    const Deadline deadline = Deadline::In(kTurnLimitSeconds);
    const bool free = Await(deadline, [this] {
        return cleanupsBefore_ != __CleanupsBegun || !(__Initialising || __CleaningUp);
    });
    if (!free || cleanupsBefore_ != __CleanupsBegun || IsInitialized()) return false;
    turn_ = ++__InitTurns;
    __Initialiser = pthread_self();
    __Initialising = true;
    // In here, so that a cleanup which begins now ends this life and not the one before.
    BeginWork();
    // A request that is still walking the list must not see it grow.
    Await(deadline, NoRequests);
    return true;
}

void FactoryCall::EndTurn() {
    if (turn_ == 0) return;
    MutexGuard lock(__TurnMutex);
    if (turn_ == __InitTurns) __Initialising = false;
    turn_ = 0;
    Announce();
}

CleanupTurn::CleanupTurn() {
    MutexGuard lock(__TurnMutex);
    taken_ = !__CleaningUp;
    if (!taken_) {
        const unsigned int awaited = __CleanupsBegun;
        __CleanupsWaiting++;
        while (__CleanupsEnded < awaited) pthread_cond_wait(&__TurnChanged, &__TurnMutex);
        __CleanupsWaiting--;
        Announce();
        return;
    }
    __CleaningUp = true;
    __CleanupsBegun++;
    __OldFactoryCalls += __FactoryCalls;
    __FactoryCalls = 0;
    Announce();
}

CleanupTurn::~CleanupTurn() {
    if (!taken_) return;
    MutexGuard lock(__TurnMutex);
    __CleaningUp = false;
    __CleanupsEnded++;
    Announce();
    // The manager may unmap the library as soon as this one returns.
    while (__CleanupsWaiting != 0) pthread_cond_wait(&__TurnChanged, &__TurnMutex);
}

bool CleanupTurn::AwaitFactoryCalls(const Deadline& deadline) {
    MutexGuard lock(__TurnMutex);
    const bool ended = !CalledFromTheSearch() &&
                       Await(deadline, [] { return !__Initialising && __OldFactoryCalls == 0; });
    if (ended || !__Initialising) return ended;
    __InitTurns++;
    __Initialising = false;
    return false;
}

bool CleanupTurn::AwaitRequests(const Deadline& deadline) {
    MutexGuard lock(__TurnMutex);
    return Await(deadline, NoRequests);
}

bool CleanupTurn::HasFactoryCallsWaiting() const {
    MutexGuard lock(__TurnMutex);
    return __FactoryCalls + __OldFactoryCalls != 0;
}
