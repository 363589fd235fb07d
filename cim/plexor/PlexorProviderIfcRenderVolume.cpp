// Rendering logical volumes.
#include <sched.h>

#include "PlexorProviderIfc.h"
#include "PlexorProviderIfcProperty.h"
#include "PlexorProviderUtilLife.h"

namespace {

using VolumeText = BoundedText<512>;

constexpr CMPIUint64 kBlockSize = 512;

struct VolumeState {
    CMPIUint16 opStatus;
    const char* suffix;
    CMPIUint16 health;
};

constexpr VolumeState kVolumeStates[] = {
    {OPSTATUS_OK, " - OPTIMAL", HEALTHSTATE_OK},
    {OPSTATUS_DEGRADED, " - DEGRADED", HEALTHSTATE_WARNING},
    {OPSTATUS_ERROR, " - OFFLINE", HEALTHSTATE_FAILED},
};
constexpr VolumeState kUndefinedState = {OPSTATUS_UNKNOWN, " - UNDEFINED", HEALTHSTATE_UNKNOWN};

const VolumeState& StateOf(const StorageVolume_t* volume) {
    for (const VolumeState& state : kVolumeStates) {
        if (state.opStatus == volume->OperationalStatus) return state;
    }
    return kUndefinedState;
}

CMPIUint16 NameSpaceOf(CMPIUint16 nameFormat) {
    // Index: NameFormat.
    constexpr CMPIUint16 kNameSpaces[] = {0, 1, 2, 2, 3, 4, 1, 7, 7, 2, 1, 1};
    constexpr size_t kCount = sizeof kNameSpaces / sizeof kNameSpaces[0];
    return nameFormat < kCount ? kNameSpaces[nameFormat] : 0;
}

/// The member's record. The request waits until there is one: a member is never left out. It does
/// not wait for ever: who changes the members changes the records in the same hold of CtrlMutex.
/// Null when a cleanup has given up waiting for the request.
const DiskDrive_t* WaitForDisk(const RaidController_t* ctrl, const char* deviceID)
    PLEXOR_HOLDS(ctrl->CtrlMutex) {
    const DiskDrive_t* disk = FindDiskByDeviceID(ctrl, deviceID);
    while (disk == nullptr && !LifeGuard().MemberOfEnded()) {
        sched_yield();
        disk = FindDiskByDeviceID(ctrl, deviceID);
    }
    return disk;
}

void AppendMembers(VolumeText& text, const RaidController_t* ctrl, const StoragePool_t* pool)
    PLEXOR_HOLDS(ctrl->CtrlMutex) {
    text.Append(", Drives(");
    // Without members the parenthesis stays open: that is the text's form.
    const List_Entry_t* entry = pool->Drives->Head;
    for (; entry != nullptr; entry = entry->Next) {
        const DiskDrive_t* disk = WaitForDisk(ctrl, static_cast<char*>(entry->Data));
        if (disk == nullptr) return;
        const Chassis_t* chassis = FindChassisByTag(ctrl, disk->Chassis);
        if (chassis != nullptr) {
            text.Append("%de%s", disk->SlotNumber, chassis->InternalTag);
        } else {
            text.Append("%s", disk->DeviceID);
        }
        text.Append("%s", entry->Next != nullptr ? "," : ")");
    }
}

void ComposeName(VolumeText& text, const RaidController_t* ctrl, const StorageVolume_t* volume)
    PLEXOR_HOLDS(ctrl->CtrlMutex) {
    if (volume->RaidLevel != nullptr && volume->RaidLevel[0] != '\0') {
        text.Append("%s ", volume->RaidLevel);
    }
    if (volume->ElementName != nullptr && volume->ElementName[0] != '\0') {
        text.Append("%s ", volume->ElementName);
    }
    text.Append("Logical Volume %s on controller %s", volume->DeviceID, ctrl->DeviceID);
    const StoragePool_t* pool = FindStoragePoolByID(ctrl, volume->FromPool);
    if (pool != nullptr && pool->Drives != nullptr) {
        AppendMembers(text, ctrl, pool);
    } else {
        syslog(LOG_ERR, "%s: Cannot get physical drive info for logical volume %s\n",
               "FillVolumeInstance", volume->DeviceID);
    }
    text.Append("%s", StateOf(volume).suffix);
}

}  // namespace

void FillVolumeInstance(CMPIInstance* inst, RaidController_t* ctrl, StorageVolume_t* volume) {
    VolumeText text;
    ComposeName(text, ctrl, volume);
    SetNameAndCaption(inst, text.Text());
    SetUint16Array(inst, "OperationalStatus", volume->OperationalStatus);
    SetUint16(inst, "HealthState", StateOf(volume).health);
    SetUint16(inst, "NameFormat", volume->NameFormat);
    SetChars(inst, "Name", volume->Name);
    SetUint16(inst, "NameNameSpace", NameSpaceOf(volume->NameFormat));
    SetUint64(inst, "BlockSize", kBlockSize);
    SetUint64(inst, "NumberOfBlocks", volume->NumberOfBlocks);
    SetUint64(inst, "ConsumableBlocks", volume->ConsumableBlocks);
    SetBoolean(inst, "IsBasedOnUnderlyingRedundancy", volume->IsBasedOnUnderlyingRedundancy);
    SetBoolean(inst, "NoSinglePointOfFailure", true);
    SetUint16(inst, "DataRedundancy", volume->DataRedundancy);
    SetUint8(inst, "DeltaReservation", volume->DeltaReservation);
    SetBoolean(inst, "Primordial", volume->Primordial);
    SetUint16Array(inst, "ExtentStatus", volume->ExtentStatus);
}
