// The cached records: path accessors, release, deletion.
#include <stddef.h>
#include <stdlib.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderLock.h"

static List_t __RaidControllerList = {};
List_t* RaidControllerList = &__RaidControllerList;

namespace {

// Every device record begins with its object path, so one accessor serves them all.
CMPIObjectPath* FirstFieldPath(const void* device) {
    return *static_cast<CMPIObjectPath* const*>(device);
}

static_assert(offsetof(StorageVolume_t, VolumeOp) == 0);
static_assert(offsetof(DiskDrive_t, DiskOp) == 0);
static_assert(offsetof(StoragePool_t, PoolOp) == 0);
static_assert(offsetof(Battery_t, BatteryOp) == 0);
static_assert(offsetof(SASSATAPort_t, PortOp) == 0);
static_assert(offsetof(Chassis_t, ChassisOp) == 0);

// Not the table's order, in which the locks end: both orders are relied on outside.
constexpr const DeviceKind* kReleaseOrder[] = {&kVolumes, &kDrives,    &kPools,
                                               &kPorts,   &kBatteries, &kEnclosures};
static_assert(sizeof kReleaseOrder == sizeof kDeviceKinds);

void Release(char*& text) {
    free(text);
    text = nullptr;
}

}  // namespace

CMPIObjectPath* GetVolumeOp(const void* device) {
    return FirstFieldPath(device);
}
CMPIObjectPath* GetDiskOp(const void* device) {
    return FirstFieldPath(device);
}
CMPIObjectPath* GetPortOp(const void* device) {
    return FirstFieldPath(device);
}
CMPIObjectPath* GetBatteryOp(const void* device) {
    return FirstFieldPath(device);
}
CMPIObjectPath* GetPoolOp(const void* device) {
    return FirstFieldPath(device);
}
CMPIObjectPath* GetChassisOp(const void* device) {
    return FirstFieldPath(device);
}
CMPIObjectPath* GetControllerOp(const void* device) {
    return static_cast<const RaidController_t*>(device)->ControllerOp;
}

void FreeVolume(void* data) {
    auto* volume = static_cast<StorageVolume_t*>(data);
    if (volume == nullptr) return;
    syslog(LOG_DEBUG, "Volume %s (%s) deleted\n", OrNull(volume->Name),
           OrNull(volume->ElementName));
    Release(volume->ElementName);
    Release(volume->RaidLevel);
    Release(volume->DeviceID);
    Release(volume->Name);
    Release(volume->FromPool);
    ReleasePath(volume->VolumeOp);
    free(volume);
}

void FreeDisk(void* data) {
    auto* disk = static_cast<DiskDrive_t*>(data);
    if (disk == nullptr) return;
    syslog(LOG_DEBUG, "%s deleted\n", OrNull(disk->Name));
    Release(disk->FwVersion);
    Release(disk->Name);
    Release(disk->DeviceID);
    Release(disk->Pool);
    Release(disk->Chassis);
    ReleasePath(disk->DiskOp);
    ReleasePath(disk->ExtentOp);
    free(disk);
}

void FreePort(void* data) {
    auto* port = static_cast<SASSATAPort_t*>(data);
    if (port == nullptr) return;
    syslog(LOG_DEBUG, "%s deleted\n", OrNull(port->PortName));
    Release(port->PortName);
    Release(port->DeviceID);
    ReleasePath(port->PortOp);
    free(port);
}

void FreeBattery(void* data) {
    auto* battery = static_cast<Battery_t*>(data);
    if (battery == nullptr) return;
    syslog(LOG_DEBUG, "Battery %s deleted\n", OrNull(battery->DeviceID));
    Release(battery->DeviceID);
    ReleasePath(battery->BatteryOp);
    free(battery);
}

void FreeChassis(void* data) {
    auto* chassis = static_cast<Chassis_t*>(data);
    if (chassis == nullptr) return;
    syslog(LOG_DEBUG, "Chassis %s deleted\n", OrNull(chassis->Tag));
    Release(chassis->Tag);
    Release(chassis->InternalTag);
    ReleasePath(chassis->ChassisOp);
    free(chassis);
}

