// The kinds of devices: what the units need to know of each, in one place.
#pragma once

#include "PlexorProvider.h"

/// One kind of device. The members of RaidController_t that belong to it are named, so that what is
/// done for every kind is a loop over kDeviceKinds.
struct DeviceKind {
    const char* noun;        ///< as log lines name a device
    const char* recordName;  ///< as log lines name its record
    ConfigAction_t action;   ///< how it is found, matched, built, updated and deleted
    int deviceCode;          ///< class code of its work items, 1 to 4; 0: a worker builds it inline
    pthread_mutex_t RaidController_t::*classMutex;
    time_t RaidController_t::*updateTime;
    List_t* RaidController_t::*list;
    List_t RaidController_t::*embeddedList;  ///< what `list` points at
    ReleaseFunc_t release;
};

extern const DeviceKind kVolumes;
extern const DeviceKind kDrives;
extern const DeviceKind kPools;
extern const DeviceKind kPorts;
extern const DeviceKind kBatteries;
extern const DeviceKind kEnclosures;

/// All kinds, in the order in which a controller's locks end.
constexpr const DeviceKind* kDeviceKinds[] = {&kDrives,    &kVolumes, &kPorts,
                                              &kBatteries, &kPools,   &kEnclosures};

/// How many kinds have a code. A device's class is tested in the order of the codes: that decides
/// for a class that is several of these.
constexpr int kDeviceCodes = 4;

/// The controller's devices of a kind, for those who hold CtrlMutex.
List_t* DevicesOf(const RaidController_t* ctrl, const DeviceKind& kind)
    PLEXOR_HOLDS(ctrl->CtrlMutex);

/// The kind with that action code; null for every other number.
const DeviceKind* FindKindByAction(int action);
/// The kind with that device code, 1 to kDeviceCodes; null for every other number.
const DeviceKind* FindKindByCode(int deviceCode);
