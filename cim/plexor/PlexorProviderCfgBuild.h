// What the builders and updaters of all device kinds share. A builder makes a new record, reads its
// parts, dumps it to the log and publishes it.
#pragma once

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgKinds.h"

/// A zero-filled record; null without memory, which is logged in the builder's name.
template <typename Record>
Record* NewDevice(const char* builder, const DeviceKind& kind) {
    auto* record = NewRecord<Record>();
    if (record == nullptr) {
        syslog(LOG_ERR, "%s, failed to allocate memory for %s\n", builder, kind.recordName);
    }
    return record;
}

/// Builds a device with `steps`, which take its record and give 0 once they have published it. One
/// that is turned away is released here as its kind is; not by a destructor, as that logs, and a
/// thread may be cancelled while it does. -2 without memory, else the steps' code.
template <typename Record, typename Steps>
int BuildRecord(const char* builder, const DeviceKind& kind, Steps steps) {
    auto* record = NewDevice<Record>(builder, kind);
    if (record == nullptr) return RESULT_NO_MEMORY;
    const int rc = steps(record);
    if (rc != RESULT_OK) kind.release(record);
    return rc;
}

/// The instance's DeviceID, the caller's; null without one, which is logged with the device's path.
char* CloneDeviceID(const DeviceKind& kind, const CMPIInstance* inst, const CMPIObjectPath* op);

/// Appends a record to its kind's list and stamps the kind's time when that worked. The list's
/// code. The caller holds CtrlMutex.
int AppendRecord(RaidController_t* ctrl, const DeviceKind& kind, void* record)
    PLEXOR_HOLDS(ctrl->CtrlMutex);

/// AppendRecord under CtrlMutex, and a line in the builder's name that says how it ended. The
/// list's code; the caller's record when it is not 0.
int PublishRecord(const char* builder, RaidController_t* ctrl, const DeviceKind& kind, void* record)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);

/// Stamps the kind's update time. Takes CtrlMutex.
void StampTime(RaidController_t* ctrl, const DeviceKind& kind) PLEXOR_WITHOUT(ctrl->CtrlMutex);
