// The provider's shared header: records, enumerations, lists, work items and the functions that its
// units (Ifc, Cfg, Util) call in each other. Dependencies point one way, Ifc -> Cfg -> Util; the
// only references back are `Broker` and `InitCompleteTime`.
//
// Everything declared here with C linkage is exported under its plain name, and relied on outside;
// functions that nothing in here calls say so. Strings and object paths in records are owned by the
// record; what the broker returned belongs to the broker.
//
// Which lock guards a controller's devices stands at RaidController_t, the lock order in
// PlexorProviderLock.h.
#pragma once

#include <pthread.h>
#include <stdint.h>
#include <string.h>
#include <syslog.h>
#include <time.h>

#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

#include "PlexorProviderThreadSafety.h"

#define PLEXOR_API extern "C" __attribute__((visibility("default")))

/// Codes that the provider's own functions return.
enum ResultCode : int {
    RESULT_OK = 0,
    RESULT_BAD_ARGUMENT = -1,  ///< null argument or rejected input
    RESULT_NO_MEMORY = -2,     ///< an allocation failed
    RESULT_NOT_FOUND = -3,     ///< not in the list, or malformed input
    RESULT_ARRAY_FULL = -5,
    RESULT_FIFO_FULL = -6,
    RESULT_NOTHING = -100,  ///< the broker has nothing to offer
};

/// CIM OperationalStatus.
enum OpStatus {
    OPSTATUS_UNKNOWN = 0,
    OPSTATUS_OTHER = 1,
    OPSTATUS_OK = 2,
    OPSTATUS_DEGRADED = 3,
    OPSTATUS_STRESSED = 4,
    OPSTATUS_PREDICTIVE_FAILURE = 5,
    OPSTATUS_ERROR = 6,
    OPSTATUS_NON_RECOVERABLE = 7,
    OPSTATUS_STARTING = 8,
    OPSTATUS_STOPPING = 9,
    OPSTATUS_STOPPED = 10,
    OPSTATUS_IN_SERVICE = 11,
    OPSTATUS_NO_CONTACT = 12,
    OPSTATUS_LOST_COM = 13,
    OPSTATUS_ABORTED = 14,
    OPSTATUS_DORMANT = 15,
    OPSTATUS_SUP_ENT_ERR = 16,
    OPSTATUS_COMPLETED = 17,
    OPSTATUS_POWER_MODE = 18,
};

/// CIM HealthState.
enum HealthState {
    HEALTHSTATE_UNKNOWN = 0,
    HEALTHSTATE_OK = 5,
    HEALTHSTATE_WARNING = 10,
    HEALTHSTATE_MINOR = 15,
    HEALTHSTATE_MAJOR = 20,
    HEALTHSTATE_CRIT = 25,
    HEALTHSTATE_FAILED = 30,
};

// ---------------------------------------------------------------------------------------------
// Lists, FIFO, work items

/// One node of a list. `Data` is the caller's; the list never owns or copies it.
struct List_Entry_t {
    List_Entry_t* Next;
    void* Data;
};

/// A singly linked list; zero-filled it is a valid empty one. A list whose Head is null is empty,
/// whatever Tail says. Unsynchronised: the caller holds the lock that guards the list.
struct List_t {
    List_Entry_t* Head;
    List_Entry_t* Tail;
    unsigned int Size;
};

/// A bounded queue.
struct Fifo_t {
    pthread_mutex_t Mutex;
    unsigned int Size;  ///< length limit, constant
    List_t List PLEXOR_GUARDED_BY(Mutex);
};

typedef void (*WorkFunc_t)(CMPIContext* ctx, void* args);

/// A work item, allocated zero-filled by whoever queues it and freed by its work function. As the
/// start-up record of a worker: Arg0 is the index, Arg1 the prepared context.
struct Thread_Args_t {
    WorkFunc_t Func;
    uintptr_t Arg0, Arg1, Arg2, Arg3, Arg4, Arg5;
};

/// A small fixed array: the profiles found at start-up. The instances in it are the broker's.
struct Array_t {
    unsigned int Count;
    void* Array[8];
};

// ---------------------------------------------------------------------------------------------
// Records. Every device record has its object path as first field. Fields are constant once the
// record is in its list, but for those that are said to be changing: see RaidController_t.

