// Building a drive's record from the drive, its extent, firmware, place and pool.
#include <stdlib.h>

#include "PlexorProviderCfgBuild.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kBuilder[] = "BuildDiskInfo";

/// The drive's own properties. False without DeviceID.
bool ReadDrive(DiskDrive_t* disk, const CMPIInstance* inst) {
    disk->DeviceID = CloneDeviceID(kDrives, inst, disk->DiskOp);
    if (disk->DeviceID == nullptr) return false;
    disk->Name = StringClone(ReadString(inst, "Name"));
    disk->EnabledState = ReadUint16(inst, "EnabledState");
    disk->OperationalStatus = GetOperationalStatus(inst);
    return true;
}

/// The extent that stands for the drive's media. False without one.
bool ReadMedia(DiskDrive_t* disk, const CMPIContext* ctx, const CMPIObjectPath* devOp) {
    CMPIEnumeration* media = QueryAssociators({kBuilder, ctx, devOp, "CIM_MediaPresent", nullptr});
    if (media == nullptr) return false;
    if (!HasNext(media)) {
        syslog(LOG_ERR, "Disk %s no media present\n", disk->DeviceID);
        return false;
    }
    const CMPIInstance* extent = NextInstance(media);
    if (extent == nullptr) return false;
    disk->ExtentOp = ClonePath(InstancePath(extent));
    disk->NumberOfBlocks = ReadUint64(extent, "NumberOfBlocks");
    disk->ConsumableBlocks = ReadUint64(extent, "ConsumableBlocks");
    disk->Primordial = ReadBoolean(extent, "Primordial");
    disk->ExtentStatus = ReadArrayUint16(extent, "ExtentStatus");
    return true;
}

void ReadFirmware(DiskDrive_t* disk, const CMPIContext* ctx, const CMPIObjectPath* devOp) {
    CMPIEnumeration* identities = QueryAssociators(
        {kBuilder, ctx, devOp, "CIM_ElementSoftwareIdentity", "CIM_SoftwareIdentity"});
    if (identities == nullptr) return;
    if (!HasNext(identities)) {
        syslog(LOG_ERR, "Disk %s firmware version no available\n", disk->DeviceID);
        return;
    }
    disk->FwVersion = StringClone(ReadString(NextInstance(identities), "VersionString"));
}

/// Slot and enclosure, as far as the chain package, slot, chassis goes.
void ReadLocation(DiskDrive_t* disk, const CMPIContext* ctx, const CMPIObjectPath* devOp) {
    const CMPIObjectPath* package = NextPath(
        QueryAssociatorNames({kBuilder, ctx, devOp, "CIM_Realizes", "CIM_PhysicalPackage"}));
    if (package == nullptr) return;
    syslog(LOG_DEBUG, "CIM_PhysicalPackage(Physical Drive): %s\n", PathText(LOG_DEBUG, package));

    const CMPIInstance* slot = NextInstance(
        QueryAssociators({kBuilder, ctx, package, "CIM_PackageInConnector", "CIM_Slot"}));
    if (slot == nullptr) return;
    disk->SlotNumber = ReadUint16(slot, "Number");

    const CMPIObjectPath* chassis = NextPath(
        QueryAssociatorNames({kBuilder, ctx, InstancePath(slot), "CIM_Container", "CIM_Chassis"}));
    disk->Chassis = StringClone(ReadKey(chassis, "Tag"));
}

void DumpDisk(const DiskDrive_t* disk) {
    syslog(LOG_INFO,
           "\nDiskOp: %s\nExtentOp: %s\n\tDeviceID          - %s\n\tName              - %s\n"
           "\tFirmwareVersion   - %s\n\tNumberOfBlocks    - %llu\n\tConsumableBlocks  - %llu\n"
           "\tPrimordial        - %d\n\tEnabledState      - %d\n\tOperationalStatus - %d\n"
           "\tSlot              - %d\n\tChassis           - %s\n",
           PathText(LOG_INFO, disk->DiskOp), PathText(LOG_INFO, disk->ExtentOp), disk->DeviceID,
           OrNull(disk->Name), OrNull(disk->FwVersion), disk->NumberOfBlocks,
           disk->ConsumableBlocks, disk->Primordial, disk->EnabledState, disk->OperationalStatus,
           disk->SlotNumber, disk->Chassis != nullptr ? disk->Chassis : "No Chassis");
}

/// Candidate pools of the drive's extent; null without an extent or when the query failed.
CMPIEnumeration* CandidatePools(const DiskDrive_t* disk, const CMPIContext* ctx) {
    if (disk->ExtentOp == nullptr) return nullptr;
    // The line names the classes of the enclosure query: so it is matched, and so it stays.
    LogAssociatorNames({kBuilder, ctx, disk->ExtentOp, "CIM_Container", "CIM_Chassis"});
    return RunAssociatorNames(
        {kBuilder, ctx, disk->ExtentOp, "CIM_ConcreteComponent", "CIM_StoragePool"});
}

