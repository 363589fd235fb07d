// Building the controllers behind the profiles, and their (empty) update.
#include <stdlib.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderLock.h"

namespace {

constexpr const char kBuilder[] = "BuildControllerInfo";

/// CIM_SoftwareIdentity.Classifications, as far as it names a field of the record.
char** VersionField(RaidController_t* ctrl, CMPIUint16 classification) {
    switch (classification) {
        case 10:
            return &ctrl->FirmwareVersion;
        case 11:
            return &ctrl->BiosVersion;
        case 2:
            return &ctrl->DriverVersion;
        case 0:
        case 13:
            return &ctrl->BundleVersion;
        default:
            return nullptr;
    }
}

void InitLocksAndLists(RaidController_t* ctrl) {
    pthread_mutex_init(&ctrl->CtrlMutex, nullptr);
    for (const DeviceKind* kind : kDeviceKinds) {
        pthread_mutex_init(&(ctrl->*kind->classMutex), nullptr);
        ctrl->*kind->list = &(ctrl->*kind->embeddedList);
    }
}

/// The port controller itself. False without DeviceID.
bool ReadPortController(RaidController_t* ctrl, const CMPIInstance* inst) {
    ctrl->PortControllerOp = ClonePath(InstancePath(inst));
    ctrl->DeviceID = StringClone(ReadString(inst, "DeviceID"));
    if (ctrl->DeviceID != nullptr) return true;
    syslog(LOG_ERR, "NULL DeviceID for PortController: %s\n",
           PathText(LOG_ERR, ctrl->PortControllerOp));
    return false;
}

/// The computer system that stands for the controller. False without one.
bool ReadComputerSystem(RaidController_t* ctrl, const CMPIContext* ctx) {
    const Query_t query = {kBuilder, ctx, ctrl->PortControllerOp, "CIM_LogicalIdentity",
                           "CIM_ComputerSystem"};
    LogAssociators(query);
    syslog(LOG_DEBUG, "PortController: %s\n", PathText(LOG_DEBUG, ctrl->PortControllerOp));
    const CMPIInstance* system = NextInstance(RunAssociators(query));
    if (system == nullptr) return false;
    ctrl->ControllerOp = ClonePath(InstancePath(system));
    ctrl->OperationalStatus = GetOperationalStatus(system);
    return true;
}

void ReadPackage(RaidController_t* ctrl, const CMPIContext* ctx) {
    const CMPIInstance* package = NextInstance(QueryAssociators(
        {kBuilder, ctx, ctrl->PortControllerOp, "CIM_Realizes", "CIM_PhysicalPackage"}));
    if (package == nullptr) return;
    ctrl->Model = StringClone(ReadString(package, "Model"));
    ctrl->HealthState = ReadUint16(package, "HealthState");
}

void ReadSoftware(RaidController_t* ctrl, const CMPIContext* ctx) {
    CMPIEnumeration* identities = QueryAssociators(
        {kBuilder, ctx, ctrl->ControllerOp, "CIM_ElementSoftwareIdentity", "CIM_SoftwareIdentity"});
    while (const CMPIInstance* identity = NextInstance(identities)) {
        if (StopRequested()) return;
        const CMPIUint16 classification = ReadArrayUint16(identity, "Classifications");
        char* version = StringClone(ReadString(identity, "VersionString"));
        syslog(LOG_DEBUG, "%s: ctrl %s, swClass %d, versionStr %s\n", kBuilder, ctrl->DeviceID,
               classification, OrNull(version));
        char** field = VersionField(ctrl, classification);
        if (field == nullptr) {
            free(version);
            continue;
        }
        free(*field);
        *field = version;
    }
}

void DumpController(const RaidController_t* ctrl) {
    syslog(LOG_INFO,
           "\nPortControllerOp: %s\nControllerOp:     %s\n\tDeviceID          - %s\n"
           "\tModel             - %s\n\tFirmwareVersion   - %s\n\tBiosVersion       - %s\n"
           "\tDriverVersion     - %s\n\tBundleVersion     - %s\n\tHealthState       - %d\n"
           "\tOperationalStatus - %d\n",
           PathText(LOG_INFO, ctrl->PortControllerOp), PathText(LOG_INFO, ctrl->ControllerOp),
           ctrl->DeviceID, ctrl->Model, ctrl->FirmwareVersion, ctrl->BiosVersion,
           ctrl->DriverVersion, ctrl->BundleVersion, ctrl->HealthState, ctrl->OperationalStatus);
}

/// Appends the controller. 0, the list's code, or -100 after a stop, silently: the list is not this
/// thread's any more.
int PublishController(RaidController_t* ctrl) {
    int rc = RESULT_NOTHING;
    {
        const LifeGuard life;
        if (life.Stands()) rc = AddEntryAtListTail(RaidControllerList, ctrl);
    }
    if (rc == RESULT_OK) {
        syslog(LOG_DEBUG, "%s: controller %p added to the list\n", kBuilder,
               static_cast<void*>(ctrl));
    } else if (rc != RESULT_NOTHING) {
        syslog(LOG_ERR, "%s: failed to add controller to list, rc %d.\n", kBuilder, rc);
    }
    return rc;
}

/// Whether the port controller is one that can be shown.
bool ReadParts(RaidController_t* ctrl, const CMPIContext* ctx, const CMPIInstance* inst) {
    if (!ReadPortController(ctrl, inst) || !ReadComputerSystem(ctrl, ctx)) return false;
    ReadPackage(ctrl, ctx);
    ReadSoftware(ctrl, ctx);
    StoreShared(ctrl->ControllerUpdateTime, time(nullptr));
    return true;
}

/// Builds and appends one controller. Not 0 only when memory is short; an unusable port controller
/// is skipped with 0.
int BuildController(const CMPIContext* ctx, const CMPIInstance* inst) {
    auto* ctrl = NewRecord<RaidController_t>();
    if (ctrl == nullptr) {
        syslog(LOG_ERR, "%s, failed to allocate memory for RaidController_t\n", kBuilder);
        return RESULT_NO_MEMORY;
    }
    InitLocksAndLists(ctrl);
    int rc = RESULT_NOTHING;
    if (ReadParts(ctrl, ctx, inst)) {
        DumpController(ctrl);
        rc = PublishController(ctrl);
    }
    if (rc != RESULT_OK) FreeController(ctrl);
    return rc == RESULT_NOTHING ? RESULT_OK : rc;
}

int BuildControllersOfProfile(const CMPIContext* ctx, const CMPIInstance* profile) {
    const CMPIObjectPath* path = InstancePath(profile);
    if (path == nullptr) return RESULT_OK;
    CMPIEnumeration* found = QueryAssociators(
        {kBuilder, ctx, path, "CIM_ElementConformsToProfile", "CIM_PortController"});
    while (!StopRequested()) {
        const CMPIInstance* inst = NextInstance(found);
        if (inst == nullptr) break;
        const int rc = BuildController(ctx, inst);
        if (rc != RESULT_OK) return rc;
    }
    return RESULT_OK;
}

}  // namespace

