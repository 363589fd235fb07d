// Records of the inventory made by hand, without the provider's builders.
#pragma once

#include "PlexorProvider.h"

namespace plexortest {

/// A heap copy as records own it; null for null. Never fails, whatever FailAllocation says.
char* ownedCopy(const char* text);
/// A zero-filled block as records are made of. Never fails, whatever FailAllocation says.
void* zeroedBlock(size_t size);

/// A record or work item, all fields zero.
template <typename Record>
Record* zeroed() {
    return static_cast<Record*>(zeroedBlock(sizeof(Record)));
}

/// A controller as discovery leaves it: mutexes made, lists empty, ExtentList null. Its model is
/// "Model " and the id, its four versions are "FW-", "BIOS-", "DRV-" and "PKG-" and the id; it is
/// well (5) and OK (2). No paths. Released with FreeController.
RaidController_t* newController(const char* deviceID);

// Devices with their texts filled and their status OK (2), no paths, in no list. Released with the
// Free function of their kind.

/// Name is "Name " and the id, ElementName "Volume " and the id, RaidLevel "RAID5".
StorageVolume_t* newVolume(const char* deviceID, const char* pool = nullptr);
/// Name is "Disk " and the id, FwVersion "FW1". `pool` and `chassis` may be null.
DiskDrive_t* newDisk(const char* deviceID, const char* pool = nullptr,
                     const char* chassis = nullptr);
/// PoolID is "Pool " and the id; Drives points at _Drives.
StoragePool_t* newPool(const char* instanceID);
/// PortName is "Port " and the id.
SASSATAPort_t* newPort(const char* deviceID);
Battery_t* newBattery(const char* deviceID);
/// InternalTag may be null.
Chassis_t* newChassis(const char* tag, const char* internalTag = nullptr);

/// Appends to a list without the provider's functions and without a log line.
void append(List_t& list, void* item);
/// Each appends a record to its list of the controller and returns it.
StorageVolume_t* attach(RaidController_t* ctrl, StorageVolume_t* volume);
DiskDrive_t* attach(RaidController_t* ctrl, DiskDrive_t* disk);
StoragePool_t* attach(RaidController_t* ctrl, StoragePool_t* pool);
SASSATAPort_t* attach(RaidController_t* ctrl, SASSATAPort_t* port);
Battery_t* attach(RaidController_t* ctrl, Battery_t* battery);
Chassis_t* attach(RaidController_t* ctrl, Chassis_t* chassis);
/// Appends a controller to RaidControllerList.
RaidController_t* attach(RaidController_t* ctrl);

/// Appends an owned copy of a drive's DeviceID to a pool's members.
void addMember(StoragePool_t* pool, const char* deviceID);

}  // namespace plexortest