struct StorageVolume_t {
    CMPIObjectPath* VolumeOp;
    char* DeviceID;
    char* RaidLevel;
    char* ElementName;  ///< changing
    char* Name;
    CMPIUint16 NameFormat;
    CMPIUint16 NameNameSpace;
    CMPIUint16 ExtentStripeLength;
    CMPIUint16 ExtentStatus;       ///< changing
    CMPIUint16 OperationalStatus;  ///< changing
    CMPIUint64 NumberOfBlocks;     ///< changing
    CMPIUint64 ConsumableBlocks;   ///< changing
    CMPIUint16 DataRedundancy;
    CMPIUint16 PackageRedundancy;
    CMPIBoolean IsBasedOnUnderlyingRedundancy;
    CMPIUint8 DeltaReservation;
    CMPIBoolean Primordial;
    time_t LastUpdateTime;
    unsigned char UpdateEnabled;
    char* FromPool;  ///< InstanceID of the pool the volume is allocated from
};

struct DiskDrive_t {
    CMPIObjectPath* DiskOp;
    CMPIObjectPath* ExtentOp;
    char* DeviceID;
    char* Name;
    char* FwVersion;
    char* Model;  ///< never filled, never released
    CMPIUint16 EnabledState;
    CMPIUint16 OperationalStatus;  ///< changing
    CMPIUint16 ExtentStatus;       ///< changing
    CMPIUint64 NumberOfBlocks;
    CMPIUint64 ConsumableBlocks;
    CMPIBoolean Primordial;
    time_t LastUpdateTime;
    unsigned char UpdateEnabled;
    CMPIUint16 SlotNumber;
    char* Chassis;  ///< Tag of the enclosing chassis
    char* Pool;     ///< InstanceID of the drive's pool; changing
};

struct StoragePool_t {
    CMPIObjectPath* PoolOp;
    char* InstanceID;
    char* PoolID;
    CMPIBoolean Primordial;
    CMPIUint16 OperationalStatus;
    CMPIUint64 TotalManagedSpace;
    CMPIUint64 RemainingManagedSpace;
    time_t LastUpdateTime;
    unsigned char UpdateEnabled;
    List_t* Drives;  ///< points at _Drives
    List_t _Drives;  ///< owned copies of member drives' DeviceIDs; changing
};

struct Battery_t {
    CMPIObjectPath* BatteryOp;
    time_t LastUpdateTime;
    unsigned char UpdateEnabled;
    char* DeviceID;
    CMPIUint16 BatteryStatus;      ///< changing
    CMPIUint16 OperationalStatus;  ///< changing
};

struct SASSATAPort_t {
    CMPIObjectPath* PortOp;
    time_t LastUpdateTime;
    unsigned char UpdateEnabled;
    char* DeviceID;
    char* PortName;
    CMPIUint16 PortType;
    CMPIUint16 OperationalStatus;
    CMPIUint16 UsageRestriction;
};

struct Chassis_t {
    CMPIObjectPath* ChassisOp;
    char* Tag;
    char* InternalTag;  ///< Tag without the controller's prefix; may be null
    CMPIUint16 OperationalStatus;
    time_t LastUpdateTime;
    unsigned char UpdateEnabled;
};

/// One RAID controller. Strings, paths and scalars are constant once the record is in
/// RaidControllerList. The update times are read and written as relaxed atomics (LoadShared,
/// StoreShared); those who stamp them after a build or update hold CtrlMutex.
///
/// The lists of its devices and the records' changing fields have two locks, the *CfgMutex of the
/// device class and CtrlMutex. Who changes them holds both, who reads them holds either: a refresh
/// reads what only it could change with its class's mutex alone, a request holds CtrlMutex. The
/// drives of a pool change with the drives' class: with DiskCfgMutex and CtrlMutex.
struct RaidController_t {
    pthread_mutex_t CtrlMutex;  ///< guards membership and changing fields of all device lists
    CMPIObjectPath* PortControllerOp;
    CMPIObjectPath* ControllerOp;  ///< source of every device walk
    char* DeviceID;
    char* Model;
    char* FirmwareVersion;
    char* BiosVersion;
    char* DriverVersion;
    char* BundleVersion;
    CMPIUint16 HealthState;
    CMPIUint16 OperationalStatus;
    time_t ControllerUpdateTime;
    time_t ChassisUpdateTime;
    time_t PoolUpdateTime;
    time_t VolumeUpdateTime;
    time_t DiskUpdateTime;
    time_t PortUpdateTime;
    time_t BatteryUpdateTime;
    unsigned char UpdateEnabled;
    // Each serialises the builds and refreshes of one device class.
    pthread_mutex_t DiskCfgMutex;
    pthread_mutex_t VolumeCfgMutex;
    pthread_mutex_t PortCfgMutex;
    pthread_mutex_t BatteryCfgMutex;
    pthread_mutex_t PoolCfgMutex;
    pthread_mutex_t ChassisCfgMutex;
    // Each points at the embedded list below.
    List_t* VolumeList;
    List_t* ExtentList;  ///< stays null: drive extents live in the drive records
    List_t* DiskList;
    List_t* PoolList;
    List_t* BatteryList;
    List_t* PortList;
    List_t* ChassisList;
    List_t __VolumeList;
    List_t __ExtentList;  ///< never filled
    List_t __DiskList;
    List_t __PoolList;
    List_t __BatteryList;
    List_t __PortList;
    List_t __ChassisList;
};