/// Appends the drive and, when that fails, withdraws it from `pool` again. The list's code.
int Append(RaidController_t* ctrl, DiskDrive_t* disk, StoragePool_t* pool)
    PLEXOR_HOLDS(ctrl->CtrlMutex) {
    void* const list = ctrl->DiskList;
    const int rc = AppendRecord(ctrl, kDrives, disk);
    if (rc == RESULT_OK) {
        syslog(LOG_DEBUG, "%s: disk %p added to the list %p\n", kBuilder, static_cast<void*>(disk),
               list);
        return rc;
    }
    syslog(LOG_ERR, "%s: failed to add disk %p to list %p, rc %d.\n", kBuilder,
           static_cast<void*>(disk), list, rc);
    if (pool == nullptr) return rc;
    syslog(LOG_DEBUG, "%s: remove disk %s from pool %p\n", kBuilder, disk->DeviceID,
           static_cast<void*>(pool));
    RemoveDiskFromPool(pool, disk->DeviceID);
    return rc;
}

/// Takes `candidate` as the drive's pool. When it is cached, joins it and appends the drive under
/// one hold of CtrlMutex: a reader that finds the member must find its record. True when that
/// happened, with the list's code in `rc`.
bool JoinAndAppend(RaidController_t* ctrl, DiskDrive_t* disk, const CMPIObjectPath* candidate,
                   int& rc) {
    free(disk->Pool);
    disk->Pool = StringClone(ReadKey(candidate, "InstanceID"));
    const NoCancellation whole;  // a member without its record would keep requests waiting
    MutexGuard lock(ctrl->CtrlMutex);
    StoragePool_t* pool = FindStoragePoolByID(ctrl, disk->Pool);
    if (pool == nullptr) return false;
    syslog(LOG_DEBUG, "%s: found a pool %p with ID %s\n", kBuilder, static_cast<void*>(pool),
           disk->Pool);
    AddDiskToPool(pool, disk->DeviceID);
    rc = Append(ctrl, disk, pool);
    return true;
}

/// Finds the drive's pool and puts the drive into the controller's list. 0, -1 without a pool, or
/// the list's code.
int JoinAndPublish(RaidController_t* ctrl, DiskDrive_t* disk, const CMPIContext* ctx) {
    CMPIEnumeration* pools = CandidatePools(disk, ctx);
    while (const CMPIObjectPath* candidate = NextPath(pools)) {
        if (StopRequested()) break;
        int rc = RESULT_OK;
        if (JoinAndAppend(ctrl, disk, candidate, rc)) return rc;
    }
    if (disk->Pool == nullptr) {
        if (StopRequested()) return RESULT_BAD_ARGUMENT;  // it may not have been asked for
        syslog(LOG_ERR, "No pool associated with disk %s\n", PathText(LOG_ERR, disk->DiskOp));
        return RESULT_BAD_ARGUMENT;
    }
    // Its pool is not cached yet; the next refresh of the drive joins it.
    MutexGuard lock(ctrl->CtrlMutex);
    return Append(ctrl, disk, nullptr);
}

bool ReadParts(DiskDrive_t* disk, const CMPIContext* ctx, const CMPIInstance* devInst,
               const CMPIObjectPath* devOp) {
    disk->DiskOp = ClonePath(devOp);
    if (!ReadDrive(disk, devInst)) return false;
    if (!ReadMedia(disk, ctx, devOp)) return false;
    ReadFirmware(disk, ctx, devOp);
    ReadLocation(disk, ctx, devOp);
    disk->LastUpdateTime = time(nullptr);
    return true;
}

int Build(RaidController_t* ctrl, const CMPIContext* ctx, const CMPIInstance* devInst,
          const CMPIObjectPath* devOp) {
    if (devOp == nullptr || devInst == nullptr || ctrl == nullptr) return RESULT_BAD_ARGUMENT;
    return BuildRecord<DiskDrive_t>(kBuilder, kDrives, [&](DiskDrive_t* disk) -> int {
        if (!ReadParts(disk, ctx, devInst, devOp)) return RESULT_BAD_ARGUMENT;
        DumpDisk(disk);
        return JoinAndPublish(ctrl, disk, ctx);
    });
}

}  // namespace

int BuildDiskInfo(const CMPIInstanceMI*, const CMPIContext* ctx, RaidController_t* ctrl,
                  const CMPIInstance* devInst, const CMPIObjectPath* devOp) {
    syslog(LOG_DEBUG, "%s, ENTER...\n", __func__);
    const int rc = Build(ctrl, ctx, devInst, devOp);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", __func__, rc);
    return rc;
}
