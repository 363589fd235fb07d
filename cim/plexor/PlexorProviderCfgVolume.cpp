// Logical volumes: their records and what is watched on them.
#include <stdlib.h>

#include "PlexorProviderCfgBuild.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kBuilder[] = "BuildVolumeInfo";
constexpr const char kUpdater[] = "CheckAndUpdateVolumeInfo";

void ReadProperties(StorageVolume_t* volume, const CMPIInstance* inst) {
    volume->ElementName = StringClone(ReadString(inst, "ElementName"));
    volume->NumberOfBlocks = ReadUint64(inst, "NumberOfBlocks");
    volume->ConsumableBlocks = ReadUint64(inst, "ConsumableBlocks");
    volume->DataRedundancy = ReadUint16(inst, "DataRedundancy");
    volume->PackageRedundancy = ReadUint16(inst, "PackageRedundancy");
    volume->Name = StringClone(ReadString(inst, "Name"));
    volume->NameFormat = ReadUint16(inst, "NameFormat");
    volume->NameNameSpace = ReadUint16(inst, "NameNameSpace");
    volume->IsBasedOnUnderlyingRedundancy = ReadBoolean(inst, "IsBasedOnUnderlyingRedundancy");
    volume->DeltaReservation = ReadUint8(inst, "DeltaReservation");
    volume->Primordial = ReadBoolean(inst, "Primordial");
    volume->OperationalStatus = GetOperationalStatus(inst);
    volume->ExtentStatus = ReadArrayUint16(inst, "ExtentStatus");
}

void ReadRaidLevel(StorageVolume_t* volume, const CMPIContext* ctx, const CMPIObjectPath* devOp) {
    const CMPIInstance* setting = NextInstance(
        QueryAssociators({kBuilder, ctx, devOp, "CIM_ElementSettingData", "CIM_StorageSetting"}));
    volume->RaidLevel = StringClone(ReadString(setting, "ElementName"));
}

void DumpVolume(const StorageVolume_t* volume) {
    syslog(LOG_DEBUG,
           "\nVolumeOp: %s\n\tElementName       - %s\n\tDeviceID          - %s\n"
           "\tRaidLevel         - %s\n\tNumberOfBlocks    - %llu\n\tConsumableBlocks  - %llu\n"
           "\tDataRedundancy    - %d\n\tPackageRedundancy - %d\n\tNameFormat        - %d\n"
           "\tName              - %s\n\tNameNameSpace     - %d\n"
           "\tIsBasedOnUnderlyingRedundancy - %d\n\tDeltaReservation  - %d\n"
           "\tPrimordial        - %d\n\tOperationalStatus - %d\n",
           PathText(LOG_DEBUG, volume->VolumeOp), OrNull(volume->ElementName), volume->DeviceID,
           volume->RaidLevel, volume->NumberOfBlocks, volume->ConsumableBlocks,
           volume->DataRedundancy, volume->PackageRedundancy, volume->NameFormat,
           OrNull(volume->Name), volume->NameNameSpace, volume->IsBasedOnUnderlyingRedundancy,
           volume->DeltaReservation, volume->Primordial, volume->OperationalStatus);
}

void ReadPool(StorageVolume_t* volume, const CMPIContext* ctx) {
    CMPIEnumeration* pools = QueryAssociatorNames(
        {kBuilder, ctx, volume->VolumeOp, "CIM_AllocatedFromStoragePool", "CIM_StoragePool"});
    if (!HasNext(pools)) return;
    syslog(LOG_DEBUG, "%s: found a pool instance\n", kBuilder);
    volume->FromPool = StringClone(ReadKey(NextPath(pools), "InstanceID"));
}

/// Path, identity, properties and RAID level. False without DeviceID.
bool ReadParts(StorageVolume_t* volume, const CMPIContext* ctx, const CMPIInstance* devInst,
               const CMPIObjectPath* devOp) {
    volume->VolumeOp = ClonePath(devOp);
    volume->DeviceID = CloneDeviceID(kVolumes, devInst, volume->VolumeOp);
    if (volume->DeviceID == nullptr) return false;
    ReadProperties(volume, devInst);
    ReadRaidLevel(volume, ctx, devOp);
    volume->LastUpdateTime = time(nullptr);
    return true;
}

/// Puts the volume into the controller's list. 0, -1 without a pool, or the list's code.
int PublishWithPool(RaidController_t* ctrl, StorageVolume_t* volume) {
    if (volume->FromPool == nullptr) {
        syslog(LOG_ERR, "No pool associated with volume %s\n", PathText(LOG_ERR, volume->VolumeOp));
        return RESULT_BAD_ARGUMENT;
    }
    return PublishRecord(kBuilder, ctrl, kVolumes, volume);
}

