// Matching the cached records of a class with the fresh results of its association.
#include <stdlib.h>

#include "PlexorProviderCfg.h"

namespace {

constexpr const char kCaller[] = "CrossoutDuplicatedEntries";

/// The two arrays while they are filled and matched, with the counts that the log shows.
struct Matching {
    UpdateInfo_t* cached = nullptr;
    int cachedCount = 0;
    int cachedLeft = 0;  ///< cached entries not matched
    NewInfo_t* fresh = nullptr;
    int freshCount = 0;
    int freshLeft = 0;  ///< fresh entries not matched
};

/// Class name and key of a path, the broker's texts.
struct Identity {
    const char* className;
    const char* key;

    Identity(const CMPIObjectPath* op, const char* keyname)
        : className(ClassNameText(op)), key(ReadKey(op, keyname)) {}

    /// A path that lacks either text is nobody's equal.
    bool operator==(const Identity& other) const {
        return className != nullptr && key != nullptr && other.className != nullptr &&
               other.key != nullptr && strcmp(className, other.className) == 0 &&
               strcmp(key, other.key) == 0;
    }
};

/// Room for entry number `count` in an array of `capacity` entries: an enumeration may give more
/// elements than its array had.
bool MakeRoom(NewInfo_t*& entries, size_t count, size_t& capacity) {
    if (count < capacity) return true;
    const size_t wanted = capacity * 2 + 8;
    void* grown = realloc(entries, wanted * sizeof(NewInfo_t));
    if (grown == nullptr) return false;
    entries = static_cast<NewInfo_t*>(grown);
    capacity = wanted;
    return true;
}

/// Gives up: to go on without the rest would be to take devices for gone that are there.
int GiveUp(Matching& matching, int rc) {
    free(matching.fresh);
    matching.fresh = nullptr;
    matching.freshCount = matching.freshLeft = 0;
    return rc;
}

/// Walks the enumeration into matching.fresh, which has room for `capacity` entries so far.
int WalkFresh(Matching& matching, const CMPIEnumeration* enums, size_t capacity) {
    size_t count = 0;
    bool failed = false;
    while (CMPIInstance* inst = NextInstance(enums, &failed)) {
        if (!MakeRoom(matching.fresh, count, capacity)) {
            syslog(LOG_ERR, "%s, failed to allocate memory for enum\n", kCaller);
            return GiveUp(matching, RESULT_NO_MEMORY);
        }
        CMPIObjectPath* op = InstancePath(inst);
        matching.fresh[count] = {op, inst};
        syslog(LOG_DEBUG, "OP %p added to opArr[%d]\n", static_cast<void*>(op),
               static_cast<int>(count));
        count++;
    }
    matching.freshCount = matching.freshLeft = static_cast<int>(count);
    return failed ? GiveUp(matching, RESULT_NOTHING) : RESULT_OK;
}

int CollectFresh(Matching& matching, const CMPIEnumeration* enums) {
    CMPIArray* array = enums != nullptr ? enums->ft->toArray(enums, nullptr) : nullptr;
    syslog(LOG_DEBUG, "arrPtr %p\n", static_cast<void*>(array));
    if (array == nullptr) {
        syslog(LOG_ERR, "%s, failed to get array from enum\n", kCaller);
        return RESULT_NOTHING;
    }
    const size_t size = array->ft->getSize(array, nullptr);
    syslog(LOG_DEBUG, "Enum array size %d\n", static_cast<int>(size));
    if (size != 0) {
        matching.fresh = static_cast<NewInfo_t*>(calloc(size, sizeof(NewInfo_t)));
        if (matching.fresh == nullptr) {
            syslog(LOG_ERR, "%s, failed to allocate memory for enum\n", kCaller);
            return RESULT_NO_MEMORY;
        }
    }
    return WalkFresh(matching, enums, size);
}

int CollectCached(Matching& matching, const List_t* list) {
    syslog(LOG_DEBUG, "List %p, size %d\n", static_cast<const void*>(list),
           list != nullptr ? static_cast<int>(list->Size) : 0);
    if (list == nullptr || list->Size == 0) return RESULT_OK;
    matching.cached = static_cast<UpdateInfo_t*>(calloc(list->Size, sizeof(UpdateInfo_t)));
    if (matching.cached == nullptr) {
        free(matching.fresh);
        matching.fresh = nullptr;
        matching.freshCount = 0;
        syslog(LOG_ERR, "%s, failed to allocate memory for list\n", kCaller);
        return RESULT_NO_MEMORY;
    }
    int count = 0;
    const List_Entry_t* entry = list->Head;
    for (; entry != nullptr && count < static_cast<int>(list->Size); entry = entry->Next) {
        matching.cached[count].Device = entry->Data;
        syslog(LOG_DEBUG, "data %p added to dataArr[%d]\n", entry->Data, count);
        count++;
    }
    matching.cachedCount = matching.cachedLeft = count;
    return RESULT_OK;
}

/// Looks for the fresh entry of cached entry `i`.
void MatchOne(Matching& matching, int i, GetOpFunc_t getOp, const char* keyname) {
    UpdateInfo_t& cached = matching.cached[i];
    const Identity wanted(getOp(cached.Device), keyname);
    syslog(LOG_DEBUG, "dataArr[%d]: class name %s, key %s\n", i, wanted.className, wanted.key);
    for (int j = 0; j < matching.freshCount; j++) {
        NewInfo_t& fresh = matching.fresh[j];
        if (fresh.Op == nullptr) continue;
        const Identity candidate(fresh.Op, keyname);
        syslog(LOG_DEBUG, "opArr[%d]: class name %s, key %s\n", j, candidate.className,
               candidate.key);
        if (!(wanted == candidate)) continue;
        cached.Instance = fresh.Instance;
        cached.Flag = 1;
        fresh = {nullptr, nullptr};
        matching.freshLeft--;
        matching.cachedLeft--;
        syslog(LOG_DEBUG, "%s,%s duplicated, candidate for update. ci %d, cj %d\n",
               wanted.className, wanted.key, matching.freshLeft, matching.cachedLeft);
        return;
    }
}

int Match(Matching& matching, const List_t* list, const CMPIEnumeration* enums, GetOpFunc_t getOp,
          const char* keyname) {
    int rc = CollectFresh(matching, enums);
    if (rc == RESULT_OK) rc = CollectCached(matching, list);
    if (rc != RESULT_OK) return rc;
    for (int i = 0; i < matching.cachedCount; i++) MatchOne(matching, i, getOp, keyname);
    if (matching.freshLeft == 0) {
        free(matching.fresh);
        matching.fresh = nullptr;
        matching.freshCount = 0;
    }
    return RESULT_OK;
}

}  // namespace

int CrossoutDuplicatedEntries(const List_t* list, const CMPIEnumeration* enums, GetOpFunc_t getOp,
                              const char* keyname, UpdateInfo_t** dataPtrs, NewInfo_t** opPtrs,
                              int* datacount, int* opcount) {
    syslog(LOG_DEBUG, "%s: ENTER...\n", __func__);
    Matching matching;
    int rc = RESULT_NOTHING;
    if (dataPtrs == nullptr || keyname == nullptr || datacount == nullptr || opPtrs == nullptr ||
        opcount == nullptr) {
        syslog(LOG_ERR, "%s: invalid parameter\n", __func__);
    } else {
        rc = Match(matching, list, enums, getOp, keyname);
        *dataPtrs = matching.cached;
        *datacount = matching.cachedCount;
        *opPtrs = matching.fresh;
        *opcount = matching.freshCount;
    }
    syslog(LOG_DEBUG, "%s EXITED, rc %d, remove %d, add %d\n", __func__, rc, matching.cachedLeft,
           matching.freshLeft);
    return rc;
}
