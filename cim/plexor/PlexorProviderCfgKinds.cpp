// The table of device kinds. One that is reconciled before another stands in its `PreConfigAction`:
// pools, then drives, then volumes.
#include "PlexorProviderCfgKinds.h"

#include "PlexorProviderLock.h"

constexpr DeviceKind kVolumes = {
    .noun = "volume",
    .recordName = "StorageVolume_t",
    .action = {ACTION_VOLUME, ACTION_DISK, "CIM_SystemDevice", "CIM_StorageVolume", "DeviceID",
               GetVolumeOp, BuildVolumeInfo, CheckAndUpdateVolumeInfo, DeleteVolume},
    .deviceCode = 1,
    .classMutex = &RaidController_t::VolumeCfgMutex,
    .updateTime = &RaidController_t::VolumeUpdateTime,
    .list = &RaidController_t::VolumeList,
    .embeddedList = &RaidController_t::__VolumeList,
    .release = FreeVolume,
};

constexpr DeviceKind kPorts = {
    .noun = "port",
    .recordName = "SASSATAPort_t",
    .action = {ACTION_PORT, ACTION_NONE, "CIM_SystemDevice", "CIM_SASSATAPort", "DeviceID",
               GetPortOp, BuildPortInfo, CheckAndUpdatePortInfo, DeletePort},
    .deviceCode = 2,
    .classMutex = &RaidController_t::PortCfgMutex,
    .updateTime = &RaidController_t::PortUpdateTime,
    .list = &RaidController_t::PortList,
    .embeddedList = &RaidController_t::__PortList,
    .release = FreePort,
};

constexpr DeviceKind kDrives = {
    .noun = "disk",
    .recordName = "DiskDrive_t",
    .action = {ACTION_DISK, ACTION_POOL, "CIM_SystemDevice", "CIM_DiskDrive", "DeviceID", GetDiskOp,
               BuildDiskInfo, CheckAndUpdateDiskInfo, DeleteDisk},
    .deviceCode = 3,
    .classMutex = &RaidController_t::DiskCfgMutex,
    .updateTime = &RaidController_t::DiskUpdateTime,
    .list = &RaidController_t::DiskList,
    .embeddedList = &RaidController_t::__DiskList,
    .release = FreeDisk,
};

constexpr DeviceKind kBatteries = {
    .noun = "battery",
    .recordName = "Battery_t",
    .action = {ACTION_BATTERY, ACTION_NONE, "CIM_SystemDevice", "CIM_Battery", "DeviceID",
               GetBatteryOp, BuildBatteryInfo, CheckAndUpdateBatteryInfo, DeleteBattery},
    .deviceCode = 4,
    .classMutex = &RaidController_t::BatteryCfgMutex,
    .updateTime = &RaidController_t::BatteryUpdateTime,
    .list = &RaidController_t::BatteryList,
    .embeddedList = &RaidController_t::__BatteryList,
    .release = FreeBattery,
};

constexpr DeviceKind kPools = {
    .noun = "pool",
    .recordName = "StoragePool_t",
    .action = {ACTION_POOL, ACTION_NONE, "CIM_HostedStoragePool", "CIM_StoragePool", "InstanceID",
               GetPoolOp, BuildSinglePoolInfo, CheckAndUpdatePoolInfo, DeletePool},
    .deviceCode = 0,
    .classMutex = &RaidController_t::PoolCfgMutex,
    .updateTime = &RaidController_t::PoolUpdateTime,
    .list = &RaidController_t::PoolList,
    .embeddedList = &RaidController_t::__PoolList,
    .release = FreePool,
};

constexpr DeviceKind kEnclosures = {
    .noun = "chassis",
    .recordName = "Chassis_t",
    .action = {ACTION_CHASSIS, ACTION_NONE, "CIM_SystemPackaging", "CIM_Chassis", "Tag",
               GetChassisOp, BuildSingleChassisInfo, CheckAndUpdateChassisInfo, DeleteChassis},
    .deviceCode = 0,
    .classMutex = &RaidController_t::ChassisCfgMutex,
    .updateTime = &RaidController_t::ChassisUpdateTime,
    .list = &RaidController_t::ChassisList,
    .embeddedList = &RaidController_t::__ChassisList,
    .release = FreeChassis,
};

namespace {

constexpr int CountCodes() {
    int count = 0;
    for (const DeviceKind* kind : kDeviceKinds) {
        if (kind->deviceCode != 0) count++;
    }
    return count;
}
static_assert(CountCodes() == kDeviceCodes);

}  // namespace

List_t* DevicesOf(const RaidController_t* ctrl, const DeviceKind& kind) {
    ExpectHeld(ctrl->CtrlMutex, __func__);
    return ctrl->*kind.list;
}

const DeviceKind* FindKindByAction(int action) {
    for (const DeviceKind* kind : kDeviceKinds) {
        if (kind->action.ConfigAction == action) return kind;
    }
    return nullptr;
}

const DeviceKind* FindKindByCode(int deviceCode) {
    if (deviceCode == 0) return nullptr;
    for (const DeviceKind* kind : kDeviceKinds) {
        if (kind->deviceCode == deviceCode) return kind;
    }
    return nullptr;
}
