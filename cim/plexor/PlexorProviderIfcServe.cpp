// The three served operations: one table of classes, one walk for each operation. Everything is
// answered from the cache; a refresh that a request causes shows in later answers.
#include <stdlib.h>

#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderIfc.h"
#include "PlexorProviderIfcTurns.h"
#include "PlexorProviderLock.h"
#include "PlexorProviderUtilIndex.h"
#include "PlexorProviderUtilManager.h"

namespace {

/// A class that clients can ask for: the devices of a kind, or the controllers themselves.
struct ServedClass {
    const char* name;
    const char* keyPrefix;
    const char* keyName;     ///< key that names the instance
    const DeviceKind* kind;  ///< null: the controllers
    void (*fillControllerPath)(CMPIObjectPath* cop, RaidController_t* ctrl);  ///< controllers only
    IdOf_t deviceId;                                                          ///< devices only
    void (*render)(CMPIInstance* inst, RaidController_t* ctrl, void* record);
};

// The table's view of the typed functions.

void RenderController(CMPIInstance* inst, RaidController_t* ctrl, void*) {
    FillControllerInstance(inst, ctrl);
}

void RenderSoftwareIdentity(CMPIInstance* inst, RaidController_t* ctrl, void*) {
    FillSoftwareIdentityInstance(inst, ctrl);
}

template <typename Record>
const char* DeviceIdOf(const void* record) {
    return static_cast<const Record*>(record)->DeviceID;
}

template <typename Record, void (*Fill)(CMPIInstance*, RaidController_t*, Record*)>
void RenderDevice(CMPIInstance* inst, RaidController_t* ctrl, void* record)
    PLEXOR_HOLDS(ctrl->CtrlMutex) {
    Fill(inst, ctrl, static_cast<Record*>(record));
}

// In the order in which a request's class is tested.
constexpr ServedClass kServedClasses[] = {
    {.name = kControllerClass,
     .keyPrefix = kControllerPrefix,
     .keyName = kControllerKey,
     .kind = nullptr,
     .fillControllerPath = FillControllerObjectPath,
     .deviceId = nullptr,
     .render = RenderController},
    {.name = kSoftwareClass,
     .keyPrefix = kSoftwarePrefix,
     .keyName = kSoftwareKey,
     .kind = nullptr,
     .fillControllerPath = FillSoftwareIdentityObjectPath,
     .deviceId = nullptr,
     .render = RenderSoftwareIdentity},
    {.name = "Tovexa_PlexorStorageVolume",
     .keyPrefix = "tvxStorageVolume",
     .keyName = kDeviceKey,
     .kind = &kVolumes,
     .fillControllerPath = nullptr,
     .deviceId = DeviceIdOf<StorageVolume_t>,
     .render = RenderDevice<StorageVolume_t, FillVolumeInstance>},
    {.name = "Tovexa_PlexorStorageExtent",
     .keyPrefix = "tvxStorageExt",
     .keyName = kDeviceKey,
     .kind = &kDrives,
     .fillControllerPath = nullptr,
     .deviceId = DeviceIdOf<DiskDrive_t>,
     .render = RenderDevice<DiskDrive_t, FillExtentInstance>},
    {.name = "Tovexa_PlexorSASSATAPort",
     .keyPrefix = "tvxPort",
     .keyName = kDeviceKey,
     .kind = &kPorts,
     .fillControllerPath = nullptr,
     .deviceId = DeviceIdOf<SASSATAPort_t>,
     .render = RenderDevice<SASSATAPort_t, FillPortInstance>},
    {.name = "Tovexa_PlexorBattery",
     .keyPrefix = "tvxControllerBattery",
     .keyName = kDeviceKey,
     .kind = &kBatteries,
     .fillControllerPath = nullptr,
     .deviceId = DeviceIdOf<Battery_t>,
     .render = RenderDevice<Battery_t, FillBatteryInstance>},
};

KeyCopying __KeyCopying[sizeof kServedClasses / sizeof kServedClasses[0]];

/// A client's request while it is served.
struct Request {
    const char* caller;
    CMPIInstanceMI* mi;
    const CMPIContext* ctx;
    const CMPIResult* result;
    const CMPIObjectPath* path;
    const char** properties;  ///< null: all
    bool namesOnly;
    const CMPIString* className;  ///< the client's spelling
    const char* nameSpace;
    const ServedClass* served;  ///< null: a class that is not ours
};

/// What a get asks for; null identifiers match everything.
struct Wanted {
    char* controllerId = nullptr;
    char* deviceId = nullptr;

