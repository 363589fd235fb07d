// When the provider may be unloaded, and what it releases then.
#include "PlexorProviderCfg.h"
#include "PlexorProviderLock.h"

unsigned int IdleTimeBeforeTerminating = 5;
time_t NextUnloadTime = 0;

namespace {

constexpr unsigned int kMaxIdleMinutes = 10;
constexpr time_t kSecondsPerMinute = 60;

/// Whether the provider has been idle for long enough.
int CanUnload() {
    return time(nullptr) >= LoadTime(NextUnloadTime) ? 1 : 0;
}

/// Releases every controller. Where a worker is still busy with one, they are given up instead:
/// what it uses must outlive it.
void ReleaseInventory() {
    if (QuiesceWorkers()) {
        FreeList(RaidControllerList, FreeController);
        return;
    }
    syslog(LOG_ERR, "%s: a worker is still busy, the inventory stays in memory\n",
           "PlexorProviderCleanup");
    *RaidControllerList = {nullptr, nullptr, 0};
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
    if (!IsListEmpty(RaidControllerList) && !terminating && !CanUnload()) {
        syslog(LOG_DEBUG, "%s: idle timer(%d) has not expired, don't unload\n", __func__,
               static_cast<int>(__atomic_load_n(&IdleTimeBeforeTerminating, __ATOMIC_RELAXED)));
        return {CMPI_RC_DO_NOT_UNLOAD, nullptr};
    }
    ReleaseInventory();
    ReleaseSystemInfo();
    CleanupPlexorThreads();
    __atomic_store_n(&_ProviderInitialized, 0, __ATOMIC_RELAXED);
    syslog(LOG_DEBUG, "%s: EXIT\n", __func__);
    return {CMPI_RC_OK, nullptr};
}
