// The walk over a controller's logical devices: classify each, hand it to the workers, wait for
// them.
#include <stdlib.h>
#include <unistd.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgClassLock.h"
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
    item->Func = ProcessBuildLogicalDeviceInfo;
    item->Arg0 = reinterpret_cast<uintptr_t>(ctrl);
    item->Arg1 = reinterpret_cast<uintptr_t>(mi);
    item->Arg3 = reinterpret_cast<uintptr_t>(ClonePath(op));
    item->Arg4 = reinterpret_cast<uintptr_t>(CloneInstance(inst));
    item->Arg5 = static_cast<uintptr_t>(code);
    if (item->Arg3 != 0 && item->Arg4 != 0) return item;
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
    return IsFifoEmpty(&__FIFO) && ActiveWorkers() <= 1;
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
    auto* op = reinterpret_cast<CMPIObjectPath*>(item->Arg3);
    auto* inst = reinterpret_cast<CMPIInstance*>(item->Arg4);
    free(item);
    ReleasePath(op);
    ReleaseInstance(inst);
}

void ProcessBuildLogicalDeviceInfo(CMPIContext* ctx, void* args) {
    auto* item = static_cast<Thread_Args_t*>(args);
    auto* ctrl = reinterpret_cast<RaidController_t*>(item->Arg0);
    auto* mi = reinterpret_cast<const CMPIInstanceMI*>(item->Arg1);
    auto* op = reinterpret_cast<CMPIObjectPath*>(item->Arg3);
    auto* inst = reinterpret_cast<CMPIInstance*>(item->Arg4);
    const int code = static_cast<int>(item->Arg5);
    free(item);

    const DeviceKind* kind = FindKindByCode(code);
    if (kind != nullptr) {
        ClassLock lock(ctrl, ctrl->*kind->classMutex, kind->action.AssociatedClassName);
        if (lock.Locked()) kind->action.BuildFunc(mi, ctx, ctrl, inst, op);
        lock.Unlock();
    } else {
        syslog(LOG_ERR, "%s: invalid type %d\n", __func__, code);
    }
    ReleasePath(op);
    ReleaseInstance(inst);
}
