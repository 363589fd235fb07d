// The index of a list: chains of the entries whose identifiers have the same hash. Each chain is in
// the list's order, so that records with the same identifier are found in that order too.
#include "PlexorProviderUtilIndex.h"

#include <stdlib.h>
#include <string.h>

struct ListIndex_t {
    IdOf_t idOf;
    std::uint32_t size;            ///< positions that have been given
    std::uint32_t capacity;        ///< also the number of chains
    const List_Entry_t** entries;  ///< in the list's order; those of no chain may have left it
    std::uint32_t* following;      ///< for each entry: the next one's position; 0: none
    std::uint32_t* first;          ///< for each chain; positions count from 1, 0: none
    std::uint32_t* last;           ///< the same
};

namespace {

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
    if (list->Index != nullptr) return list->Index->idOf == idOf ? list->Index : nullptr;
    ListIndex_t* index = NewIndex(list->Size, idOf);
    if (index == nullptr) return nullptr;
    const List_Entry_t* entry = list->Head;
    for (; entry != nullptr && index->size < index->capacity; entry = entry->Next)
        Append(index, entry);
    return list->Index = index;
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

void IndexTail(List_t* list) {
    ListIndex_t* index = list->Index;
    if (index == nullptr) return;
    // The next look makes a larger one.
    if (index->size == index->capacity) return DropIndex(list);
    Append(index, list->Tail);
}

void UnindexEntry(List_t* list, const List_Entry_t* entry) {
    ListIndex_t* index = list->Index;
    if (index == nullptr) return;
    const char* id = list->Head != nullptr ? index->idOf(entry->Data) : nullptr;
    if (id == nullptr || !Unchain(index, ChainOf(index, id), entry)) DropIndex(list);
}

void DropIndex(List_t* list) {
    if (list->Index == nullptr) return;
    free(list->Index);
    list->Index = nullptr;
}
