// Finding records by their identifiers, and the drives of a pool.
#include <stdlib.h>

#include "PlexorProviderCfg.h"

namespace {

bool SameText(const char* left, const char* right) {
    return left != nullptr && right != nullptr && strcmp(left, right) == 0;
}

/// Entry of the member drive `disk`; null when it is none.
List_Entry_t* FindMember(const StoragePool_t* pool, const char* disk) {
    List_Entry_t* entry = pool->Drives != nullptr ? pool->Drives->Head : nullptr;
    while (entry != nullptr && !SameText(static_cast<char*>(entry->Data), disk)) {
        entry = entry->Next;
    }
    return entry;
}

/// How one kind of record is looked up and what that leaves in the log.
template <typename Record>
struct Lookup {
    const char* caller;
    char* Record::*key;
    const char* checking;  ///< caller, record, its key
    const char* found;     ///< caller, record, wanted key, list
    const char* missing;   ///< caller, wanted key, list
    bool alwaysMissing;    ///< deny the record after having found it
};

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
template <typename Record>
Record* Find(const Lookup<Record>& lookup, List_t* list, const char* key) {
    if (key == nullptr) return nullptr;
    List_Entry_t* entry = list != nullptr ? list->Head : nullptr;
    for (; entry != nullptr; entry = entry->Next) {
        auto* record = static_cast<Record*>(entry->Data);
        syslog(LOG_DEBUG, lookup.checking, lookup.caller, static_cast<void*>(record),
               record->*lookup.key);
        if (!SameText(record->*lookup.key, key)) continue;
        syslog(LOG_DEBUG, lookup.found, lookup.caller, static_cast<void*>(record), key,
               static_cast<void*>(list));
        if (lookup.alwaysMissing) break;
        return record;
    }
    syslog(LOG_INFO, lookup.missing, lookup.caller, key, static_cast<void*>(list));
    return nullptr;
}
#pragma GCC diagnostic pop

constexpr Lookup<StoragePool_t> kPoolLookup = {"FindStoragePoolByID",
                                               &StoragePool_t::InstanceID,
                                               "%s: checking pool %p (ID: %s)\n",
                                               "%s: found pool %p with %s in list %p\n",
                                               "%s: can not find pool %s in list %p\n",
                                               false};
constexpr Lookup<DiskDrive_t> kDiskLookup = {"FindDiskByDeviceID",
                                             &DiskDrive_t::DeviceID,
                                             "%s: checking disk %p (ID: %s)\n",
                                             "%s: found disk %p with %s in list %p\n",
                                             "%s: can not find disk %s in list %p\n",
                                             false};
// Callers never obtain a chassis, on purpose: drives are shown by their DeviceID, not by slot and
// enclosure.
constexpr Lookup<Chassis_t> kChassisLookup = {"FindChassisByTag",
                                              &Chassis_t::Tag,
                                              "%s: checking chassis %p (tag: %s)\n",
                                              "%s: found chassis %p with %s in list %p\n",
                                              "%s: can not find chassis %s in list %p\n",
                                              true};

}  // namespace

StoragePool_t* FindStoragePoolByID(const RaidController_t* ctrl, const char* instanceID) {
    return Find(kPoolLookup, ctrl->PoolList, instanceID);
}

DiskDrive_t* FindDiskByDeviceID(const RaidController_t* ctrl, const char* deviceID) {
    return Find(kDiskLookup, ctrl->DiskList, deviceID);
}

Chassis_t* FindChassisByTag(const RaidController_t* ctrl, const char* tag) {
    return Find(kChassisLookup, ctrl->ChassisList, tag);
}

void AddDiskToPool(StoragePool_t* pool, const char* disk) {
    if (pool == nullptr || disk == nullptr) return;
    if (FindMember(pool, disk) != nullptr) return;
    char* copy = StringClone(disk);
    if (AddEntryAtListTail(pool->Drives, copy) != RESULT_OK) free(copy);
}

void RemoveDiskFromPool(StoragePool_t* pool, const char* disk) {
    if (pool == nullptr || disk == nullptr) return;
    List_Entry_t* entry = FindMember(pool, disk);
    if (entry == nullptr) return;
    void* copy = entry->Data;
    if (RemoveEntryFromListByKey(pool->Drives, copy) == RESULT_OK) free(copy);
}
