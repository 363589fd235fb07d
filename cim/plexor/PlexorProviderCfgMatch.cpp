// Matching the cached records of a class with the fresh results of its association.
#include <stdlib.h>

#include "PlexorProviderCfg.h"

namespace {

constexpr const char kCaller[] = "CrossoutDuplicatedEntries";

/// Class name and key of a path, the broker's texts.
struct Identity {
    const char* className;
    const char* key;
};

Identity ReadIdentity(const CMPIObjectPath* op, const char* keyname) {
    return {ClassNameText(op), ReadKey(op, keyname)};
}

/// Order of two identities that have both texts.
int Compare(const Identity& left, const Identity& right) {
    const int byKey = strcmp(left.key, right.key);
    return byKey != 0 ? byKey : strcmp(left.className, right.className);
}

/// A fresh result as it is looked up. Reading a path's texts costs objects of the broker's, so they
/// are read once, whatever order the results come in.
struct FreshIdentity {
    Identity identity;
    int entry;  ///< its place among the results
    int taken;  ///< at the first of several equal ones: how many of them are matched
};

/// The two arrays while they are filled and matched, with the counts that the log shows.
struct Matching {
    UpdateInfo_t* cached = nullptr;
    int cachedCount = 0;
    int cachedLeft = 0;  ///< cached entries not matched
    NewInfo_t* fresh = nullptr;
    int freshCount = 0;
    int freshLeft = 0;                ///< fresh entries not matched
    FreshIdentity* sorted = nullptr;  ///< by identity, equal ones by place
    Identity* identities = nullptr;   ///< of the fresh entries, by place
    int sortedCount = 0;

    Matching() = default;
    Matching(const Matching&) = delete;
    Matching& operator=(const Matching&) = delete;
    ~Matching() {
        free(sorted);
        free(identities);
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

void DropFresh(Matching& matching) {
    free(matching.fresh);
    matching.fresh = nullptr;
    matching.freshCount = 0;
}

/// Gives up: to go on without the rest would be to take devices for gone that are there.
int GiveUp(Matching& matching, int rc) {
    DropFresh(matching);
    matching.freshLeft = 0;
    return rc;
}

/// Walks the enumeration into matching.fresh, which has room for `capacity` entries so far.
int WalkFresh(Matching& matching, const CMPIEnumeration* enums, size_t capacity) {
    size_t count = 0;
    bool failed = false;
    while (CMPIInstance* inst = NextInstance(enums, &failed)) {
        if (StopRequested()) return GiveUp(matching, RESULT_NOTHING);
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
        DropFresh(matching);
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

int ByIdentity(const void* left, const void* right) {
    const auto* a = static_cast<const FreshIdentity*>(left);
    const auto* b = static_cast<const FreshIdentity*>(right);
    const int order = Compare(a->identity, b->identity);
    return order != 0 ? order : a->entry - b->entry;
}

/// Reads the identity of every fresh entry and sorts those that can be somebody's equal.
int SortFresh(Matching& matching, const char* keyname) {
    const size_t count = static_cast<size_t>(matching.freshCount);
    if (count == 0 || matching.cachedCount == 0) return RESULT_OK;
    matching.identities = static_cast<Identity*>(calloc(count, sizeof(Identity)));
    matching.sorted = static_cast<FreshIdentity*>(calloc(count, sizeof(FreshIdentity)));
    if (matching.identities == nullptr || matching.sorted == nullptr) {
        syslog(LOG_ERR, "%s, failed to allocate memory for enum\n", kCaller);
        return RESULT_NO_MEMORY;
    }
    for (int j = 0; j < matching.freshCount; j++) {
        if (StopRequested()) return RESULT_NOTHING;
        const CMPIObjectPath* op = matching.fresh[j].Op;
        if (op == nullptr) continue;
        const Identity identity = ReadIdentity(op, keyname);
        matching.identities[j] = identity;
        // A path that lacks either text is nobody's equal.
        if (identity.className == nullptr || identity.key == nullptr) continue;
        matching.sorted[matching.sortedCount++] = {identity, j, 0};
    }
    qsort(matching.sorted, static_cast<size_t>(matching.sortedCount), sizeof(FreshIdentity),
          ByIdentity);
    return RESULT_OK;
}

/// Takes the first unmatched fresh entry of that identity; -1 without one.
int TakeEqual(Matching& matching, const Identity& wanted) {
    if (wanted.className == nullptr || wanted.key == nullptr) return -1;
    int low = 0;
    int high = matching.sortedCount;
    while (low < high) {
        const int middle = low + (high - low) / 2;
        if (Compare(matching.sorted[middle].identity, wanted) < 0) {
            low = middle + 1;
        } else {
            high = middle;
        }
    }
    if (low == matching.sortedCount) return -1;
    FreshIdentity& first = matching.sorted[low];
    const int next = low + first.taken;
    if (next >= matching.sortedCount || Compare(matching.sorted[next].identity, wanted) != 0) {
        return -1;
    }
    first.taken++;
    return matching.sorted[next].entry;
}

/// The lines of a comparison with the unmatched entries one after the other, up to entry `match`,
/// or to the end (-1).
void LogComparisons(const Matching& matching, int match) {
    if (!LogEnabled(LOG_DEBUG)) return;
    const int end = match < 0 ? matching.freshCount : match + 1;
    for (int j = 0; j < end && !StopRequested(); j++) {
        if (matching.fresh[j].Op == nullptr) continue;
        syslog(LOG_DEBUG, "opArr[%d]: class name %s, key %s\n", j,
               OrNull(matching.identities[j].className), OrNull(matching.identities[j].key));
    }
}

/// Looks for the fresh entry of cached entry `i`.
void MatchOne(Matching& matching, int i, GetOpFunc_t getOp, const char* keyname) {
    UpdateInfo_t& cached = matching.cached[i];
    const Identity wanted = ReadIdentity(getOp(cached.Device), keyname);
    syslog(LOG_DEBUG, "dataArr[%d]: class name %s, key %s\n", i, OrNull(wanted.className),
           OrNull(wanted.key));
    const int match = TakeEqual(matching, wanted);
    LogComparisons(matching, match);
    if (match < 0) return;
    NewInfo_t& fresh = matching.fresh[match];
    cached.Instance = fresh.Instance;
    cached.Flag = 1;
    fresh = {nullptr, nullptr};
    matching.freshLeft--;
    matching.cachedLeft--;
    syslog(LOG_DEBUG, "%s,%s duplicated, candidate for update. ci %d, cj %d\n", wanted.className,
           wanted.key, matching.freshLeft, matching.cachedLeft);
}

/// Drops what has been matched so far: the cache stays as it is.
int GiveUpMatching(Matching& matching, int rc) {
    free(matching.cached);
    matching.cached = nullptr;
    matching.cachedCount = matching.cachedLeft = 0;
    return GiveUp(matching, rc);
}

int Match(Matching& matching, const List_t* list, const CMPIEnumeration* enums, GetOpFunc_t getOp,
          const char* keyname) {
    int rc = CollectFresh(matching, enums);
    if (rc == RESULT_OK) rc = CollectCached(matching, list);
    if (rc != RESULT_OK) return rc;
    rc = SortFresh(matching, keyname);
    if (rc != RESULT_OK) return GiveUpMatching(matching, rc);
    for (int i = 0; i < matching.cachedCount; i++) {
        if (StopRequested()) return GiveUpMatching(matching, RESULT_NOTHING);
        MatchOne(matching, i, getOp, keyname);
    }
    if (matching.freshLeft == 0) DropFresh(matching);
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
