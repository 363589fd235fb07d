// Following the hardware: a request's wish for a refresh, and the refresh on a worker.
#include <stdlib.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgClassLock.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kProcess[] = "ProcessDeviceConfigChange";
constexpr int kMaxChain = 10;
constexpr time_t kGraceSeconds = 3;

constexpr ConfigAction_t kActions[] = {
    {ACTION_DISK, ACTION_POOL, "CIM_SystemDevice", "CIM_DiskDrive", "DeviceID", GetDiskOp,
     BuildDiskInfo, CheckAndUpdateDiskInfo, DeleteDisk},
    {ACTION_VOLUME, ACTION_DISK, "CIM_SystemDevice", "CIM_StorageVolume", "DeviceID", GetVolumeOp,
     BuildVolumeInfo, CheckAndUpdateVolumeInfo, DeleteVolume},
    {ACTION_PORT, ACTION_NONE, "CIM_SystemDevice", "CIM_SASSATAPort", "DeviceID", GetPortOp,
     BuildPortInfo, CheckAndUpdatePortInfo, DeletePort},
    {ACTION_BATTERY, ACTION_NONE, "CIM_SystemDevice", "CIM_Battery", "DeviceID", GetBatteryOp,
     BuildBatteryInfo, CheckAndUpdateBatteryInfo, DeleteBattery},
    {ACTION_POOL, ACTION_NONE, "CIM_HostedStoragePool", "CIM_StoragePool", "InstanceID", GetPoolOp,
     BuildSinglePoolInfo, CheckAndUpdatePoolInfo, DeletePool},
    {ACTION_CHASSIS, ACTION_NONE, "CIM_SystemPackaging", "CIM_Chassis", "Tag", GetChassisOp,
     BuildSingleChassisInfo, CheckAndUpdateChassisInfo, DeleteChassis},
};

/// The controller's fields that belong to an action.
struct ActionFields {
    int action;
    pthread_mutex_t RaidController_t::*classMutex;
    time_t RaidController_t::*updateTime;
    List_t* RaidController_t::*list;
};

constexpr ActionFields kFields[] = {
    {ACTION_DISK, &RaidController_t::DiskCfgMutex, &RaidController_t::DiskUpdateTime,
     &RaidController_t::DiskList},
    {ACTION_VOLUME, &RaidController_t::VolumeCfgMutex, &RaidController_t::VolumeUpdateTime,
     &RaidController_t::VolumeList},
    {ACTION_PORT, &RaidController_t::PortCfgMutex, &RaidController_t::PortUpdateTime,
     &RaidController_t::PortList},
    {ACTION_BATTERY, &RaidController_t::BatteryCfgMutex, &RaidController_t::BatteryUpdateTime,
     &RaidController_t::BatteryList},
    {ACTION_POOL, &RaidController_t::PoolCfgMutex, &RaidController_t::PoolUpdateTime,
     &RaidController_t::PoolList},
    {ACTION_CHASSIS, &RaidController_t::ChassisCfgMutex, &RaidController_t::ChassisUpdateTime,
     &RaidController_t::ChassisList},
};

const ConfigAction_t* FindAction(int action) {
    for (const ConfigAction_t& row : kActions) {
        if (row.ConfigAction == action) return &row;
    }
    return nullptr;
}

const ActionFields* FindFields(int action) {
    for (const ActionFields& fields : kFields) {
        if (fields.action == action) return &fields;
    }
    return nullptr;
}

/// The rows to reconcile for `action`, itself first, each followed by what it depends on.
struct Chain {
    const ConfigAction_t* rows[kMaxChain];
    int length = 0;

    explicit Chain(int action) {
        int next = action;
        do {
            const ConfigAction_t* row = FindAction(next);
            if (row == nullptr) return;
            rows[length++] = row;
            next = row->PreConfigAction;
        } while (next != ACTION_STOP && next != ACTION_NONE && next != action &&
                 length < kMaxChain);
    }
};

/// One due class of one controller on its way through a refresh.
struct Refresh {
    const CMPIInstanceMI* mi;
    const CMPIContext* ctx;
    RaidController_t* ctrl;
    const ConfigAction_t* row;
    const ActionFields* fields;
};

/// Updates the cached devices that are still there and deletes the others, in list order. What is
/// still queued when the workers are stopped stays as it is.
void UpdateOrDelete(const Refresh& refresh, UpdateInfo_t* devices, int count) {
    for (int i = 0; i < count && !StopRequested(); i++) {
        if (devices[i].Flag) {
            syslog(LOG_DEBUG, "Updating devices[%d]: %p\n", i, devices[i].Device);
            refresh.row->UpdateFunc(refresh.mi, refresh.ctx, refresh.ctrl, devices[i].Device,
                                    devices[i].Instance);
            continue;
        }
        syslog(LOG_DEBUG, "Deleting devices[%d]: %p\n", i, devices[i].Device);
        if (refresh.row->DeleteFunc(refresh.ctrl, devices[i].Device) == RESULT_OK) {
            devices[i].Device = nullptr;
        }
    }
}

