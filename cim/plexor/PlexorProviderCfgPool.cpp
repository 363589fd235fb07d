// Storage pools and enclosures: the two walks that a worker does inline, and their builders.
#include "PlexorProviderCfgBuild.h"
#include "PlexorProviderCfgClassLock.h"

namespace {

constexpr const char kPoolBuilder[] = "BuildSinglePoolInfo";
constexpr const char kChassisBuilder[] = "BuildSingleChassisInfo";

/// Builds every device of a kind, up to the first that fails. Its code, or 0.
int BuildAll(const char* caller, const DeviceKind& kind, const CMPIInstanceMI* mi,
             const CMPIContext* ctx, RaidController_t* ctrl) {
    const ConfigAction_t& action = kind.action;
    CMPIEnumeration* found = QueryAssociators(
        {caller, ctx, ctrl->ControllerOp, action.AssociationClassName, action.AssociatedClassName});
    if (found == nullptr) return RESULT_OK;

    pthread_mutex_t& classMutex = ctrl->*kind.classMutex;
    ClassLock lock(ctrl, classMutex, action.AssociatedClassName);
    int rc = RESULT_OK;
    while (rc == RESULT_OK && !StopRequested()) {
        const CMPIInstance* inst = NextInstance(found);
        if (inst == nullptr) break;
        rc = action.BuildFunc(mi, ctx, ctrl, inst, InstancePath(inst));
    }
    lock.Unlock();
    return rc;
}

/// The tag without the controller's DeviceID and the underscores behind it; null when it does not
/// begin with the DeviceID or nothing is left.
const char* InternalTagOf(const char* tag, const char* controllerId) {
    const size_t length = strlen(controllerId);
    if (strncmp(tag, controllerId, length) != 0) return nullptr;
    const char* rest = tag + length + strspn(tag + length, "_");
    return *rest != '\0' ? rest : nullptr;
}

bool ReadPool(StoragePool_t* pool, const CMPIInstance* inst, const CMPIObjectPath* op) {
    pool->Drives = &pool->_Drives;
    pool->PoolOp = ClonePath(op);
    pool->InstanceID = StringClone(ReadString(inst, "InstanceID"));
    pool->PoolID = StringClone(ReadString(inst, "PoolID"));
    if (pool->InstanceID == nullptr || pool->PoolID == nullptr) {
        syslog(LOG_ERR, "NULL InstanceID or PoolID for pool %s\n", PathText(LOG_ERR, pool->PoolOp));
        return false;
    }
    pool->TotalManagedSpace = ReadUint64(inst, "TotalManagedSpace");
    pool->RemainingManagedSpace = ReadUint64(inst, "RemainingManagedSpace");
    pool->Primordial = ReadBoolean(inst, "Primordial");
    pool->OperationalStatus = GetOperationalStatus(inst);
    pool->LastUpdateTime = time(nullptr);
    return true;
}

void DumpPool(const StoragePool_t* pool) {
    syslog(LOG_INFO,
           "\nPoolOp: %s\n\tInstanceID            - %s\n\tPoolId                - %s\n"
           "\tPrimordial            - %d\n\tTotalManagedSpace     - %llu\n"
           "\tRemainingManagedSpace - %llu\n\tOperationalStatus     - %d\n",
           PathText(LOG_INFO, pool->PoolOp), pool->InstanceID, pool->PoolID, pool->Primordial,
           pool->TotalManagedSpace, pool->RemainingManagedSpace, pool->OperationalStatus);
}

int BuildPool(RaidController_t* ctrl, const CMPIInstance* inst, const CMPIObjectPath* op) {
    return BuildRecord<StoragePool_t>(kPoolBuilder, kPools, [&](StoragePool_t* pool) -> int {
        if (!ReadPool(pool, inst, op)) return RESULT_BAD_ARGUMENT;
        DumpPool(pool);
        return PublishRecord(kPoolBuilder, ctrl, kPools, pool);
    });
}

bool ReadChassis(Chassis_t* chassis, const RaidController_t* ctrl, const CMPIInstance* inst,
                 const CMPIObjectPath* op) {
    chassis->ChassisOp = ClonePath(op);
    chassis->Tag = StringClone(ReadString(inst, "Tag"));
    if (chassis->Tag == nullptr) {
        syslog(LOG_ERR, "NULL tag for chassis %s\n", PathText(LOG_ERR, chassis->ChassisOp));
        return false;
    }
    chassis->OperationalStatus = GetOperationalStatus(inst);
    chassis->InternalTag = StringClone(InternalTagOf(chassis->Tag, ctrl->DeviceID));
    chassis->LastUpdateTime = time(nullptr);
    return true;
}

void DumpChassis(const Chassis_t* chassis) {
    syslog(LOG_DEBUG,
           "\nChassisOp: %s\n\tTag               - %s\n\tInternalTag       - %s\n"
           "\tOperationalStatus - %d\n",
           PathText(LOG_DEBUG, chassis->ChassisOp), chassis->Tag, OrNull(chassis->InternalTag),
           chassis->OperationalStatus);
}

int BuildChassis(RaidController_t* ctrl, const CMPIInstance* inst, const CMPIObjectPath* op) {
    return BuildRecord<Chassis_t>(kChassisBuilder, kEnclosures, [&](Chassis_t* chassis) -> int {
        if (!ReadChassis(chassis, ctrl, inst, op)) return RESULT_BAD_ARGUMENT;
        DumpChassis(chassis);
        return PublishRecord(kChassisBuilder, ctrl, kEnclosures, chassis);
    });
}

}  // namespace

int BuildPoolInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx, RaidController_t* ctrl) {
    syslog(LOG_DEBUG, "%s, ENTER...\n", __func__);
    const int rc = BuildAll(__func__, kPools, mi, ctx, ctrl);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", __func__, rc);
    return rc;
}

int BuildChassisInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx, RaidController_t* ctrl) {
    syslog(LOG_DEBUG, "%s, enter...\n", __func__);
    const int rc = BuildAll(__func__, kEnclosures, mi, ctx, ctrl);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", __func__, rc);
    return rc;
}

int BuildSinglePoolInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                        const CMPIInstance* poolInstance, const CMPIObjectPath* poolOp) {
    syslog(LOG_DEBUG, "%s, enter...\n", __func__);
    const int rc = BuildPool(ctrl, poolInstance, poolOp);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", __func__, rc);
    return rc;
}

int BuildSingleChassisInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                           const CMPIInstance* chassisInstance, const CMPIObjectPath* chassisOp) {
    syslog(LOG_DEBUG, "%s, enter...\n", __func__);
    const int rc = BuildChassis(ctrl, chassisInstance, chassisOp);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", __func__, rc);
    return rc;
}

int CheckAndUpdatePoolInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                           void* device, CMPIInstance*) {
    const auto* pool = static_cast<StoragePool_t*>(device);
    syslog(LOG_DEBUG, "%s: ENTER. pool - %s\n", __func__, pool->InstanceID);
    if (NeedUpdate(pool->LastUpdateTime, pool->UpdateEnabled)) {
        StampTime(ctrl, kPools);
    }
    syslog(LOG_DEBUG, "%s, exit.\n", __func__);
    return RESULT_OK;
}

int CheckAndUpdateChassisInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                              void* device, CMPIInstance*) {
    const auto* chassis = static_cast<Chassis_t*>(device);
    syslog(LOG_DEBUG, "%s, enter...\n", __func__);
    if (NeedUpdate(chassis->LastUpdateTime, chassis->UpdateEnabled)) {
        StampTime(ctrl, kEnclosures);
    }
    syslog(LOG_DEBUG, "%s, exit.\n", __func__);
    return RESULT_OK;
}
