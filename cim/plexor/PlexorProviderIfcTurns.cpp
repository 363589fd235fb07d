// Requests, factory calls and cleanups that meet.
#include "PlexorProviderIfcTurns.h"

#include <atomic>

#include "PlexorProviderCfg.h"
#include "PlexorProviderIfc.h"
#include "PlexorProviderIfcInFlight.h"

namespace {

constexpr time_t kTurnLimitSeconds = 30;  // what a factory call waits for its turn
constexpr time_t kNewcomerSeconds = 1;    // what a request that finds nothing gets to leave

pthread_mutex_t __TurnMutex = PTHREAD_MUTEX_INITIALIZER;
pthread_cond_t __TurnChanged = PTHREAD_COND_INITIALIZER;  // with __TurnMutex

// Written under __TurnMutex; requests read them without it.
std::atomic<bool> __Initialising = false;
std::atomic<bool> __CleaningUp = false;

// Closed under __TurnMutex.
CallsInFlight __Requests;
CallsInFlight __FactoryCalls;

// Meaningful while __Initialising.
pthread_t __Initialiser PLEXOR_GUARDED_BY(__TurnMutex);
// Turns given so far; the latest one's number.
unsigned int __InitTurns PLEXOR_GUARDED_BY(__TurnMutex) = 0;
// Cleanups that took the turn, that gave it back, and that wait for another one's end.
unsigned int __CleanupsBegun PLEXOR_GUARDED_BY(__TurnMutex) = 0;
unsigned int __CleanupsEnded PLEXOR_GUARDED_BY(__TurnMutex) = 0;
unsigned int __CleanupsWaiting PLEXOR_GUARDED_BY(__TurnMutex) = 0;
// Meaningful while __CleaningUp.
Deadline __LeaveBy PLEXOR_GUARDED_BY(__TurnMutex);

void Announce() {
    pthread_cond_broadcast(&__TurnChanged);
}

/// Waits until `quiet` or the limit, which may be brought forward.
template <typename Condition>
bool Await(const Deadline& limit, Condition quiet) PLEXOR_HOLDS(__TurnMutex) {
    ExpectHeld(__TurnMutex, __func__);
    while (!quiet()) {
        const Deadline deadline = limit;
        if (WaitUntil(__TurnChanged, __TurnMutex, deadline)) continue;
        if (!limit.IsBefore(deadline)) return quiet();
    }
    return true;
}

bool OldRequestsAreGone() {
    return __Requests.ClosedAreGone();
}

bool CalledFromTheSearch() PLEXOR_HOLDS(__TurnMutex) {
    return __Initialising && pthread_equal(__Initialiser, pthread_self());
}

void Leave(CallsInFlight& calls, unsigned int generation) {
    if (calls.LeaveOpen(generation)) return;
    MutexGuard lock(__TurnMutex);
    calls.LeaveClosed(generation);
    Announce();
}

/// One of the cleanups that wait for another one's end, also when the thread is cancelled.
class WaitingCleanup {
public:
    WaitingCleanup() PLEXOR_HOLDS(__TurnMutex) { __CleanupsWaiting++; }
    ~WaitingCleanup() PLEXOR_HOLDS(__TurnMutex) {
        __CleanupsWaiting--;
        Announce();
    }
    WaitingCleanup(const WaitingCleanup&) = delete;
    WaitingCleanup& operator=(const WaitingCleanup&) = delete;
};

}  // namespace

// First counted, then the look whether controllers may be walked; those who close them do it the
// other way round, so that one of the two sees the other.
RequestInFlight::RequestInFlight() : generation_(__Requests.Enter()) {}

RequestInFlight::~RequestInFlight() {
    Leave(__Requests, generation_);
}

const List_Entry_t* RequestInFlight::FirstController() {
    if (__Initialising || __CleaningUp) return nullptr;
    return RaidControllerList->Head;
}

FactoryCall::FactoryCall() : generation_(__FactoryCalls.Enter()) {}

