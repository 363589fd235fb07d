// Who may do what while the manager calls in on several threads: requests, factory calls, cleanups.
//
// One factory call initialises at a time, one cleanup releases at a time, and never both. Requests
// take no lock: they are counted, and find no controllers while the inventory is not there to be
// walked. A cleanup asks the initialisation to end, then waits until every request and every
// factory call that came before it has left.
#pragma once

#include <optional>

#include "PlexorProviderDeadline.h"
#include "PlexorProviderLock.h"
#include "PlexorProviderUtil.h"
#include "PlexorProviderUtilLife.h"

/// A request in flight, for a scope.
class RequestInFlight {
public:
    RequestInFlight();
    ~RequestInFlight();
    RequestInFlight(const RequestInFlight&) = delete;
    RequestInFlight& operator=(const RequestInFlight&) = delete;

    /// The first controller's entry. Null without controllers, while they are still being looked
    /// for (such a request comes from the search itself), and while they are being released.
    static const List_Entry_t* FirstController();

private:
    /// What it queues when a cleanup has given up waiting for it must not become a later life's.
    const LifeMember member_{LifeMember::When::kUnlessEnded};
    const unsigned int generation_;
};

/// A factory call in flight, for a scope.
class FactoryCall {
public:
    FactoryCall();
    ~FactoryCall();
    FactoryCall(const FactoryCall&) = delete;
    FactoryCall& operator=(const FactoryCall&) = delete;

    /// Waits for the right to initialise, begins a life with it and makes the thread its member. No
    /// turn is given when the provider is initialised. A vendor that is asked for its controllers
    /// may itself ask the manager for computer systems, and so have the factory called before it
    /// answers: on the same thread such a call gets no turn, on another one none after 30 seconds.
    /// Nor does a call that a cleanup has overtaken: the manager that makes it is stopping.
    bool TakeTurn();

private:
    /// Gives the right back, if it has not been taken away.
    void EndTurn();
    bool Overtaken() const;

    unsigned int generation_;
    unsigned int turn_ = 0;  ///< number of the turn that this call has; 0: none
    std::optional<LifeMember> member_;
};

/// The right to clean up, for a scope. A cleanup that finds another under way waits for it instead,
/// and has it hurry when it must itself.
class CleanupTurn {
public:
    /// Whoever is still inside gets `leaveSeconds` to leave. Where no other cleanup is under way
    /// `refuse` is asked first, if given; a turn that it refuses is not begun.
    CleanupTurn(time_t leaveSeconds, bool (*refuse)());
    ~CleanupTurn();
    CleanupTurn(const CleanupTurn&) = delete;
    CleanupTurn& operator=(const CleanupTurn&) = delete;

    /// Neither taken nor refused: another cleanup has done it.
    bool Taken() const { return outcome_ == Outcome::kTaken; }
    bool Refused() const { return outcome_ == Outcome::kRefused; }
    /// When everybody must have left, in the turn that is under way.
    static Deadline Limit();
    /// Waits until the initialisation has ended and every factory call from before has left. False
    /// at the limit: then the initialisation's turn is taken away from it.
    bool AwaitFactoryCalls();
    /// Waits until no request from before is in flight. False at the limit.
    bool AwaitRequests();
    /// Waits, a second at most, for the requests that came after it. False when one of them, or a
    /// factory call, which waits for this turn to end, stays inside the library.
    bool AwaitNewcomers();

private:
    enum class Outcome { kTaken, kRefused, kDoneByAnother };

    static void AwaitOther(MutexGuard& lock, time_t leaveSeconds);

    Outcome outcome_;
};