// ---------------------------------------------------------------------------------------------
// Reconciliation

typedef CMPIObjectPath* (*GetOpFunc_t)(const void* device);
typedef int (*BuildFunc_t)(const CMPIInstanceMI* mi, const CMPIContext* ctx, RaidController_t* ctrl,
                           const CMPIInstance* devInst, const CMPIObjectPath* devOp);
typedef int (*UpdateFunc_t)(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                            RaidController_t* ctrl, void* device, CMPIInstance* devInst);
typedef int (*DeleteFunc_t)(RaidController_t* ctrl, void* device);
typedef void (*ReleaseFunc_t)(void* item);

/// One row of the action table.
struct ConfigAction_t {
    int ConfigAction;     ///< action code
    int PreConfigAction;  ///< action to reconcile before this one, or 0
    const char* AssociationClassName;
    const char* AssociatedClassName;
    const char* KeyName;  ///< key property that identifies a device
    GetOpFunc_t GetOpFunc;
    BuildFunc_t BuildFunc;
    UpdateFunc_t UpdateFunc;
    DeleteFunc_t DeleteFunc;
};

/// One cached device while a class is reconciled.
struct UpdateInfo_t {
    void* Device;
    int Flag;                ///< 1: still present, 0: gone
    CMPIInstance* Instance;  ///< fresh instance, the broker's; null when gone
};

/// One fresh association result; both fields null once it is matched. The broker's objects.
struct NewInfo_t {
    CMPIObjectPath* Op;
    CMPIInstance* Instance;
};

/// Action codes.
enum ActionCode : int {
    ACTION_NONE = 0,
    ACTION_DISK = 100,
    ACTION_VOLUME = 101,
    ACTION_PORT = 102,
    ACTION_BATTERY = 103,
    ACTION_POOL = 104,
    ACTION_CHASSIS = 105,
    ACTION_STOP = 106,  ///< stop mark of a dependency chain
};

// ---------------------------------------------------------------------------------------------
// Util: lists, host identity, settings

PLEXOR_API Fifo_t __FIFO;       ///< the one queue between requests and workers, limit 20
PLEXOR_API char* __SystemName;  ///< also the mark that the identity has been read
PLEXOR_API char* __HostName;
PLEXOR_API char* __SystemClassName;

/// strcasecmp of the string's text (a string without text counts as "") and `str2`.
PLEXOR_API int CMStringCmp(const CMPIString* str1, const char* str2);
/// Pushes in front. Null data: no-op, 0. Null list: -1. No memory: -2. Called from outside only.
PLEXOR_API int AddEntryAtListHead(List_t* list, void* data);
/// Appends; results as AddEntryAtListHead.
PLEXOR_API int AddEntryAtListTail(List_t* list, void* data);
/// Pops the front into `*data` (null when empty). Null list: -1, `*data` untouched.
PLEXOR_API int RemoveEntryFromList(List_t* list, void** data);
/// Unlinks the first entry whose Data is `data` (pointer identity), not releasing the item.
/// -1 null argument, -3 not in the list. Leaves Tail alone when it removes the first entry.
PLEXOR_API int RemoveEntryFromListByKey(List_t* list, void* data);
/// 1 when Size is 0. The list must not be null.
PLEXOR_API int IsListEmpty(List_t* list);
/// Queues at the tail; -6 when full. Never blocks for room.
PLEXOR_API int PutItem(Fifo_t* fifo, void* item);
/// Takes from the head; null when empty.
PLEXOR_API void* GetItem(Fifo_t* fifo);
PLEXOR_API int IsFifoEmpty(Fifo_t* fifo);
/// Drains a list, giving each item to `release`, or to free() when `release` is null.
PLEXOR_API void FreeList(List_t* list, ReleaseFunc_t release);