FactoryCall::~FactoryCall() {
    EndTurn();
    Leave(__FactoryCalls, generation_);
}

bool FactoryCall::Overtaken() const {
    return __FactoryCalls.IsClosed(generation_);
}

bool FactoryCall::TakeTurn() {
    MutexGuard lock(__TurnMutex);
    if (CalledFromTheSearch()) return false;
    const Deadline deadline = Deadline::In(kTurnLimitSeconds);
    const bool free =
        Await(deadline, [this] { return Overtaken() || !(__Initialising || __CleaningUp); });
    if (!free || Overtaken() || IsInitialized()) return false;
    turn_ = ++__InitTurns;
    __Initialiser = pthread_self();
    __Initialising = true;
    // In here, so that a cleanup which begins now ends this life and not the one before.
    BeginWork();
    member_.emplace();
    // A request that is still walking the list must not see it grow.
    __Requests.Close(false);
    Await(deadline, [this] { return Overtaken() || OldRequestsAreGone(); });
    return !Overtaken();
}

void FactoryCall::EndTurn() {
    if (turn_ == 0) return;
    MutexGuard lock(__TurnMutex);
    if (turn_ == __InitTurns) __Initialising = false;
    Announce();
}

CleanupTurn::CleanupTurn(time_t leaveSeconds, bool (*refuse)()) {
    MutexGuard lock(__TurnMutex);
    if (__CleaningUp) {
        outcome_ = Outcome::kDoneByAnother;
        AwaitOther(lock, leaveSeconds);
        return;
    }
    outcome_ = refuse != nullptr && refuse() ? Outcome::kRefused : Outcome::kTaken;
    if (!Taken()) return;
    __CleaningUp = true;
    __CleanupsBegun++;
    __LeaveBy = Deadline::In(leaveSeconds);
    __FactoryCalls.Close(false);
    __Requests.Close(__Initialising);
    Announce();
}

CleanupTurn::~CleanupTurn() {
    if (!Taken()) return;
    const NoCancellation uncancelled;
    MutexGuard lock(__TurnMutex);
    __CleaningUp = false;
    __CleanupsEnded++;
    Announce();
    // The manager may unmap the library as soon as this one returns.
    while (__CleanupsWaiting != 0) pthread_cond_wait(&__TurnChanged, &__TurnMutex);
}

void CleanupTurn::AwaitOther(MutexGuard& lock, time_t leaveSeconds) PLEXOR_LOCKS_UNCHECKED {
    const unsigned int awaited = __CleanupsBegun;
    const WaitingCleanup waiting;
    const Deadline own = Deadline::In(leaveSeconds);
    if (own.IsBefore(__LeaveBy)) {
        __LeaveBy = own;
        Announce();
        lock.Unlock();
        WakeQuiesce();
        lock.Lock();
    }
    while (__CleanupsEnded < awaited) pthread_cond_wait(&__TurnChanged, &__TurnMutex);
}

Deadline CleanupTurn::Limit() {
    MutexGuard lock(__TurnMutex);
    return __LeaveBy;
}

bool CleanupTurn::AwaitFactoryCalls() {
    MutexGuard lock(__TurnMutex);
    const bool ended = !CalledFromTheSearch() && Await(__LeaveBy, [] {
        return !__Initialising && __FactoryCalls.ClosedAreGone();
    });
    if (ended) return true;
    __InitTurns++;  // the call that has the turn no longer gives it back
    __Initialising = false;
    return false;
}

bool CleanupTurn::AwaitRequests() {
    MutexGuard lock(__TurnMutex);
    return Await(__LeaveBy, OldRequestsAreGone);
}

bool CleanupTurn::AwaitNewcomers() {
    MutexGuard lock(__TurnMutex);
    __Requests.Close(false);
    const Deadline deadline = Deadline::In(kNewcomerSeconds);
    return Await(deadline, OldRequestsAreGone) && !__FactoryCalls.HasOpen();
}
