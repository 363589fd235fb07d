// When the provider may be unloaded, and what it releases then.
#include "PlexorProviderCfg.h"
#include "PlexorProviderIfcTurns.h"
#include "PlexorProviderLock.h"

unsigned int IdleTimeBeforeTerminating = 5;
time_t NextUnloadTime = 0;

namespace {

constexpr unsigned int kMaxIdleMinutes = 10;
constexpr time_t kSecondsPerMinute = 60;

// What everybody who is still inside gets to leave. A manager that stops may answer none of the
// calls that they wait for, and is itself waited for.
constexpr time_t kLeaveSeconds = 30;
constexpr time_t kLeaveSecondsTerminating = 3;

/// Whether the provider has been idle for long enough.
int CanUnload() {
    return time(nullptr) >= LoadTime(NextUnloadTime) ? 1 : 0;
}

bool HasControllers() {
    const LifeGuard life;  // a search that is under way adds to the list
    return !IsListEmpty(RaidControllerList);
}

/// Who was still inside at the deadline; null when everybody has left.
const char* AwaitQuiet(CleanupTurn& turn, const Deadline& deadline) {
    RequestStop();
    const bool factoryCallsLeft = turn.AwaitFactoryCalls(deadline);
    const bool requestsEnded = turn.AwaitRequests(deadline);
    const bool workersIdle = QuiesceWorkers(deadline);
    if (!workersIdle) return "a worker";
    if (!requestsEnded) return "a request";
    return factoryCallsLeft ? nullptr : "a factory call";
}

/// Gives the inventory and the identity up to whoever still uses them: what they use must outlive
/// them, and so must the library.
void GiveUpInventory(const char* user) {
    syslog(LOG_ERR, "%s: %s is still busy, the inventory stays in memory\n",
           "PlexorProviderCleanup", user);
    const LifeGuard life;
    *RaidControllerList = {nullptr, nullptr, 0};
    GiveUpSystemInfo();
    KeepLibraryMapped();
}

void Unload(CleanupTurn& turn, time_t leaveSeconds) {
    const char* user = AwaitQuiet(turn, Deadline::In(leaveSeconds));
    if (user == nullptr) {
        FreeList(RaidControllerList, FreeController);
        ReleaseSystemInfo();
    } else {
        GiveUpInventory(user);
    }
    CleanupPlexorThreads();
    __atomic_store_n(&_ProviderInitialized, 0, __ATOMIC_RELAXED);
    if (turn.HasFactoryCallsWaiting()) KeepLibraryMapped();
}

}  // namespace

void ResetNextUnloadTime() {
    unsigned int minutes = __atomic_load_n(&IdleTimeBeforeTerminating, __ATOMIC_RELAXED);
    if (minutes > kMaxIdleMinutes) {
        minutes = kMaxIdleMinutes;
        __atomic_store_n(&IdleTimeBeforeTerminating, minutes, __ATOMIC_RELAXED);
    }
    StoreTime(NextUnloadTime, time(nullptr) + static_cast<time_t>(minutes) * kSecondsPerMinute);
}

CMPIStatus PlexorProviderCleanup(CMPIInstanceMI*, const CMPIContext*, CMPIBoolean terminating) {
    syslog(LOG_DEBUG, "%s: ENTER...\n", __func__);
    if (HasControllers() && !terminating && !CanUnload()) {
        syslog(LOG_DEBUG, "%s: idle timer(%d) has not expired, don't unload\n", __func__,
               static_cast<int>(__atomic_load_n(&IdleTimeBeforeTerminating, __ATOMIC_RELAXED)));
        return {CMPI_RC_DO_NOT_UNLOAD, nullptr};
    }
    {
        CleanupTurn turn;
        if (turn.Taken()) Unload(turn, terminating ? kLeaveSecondsTerminating : kLeaveSeconds);
    }
    syslog(LOG_DEBUG, "%s: EXIT\n", __func__);
    return {CMPI_RC_OK, nullptr};
}