/// Builds the devices that no cached record matched, in the order of the results.
void BuildNew(const Refresh& refresh, const NewInfo_t* ops, int count) {
    for (int i = 0; i < count && !StopRequested(); i++) {
        if (ops[i].Op == nullptr) continue;
        syslog(LOG_DEBUG, "Adding device ops[%d]: %p\n", i, static_cast<void*>(ops[i].Op));
        refresh.row->BuildFunc(refresh.mi, refresh.ctx, refresh.ctrl, ops[i].Instance, ops[i].Op);
    }
}

void ApplyResults(const Refresh& refresh, const CMPIEnumeration* results) {
    UpdateInfo_t* devices = nullptr;
    NewInfo_t* ops = nullptr;
    int removeCount = 0;
    int addCount = 0;
    const int rc = CrossoutDuplicatedEntries(refresh.ctrl->*refresh.fields->list, results,
                                             refresh.row->GetOpFunc, refresh.row->KeyName, &devices,
                                             &ops, &removeCount, &addCount);
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
    const bool due = now >= last + LoadTime(StateUpdateInterval);
    constexpr const char kSkip[] =
        "%s(%p): Action %d, last %lu, now %lu, interval %ld secs, ctrl %s, locker %p, skip";
    constexpr const char kGo[] =
        "%s(%p): Action %d, last %lu, now %lu, interval %ld secs, ctrl %s, locker %p";
    syslog(LOG_DEBUG, due ? kGo : kSkip, kProcess, reinterpret_cast<void*>(pthread_self()),
           refresh.row->ConfigAction, static_cast<unsigned long>(last),
           static_cast<unsigned long>(now), static_cast<long>(now - last), refresh.ctrl->DeviceID,
           static_cast<const void*>(&classMutex));
    return due;
}

void ReconcileRow(const Refresh& refresh) {
    pthread_mutex_t& classMutex = refresh.ctrl->*refresh.fields->classMutex;
    time_t& updateTime = refresh.ctrl->*refresh.fields->updateTime;
    ClassLock lock(refresh.ctrl, classMutex, refresh.row->AssociatedClassName,
                   ClassLock::Patience::kLimited);
    if (!lock.Locked()) return;
    if (!IsDue(refresh, classMutex, LoadTime(updateTime), time(nullptr))) return;

    CMPIEnumeration* results =
        QueryAssociators({kProcess, refresh.ctx, refresh.ctrl->ControllerOp,
                          refresh.row->AssociationClassName, refresh.row->AssociatedClassName});
    if (results != nullptr) ApplyResults(refresh, results);
    // Also after a failure: the vendor is not asked again before the next interval.
    StoreTime(updateTime, time(nullptr));
    lock.Unlock();
}

/// Queues a refresh. The queue's code.
int QueueRefresh(const CMPIInstanceMI* mi, RaidController_t* ctrl, int action) {
    auto* item = NewRecord<Thread_Args_t>();
    if (item == nullptr) return RESULT_OK;
    item->Func = DoDeviceConfigChange;
    item->Arg0 = reinterpret_cast<uintptr_t>(mi);
    item->Arg2 = reinterpret_cast<uintptr_t>(ctrl);
    item->Arg3 = static_cast<uintptr_t>(action);
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
    const ActionFields* fields = FindFields(action);
    if (fields == nullptr) {
        syslog(LOG_ERR, "%s: wrong action %d, ignored\n", __func__, action);
        return RESULT_OK;
    }
    const time_t last = LoadTime(ctrl->*fields->updateTime);
    if (now - last < LoadTime(StateUpdateInterval)) {
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
    auto* item = static_cast<Thread_Args_t*>(args);
    auto* mi = reinterpret_cast<const CMPIInstanceMI*>(item->Arg0);
    auto* ctrl = reinterpret_cast<RaidController_t*>(item->Arg2);
    const int action = static_cast<int>(item->Arg3);
    free(item);
    ProcessDeviceConfigChange(mi, ctx, ctrl, action);
}

int ProcessDeviceConfigChange(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                              RaidController_t* ctrl, int action) {
    syslog(LOG_DEBUG, "%s, ENTER(%d)...\n", __func__, action);
    if (time(nullptr) >= LoadTime(InitCompleteTime) + kGraceSeconds) {
        const Chain chain(action);
        for (int i = chain.length - 1; i >= 0 && !StopRequested(); i--) {
            const ConfigAction_t* row = chain.rows[i];
            const ActionFields* fields = FindFields(row->ConfigAction);
            if (fields != nullptr) ReconcileRow({mi, ctx, ctrl, row, fields});
        }
    }
    syslog(LOG_DEBUG, "%s, EXIT\n", __func__);
    return RESULT_OK;
}
