// Finding records by their identifiers, and the drives of a pool.
#include <stdlib.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgKinds.h"
#include "PlexorProviderUtilList.h"

namespace {

bool SameText(const char* left, const char* right) {
    return left != nullptr && right != nullptr && strcmp(left, right) == 0;
}

/// The first entry with that text from `entry` on, before `end`; null when there is none.
List_Entry_t* FindText(List_Entry_t* entry, const List_Entry_t* end, const char* text) {
    while (entry != end && !SameText(static_cast<char*>(entry->Data), text)) entry = entry->Next;
    return entry != end ? entry : nullptr;
}

/// Where this thread has found a member last. A refresh asks for the drives in the order in which
/// their pool lists them: the next one stands behind it, and nobody has to look at all before.
struct FoundLast {
    const List_t* list;
    List_Entry_t* entry;
    std::uint64_t removed;  ///< EntriesRemoved at that time

    /// Null when it may be gone.
    List_Entry_t* In(const List_t* wanted) const {
        return list == wanted && removed == EntriesRemoved() ? entry : nullptr;
    }
};
thread_local FoundLast __FoundLast = {nullptr, nullptr, 0};

/// Whether the list, whose lock the caller holds, has the drive.
bool IsMember(const List_t* list, const char* disk) {
    if (list == nullptr) return false;
    List_Entry_t* last = __FoundLast.In(list);
    List_Entry_t* found = FindText(last, nullptr, disk);
    if (found == nullptr) found = FindText(list->Head, last, disk);
    if (found != nullptr) __FoundLast = {list, found, EntriesRemoved()};
    return found != nullptr;
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
    if (IsMember(pool->Drives, disk)) return;
    char* copy = StringClone(disk);
    if (AddEntryAtListTail(pool->Drives, copy) != RESULT_OK) free(copy);
}

void RemoveDiskFromPool(StoragePool_t* pool, const char* disk) {
    if (pool == nullptr || disk == nullptr || pool->Drives == nullptr) return;
    List_Entry_t* entry = FindText(pool->Drives->Head, nullptr, disk);
    if (entry == nullptr) return;
    void* copy = entry->Data;
    if (RemoveEntryFromListByKey(pool->Drives, copy) == RESULT_OK) free(copy);
}