int Build(RaidController_t* ctrl, const CMPIContext* ctx, const CMPIInstance* devInst,
          const CMPIObjectPath* devOp) {
    auto* volume = NewDevice<StorageVolume_t>(kBuilder, kVolumes);
    if (volume == nullptr) return RESULT_NO_MEMORY;
    if (!ReadParts(volume, ctx, devInst, devOp)) {
        FreeVolume(volume);
        return RESULT_BAD_ARGUMENT;
    }
    DumpVolume(volume);
    ReadPool(volume, ctx);
    if (volume->FromPool == nullptr && StopRequested()) {
        FreeVolume(volume);  // the pool may not have been asked for
        return RESULT_BAD_ARGUMENT;
    }

    const int rc = PublishWithPool(ctrl, volume);
    // Not by BuildRecord, and only the block: what a volume that is turned away here holds stays
    // behind. To release it would add broker calls and log lines that others do not expect here.
    if (rc != RESULT_OK) free(volume);
    return rc;
}

// The three comparisons of an update; the caller holds CtrlMutex.

void UpdateStatus(StorageVolume_t* volume, CMPIUint16 operational, CMPIUint16 extentStatus) {
    if (operational == volume->OperationalStatus && extentStatus == volume->ExtentStatus) return;
    syslog(LOG_DEBUG,
           "%s: volume %s status changed. Old opStat %d extStat %d, new opStat %d extStat %d\n",
           kUpdater, volume->DeviceID, volume->OperationalStatus, volume->ExtentStatus, operational,
           extentStatus);
    volume->OperationalStatus = operational;
    volume->ExtentStatus = extentStatus;
}

void UpdateCapacity(StorageVolume_t* volume, CMPIUint64 total, CMPIUint64 available) {
    if (total == volume->NumberOfBlocks && available == volume->ConsumableBlocks) return;
    syslog(LOG_DEBUG,
           "%s: volume %s capacity changed. Old total blocs %lld free blocks %lld, "
           "new total blocks %lld free blocks %lld\n",
           kUpdater, volume->DeviceID, static_cast<long long>(volume->NumberOfBlocks),
           static_cast<long long>(volume->ConsumableBlocks), static_cast<long long>(total),
           static_cast<long long>(available));
    volume->NumberOfBlocks = total;
    volume->ConsumableBlocks = available;
}

bool SameName(const char* left, const char* right) {
    if (left == nullptr || right == nullptr) return left == right;
    return strcmp(left, right) == 0;
}

void UpdateName(StorageVolume_t* volume, const char* name) {
    if (SameName(volume->ElementName, name)) return;
    syslog(LOG_DEBUG, "%s: volume %s element name changed. Old name %s, new name %s\n", kUpdater,
           volume->DeviceID, OrNull(volume->ElementName), OrNull(name));
    char* copy = StringClone(name);
    free(volume->ElementName);
    volume->ElementName = copy;
}

void Update(RaidController_t* ctrl, StorageVolume_t* volume, const CMPIContext* ctx,
            const CMPIInstance* devInst) {
    const CMPIInstance* inst = devInst;
    if (inst == nullptr) inst = QueryInstance(kUpdater, ctx, volume->VolumeOp);
    if (inst == nullptr) return;
    const CMPIUint16 operational = GetOperationalStatus(inst);
    const CMPIUint16 extentStatus = ReadArrayUint16(inst, "ExtentStatus");
    const CMPIUint64 total = ReadUint64(inst, "NumberOfBlocks");
    const CMPIUint64 available = ReadUint64(inst, "ConsumableBlocks");
    const char* name = ReadString(inst, "ElementName");

    MutexGuard lock(ctrl->CtrlMutex);
    UpdateStatus(volume, operational, extentStatus);
    UpdateCapacity(volume, total, available);
    UpdateName(volume, name);
}

}  // namespace

int BuildVolumeInfo(const CMPIInstanceMI*, const CMPIContext* ctx, RaidController_t* ctrl,
                    const CMPIInstance* devInst, const CMPIObjectPath* devOp) {
    syslog(LOG_DEBUG, "%s, ENTER...\n", __func__);
    const int rc = Build(ctrl, ctx, devInst, devOp);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", __func__, rc);
    return rc;
}

int CheckAndUpdateVolumeInfo(const CMPIInstanceMI*, const CMPIContext* ctx, RaidController_t* ctrl,
                             void* device, CMPIInstance* devInst) {
    auto* volume = static_cast<StorageVolume_t*>(device);
    syslog(LOG_DEBUG, "%s: ENTER. volume - %s\n", __func__, OrNull(volume->ElementName));
    if (NeedUpdate(volume->LastUpdateTime, volume->UpdateEnabled)) {
        Update(ctrl, volume, ctx, devInst);
        StampTime(ctrl, kVolumes);
    }
    syslog(LOG_DEBUG, "%s, exit\n", __func__);
    return RESULT_OK;
}
