// The walk over a controller's logical devices: classify each, hand it to the workers, wait for
// them.
#include <stdlib.h>
#include <unistd.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgClassLock.h"
#include "PlexorProviderCfgItems.h"
#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kCaller[] = "BuildLogicalDeviceInfo";

constexpr int kUnknownCode = 99;  // the device code of a class that is none of ours

/// Spares broker calls: what has been learnt about class names during one walk. The names are the
/// broker's texts and live as long as the walk's results.
struct ClassCache {
    const char* previousName = nullptr;
    int previousCode = kUnknownCode;
    const char* slots[kDeviceCodes] = {};  ///< by device code, from 1 on
};

int AskBroker(const CMPIObjectPath* op) {
    const CMPIBroker* broker = CurrentBroker();
    for (int code = 1; code <= kDeviceCodes; code++) {
        const char* className = FindKindByCode(code)->action.AssociatedClassName;
        if (broker->eft->classPathIsA(broker, op, className, nullptr)) return code;
    }
    return kUnknownCode;
}

int Classify(ClassCache& cache, const CMPIObjectPath* op, const char* className) {
    if (cache.previousName != nullptr && strcmp(cache.previousName, className) == 0) {
        return cache.previousCode;
    }
    for (int code = 1; code <= kDeviceCodes; code++) {
        const char* known = cache.slots[code - 1];
        if (known != nullptr && strcmp(known, className) == 0) return code;
    }
    const int code = AskBroker(op);
    if (code != kUnknownCode) cache.slots[code - 1] = className;
    cache.previousName = className;
    cache.previousCode = code;
    return code;
}

/// A work item with clones of the device's path and instance; null when memory is short: then the
/// device is left out of this pass.
Thread_Args_t* MakeItem(const CMPIInstanceMI* mi, RaidController_t* ctrl, const CMPIObjectPath* op,
                        const CMPIInstance* inst, int code) {
    auto* item = NewRecord<Thread_Args_t>();
    if (item == nullptr) return nullptr;
    const DeviceWork work = {ctrl, mi, ClonePath(op), CloneInstance(inst), code};
    Pack(item, work);
    if (work.op != nullptr && work.inst != nullptr) return item;
    ReleaseDeviceItem(item);
    return nullptr;
}

/// Offers the item until there is room for it.
void Enqueue(const CMPIContext* ctx, Thread_Args_t* item, const CMPIObjectPath* op) {
    int rc = QueueItem(item);
    while (rc == RESULT_FIFO_FULL && !StopRequested()) {
        if (!RunQueuedItemAlone(ctx)) {
            syslog(LOG_ERR, "%s: FIFO full, waiting...\n", kCaller);
            sleep(1);
        }
        rc = QueueItem(item);
    }
    if (rc != RESULT_OK) ReleaseDeviceItem(item);
    if (rc != RESULT_OK && StopRequested()) return;
    syslog(LOG_DEBUG, "Added to FIFO: %s\n", PathText(LOG_DEBUG, op));
    pthread_cond_broadcast(&PlexorThreadCond);
}

void QueueDevice(const CMPIInstanceMI* mi, const CMPIContext* ctx, RaidController_t* ctrl,
                 const CMPIInstance* inst, ClassCache& cache) {
    const CMPIObjectPath* op = InstancePath(inst);
    const char* className = ClassNameText(op);
    if (className == nullptr) return;
    const int code = Classify(cache, op, className);
    syslog(LOG_DEBUG, "%s: (%d)%s\n", kCaller, code, PathText(LOG_DEBUG, op));
    if (code == kUnknownCode) return;
    Thread_Args_t* item = MakeItem(mi, ctrl, op, inst, code);
    if (item != nullptr) Enqueue(ctx, item, op);
}

bool WorkDone() {
    MutexGuard lock(PlexorThreadMutex);
    return IsFifoEmpty(&__FIFO) && OneWorkerActiveAtMost();
}

/// Waits until the queue is empty and the caller is the only active worker. No time limit, but the
/// workers' stop ends it.
void WaitUntilDone(const CMPIContext* ctx) {
    while (!WorkDone() && !StopRequested()) {
        if (RunQueuedItemAlone(ctx)) continue;
        syslog(LOG_DEBUG, "%s: FIFO not empty, waiting...\n", kCaller);
        sleep(1);
    }
}

}  // namespace

int BuildLogicalDeviceInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                           RaidController_t* ctrl) {
    syslog(LOG_DEBUG, "%s, enter...\n", __func__);
    syslog(LOG_DEBUG, "%s: %s\n", __func__, PathText(LOG_DEBUG, ctrl->ControllerOp));
    ClassCache cache;
    CMPIEnumeration* devices =
        QueryAssociators({kCaller, ctx, ctrl->ControllerOp, "CIM_SystemDevice", nullptr});
    while (const CMPIInstance* inst = NextInstance(devices)) {
        if (StopRequested()) break;
        QueueDevice(mi, ctx, ctrl, inst, cache);
    }
    WaitUntilDone(ctx);
    syslog(LOG_DEBUG, "%s, DONE...\n", __func__);
    syslog(LOG_DEBUG, "%s, exit...\n", __func__);
    return RESULT_OK;
}

void ReleaseDeviceItem(Thread_Args_t* item) {
    auto work = TakeWork<DeviceWork>(item);
    ReleasePath(work.op);
    ReleaseInstance(work.inst);
}

void ProcessBuildLogicalDeviceInfo(CMPIContext* ctx, void* args) {
    auto work = TakeWork<DeviceWork>(args);
    const DeviceKind* kind = FindKindByCode(work.deviceCode);
    if (kind != nullptr) {
        const ConfigAction_t& action = kind->action;
        pthread_mutex_t& classMutex = work.ctrl->*kind->classMutex;
        ClassLock lock(work.ctrl, classMutex, action.AssociatedClassName);
        if (lock.Locked()) action.BuildFunc(work.mi, ctx, work.ctrl, work.inst, work.op);
        lock.Unlock();
    } else {
        syslog(LOG_ERR, "%s: invalid type %d\n", __func__, work.deviceCode);
    }
    ReleasePath(work.op);
    ReleaseInstance(work.inst);
}
