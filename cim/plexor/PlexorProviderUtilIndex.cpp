// The index of a list: chains of the entries whose identifiers have the same hash. Each chain is in
// the list's order, so that records with the same identifier are found in that order too.
//
// Lists are what others know them as, so the indexes stand beside them, found by the list's
// address.
#include "PlexorProviderUtilIndex.h"

#include <stdlib.h>
#include <string.h>

#include <atomic>

#include "PlexorProviderLock.h"

struct ListIndex_t {
    const List_t* list;
    ListIndex_t* next;             ///< of another list, guarded by __IndexMutex
    unsigned int listSize;         ///< of the list that it knows
    const List_Entry_t* listTail;  ///< the same
    IdOf_t idOf;
    std::uint32_t size;            ///< positions that have been given
    std::uint32_t capacity;        ///< also the number of chains
    const List_Entry_t** entries;  ///< in the list's order; those of no chain may have left it
    std::uint32_t* following;      ///< for each entry: the next one's position; 0: none
    std::uint32_t* first;          ///< for each chain; positions count from 1, 0: none
    std::uint32_t* last;           ///< the same
};

namespace {

pthread_mutex_t __IndexMutex = PTHREAD_MUTEX_INITIALIZER;
constexpr size_t kIndexChains = 64;
ListIndex_t* __Indexes[kIndexChains] PLEXOR_GUARDED_BY(__IndexMutex);
// Spares the lists of those without an index the look: who made one did it under their list's lock.
std::atomic<unsigned int> __IndexCount = 0;

/// Where the chain begins that has the list's index, if there is one.
ListIndex_t** IndexChainOf(const List_t* list) PLEXOR_HOLDS(__IndexMutex) {
    return &__Indexes[reinterpret_cast<uintptr_t>(list) / sizeof(List_t) % kIndexChains];
}

void Keep(ListIndex_t* index, const List_t* list) {
    index->list = list;
    const MutexGuard lock(__IndexMutex);
    ListIndex_t** chain = IndexChainOf(list);
    index->next = *chain;
    *chain = index;
    __IndexCount++;
}

void Forget(const ListIndex_t* index) {
    const MutexGuard lock(__IndexMutex);
    ListIndex_t** place = IndexChainOf(index->list);
    while (*place != index) place = &(*place)->next;
    *place = index->next;
    __IndexCount--;
}

/// Whether nobody has changed the list in another way since the index has followed it.
bool Knows(const ListIndex_t* index, const List_t* list) {
    return index->listSize == list->Size && index->listTail == list->Tail;
}

/// A walk of so few is not worth an allocation.
constexpr unsigned int kShortList = 32;

std::uint32_t HashOf(const char* id) {
    std::uint32_t hash = 2166136261U;
    for (; *id != '\0'; id++) hash = (hash ^ static_cast<unsigned char>(*id)) * 16777619U;
    return hash;
}

std::uint32_t ChainOf(const ListIndex_t* index, const char* id) {
    return HashOf(id) % index->capacity;
}

/// An index without entries that has room for twice as many as `size`, so that few changes of the
/// list need a new one; null when there is no memory.
ListIndex_t* NewIndex(std::uint32_t size, IdOf_t idOf) {
    const std::uint32_t capacity = size * 2;
    const size_t each = sizeof(void*) + 3 * sizeof(std::uint32_t);
    auto* index = static_cast<ListIndex_t*>(calloc(1, sizeof(ListIndex_t) + capacity * each));
    if (index == nullptr) return nullptr;
    index->idOf = idOf;
    index->capacity = capacity;
    index->entries = reinterpret_cast<const List_Entry_t**>(index + 1);
    index->following = reinterpret_cast<std::uint32_t*>(index->entries + capacity);
    index->first = index->following + capacity;
    index->last = index->first + capacity;
    return index;
}

/// Lets a position follow another one in its chain; 0 is before the first and behind the last.
void Link(ListIndex_t* index, std::uint32_t chain, std::uint32_t before, std::uint32_t position) {
    (before != 0 ? index->following[before - 1] : index->first[chain]) = position;
}

/// Puts an entry behind those that the index has, for which it has room.
void Append(ListIndex_t* index, const List_Entry_t* entry) {
    index->entries[index->size] = entry;
    const std::uint32_t position = ++index->size;
    const char* id = index->idOf(entry->Data);
    if (id == nullptr) return;
    const std::uint32_t chain = ChainOf(index, id);
    Link(index, chain, index->last[chain], position);
    index->last[chain] = position;
}

/// Takes an entry out of the chain of its identifier; whether it was there.
bool Unchain(ListIndex_t* index, std::uint32_t chain, const List_Entry_t* entry) {
    std::uint32_t before = 0;
    std::uint32_t position = index->first[chain];
    while (position != 0 && index->entries[position - 1] != entry) {
        before = position;
        position = index->following[position - 1];
    }
    if (position == 0) return false;
    Link(index, chain, before, index->following[position - 1]);
    if (index->last[chain] == position) index->last[chain] = before;
    return true;
}

/// The list's index, made if there is none yet; null for a short list, without memory, and when it
/// is of another identifier.
const ListIndex_t* IndexOf(List_t* list, IdOf_t idOf) {
    if (list->Size <= kShortList) return nullptr;
    ListIndex_t* index = KeptIndex(list);
    if (index != nullptr && Knows(index, list)) return index->idOf == idOf ? index : nullptr;
    DropIndex(list);
    index = NewIndex(list->Size, idOf);
    if (index == nullptr) return nullptr;
    const List_Entry_t* entry = list->Head;
    for (; entry != nullptr && index->size < index->capacity; entry = entry->Next)
        Append(index, entry);
    index->listSize = list->Size;
    index->listTail = list->Tail;
    Keep(index, list);
    return index;
}

}  // namespace

