// Who holds which device class, and for how long.
#include "PlexorProviderCfgClassLock.h"

#include "PlexorProviderLock.h"
#include "PlexorProviderUtilLife.h"

namespace {

constexpr time_t kHungSeconds = 30;  // what a holder gets before its class is passed over
constexpr time_t kLookSeconds = 1;   // how often a waiter looks for a stop

pthread_mutex_t __HoldersMutex = PTHREAD_MUTEX_INITIALIZER;
pthread_cond_t __HolderLeft = PTHREAD_COND_INITIALIZER;
ClassLock* __Holders PLEXOR_GUARDED_BY(__HoldersMutex) = nullptr;

}  // namespace

ClassLock::ClassLock(RaidController_t* ctrl, pthread_mutex_t& classMutex, const char* deviceClass,
                     Patience patience)
    : ctrl_(ctrl), mutex_(&classMutex), deviceClass_(deviceClass), patience_(patience) {
    if (!AwaitTurn()) return;
    locked_ = pthread_mutex_lock(mutex_) == 0;
    if (!locked_) Leave();
}

ClassLock::~ClassLock() {
    if (!locked_) return;
    pthread_mutex_unlock(mutex_);
    Leave();
}

void ClassLock::Unlock() {
    if (!locked_) return;
    const time_t seconds = since_.SecondsAgo();
    locked_ = false;
    pthread_mutex_unlock(mutex_);
    if (!Leave() || StopRequested()) return;
    syslog(LOG_ERR, "%s: controller %s, %s: a refresh has ended after %ld secs, served again\n",
           "ClassLock", ctrl_->DeviceID, deviceClass_, static_cast<long>(seconds));
}

/// Waits until no other thread holds the class, then enters the books. False when it is passed
/// over.
bool ClassLock::AwaitTurn() {
    MutexGuard books(__HoldersMutex);
    for (ClassLock* other = HolderOf(mutex_); other != nullptr; other = HolderOf(mutex_)) {
        if (StopRequested()) return false;
        if (patience_ == Patience::kLimited && other->since_.Plus(kHungSeconds).Passed()) {
            const bool first = !other->passedOver_;
            other->passedOver_ = true;
            books.Unlock();
            if (first) {
                syslog(LOG_ERR,
                       "%s: controller %s, %s: a refresh has been under way for %ld secs, passed "
                       "over until it ends\n",
                       "ClassLock", ctrl_->DeviceID, deviceClass_, static_cast<long>(kHungSeconds));
            }
            return false;
        }
        WaitUntil(__HolderLeft, __HoldersMutex, Deadline::In(kLookSeconds));
    }
    Enlist();
    return true;
}

ClassLock* ClassLock::HolderOf(const pthread_mutex_t* mutex) const PLEXOR_HOLDS(__HoldersMutex) {
    ClassLock* holder = __Holders;
    while (holder != nullptr && holder->mutex_ != mutex) holder = holder->next_;
    return holder;
}

void ClassLock::Enlist() PLEXOR_HOLDS(__HoldersMutex) {
    since_ = Deadline::Now();
    next_ = __Holders;
    __Holders = this;
}

/// Leaves the books. Whether somebody had passed the class over.
bool ClassLock::Leave() {
    MutexGuard books(__HoldersMutex);
    ClassLock** link = &__Holders;
    while (*link != this) link = &(*link)->next_;
    *link = next_;
    pthread_cond_broadcast(&__HolderLeft);
    return passedOver_;
}
