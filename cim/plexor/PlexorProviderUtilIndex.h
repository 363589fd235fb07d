// Finding the entries of a list by an identifier of their records.
#pragma once

#include <cstdint>

#include "PlexorProvider.h"

struct ListIndex_t;

/// The identifier of the record that an entry points at; null when it has none. It stays as it is
/// while the record is in a list.
typedef const char* (*IdOf_t)(const void* data);

/// Whether an identifier is the wanted one; null wants all.
bool SameId(const char* wanted, const char* id);

/// The entries whose records have an identifier, in the list's order; with a null one, all entries.
/// A long list is looked up in its index, which the first look makes and which follows the list
/// from then on; without memory for one, and when the list's index is of another identifier, the
/// list is walked. One that somebody has changed without the functions for lists gets a new index:
/// its length or its tail shows that. The caller holds the lock that guards the list, and does not
/// change it before the end.
class EntriesWithId {
public:
    EntriesWithId(List_t* list, const char* id, IdOf_t idOf);

    /// The next one; null after the last.
    const List_Entry_t* Next();

private:
    const List_Entry_t* Following();

    const char* id_;
    IdOf_t idOf_;
    const ListIndex_t* index_;   ///< null: the list is walked
    std::uint32_t position_;     ///< the next one's in the index; 0: none
    const List_Entry_t* entry_;  ///< the next one of a walk
};

/// The list's index; null while it has none. The caller holds the lock that guards the list, which
/// guards its index, too.
ListIndex_t* KeptIndex(const List_t* list);

/// Adds the entry that has come to the list's tail to its index.
void IndexTail(List_t* list);

/// Takes out of the list's index an entry that has left the list, while its record is still there.
/// A list that has become empty keeps no index.
void UnindexEntry(List_t* list, const List_Entry_t* entry);

/// Forgets the list's index: the next look makes one.
void DropIndex(List_t* list);
