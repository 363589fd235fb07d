// Rendering physical drives, seen as extents.
#include "PlexorProviderIfc.h"
#include "PlexorProviderIfcProperty.h"

namespace {

constexpr CMPIUint16 kBlockSize = 512;

/// CIM ExtentStatus, as far as a drive's condition depends on it.
enum ExtentState : CMPIUint16 {
    EXTENT_BROKEN = 3,
    EXTENT_REBUILD = 11,
    EXTENT_SPARE_IN_USE = 13,
};

struct Condition {
    const char* word;
    CMPIUint16 health;
};

Condition ConditionOf(const DiskDrive_t* disk, bool primordial) {
    switch (disk->OperationalStatus) {
        case OPSTATUS_OK:
            if (disk->ExtentStatus == EXTENT_SPARE_IN_USE) return {"HOT SPARE", HEALTHSTATE_OK};
            if (primordial) return {"UNCONFIGURED GOOD", HEALTHSTATE_OK};
            if (disk->ExtentStatus == EXTENT_REBUILD) return {"REBUILD", HEALTHSTATE_OK};
            return {"ONLINE", HEALTHSTATE_OK};
        case OPSTATUS_ERROR:
            if (primordial && disk->ExtentStatus != EXTENT_BROKEN) {
                return {"UNCONFIGURED BAD", HEALTHSTATE_WARNING};
            }
            return {"FAILED", HEALTHSTATE_FAILED};
        case OPSTATUS_NO_CONTACT:
            return {"OFFLINE", HEALTHSTATE_MAJOR};
        case OPSTATUS_DORMANT:
            return {"UNCONFIGURED GOOD", HEALTHSTATE_OK};
        default:
            return {"UNDEFINED", HEALTHSTATE_WARNING};
    }
}

}  // namespace

const char* GetDiskPhysicalStatus(const RaidController_t* ctrl, const DiskDrive_t* disk,
                                  CMPIUint16* health) {
    bool primordial = disk->Primordial != 0;
    const StoragePool_t* pool = FindStoragePoolByID(ctrl, disk->Pool);
    if (pool != nullptr) primordial = pool->Primordial != 0;
    const Condition condition = ConditionOf(disk, primordial);
    *health = condition.health;
    return condition.word;
}

void FillExtentInstance(CMPIInstance* inst, RaidController_t* ctrl, DiskDrive_t* extent) {
    BoundedText<128> text;
    text.Append("Drive ");
    const Chassis_t* chassis = FindChassisByTag(ctrl, extent->Chassis);
    if (chassis != nullptr) {
        text.Append("%d in enclosure %s", extent->SlotNumber, chassis->InternalTag);
    } else {
        text.Append("%s", extent->DeviceID);
    }
    text.Append(" on controller %s Fw: %s", ctrl->DeviceID, VersionOrNone(extent->FwVersion));
    CMPIUint16 health = HEALTHSTATE_UNKNOWN;
    text.Append(" - %s", GetDiskPhysicalStatus(ctrl, extent, &health));

    SetNameAndCaption(inst, text.Text());
    SetUint16Array(inst, "OperationalStatus", extent->OperationalStatus);
    SetUint16(inst, "HealthState", health);
    SetUint16(inst, "BlockSize", kBlockSize);
    SetUint64(inst, "NumberOfBlocks", extent->NumberOfBlocks);
    SetBoolean(inst, "Primordial", extent->Primordial);
}