/// Reads the host's names once. 0, -2 (no object path), -100 (no host instance).
PLEXOR_API int InitSystemInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx);
PLEXOR_API void ReleaseSystemInfo();
/// The three names; null before initialisation or when the property was missing. Not the caller's.
PLEXOR_API const char* GetHostName();
PLEXOR_API const char* GetSystemName();
PLEXOR_API const char* GetSystemClassName();
/// Element 0 of an array property; a zero value when there is no array. Called from outside only.
PLEXOR_API CMPIValue GetArrayProperty(const CMPIInstance* inst, const char* property);
/// First element of OperationalStatus; 0 when there is no array.
PLEXOR_API CMPIUint16 GetOperationalStatus(const CMPIInstance* inst);
/// The polling interval from the host's option store, seconds, unchecked; 20 by default.
PLEXOR_API int GetSampelInterval();

// ---------------------------------------------------------------------------------------------
// Cfg: records

PLEXOR_API List_t* RaidControllerList;  ///< in discovery order; filled before the workers start

PLEXOR_API CMPIObjectPath* GetVolumeOp(const void* device);
PLEXOR_API CMPIObjectPath* GetDiskOp(const void* device);
PLEXOR_API CMPIObjectPath* GetPortOp(const void* device);
PLEXOR_API CMPIObjectPath* GetBatteryOp(const void* device);
PLEXOR_API CMPIObjectPath* GetPoolOp(const void* device);
PLEXOR_API CMPIObjectPath* GetChassisOp(const void* device);
PLEXOR_API CMPIObjectPath* GetControllerOp(const void* device);  ///< called from outside only

// Release functions; null is ignored. No locks: the record is in no list any more.
PLEXOR_API void FreeVolume(void* data);
PLEXOR_API void FreeDisk(void* data);
PLEXOR_API void FreePort(void* data);
PLEXOR_API void FreeBattery(void* data);
PLEXOR_API void FreeChassis(void* data);
PLEXOR_API void FreePool(void* data);
/// Releases the controller with all its devices. No thread may use it any more.
PLEXOR_API void FreeController(void* data);

// Unlink a record and release it; 0, -1 (null argument) or -3 (not in its list, record kept).
// They take CtrlMutex.
PLEXOR_API int DeleteVolume(RaidController_t* ctrl, void* device) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int DeleteDisk(RaidController_t* ctrl, void* device) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int DeletePort(RaidController_t* ctrl, void* device) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int DeleteBattery(RaidController_t* ctrl, void* device) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int DeleteChassis(RaidController_t* ctrl, void* device) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int DeletePool(RaidController_t* ctrl, void* device) PLEXOR_WITHOUT(ctrl->CtrlMutex);

// Pool membership and look-ups; the caller holds CtrlMutex.
PLEXOR_API void AddDiskToPool(StoragePool_t* pool, const char* disk);
PLEXOR_API void RemoveDiskFromPool(StoragePool_t* pool, const char* disk);
PLEXOR_API StoragePool_t* FindStoragePoolByID(const RaidController_t* ctrl, const char* instanceID)
    PLEXOR_HOLDS(ctrl->CtrlMutex);
PLEXOR_API DiskDrive_t* FindDiskByDeviceID(const RaidController_t* ctrl, const char* deviceID)
    PLEXOR_HOLDS(ctrl->CtrlMutex);
/// Searches, logs what it found, and always answers null.
PLEXOR_API Chassis_t* FindChassisByTag(const RaidController_t* ctrl, const char* tag)
    PLEXOR_HOLDS(ctrl->CtrlMutex);

// ---------------------------------------------------------------------------------------------
// Cfg: inventory

/// Collects the vendor's registrations of the RAID profile. Number found (0 to 8), -1 null
/// argument, -2 no object path, -5 more instances than slots.
PLEXOR_API int GetHHRCProfiles(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                               Array_t* profileArray);
/// Caches every usable controller behind the profiles. 0, or a negative code after which the list
/// is empty.
PLEXOR_API int BuildControllerInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                   Array_t* profiles);
/// Always 1: every record is refreshed on every pass.
PLEXOR_API int NeedUpdate(time_t lastUpdateTime, unsigned char updateEnabled);
/// Moves the controller's time stamp; reads nothing anew. Always 0. Called from outside only:
/// controllers are not refreshed.
PLEXOR_API int CheckAndUpdateControllerInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                            RaidController_t* ctrl, void* device,
                                            CMPIInstance* devInst) PLEXOR_WITHOUT(ctrl->CtrlMutex);

