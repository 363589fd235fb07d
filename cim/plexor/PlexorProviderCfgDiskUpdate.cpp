// Bringing a cached drive's status and pool up to date.
#include <stdlib.h>

#include "PlexorProviderCfgBuild.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kUpdater[] = "CheckAndUpdateDiskInfo";

void UpdateStatus(RaidController_t* ctrl, DiskDrive_t* disk, const CMPIContext* ctx,
                  const CMPIInstance* inst) {
    const CMPIUint16 operational = GetOperationalStatus(inst);
    bool failed = false;
    const CMPIInstance* extent = QueryInstance(kUpdater, ctx, disk->ExtentOp, &failed);
    if (extent == nullptr || failed) return;
    const CMPIUint16 extentStatus = ReadArrayUint16(extent, "ExtentStatus");
    if (operational == disk->OperationalStatus && extentStatus == disk->ExtentStatus) return;

    MutexGuard lock(ctrl->CtrlMutex);
    syslog(LOG_INFO,
           "%s: disk %s status changed. Old opStat %d extStat %d, new opStat %d extStat %d\n",
           kUpdater, disk->DeviceID, disk->OperationalStatus, disk->ExtentStatus, operational,
           extentStatus);
    disk->OperationalStatus = operational;
    disk->ExtentStatus = extentStatus;
}

void MoveToPool(RaidController_t* ctrl, DiskDrive_t* disk, const char* newPool) {
    syslog(LOG_DEBUG, "%s: disk %s pool changed, old %s, new %s\n", kUpdater, disk->DeviceID,
           OrNull(disk->Pool), newPool);
    MutexGuard lock(ctrl->CtrlMutex);
    RemoveDiskFromPool(FindStoragePoolByID(ctrl, disk->Pool), disk->DeviceID);
    char* pool = StringClone(newPool);
    free(disk->Pool);
    disk->Pool = pool;
}

void UpdatePool(RaidController_t* ctrl, DiskDrive_t* disk, const CMPIContext* ctx) {
    CMPIEnumeration* pools = QueryAssociatorNames(
        {kUpdater, ctx, disk->ExtentOp, "CIM_ConcreteComponent", "CIM_StoragePool"});
    const char* newPool = ReadKey(NextPath(pools), "InstanceID");
    if (newPool == nullptr) return;
    if (disk->Pool == nullptr || strcmp(disk->Pool, newPool) != 0) MoveToPool(ctrl, disk, newPool);

    // Also when nothing changed: the pool may have been cached after the drive.
    MutexGuard lock(ctrl->CtrlMutex);
    AddDiskToPool(FindStoragePoolByID(ctrl, disk->Pool), disk->DeviceID);
}

void Update(RaidController_t* ctrl, DiskDrive_t* disk, const CMPIContext* ctx,
            const CMPIInstance* devInst) {
    const CMPIInstance* inst = devInst;
    if (inst == nullptr) inst = QueryInstance(kUpdater, ctx, disk->DiskOp);
    if (inst == nullptr || disk->ExtentOp == nullptr) return;
    UpdateStatus(ctrl, disk, ctx, inst);
    UpdatePool(ctrl, disk, ctx);
}

}  // namespace

int CheckAndUpdateDiskInfo(const CMPIInstanceMI*, const CMPIContext* ctx, RaidController_t* ctrl,
                           void* device, CMPIInstance* devInst) {
    auto* disk = static_cast<DiskDrive_t*>(device);
    syslog(LOG_DEBUG, "%s: ENTER. disk - %s\n", __func__, OrNull(disk->Name));
    if (NeedUpdate(disk->LastUpdateTime, disk->UpdateEnabled)) {
        Update(ctrl, disk, ctx, devInst);
        StampTime(ctrl, kDrives);
    }
    syslog(LOG_DEBUG, "%s, exit\n", __func__);
    return RESULT_OK;
}
