// One device class of one controller, held for a build or a refresh.
#pragma once

#include "PlexorProvider.h"
#include "PlexorProviderDeadline.h"

/// Holds a class's *CfgMutex for a scope, in turn with the other threads. A vendor's provider that
/// does not answer would keep everybody waiting who wants the class next. So a waiter of limited
/// patience passes it over when the holder has had it for 30 seconds; measured from when it was
/// taken, so that who comes later does not wait again. That a class begins to be passed over and
/// that it is held no longer are told at error level.
class PLEXOR_SCOPED_LOCK ClassLock {
public:
    enum class Patience { kEndless, kLimited };

    /// `deviceClass` is the class's name in the log. A stop of the provider ends every wait.
    ClassLock(RaidController_t* ctrl, pthread_mutex_t& classMutex, const char* deviceClass,
              Patience patience = Patience::kEndless) PLEXOR_TAKES(classMutex);
    ~ClassLock() PLEXOR_GIVES_BACK();
    ClassLock(const ClassLock&) = delete;
    ClassLock& operator=(const ClassLock&) = delete;

    /// False when the class was passed over, or its mutex could not be taken.
    bool Locked() const { return locked_; }
    /// Gives the class back, telling that it is served again if it had been passed over. Not left
    /// to the destructor: a thread may be cancelled while it logs.
    void Unlock() PLEXOR_GIVES_BACK();

private:
    bool AwaitTurn();
    ClassLock* HolderOf(const pthread_mutex_t* mutex) const;
    void Enlist();
    bool Leave();

    RaidController_t* ctrl_;
    pthread_mutex_t* mutex_;
    const char* deviceClass_;
    Patience patience_;
    bool locked_ = false;
    Deadline since_;           ///< when it was taken
    bool passedOver_ = false;  ///< somebody did not wait for it; guarded by the books' mutex
    ClassLock* next_ = nullptr;
};