void FreePool(void* data) {
    auto* pool = static_cast<StoragePool_t*>(data);
    if (pool == nullptr) return;
    syslog(LOG_DEBUG, "Pool %s deleted\n", OrNull(pool->PoolID));
    FreeList(pool->Drives, free);
    Release(pool->PoolID);
    Release(pool->InstanceID);
    ReleasePath(pool->PoolOp);
    free(pool);
}

void FreeController(void* data) {
    auto* ctrl = static_cast<RaidController_t*>(data);
    if (ctrl == nullptr) return;
    for (const DeviceKind* kind : kReleaseOrder) FreeList(ctrl->*kind->list, kind->release);

    syslog(LOG_DEBUG, "Controller %s (%s) deleted\n", OrNull(ctrl->Model), OrNull(ctrl->DeviceID));
    Release(ctrl->BundleVersion);
    Release(ctrl->DriverVersion);
    Release(ctrl->BiosVersion);
    Release(ctrl->FirmwareVersion);
    Release(ctrl->Model);
    Release(ctrl->DeviceID);
    ReleasePath(ctrl->ControllerOp);
    ReleasePath(ctrl->PortControllerOp);

    for (const DeviceKind* kind : kDeviceKinds) pthread_mutex_destroy(&(ctrl->*kind->classMutex));
    pthread_mutex_destroy(&ctrl->CtrlMutex);
    free(ctrl);
}

namespace {

/// Unlinks a record under CtrlMutex. 0, -1 or -3.
int Unlink(RaidController_t* ctrl, const DeviceKind& kind, void* device) {
    if (ctrl == nullptr) return RESULT_BAD_ARGUMENT;
    MutexGuard lock(ctrl->CtrlMutex);
    return RemoveEntryFromListByKey(DevicesOf(ctrl, kind), device);
}

int Delete(RaidController_t* ctrl, const DeviceKind& kind, void* device) {
    const int rc = Unlink(ctrl, kind, device);
    if (rc == RESULT_OK) kind.release(device);
    return rc;
}

void LogRemovedFromController(const char* name, const RaidController_t* ctrl) {
    syslog(LOG_INFO, "%s removed from controller %s(%s)\n", OrNull(name), ctrl->DeviceID,
           OrNull(ctrl->Model));
}

}  // namespace

int DeleteVolume(RaidController_t* ctrl, void* device) {
    return Delete(ctrl, kVolumes, device);
}

int DeleteBattery(RaidController_t* ctrl, void* device) {
    return Delete(ctrl, kBatteries, device);
}

int DeleteChassis(RaidController_t* ctrl, void* device) {
    return Delete(ctrl, kEnclosures, device);
}

int DeletePool(RaidController_t* ctrl, void* device) {
    return Delete(ctrl, kPools, device);
}

int DeletePort(RaidController_t* ctrl, void* device) {
    const int rc = Unlink(ctrl, kPorts, device);
    if (rc != RESULT_OK) return rc;
    LogRemovedFromController(static_cast<SASSATAPort_t*>(device)->PortName, ctrl);
    FreePort(device);
    return RESULT_OK;
}

int DeleteDisk(RaidController_t* ctrl, void* device) {
    if (ctrl == nullptr) return RESULT_BAD_ARGUMENT;
    const NoCancellation whole;
    // Held to the end: no reader may see the drive gone from the list but still in its pool.
    MutexGuard lock(ctrl->CtrlMutex);
    const int rc = RemoveEntryFromListByKey(DevicesOf(ctrl, kDrives), device);
    if (rc != RESULT_OK) return rc;

    auto* disk = static_cast<DiskDrive_t*>(device);
    LogRemovedFromController(disk->Name, ctrl);
    StoragePool_t* pool = FindStoragePoolByID(ctrl, disk->Pool);
    if (pool != nullptr) {
        RemoveDiskFromPool(pool, disk->DeviceID);
        syslog(LOG_INFO, "%s removed from pool %s\n", OrNull(disk->Name), disk->Pool);
    }
    FreeDisk(disk);
    return RESULT_OK;
}
