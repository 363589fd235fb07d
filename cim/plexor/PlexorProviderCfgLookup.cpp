// Finding records by their identifiers, and the drives of a pool.
#include <stdlib.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderUtilIndex.h"

namespace {

bool SameText(const char* left, const char* right) {
    return left != nullptr && right != nullptr && strcmp(left, right) == 0;
}

/// What a pool's list tells its drives apart by: the copies of their identifiers themselves.
const char* MemberId(const void* data) {
    return static_cast<const char*>(data);
}

/// The first entry of that drive in a pool's list, whose lock the caller holds; null without one.
const List_Entry_t* FindMember(List_t* list, const char* disk) {
    return list != nullptr ? EntriesWithId(list, disk, MemberId).Next() : nullptr;
}

/// What identifies a record in a look-up.
template <typename Record>
struct Lookup {
    const char* caller;
    const char* noun;
    const char* label;  ///< the key's, in the log
    char* Record::*key;
};

template <typename Record>
void LogMissing(const Lookup<Record>& lookup, const List_t* list, const char* key) {
    syslog(LOG_INFO, "%s: can not find %s %s in list %p\n", lookup.caller, lookup.noun, key,
           static_cast<const void*>(list));
}

/// First record of the list with that key; null, which is logged, when there is none. A null key is
/// nobody's.
template <typename Record>
Record* Find(const Lookup<Record>& lookup, const List_t* list, const char* key) {
    if (key == nullptr) return nullptr;
    const List_Entry_t* entry = list != nullptr ? list->Head : nullptr;
    for (; entry != nullptr; entry = entry->Next) {
        auto* record = static_cast<Record*>(entry->Data);
        syslog(LOG_DEBUG, "%s: checking %s %p (%s: %s)\n", lookup.caller, lookup.noun,
               static_cast<void*>(record), lookup.label, OrNull(record->*lookup.key));
        if (!SameText(record->*lookup.key, key)) continue;
        syslog(LOG_DEBUG, "%s: found %s %p with %s in list %p\n", lookup.caller, lookup.noun,
               static_cast<void*>(record), key, static_cast<const void*>(list));
        return record;
    }
    LogMissing(lookup, list, key);
    return nullptr;
}

constexpr Lookup<StoragePool_t> kPoolLookup = {"FindStoragePoolByID", "pool", "ID",
                                               &StoragePool_t::InstanceID};
constexpr Lookup<DiskDrive_t> kDiskLookup = {"FindDiskByDeviceID", "disk", "ID",
                                             &DiskDrive_t::DeviceID};
constexpr Lookup<Chassis_t> kChassisLookup = {"FindChassisByTag", "chassis", "tag",
                                              &Chassis_t::Tag};

}  // namespace

StoragePool_t* FindStoragePoolByID(const RaidController_t* ctrl, const char* instanceID) {
    return Find(kPoolLookup, DevicesOf(ctrl, kPools), instanceID);
}

DiskDrive_t* FindDiskByDeviceID(const RaidController_t* ctrl, const char* deviceID) {
    return Find(kDiskLookup, DevicesOf(ctrl, kDrives), deviceID);
}

Chassis_t* FindChassisByTag(const RaidController_t* ctrl, const char* tag) {
    // A chassis is denied after it has been found: clients know the drives by their DeviceID, and
    // with a chassis they would be shown by slot and enclosure.
    const List_t* enclosures = DevicesOf(ctrl, kEnclosures);
    if (Find(kChassisLookup, enclosures, tag) != nullptr) {
        LogMissing(kChassisLookup, enclosures, tag);
    }
    return nullptr;
}

void AddDiskToPool(StoragePool_t* pool, const char* disk) {
    if (pool == nullptr || disk == nullptr) return;
    if (FindMember(pool->Drives, disk) != nullptr) return;
    char* copy = StringClone(disk);
    if (AddEntryAtListTail(pool->Drives, copy) != RESULT_OK) free(copy);
}

void RemoveDiskFromPool(StoragePool_t* pool, const char* disk) {
    if (pool == nullptr || disk == nullptr) return;
    const List_Entry_t* entry = FindMember(pool->Drives, disk);
    if (entry == nullptr) return;
    void* copy = entry->Data;
    if (RemoveEntryFromListByKey(pool->Drives, copy) == RESULT_OK) free(copy);
}