bool SameId(const char* wanted, const char* id) {
    return wanted == nullptr || (id != nullptr && strcmp(wanted, id) == 0);
}

EntriesWithId::EntriesWithId(List_t* list, const char* id, IdOf_t idOf)
    : id_(id),
      idOf_(idOf),
      index_(id != nullptr ? IndexOf(list, idOf) : nullptr),
      position_(),
      entry_() {
    if (index_ != nullptr) {
        position_ = index_->first[ChainOf(index_, id)];
    } else {
        entry_ = list->Head;
    }
}

/// The next entry that may be one.
const List_Entry_t* EntriesWithId::Following() {
    const List_Entry_t* entry = entry_;
    if (index_ != nullptr) {
        if (position_ == 0) return nullptr;
        entry = index_->entries[position_ - 1];
        position_ = index_->following[position_ - 1];
    } else if (entry != nullptr) {
        entry_ = entry->Next;
    }
    return entry;
}

const List_Entry_t* EntriesWithId::Next() {
    const List_Entry_t* entry = Following();
    while (entry != nullptr && !SameId(id_, idOf_(entry->Data))) entry = Following();
    return entry;
}

ListIndex_t* KeptIndex(const List_t* list) {
    if (__IndexCount.load(std::memory_order_relaxed) == 0) return nullptr;
    const MutexGuard lock(__IndexMutex);
    ListIndex_t* index = *IndexChainOf(list);
    while (index != nullptr && index->list != list) index = index->next;
    return index;
}

void IndexTail(List_t* list) {
    ListIndex_t* index = KeptIndex(list);
    if (index == nullptr) return;
    // The next look makes a larger one.
    if (index->size == index->capacity) return DropIndex(list);
    Append(index, list->Tail);
    index->listSize++;
    index->listTail = list->Tail;
}

void UnindexEntry(List_t* list, const List_Entry_t* entry) {
    ListIndex_t* index = KeptIndex(list);
    if (index == nullptr) return;
    index->listSize--;
    index->listTail = list->Tail;
    const char* id = list->Head != nullptr ? index->idOf(entry->Data) : nullptr;
    if (id == nullptr || !Unchain(index, ChainOf(index, id), entry)) DropIndex(list);
}

void DropIndex(List_t* list) {
    ListIndex_t* index = KeptIndex(list);
    if (index == nullptr) return;
    Forget(index);
    free(index);
}