    Wanted() = default;
    Wanted(const Wanted&) = delete;
    Wanted& operator=(const Wanted&) = delete;
    ~Wanted() {
        free(controllerId);
        free(deviceId);
    }
};

/// The opening that the three operations share.
void Open(Request& request) {
    syslog(LOG_DEBUG, "%s: ObjectPath - %s\n", request.caller, PathText(LOG_DEBUG, request.path));
    ResetNextUnloadTime();
    if (request.path != nullptr) {
        request.className = request.path->ft->getClassName(request.path, nullptr);
        request.nameSpace = StringText(request.path->ft->getNameSpace(request.path, nullptr));
    }
    for (const ServedClass& served : kServedClasses) {
        if (CMStringCmp(request.className, served.name) != 0) continue;
        request.served = &served;
        syslog(LOG_DEBUG, "%s: %s\n", request.caller, served.name);
        return;
    }
    syslog(LOG_DEBUG, "%s: unsupported class %s\n", request.caller,
           OrNull(StringText(request.className)));
}

/// A path of the served class with all its keys; null when the broker gives none.
CMPIObjectPath* MakePath(const Request& request, RaidController_t* ctrl, const void* record) {
    const ServedClass& served = *request.served;
    const CMPIBroker* broker = CurrentBroker();
    CMPIObjectPath* path =
        broker->eft->newObjectPath(broker, request.nameSpace, served.name, nullptr);
    if (path == nullptr) return nullptr;
    if (served.kind == nullptr) {
        served.fillControllerPath(path, ctrl);
        return path;
    }
    char* id = MakeLogicalDeviceID(ctrl->DeviceID, served.deviceId(record), served.keyPrefix);
    FillLogicalDeviceObjectPath(path, id, served.name);
    free(id);
    return path;
}

/// Returns one record to the client, as a path or as an instance.
void ReturnRecord(const Request& request, RaidController_t* ctrl, void* record) {
    CMPIObjectPath* path = MakePath(request, ctrl, record);
    if (path == nullptr) return;
    if (request.namesOnly) {
        request.result->ft->returnObjectPath(request.result, path);
        return;
    }
    const CMPIBroker* broker = CurrentBroker();
    CMPIInstance* inst = broker->eft->newInstance(broker, path, nullptr);
    if (inst == nullptr) return;
    CompleteKeys(inst, path, __KeyCopying[request.served - kServedClasses]);
    if (request.properties != nullptr) {
        inst->ft->setPropertyFilter(inst, request.properties, nullptr);
    }
    request.served->render(inst, ctrl, record);
    request.result->ft->returnInstance(request.result, inst);
}

/// Returns the wanted devices of one controller, then asks for their refresh. How many there were.
int ReturnDevices(const Request& request, RaidController_t* ctrl, const Wanted& wanted) {
    const DeviceKind& kind = *request.served->kind;
    int found = 0;
    MutexGuard lock(ctrl->CtrlMutex);
    EntriesWithId entries(DevicesOf(ctrl, kind), wanted.deviceId, request.served->deviceId);
    while (const List_Entry_t* entry = entries.Next()) {
        ReturnRecord(request, ctrl, entry->Data);
        found++;
    }
    lock.Unlock();
    HandleDeviceConfigChange(request.mi, request.ctx, ctrl, kind.action.ConfigAction);
    return found;
}

/// Walks every controller, never stopping early: duplicates are all returned. How many records
/// were.
int ReturnWanted(const Request& request, const Wanted& wanted) {
    int found = 0;
    const List_Entry_t* entry = RequestInFlight::FirstController();
    for (; entry != nullptr; entry = entry->Next) {
        auto* ctrl = static_cast<RaidController_t*>(entry->Data);
        if (!SameId(wanted.controllerId, ctrl->DeviceID)) continue;
        if (request.served->kind != nullptr) {
            found += ReturnDevices(request, ctrl, wanted);
        } else {
            ReturnRecord(request, ctrl, nullptr);
            found++;
        }
    }
    return found;
}

/// Splits the key of a get. The key functions' codes.
int ParseKey(const Request& request, Wanted& wanted) {
    const ServedClass& served = *request.served;
    if (served.kind != nullptr) {
        return RetrieveControllerAndDeviceIDs(request.path, served.keyPrefix, &wanted.controllerId,
                                              &wanted.deviceId);
    }
    return RetrieveDeviceID(request.path, served.keyName, served.keyPrefix, &wanted.controllerId);
}

CMPIStatus Enumerate(Request& request) {
    const RequestInFlight inFlight;
    Open(request);
    if (request.served != nullptr) ReturnWanted(request, Wanted());
    syslog(LOG_DEBUG, "%s: exiting\n", request.caller);
    request.result->ft->returnDone(request.result);
    return {CMPI_RC_OK, nullptr};
}

CMPIStatus Get(Request& request) {
    const RequestInFlight inFlight;
    Open(request);
    if (request.served == nullptr) return {CMPI_RC_ERR_INVALID_CLASS, nullptr};
    Wanted wanted;
    if (ParseKey(request, wanted) != RESULT_OK) {
        syslog(LOG_ERR, "Object path %s invalid\n", PathText(LOG_ERR, request.path));
        syslog(LOG_DEBUG, "%s: exiting\n", request.caller);
        return {CMPI_RC_ERR_NOT_FOUND, nullptr};
    }
    const int found = ReturnWanted(request, wanted);
    syslog(LOG_DEBUG, "%s: exiting\n", request.caller);
    if (found == 0) return {CMPI_RC_ERR_NOT_FOUND, nullptr};
    request.result->ft->returnDone(request.result);
    return {CMPI_RC_OK, nullptr};
}

}  // namespace

CMPIStatus PlexorProviderEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                           const CMPIResult* rslt, const CMPIObjectPath* cop) {
    Request request = {__func__, mi, ctx, rslt, cop, nullptr, true, nullptr, nullptr, nullptr};
    return Enumerate(request);
}

CMPIStatus PlexorProviderEnumInstances(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                       const CMPIResult* rslt, const CMPIObjectPath* cop,
                                       const char** properties) {
    Request request = {__func__, mi, ctx, rslt, cop, properties, false, nullptr, nullptr, nullptr};
    return Enumerate(request);
}

CMPIStatus PlexorProviderGetInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                     const CMPIResult* rslt, const CMPIObjectPath* cop,
                                     const char** properties) {
    Request request = {__func__, mi, ctx, rslt, cop, properties, false, nullptr, nullptr, nullptr};
    return Get(request);
}
