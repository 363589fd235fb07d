// Who may do what while the manager calls in on several threads: requests, factory calls, cleanups.
//
// One factory call initialises at a time, one cleanup releases at a time, and never both. Requests
// take no lock: they are counted, and find no controllers while the inventory is not there to be
// walked. A cleanup asks the initialisation to end, then waits until every request and every
// factory call that came before it has left.
#pragma once

#include "PlexorProviderDeadline.h"
#include "PlexorProviderUtil.h"

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
};

/// A factory call in flight, for a scope.
class FactoryCall {
public:
    FactoryCall();
    ~FactoryCall();
    FactoryCall(const FactoryCall&) = delete;
    FactoryCall& operator=(const FactoryCall&) = delete;

    /// Waits for the right to initialise, and begins a life with it. No turn is given when the
    /// provider is initialised. A vendor that is asked for its controllers may itself ask
    /// the manager for computer systems, and so have the factory called before it answers: on the
    /// same thread such a call gets no turn, on another one none after 30 seconds. Nor does a call
    /// that a cleanup has overtaken: the manager that makes it is stopping.
    bool TakeTurn();
    /// Gives the right back, if it has not been taken away. Also done by the destructor.
    void EndTurn();

private:
    unsigned int cleanupsBefore_;
    unsigned int turn_ = 0;  ///< number of the turn that this call has; 0: none
};

/// The right to clean up, for a scope. A cleanup that finds another under way waits for it instead.
class CleanupTurn {
public:
    CleanupTurn();
    ~CleanupTurn();
    CleanupTurn(const CleanupTurn&) = delete;
    CleanupTurn& operator=(const CleanupTurn&) = delete;

    /// False when another cleanup has done it.
    bool Taken() const { return taken_; }
    /// Waits until the initialisation has ended and every factory call from before has left. False
    /// at the deadline: then the initialisation's turn is taken away from it.
    bool AwaitFactoryCalls(const Deadline& deadline);
    /// Waits until no request is in flight. False at the deadline.
    bool AwaitRequests(const Deadline& deadline);
    /// Whether factory calls wait for this cleanup to end; they are inside the library.
    bool HasFactoryCallsWaiting() const;

private:
    bool taken_;
};
