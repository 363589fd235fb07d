// Scoped locks and lock-free reads of the provider's shared words.
//
// Lock order, outermost first:
//   1. PlexorThreadMutex            state of the workers
//   2. a class's *CfgMutex          one refresh or build of a device class at a time
//   3. a controller's CtrlMutex     its device lists and changing fields
//   4. the life's mutex             LifeGuard
//   5. Fifo_t::Mutex                the work queue
//   6. the mutex of the lists' indexes
// Those of ClassLock (who holds which *CfgMutex) and of the turns (factory, cleanup) guard their
// own books; none but the life's is taken under them, nor are they taken under others but
// PlexorThreadMutex. Work functions run with PlexorThreadMutex released. No broker query is made
// while CtrlMutex is held.
#pragma once

#include <pthread.h>
#include <time.h>

#include <type_traits>

#include "PlexorProviderThreadSafety.h"

/// Holds a mutex for a scope, or until Unlock. A thread that is cancelled gives it back, too.
class PLEXOR_SCOPED_LOCK MutexGuard {
public:
    explicit MutexGuard(pthread_mutex_t& mutex) PLEXOR_TAKES(mutex) : mutex_(&mutex) { Lock(); }
    ~MutexGuard() PLEXOR_GIVES_BACK() { Unlock(); }
    MutexGuard(const MutexGuard&) = delete;
    MutexGuard& operator=(const MutexGuard&) = delete;

    /// False when the mutex could not be taken.
    bool Locked() const { return locked_; }
    void Lock() PLEXOR_TAKES() { locked_ = pthread_mutex_lock(mutex_) == 0; }
    void Unlock() PLEXOR_GIVES_BACK() {
        if (locked_) pthread_mutex_unlock(mutex_);
        locked_ = false;
    }

private:
    pthread_mutex_t* mutex_;
    bool locked_;
};

/// Keeps a cancellation of the thread pending for a scope: a destructor that waits must not be
/// left, nor two lists that belong together while only one has changed. A line to the log is a
/// place where a thread is cancelled.
class NoCancellation {
public:
    NoCancellation() { pthread_setcancelstate(PTHREAD_CANCEL_DISABLE, &before_); }
    ~NoCancellation() { pthread_setcancelstate(before_, nullptr); }
    NoCancellation(const NoCancellation&) = delete;
    NoCancellation& operator=(const NoCancellation&) = delete;

private:
    int before_;
};

#if defined(PLEXOR_CHECK_LOCKS)
/// Tells on standard error, and counts, that `function` was called without a mutex that its caller
/// has to hold. In checking builds only.
void ExpectHeld(const pthread_mutex_t& mutex, const char* function);
/// How often that was told.
unsigned int LocksMissed();
#else
inline void ExpectHeld(const pthread_mutex_t&, const char*) {}
#endif

// Exported words that one thread writes while another reads them without a lock. They keep their
// plain types for whoever looks at them; only their own value matters, so relaxed.
template <typename Word>
std::remove_cv_t<Word> LoadShared(const Word& word) {
    return __atomic_load_n(&word, __ATOMIC_RELAXED);
}
template <typename Word>
void StoreShared(Word& word, std::type_identity_t<std::remove_cv_t<Word>> value) {
    __atomic_store_n(&word, value, __ATOMIC_RELAXED);
}
