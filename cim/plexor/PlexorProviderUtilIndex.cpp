// The index of a list: chains of the entries whose identifiers have the same hash. Each chain is in
// the list's order, so that records with the same identifier are found in that order too.
#include "PlexorProviderUtilIndex.h"

#include <stdlib.h>
#include <string.h>

struct ListIndex_t {
    std::uint32_t chains;          ///< a power of two
    const List_Entry_t** entries;  ///< of the list, in its order
    std::uint32_t* following;      ///< for each entry: the next one's position; 0: none
    std::uint32_t* first;          ///< for each chain; positions count from 1, 0: none
};

namespace {

/// A walk of so few is not worth an allocation.
constexpr unsigned int kShortList = 32;

std::uint32_t HashOf(const char* id) {
    std::uint32_t hash = 2166136261U;
    for (; *id != '\0'; id++) hash = (hash ^ static_cast<unsigned char>(*id)) * 16777619U;
    return hash;
}

std::uint32_t* ChainOf(const ListIndex_t* index, const char* id) {
    return &index->first[HashOf(id) & (index->chains - 1)];
}

/// An index of that many entries without any; null when there is no memory.
ListIndex_t* NewIndex(std::uint32_t size) {
    std::uint32_t chains = 1;
    while (chains < size) chains *= 2;
    const size_t each = sizeof(void*) + sizeof(std::uint32_t);
    auto* index = static_cast<ListIndex_t*>(
        calloc(1, sizeof(ListIndex_t) + size * each + chains * sizeof(std::uint32_t)));
    if (index == nullptr) return nullptr;
    index->chains = chains;
    index->entries = reinterpret_cast<const List_Entry_t**>(index + 1);
    index->following = reinterpret_cast<std::uint32_t*>(index->entries + size);
    index->first = index->following + size;
    return index;
}

/// Puts the entries into their chains, the last one first: each goes in front of those behind it.
void FillChains(ListIndex_t* index, std::uint32_t size, IdOf_t idOf) {
    for (std::uint32_t position = size; position > 0; position--) {
        const char* id = idOf(index->entries[position - 1]->Data);
        if (id == nullptr) continue;
        std::uint32_t* chain = ChainOf(index, id);
        index->following[position - 1] = *chain;
        *chain = position;
    }
}

/// The list's index, made if there is none yet; null for a short list, and without memory.
const ListIndex_t* IndexOf(List_t* list, IdOf_t idOf) {
    if (list->Size <= kShortList) return nullptr;
    if (list->Index != nullptr) return list->Index;
    ListIndex_t* index = NewIndex(list->Size);
    if (index == nullptr) return nullptr;
    std::uint32_t size = 0;
    const List_Entry_t* entry = list->Head;
    for (; entry != nullptr && size < list->Size; entry = entry->Next) {
        index->entries[size++] = entry;
    }
    FillChains(index, size, idOf);
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
      position_(index_ != nullptr ? *ChainOf(index_, id) : 0),
      entry_(index_ == nullptr ? list->Head : nullptr) {}

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

void DropIndex(List_t* list) {
    if (list->Index == nullptr) return;
    free(list->Index);
    list->Index = nullptr;
}
