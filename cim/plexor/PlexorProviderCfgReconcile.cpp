// Following the hardware: a request's wish for a refresh, and the refresh on a worker.
#include <stdlib.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgClassLock.h"
#include "PlexorProviderCfgItems.h"
#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kProcess[] = "ProcessDeviceConfigChange";
constexpr int kMaxChain = 10;
constexpr time_t kGraceSeconds = 3;

/// The kinds to reconcile for `action`, its own first, each followed by what it depends on.
struct Chain {
    const DeviceKind* kinds[kMaxChain];
    int length = 0;

    explicit Chain(int action) {
        int next = action;
        do {
            const DeviceKind* kind = FindKindByAction(next);
            if (kind == nullptr) return;
            kinds[length++] = kind;
            next = kind->action.PreConfigAction;
        } while (next != ACTION_STOP && next != ACTION_NONE && next != action &&
                 length < kMaxChain);
    }
};

/// One due class of one controller on its way through a refresh.
struct Refresh {
    const CMPIInstanceMI* mi;
    const CMPIContext* ctx;
    RaidController_t* ctrl;
    const DeviceKind& kind;
};

/// Updates the cached devices that are still there and deletes the others, in list order. What is
/// still queued when the workers are stopped stays as it is.
void UpdateOrDelete(const Refresh& refresh, UpdateInfo_t* devices, int count) {
    for (int i = 0; i < count && !StopRequested(); i++) {
        if (devices[i].Flag) {
            syslog(LOG_DEBUG, "Updating devices[%d]: %p\n", i, devices[i].Device);
            refresh.kind.action.UpdateFunc(refresh.mi, refresh.ctx, refresh.ctrl, devices[i].Device,
                                           devices[i].Instance);
            continue;
        }
        syslog(LOG_DEBUG, "Deleting devices[%d]: %p\n", i, devices[i].Device);
        if (refresh.kind.action.DeleteFunc(refresh.ctrl, devices[i].Device) == RESULT_OK) {
            devices[i].Device = nullptr;
        }
    }
}

/// Builds the devices that no cached record matched, in the order of the results.
void BuildNew(const Refresh& refresh, const NewInfo_t* ops, int count) {
    for (int i = 0; i < count && !StopRequested(); i++) {
        if (ops[i].Op == nullptr) continue;
        syslog(LOG_DEBUG, "Adding device ops[%d]: %p\n", i, static_cast<void*>(ops[i].Op));
        refresh.kind.action.BuildFunc(refresh.mi, refresh.ctx, refresh.ctrl, ops[i].Instance,
                                      ops[i].Op);
    }
}

void ApplyResults(const Refresh& refresh, const CMPIEnumeration* results) {
    UpdateInfo_t* devices = nullptr;
    NewInfo_t* ops = nullptr;
    int removeCount = 0;
    int addCount = 0;
    const int rc = CrossoutDuplicatedEntries(
        refresh.ctrl->*refresh.kind.list, results, refresh.kind.action.GetOpFunc,
        refresh.kind.action.KeyName, &devices, &ops, &removeCount, &addCount);
    if (rc == RESULT_OK) {
        syslog(LOG_DEBUG, "%s, removecount %d, addcount %d\n", kProcess, removeCount, addCount);
        if (devices != nullptr) UpdateOrDelete(refresh, devices, removeCount);
        if (ops != nullptr) BuildNew(refresh, ops, addCount);
    }
    free(devices);
    free(ops);
}

/// Logs the due test's outcome and gives it.
bool IsDue(const Refresh& refresh, const pthread_mutex_t& classMutex, time_t last, time_t now) {
    const bool due = now >= last + LoadShared(StateUpdateInterval);
    constexpr const char kSkip[] =
        "%s(%p): Action %d, last %lu, now %lu, interval %ld secs, ctrl %s, locker %p, skip";
    constexpr const char kGo[] =
        "%s(%p): Action %d, last %lu, now %lu, interval %ld secs, ctrl %s, locker %p";
    // NOLINTNEXTLINE(performance-no-int-to-ptr): the line shows the thread as an address
    void* const self = reinterpret_cast<void*>(pthread_self());
    syslog(LOG_DEBUG, due ? kGo : kSkip, kProcess, self, refresh.kind.action.ConfigAction,
           static_cast<unsigned long>(last), static_cast<unsigned long>(now),
           static_cast<long>(now - last), refresh.ctrl->DeviceID,
           static_cast<const void*>(&classMutex));
    return due;
}