int BuildControllerInfo(const CMPIInstanceMI*, const CMPIContext* ctx, Array_t* profiles) {
    syslog(LOG_DEBUG, "%s, enter...\n", __func__);
    int rc = RESULT_OK;
    for (unsigned int i = 0; i < profiles->Count && rc == RESULT_OK; i++) {
        rc = BuildControllersOfProfile(ctx, static_cast<CMPIInstance*>(profiles->Array[i]));
    }
    // Short of memory, half an inventory would pass for the whole: have none.
    if (rc != RESULT_OK && !StopRequested()) FreeList(RaidControllerList, FreeController);
    syslog(LOG_DEBUG, "%s, EXIT(%d).\n", __func__, rc);
    return rc;
}

int CheckAndUpdateControllerInfo(const CMPIInstanceMI*, const CMPIContext*, RaidController_t* ctrl,
                                 void*, CMPIInstance*) {
    syslog(LOG_DEBUG, "%s, enter...\n", __func__);
    if (NeedUpdate(LoadShared(ctrl->ControllerUpdateTime), ctrl->UpdateEnabled)) {
        MutexGuard lock(ctrl->CtrlMutex);
        StoreShared(ctrl->ControllerUpdateTime, time(nullptr));
    }
    syslog(LOG_DEBUG, "%s, exit.\n", __func__);
    return RESULT_OK;
}
