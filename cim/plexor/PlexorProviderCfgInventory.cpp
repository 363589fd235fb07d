// The initial inventory: one work item that walks every controller, and the gate that keeps
// refreshes back until it is done.
#include <stdlib.h>

#include <atomic>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgItems.h"
#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderLock.h"

unsigned int ThreadActivityDone = 0;

namespace {

std::atomic<unsigned int> __DoneLife = 0;  // whose inventory set ThreadActivityDone; 0: unknown

/// One moment for all classes, so that all become due together.
void StampAll(RaidController_t* ctrl) {
    const time_t now = time(nullptr);
    for (const DeviceKind* kind : kDeviceKinds) StoreShared(ctrl->*kind->updateTime, now);
    StoreShared(ctrl->ControllerUpdateTime, now);
}

/// Opens the gate, unless a later life has closed it for itself.
void OpenGate() {
    MutexGuard lock(PlexorThreadMutex);
    const LifeGuard life;
    if (LifeIsOver()) return;
    ThreadActivityDone = 1;
    __DoneLife = OwnLife();
    pthread_cond_broadcast(&PlexorThreadCond);
}

/// Opens the gate when the inventory ends, be the thread cancelled: what is missing then comes with
/// the refreshes, which the gate would keep back for ever.
class InventoryEnd {
public:
    InventoryEnd() = default;
    ~InventoryEnd() { OpenGate(); }
    InventoryEnd(const InventoryEnd&) = delete;
    InventoryEnd& operator=(const InventoryEnd&) = delete;
};

void BuildAllDevices(const CMPIInstanceMI* mi, const CMPIContext* ctx) {
    const InventoryEnd end;
    const List_Entry_t* entry = StopRequested() ? nullptr : RaidControllerList->Head;
    for (; entry != nullptr && !StopRequested(); entry = entry->Next) {
        auto* ctrl = static_cast<RaidController_t*>(entry->Data);
        if (ctrl == nullptr) continue;
        BuildPoolInfo(mi, ctx, ctrl);
        BuildChassisInfo(mi, ctx, ctrl);
        BuildLogicalDeviceInfo(mi, ctx, ctrl);
        StampAll(ctrl);
    }
}

}  // namespace

void CloseInventoryGate() PLEXOR_LOCKS_UNCHECKED {
    // A word that has been reset is nobody's any more.
    if (LoadShared(ThreadActivityDone) == 0) __DoneLife = 0;
}

bool InventoryDone() {
    MutexGuard lock(PlexorThreadMutex);
    return ThreadActivityDone != 0 && (__DoneLife == 0 || __DoneLife == PresentLife());
}

int BuildDeviceInfoAsync(const CMPIInstanceMI* mi, const CMPIContext*) {
    auto* item = NewRecord<Thread_Args_t>();
    if (item == nullptr) {
        syslog(LOG_ERR, "%s, failed to allocate threadArgs\n", __func__);
        return RESULT_NO_MEMORY;
    }
    Pack(item, InventoryWork{mi});
    const int rc = QueueItem(item);
    if (rc == RESULT_FIFO_FULL) {
        free(item);
        syslog(LOG_ERR, "%s, failed to put threadArgs in FIFO\n", __func__);
        return rc;
    }
    if (rc != RESULT_OK) free(item);
    pthread_cond_signal(&PlexorThreadCond);
    return rc;
}

void DoBuildDeviceInfoAsync(CMPIContext* ctx, void* args) {
    BuildAllDevices(TakeWork<InventoryWork>(args).mi, ctx);
    syslog(LOG_DEBUG, "%s done.", __func__);
}
