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
    return time(nullptr) >= LoadShared(NextUnloadTime) ? 1 : 0;
}

bool HasControllers() {
    const LifeGuard life;  // a search that is under way adds to the list
    return !IsListEmpty(RaidControllerList);
}

/// Whether a cleanup that is none of a stopping manager has to be refused.
bool IsInUse() {
    return HasControllers() && !CanUnload();
}

/// Who was still inside at the limit; null when everybody has left.
const char* AwaitQuiet(CleanupTurn& turn) {
    RequestStop();
    const bool factoryCallsLeft = turn.AwaitFactoryCalls();
    const bool requestsEnded = turn.AwaitRequests();
    const bool workersIdle = QuiesceWorkers(CleanupTurn::Limit);
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
    *RaidControllerList = {};
    GiveUpSystemInfo();
    KeepLibraryMapped();
}

void Unload(CleanupTurn& turn) {
    const char* user = AwaitQuiet(turn);
    if (user == nullptr) {
        FreeList(RaidControllerList, FreeController);
        ReleaseSystemInfo();
    } else {
        GiveUpInventory(user);
    }
    CleanupPlexorThreads();
    StoreShared(_ProviderInitialized, 0);
    if (!turn.AwaitNewcomers()) KeepLibraryMapped();
}

/// The cleanup's return code.
CMPIrc TryUnload(CMPIBoolean terminating) {
    CleanupTurn turn(terminating ? kLeaveSecondsTerminating : kLeaveSeconds,
                     terminating ? nullptr : IsInUse);
    if (turn.Refused()) return CMPI_RC_DO_NOT_UNLOAD;
    if (turn.Taken()) Unload(turn);
    return CMPI_RC_OK;
}

}  // namespace

void ResetNextUnloadTime() {
    unsigned int minutes = LoadShared(IdleTimeBeforeTerminating);
    if (minutes > kMaxIdleMinutes) {
        minutes = kMaxIdleMinutes;
        StoreShared(IdleTimeBeforeTerminating, minutes);
    }
    StoreShared(NextUnloadTime, time(nullptr) + static_cast<time_t>(minutes) * kSecondsPerMinute);
}

CMPIStatus PlexorProviderCleanup(CMPIInstanceMI*, const CMPIContext*, CMPIBoolean terminating) {
    syslog(LOG_DEBUG, "%s: ENTER...\n", __func__);
    const CMPIrc rc = TryUnload(terminating);
    if (rc == CMPI_RC_DO_NOT_UNLOAD) {
        syslog(LOG_DEBUG, "%s: idle timer(%d) has not expired, don't unload\n", __func__,
               static_cast<int>(LoadShared(IdleTimeBeforeTerminating)));
        return {rc, nullptr};
    }
    syslog(LOG_DEBUG, "%s: EXIT\n", __func__);
    return {rc, nullptr};
}