void Reconcile(const Refresh& refresh) {
    const ConfigAction_t& action = refresh.kind.action;
    pthread_mutex_t& classMutex = refresh.ctrl->*refresh.kind.classMutex;
    time_t& updateTime = refresh.ctrl->*refresh.kind.updateTime;
    ClassLock lock(refresh.ctrl, classMutex, action.AssociatedClassName,
                   ClassLock::Patience::kLimited);
    if (!lock.Locked()) return;
    if (!IsDue(refresh, classMutex, LoadShared(updateTime), time(nullptr))) return;

    CMPIEnumeration* results =
        QueryAssociators({kProcess, refresh.ctx, refresh.ctrl->ControllerOp,
                          action.AssociationClassName, action.AssociatedClassName});
    if (results != nullptr) ApplyResults(refresh, results);
    // Also after a failure: the vendor is not asked again before the next interval.
    StoreShared(updateTime, time(nullptr));
    lock.Unlock();
}

/// Queues a refresh. The queue's code.
int QueueRefresh(const CMPIInstanceMI* mi, RaidController_t* ctrl, int action) {
    auto* item = NewRecord<Thread_Args_t>();
    if (item == nullptr) return RESULT_OK;
    Pack(item, RefreshWork{mi, ctrl, action});
    const int rc = QueueItem(item);
    if (rc != RESULT_OK) free(item);
    if (rc != RESULT_FIFO_FULL) pthread_cond_signal(&PlexorThreadCond);
    return rc;
}

}  // namespace

int HandleDeviceConfigChange(const CMPIInstanceMI* mi, const CMPIContext*, RaidController_t* ctrl,
                             int action) {
    const time_t now = time(nullptr);
    syslog(LOG_DEBUG, "%s: ENTER. ctrl %s, action %d\n", __func__, ctrl->DeviceID, action);
    if (!InventoryDone()) {
        syslog(LOG_DEBUG, "%s: BuildDeviceInfoAsync is still running, skip action %d\n", __func__,
               action);
        return RESULT_OK;
    }
    const DeviceKind* kind = FindKindByAction(action);
    if (kind == nullptr) {
        syslog(LOG_ERR, "%s: wrong action %d, ignored\n", __func__, action);
        return RESULT_OK;
    }
    const time_t last = LoadShared(ctrl->*kind->updateTime);
    if (now - last < LoadShared(StateUpdateInterval)) {
        syslog(LOG_DEBUG, "%s: ctrl %s, action %d, last %lu, now %lu, skip\n", __func__,
               ctrl->DeviceID, action, static_cast<unsigned long>(last),
               static_cast<unsigned long>(now));
        return RESULT_OK;
    }
    const int rc = QueueRefresh(mi, ctrl, action);
    syslog(LOG_DEBUG, "%s, exit...\n", __func__);
    return rc;
}

void DoDeviceConfigChange(CMPIContext* ctx, void* args) {
    const auto work = TakeWork<RefreshWork>(args);
    ProcessDeviceConfigChange(work.mi, ctx, work.ctrl, work.action);
}

int ProcessDeviceConfigChange(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                              RaidController_t* ctrl, int action) {
    syslog(LOG_DEBUG, "%s, ENTER(%d)...\n", __func__, action);
    if (time(nullptr) >= LoadShared(InitCompleteTime) + kGraceSeconds) {
        const Chain chain(action);
        for (int i = chain.length - 1; i >= 0 && !StopRequested(); i--) {
            Reconcile({mi, ctx, ctrl, *chain.kinds[i]});
        }
    }
    syslog(LOG_DEBUG, "%s, EXIT\n", __func__);
    return RESULT_OK;
}
