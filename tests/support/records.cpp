#include "records.h"

#include <cstdlib>
#include <string>

extern "C" {
void* __real_calloc(size_t count, size_t size);
char* __real_strdup(const char* text);
}

namespace plexortest {
namespace {

template <typename Record>
Record* attachTo(List_t* list, Record* record) {
    append(*list, record);
    return record;
}

char* joined(const char* prefix, const char* id) {
    return ownedCopy((std::string(prefix) + id).c_str());
}

}  // namespace

char* ownedCopy(const char* text) {
    return text != nullptr ? __real_strdup(text) : nullptr;
}

void* zeroedBlock(size_t size) {
    void* block = __real_calloc(1, size);
    if (block == nullptr) std::abort();
    return block;
}

RaidController_t* newController(const char* deviceID) {
    auto* ctrl = zeroed<RaidController_t>();
    for (pthread_mutex_t* mutex :
         {&ctrl->CtrlMutex, &ctrl->DiskCfgMutex, &ctrl->VolumeCfgMutex, &ctrl->PortCfgMutex,
          &ctrl->BatteryCfgMutex, &ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex}) {
        pthread_mutex_init(mutex, nullptr);
    }
    ctrl->VolumeList = &ctrl->__VolumeList;
    ctrl->DiskList = &ctrl->__DiskList;
    ctrl->PoolList = &ctrl->__PoolList;
    ctrl->BatteryList = &ctrl->__BatteryList;
    ctrl->PortList = &ctrl->__PortList;
    ctrl->ChassisList = &ctrl->__ChassisList;
    ctrl->DeviceID = ownedCopy(deviceID);
    ctrl->Model = joined("Model ", deviceID);
    ctrl->FirmwareVersion = joined("FW-", deviceID);
    ctrl->BiosVersion = joined("BIOS-", deviceID);
    ctrl->DriverVersion = joined("DRV-", deviceID);
    ctrl->BundleVersion = joined("PKG-", deviceID);
    ctrl->HealthState = HEALTHSTATE_OK;
    ctrl->OperationalStatus = OPSTATUS_OK;
    return ctrl;
}

StorageVolume_t* newVolume(const char* deviceID, const char* pool) {
    auto* volume = zeroed<StorageVolume_t>();
    volume->DeviceID = ownedCopy(deviceID);
    volume->Name = joined("Name ", deviceID);
    volume->ElementName = joined("Volume ", deviceID);
    volume->RaidLevel = ownedCopy("RAID5");
    volume->OperationalStatus = OPSTATUS_OK;
    volume->FromPool = ownedCopy(pool);
    return volume;
}

DiskDrive_t* newDisk(const char* deviceID, const char* pool, const char* chassis) {
    auto* disk = zeroed<DiskDrive_t>();
    disk->DeviceID = ownedCopy(deviceID);
    disk->Name = joined("Disk ", deviceID);
    disk->FwVersion = ownedCopy("FW1");
    disk->OperationalStatus = OPSTATUS_OK;
    disk->Pool = ownedCopy(pool);
    disk->Chassis = ownedCopy(chassis);
    return disk;
}

StoragePool_t* newPool(const char* instanceID) {
    auto* pool = zeroed<StoragePool_t>();
    pool->Drives = &pool->_Drives;
    pool->InstanceID = ownedCopy(instanceID);
    pool->PoolID = joined("Pool ", instanceID);
    pool->OperationalStatus = OPSTATUS_OK;
    return pool;
}

SASSATAPort_t* newPort(const char* deviceID) {
    auto* port = zeroed<SASSATAPort_t>();
    port->DeviceID = ownedCopy(deviceID);
    port->PortName = joined("Port ", deviceID);
    port->OperationalStatus = OPSTATUS_OK;
    return port;
}

Battery_t* newBattery(const char* deviceID) {
    auto* battery = zeroed<Battery_t>();
    battery->DeviceID = ownedCopy(deviceID);
    battery->OperationalStatus = OPSTATUS_OK;
    return battery;
}

Chassis_t* newChassis(const char* tag, const char* internalTag) {
    auto* chassis = zeroed<Chassis_t>();
    chassis->Tag = ownedCopy(tag);
    chassis->InternalTag = ownedCopy(internalTag);
    chassis->OperationalStatus = OPSTATUS_OK;
    return chassis;
}

void append(List_t& list, void* item) {
    auto* entry = zeroed<List_Entry_t>();
    entry->Data = item;
    if (list.Head == nullptr) {
        list.Head = entry;
    } else {
        list.Tail->Next = entry;
    }
    list.Tail = entry;
    list.Size++;
}

StorageVolume_t* attach(RaidController_t* ctrl, StorageVolume_t* volume) {
    return attachTo(ctrl->VolumeList, volume);
}
DiskDrive_t* attach(RaidController_t* ctrl, DiskDrive_t* disk) {
    return attachTo(ctrl->DiskList, disk);
}
StoragePool_t* attach(RaidController_t* ctrl, StoragePool_t* pool) {
    return attachTo(ctrl->PoolList, pool);
}
SASSATAPort_t* attach(RaidController_t* ctrl, SASSATAPort_t* port) {
    return attachTo(ctrl->PortList, port);
}
Battery_t* attach(RaidController_t* ctrl, Battery_t* battery) {
    return attachTo(ctrl->BatteryList, battery);
}
Chassis_t* attach(RaidController_t* ctrl, Chassis_t* chassis) {
    return attachTo(ctrl->ChassisList, chassis);
}
RaidController_t* attach(RaidController_t* ctrl) {
    return attachTo(RaidControllerList, ctrl);
}

void addMember(StoragePool_t* pool, const char* deviceID) {
    append(pool->_Drives, ownedCopy(deviceID));
}

}  // namespace plexortest