// The three walks of the initial inventory. The caller is a worker counted in ActiveThreads.
PLEXOR_API int BuildPoolInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                             RaidController_t* ctrl);
PLEXOR_API int BuildChassisInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                RaidController_t* ctrl);
/// Queues one work item for each device and waits until all of them are done. Always 0.
PLEXOR_API int BuildLogicalDeviceInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                      RaidController_t* ctrl);
/// Work function of those items.
PLEXOR_API void ProcessBuildLogicalDeviceInfo(CMPIContext* ctx, void* args);

// Builders: read a device from its instance and the objects around it and append a record to the
// controller's list. 0, -1 rejected, -2 no memory, or the list's code; without a record when not 0.
// The caller holds the class's *CfgMutex; they take CtrlMutex.
PLEXOR_API int BuildSinglePoolInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                   RaidController_t* ctrl, const CMPIInstance* poolInstance,
                                   const CMPIObjectPath* poolOp) PLEXOR_HOLDS(ctrl->PoolCfgMutex)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int BuildSingleChassisInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                      RaidController_t* ctrl, const CMPIInstance* chassisInstance,
                                      const CMPIObjectPath* chassisOp)
    PLEXOR_HOLDS(ctrl->ChassisCfgMutex) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int BuildDiskInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                             RaidController_t* ctrl, const CMPIInstance* devInst,
                             const CMPIObjectPath* devOp) PLEXOR_HOLDS(ctrl->DiskCfgMutex)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int BuildVolumeInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                               RaidController_t* ctrl, const CMPIInstance* devInst,
                               const CMPIObjectPath* devOp) PLEXOR_HOLDS(ctrl->VolumeCfgMutex)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int BuildPortInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                             RaidController_t* ctrl, const CMPIInstance* devInst,
                             const CMPIObjectPath* devOp) PLEXOR_HOLDS(ctrl->PortCfgMutex)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int BuildBatteryInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                RaidController_t* ctrl, const CMPIInstance* devInst,
                                const CMPIObjectPath* devOp) PLEXOR_HOLDS(ctrl->BatteryCfgMutex)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);

// Updaters: bring a cached record up to date. Always 0. Locks as for the builders.
PLEXOR_API int CheckAndUpdatePoolInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                      RaidController_t* ctrl, void* device, CMPIInstance* devInst)
    PLEXOR_HOLDS(ctrl->PoolCfgMutex) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int CheckAndUpdateChassisInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                         RaidController_t* ctrl, void* device,
                                         CMPIInstance* devInst) PLEXOR_HOLDS(ctrl->ChassisCfgMutex)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int CheckAndUpdateDiskInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                      RaidController_t* ctrl, void* device, CMPIInstance* devInst)
    PLEXOR_HOLDS(ctrl->DiskCfgMutex) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int CheckAndUpdateVolumeInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                        RaidController_t* ctrl, void* device, CMPIInstance* devInst)
    PLEXOR_HOLDS(ctrl->VolumeCfgMutex) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int CheckAndUpdatePortInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                      RaidController_t* ctrl, void* device, CMPIInstance* devInst)
    PLEXOR_HOLDS(ctrl->PortCfgMutex) PLEXOR_WITHOUT(ctrl->CtrlMutex);
PLEXOR_API int CheckAndUpdateBatteryInfo(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                         RaidController_t* ctrl, void* device,
                                         CMPIInstance* devInst) PLEXOR_HOLDS(ctrl->BatteryCfgMutex)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);

// ---------------------------------------------------------------------------------------------
// Cfg: refresh and workers

PLEXOR_API pthread_t PlexorThreads[2];
PLEXOR_API pthread_attr_t PlexorThreadAttr;
PLEXOR_API pthread_mutex_t PlexorThreadMutex;
PLEXOR_API pthread_cond_t PlexorThreadCond;
PLEXOR_API unsigned int ActiveThreads PLEXOR_GUARDED_BY(PlexorThreadMutex);
// These two are never reset.
PLEXOR_API unsigned int TerminateThread PLEXOR_GUARDED_BY(PlexorThreadMutex);
PLEXOR_API unsigned int ThreadActivityDone PLEXOR_GUARDED_BY(PlexorThreadMutex);
PLEXOR_API time_t StateUpdateInterval;  ///< seconds; relaxed atomic

