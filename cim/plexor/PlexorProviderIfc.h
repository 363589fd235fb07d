// What the interface's files share: keys and paths, rendering.
#pragma once

#include "PlexorProviderUtil.h"

/// Whether an initialisation has been started and did not fail.
bool IsInitialized();

// Class names, and what the keys of their instances are made of.
constexpr char kControllerClass[] = "Tovexa_PlexorController";
constexpr char kControllerKey[] = "Name";
constexpr char kControllerPrefix[] = "tvxController";
constexpr char kSoftwareClass[] = "Tovexa_PlexorSoftwareIdentity";
constexpr char kSoftwareKey[] = "InstanceID";
constexpr char kSoftwarePrefix[] = "tovexa:ControllerSoftware";
constexpr char kDeviceKey[] = "DeviceID";  // of all device classes

// Keys. The caller frees the strings; null after a failed copy (logged) or, for the retrieval
// functions, a negative code with nothing stored.

/// prefix + ID, cut to 255 characters.
char* MakeDeviceID(const char* ID, const char* prefix);
/// prefix + ctrlID + "_" + devID, cut to 255 characters.
char* MakeLogicalDeviceID(const char* ctrlID, const char* devID, const char* prefix);

void FillControllerObjectPath(CMPIObjectPath* cop, RaidController_t* ctrl);
void FillSoftwareIdentityObjectPath(CMPIObjectPath* cop, RaidController_t* ctrl);
void FillLogicalDeviceObjectPath(CMPIObjectPath* cop, const char* deviceID,
                                 const char* creationClassName);

/// Splits a client's key: 0, -2 (no memory), -3 (absent, another prefix, malformed).
int RetrieveDeviceID(const CMPIObjectPath* cop, const char* keyProperty, const char* prefix,
                     char** deviceID);
int RetrieveControllerAndDeviceIDs(const CMPIObjectPath* cop, const char* prefix, char** ctrlID,
                                   char** deviceID);

// Rendering: sets the non-key properties of an instance from a record. The caller holds CtrlMutex
// for the device classes.
void FillControllerInstance(CMPIInstance* inst, RaidController_t* ctrl);
void FillSoftwareIdentityInstance(CMPIInstance* inst, RaidController_t* ctrl);
void FillVolumeInstance(CMPIInstance* inst, RaidController_t* ctrl, StorageVolume_t* volume)
    PLEXOR_HOLDS(ctrl->CtrlMutex);
void FillExtentInstance(CMPIInstance* inst, RaidController_t* ctrl, DiskDrive_t* extent)
    PLEXOR_HOLDS(ctrl->CtrlMutex);
void FillPortInstance(CMPIInstance* inst, RaidController_t* ctrl, SASSATAPort_t* port)
    PLEXOR_HOLDS(ctrl->CtrlMutex);
void FillBatteryInstance(CMPIInstance* inst, RaidController_t* ctrl, Battery_t* battery)
    PLEXOR_HOLDS(ctrl->CtrlMutex);

/// HealthState of a port or battery.
CMPIUint16 GetHealthStateByOpStatus(CMPIUint16 opStatus);
/// The drive's condition in one word of the provider's own, and its HealthState.
const char* GetDiskPhysicalStatus(const RaidController_t* ctrl, const DiskDrive_t* disk,
                                  CMPIUint16* health) PLEXOR_HOLDS(ctrl->CtrlMutex);
