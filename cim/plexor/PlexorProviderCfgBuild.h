// What the builders and updaters of all device kinds share. A builder makes a new record, reads its
// parts, dumps it to the log and publishes it.
#pragma once

#include <memory>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgKinds.h"

/// A record until it is published; one that is turned away is released as its kind is.
template <typename Record>
using RecordOwner = std::unique_ptr<Record, ReleaseFunc_t>;

/// A zero-filled record; null without memory, which is logged in the builder's name.
template <typename Record>
RecordOwner<Record> NewDevice(const char* builder, const DeviceKind& kind) {
    RecordOwner<Record> record(NewRecord<Record>(), kind.release);
    if (record == nullptr) {
        syslog(LOG_ERR, "%s, failed to allocate memory for %s\n", builder, kind.recordName);
    }
    return record;
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

template <typename Record>
int Publish(const char* builder, RaidController_t* ctrl, const DeviceKind& kind,
            RecordOwner<Record>& record) {
    // Given up before anything is logged: a thread may be cancelled there.
    Record* const published = record.release();
    const int rc = PublishRecord(builder, ctrl, kind, published);
    if (rc != RESULT_OK) record.reset(published);
    return rc;
}

/// Stamps the kind's update time. Takes CtrlMutex.
void StampTime(RaidController_t* ctrl, const DeviceKind& kind) PLEXOR_WITHOUT(ctrl->CtrlMutex);