/// Asks for a refresh of a device class if one is due. 0 skipped or queued, -6 queue full. On a
/// request's thread, without CtrlMutex.
PLEXOR_API int HandleDeviceConfigChange(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                        RaidController_t* ctrl, int action)
    PLEXOR_WITHOUT(ctrl->CtrlMutex);
/// Work function of a refresh.
PLEXOR_API void DoDeviceConfigChange(CMPIContext* ctx, void* args);
/// Reconciles a class, and before it those it depends on. Always 0.
PLEXOR_API int ProcessDeviceConfigChange(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                         RaidController_t* ctrl, int action);
/// Matches cached records with fresh results. 0, -100 or -2. The caller frees both arrays with
/// free(); their objects are the broker's and the cache's.
PLEXOR_API int CrossoutDuplicatedEntries(const List_t* list, const CMPIEnumeration* enums,
                                         GetOpFunc_t getOp, const char* keyname,
                                         UpdateInfo_t** dataPtrs, NewInfo_t** opPtrs,
                                         int* datacount, int* opcount);

/// Reads the interval and starts the two workers.
PLEXOR_API void InitPlexorThreads(const CMPIContext* ctx);
/// Queues the initial inventory. 0, -2 or -6.
PLEXOR_API int BuildDeviceInfoAsync(const CMPIInstanceMI* mi, const CMPIContext* ctx);
/// Work function of the initial inventory.
PLEXOR_API void DoBuildDeviceInfoAsync(CMPIContext* ctx, void* args);
/// A worker's body.
PLEXOR_API void* PlexorThread(void* args);
/// Asks the workers to stop, waits three seconds and takes leave of those that have ended.
PLEXOR_API void CleanupPlexorThreads();

// ---------------------------------------------------------------------------------------------
// Ifc: entry and unload

PLEXOR_API const CMPIBroker* Broker;  ///< stored by every factory call; relaxed atomic
PLEXOR_API int _ProviderInitialized;
PLEXOR_API unsigned int IdleTimeBeforeTerminating;  ///< minutes
PLEXOR_API time_t NextUnloadTime;
PLEXOR_API volatile int waitDebug;  ///< cleared by an attached debugger
PLEXOR_API time_t InitCompleteTime;
PLEXOR_API CMPIInstanceMIFT instMIFT__;

/// The CMPI entry point. Never writes `*rc`; always returns the same instance interface.
PLEXOR_API CMPIInstanceMI* PlexorProvider_Create_InstanceMI(const CMPIBroker* brkr,
                                                            const CMPIContext* ctx, CMPIStatus* rc);
PLEXOR_API CMPIStatus PlexorProviderCleanup(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                            CMPIBoolean terminating);
/// Moves the time before which the provider refuses to unload.
PLEXOR_API void ResetNextUnloadTime();

// The served operations.
PLEXOR_API CMPIStatus PlexorProviderEnumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                                      const CMPIResult* rslt,
                                                      const CMPIObjectPath* cop);
PLEXOR_API CMPIStatus PlexorProviderEnumInstances(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                                  const CMPIResult* rslt, const CMPIObjectPath* cop,
                                                  const char** properties);
PLEXOR_API CMPIStatus PlexorProviderGetInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                                const CMPIResult* rslt, const CMPIObjectPath* cop,
                                                const char** properties);

// The refused operations: status 7, no side effect.
PLEXOR_API CMPIStatus PlexorProviderCreateInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                                   const CMPIResult* rslt,
                                                   const CMPIObjectPath* cop,
                                                   const CMPIInstance* ci);
PLEXOR_API CMPIStatus PlexorProviderModifyInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                                   const CMPIResult* rslt,
                                                   const CMPIObjectPath* cop,
                                                   const CMPIInstance* ci, const char** properties);
PLEXOR_API CMPIStatus PlexorProviderDeleteInstance(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                                   const CMPIResult* rslt,
                                                   const CMPIObjectPath* cop);
PLEXOR_API CMPIStatus PlexorProviderExecQuery(CMPIInstanceMI* mi, const CMPIContext* ctx,
                                              const CMPIResult* rslt, const CMPIObjectPath* cop,
                                              const char* lang, const char* query);

// ---------------------------------------------------------------------------------------------

/// A heap copy that the caller frees; null for null, and after a failed copy, which is logged.
static inline char* StringClone(const char* text) {
    if (text == nullptr) return nullptr;
    char* copy = strdup(text);
    if (copy == nullptr) syslog(LOG_WARNING, "strdup() failed to duplicate string %s\n", text);
    return copy;
}
