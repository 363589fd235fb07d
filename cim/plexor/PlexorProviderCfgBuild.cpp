// The steps that every builder and updater takes the same way.
#include "PlexorProviderCfgBuild.h"

#include "PlexorProviderLock.h"

char* CloneDeviceID(const DeviceKind& kind, const CMPIInstance* inst, const CMPIObjectPath* op) {
    char* deviceId = StringClone(ReadString(inst, "DeviceID"));
    if (deviceId == nullptr) {
        syslog(LOG_ERR, "NULL DeviceID for %s %s\n", kind.noun, PathText(LOG_ERR, op));
    }
    return deviceId;
}

int AppendRecord(RaidController_t* ctrl, const DeviceKind& kind, void* record) {
    const int rc = AddEntryAtListTail(DevicesOf(ctrl, kind), record);
    if (rc == RESULT_OK) StoreShared(ctrl->*kind.updateTime, time(nullptr));
    return rc;
}

int PublishRecord(const char* builder, RaidController_t* ctrl, const DeviceKind& kind,
                  void* record) {
    MutexGuard lock(ctrl->CtrlMutex);
    const int rc = AppendRecord(ctrl, kind, record);
    lock.Unlock();
    if (rc == RESULT_OK) {
        syslog(LOG_DEBUG, "%s: %s %p added to the list\n", builder, kind.noun, record);
    } else {
        syslog(LOG_ERR, "%s: failed to add %s to list, rc %d.\n", builder, kind.noun, rc);
    }
    return rc;
}

void StampTime(RaidController_t* ctrl, const DeviceKind& kind) {
    MutexGuard lock(ctrl->CtrlMutex);
    StoreShared(ctrl->*kind.updateTime, time(nullptr));
}

int NeedUpdate(time_t, unsigned char) {
    return 1;
}
