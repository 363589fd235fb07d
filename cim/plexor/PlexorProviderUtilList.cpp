// Lists and the bounded FIFO.
#include <stdlib.h>
#include <strings.h>

#include "PlexorProviderLock.h"
#include "PlexorProviderUtil.h"
#include "PlexorProviderUtilIndex.h"

Fifo_t __FIFO = {PTHREAD_MUTEX_INITIALIZER, 20, {}};

namespace {

List_Entry_t* NewEntry(void* data) {
    auto* entry = static_cast<List_Entry_t*>(calloc(1, sizeof(List_Entry_t)));
    if (entry != nullptr) entry->Data = data;
    return entry;
}

int EntryAdded(List_t* list, void* data) {
    list->Size++;
    syslog(LOG_DEBUG, "Data %p added to the list %p, size %d\n", data, static_cast<void*>(list),
           static_cast<int>(list->Size));
    return RESULT_OK;
}

void EntryRemoved(List_t* list, List_Entry_t* entry, void* data) {
    list->Size--;
    UnindexEntry(list, entry);
    syslog(LOG_DEBUG, "Data %p removed from list %p, size %d\n", data, static_cast<void*>(list),
           static_cast<int>(list->Size));
    free(entry);
}

}  // namespace

int CMStringCmp(const CMPIString* str1, const char* str2) {
    const char* text = StringText(str1);
    return strcasecmp(text != nullptr ? text : "", str2);
}

int AddEntryAtListHead(List_t* list, void* data) {
    syslog(LOG_DEBUG, "Adding data %p to the list %p at the head\n", data,
           static_cast<void*>(list));
    if (data == nullptr) return RESULT_OK;
    if (list == nullptr) return RESULT_BAD_ARGUMENT;
    List_Entry_t* entry = NewEntry(data);
    if (entry == nullptr) return RESULT_NO_MEMORY;

    // An empty list may carry a stale Tail (see RemoveEntryFromListByKey).
    if (list->Head == nullptr || list->Tail == nullptr) list->Tail = entry;
    entry->Next = list->Head;
    list->Head = entry;
    // An index misses the entry, which the list's size tells: the next look makes it anew.
    return EntryAdded(list, data);
}

int AddEntryAtListTail(List_t* list, void* data) {
    syslog(LOG_DEBUG, "Adding data %p to the list %p at the tail\n", data,
           static_cast<void*>(list));
    if (data == nullptr) return RESULT_OK;
    if (list == nullptr) return RESULT_BAD_ARGUMENT;
    List_Entry_t* entry = NewEntry(data);
    if (entry == nullptr) return RESULT_NO_MEMORY;

    // An empty list may carry a stale Tail (see RemoveEntryFromListByKey): never write through it.
    if (list->Head == nullptr || list->Tail == nullptr) {
        list->Head = entry;
    } else {
        list->Tail->Next = entry;
    }
    list->Tail = entry;
    IndexTail(list);
    return EntryAdded(list, data);
}

int RemoveEntryFromList(List_t* list, void** data) {
    syslog(LOG_DEBUG, "Removing data %p from list %p\n", data != nullptr ? *data : nullptr,
           static_cast<void*>(list));
    if (list == nullptr) {
        syslog(LOG_ERR, "%s: list is NULL\n", __func__);
        return RESULT_BAD_ARGUMENT;
    }
    if (data == nullptr) return RESULT_BAD_ARGUMENT;
    List_Entry_t* entry = list->Head;
    if (entry == nullptr) {
        *data = nullptr;
        return RESULT_OK;
    }

    *data = entry->Data;
    list->Head = entry->Next;
    if (list->Head == nullptr) list->Tail = nullptr;
    EntryRemoved(list, entry, *data);
    return RESULT_OK;
}

int RemoveEntryFromListByKey(List_t* list, void* data) {
    syslog(LOG_DEBUG, "Removing data %p from list %p\n", static_cast<void*>(list), data);
    if (list == nullptr || data == nullptr) return RESULT_BAD_ARGUMENT;
    List_Entry_t* entry = list->Head;
    if (entry == nullptr) return RESULT_NOT_FOUND;

    if (entry->Data == data) {
        // Tail stays as it is, also when this was the only entry.
        list->Head = entry->Next;
        EntryRemoved(list, entry, data);
        return RESULT_OK;
    }
    List_Entry_t* previous = entry;
    for (entry = entry->Next; entry != nullptr && entry->Data != data; entry = entry->Next) {
        previous = entry;
    }
    if (entry == nullptr) return RESULT_NOT_FOUND;

    previous->Next = entry->Next;
    if (list->Tail == entry) list->Tail = previous;
    EntryRemoved(list, entry, data);
    return RESULT_OK;
}

int IsListEmpty(List_t* list) {
    return list->Size == 0 ? 1 : 0;
}

int PutItem(Fifo_t* fifo, void* item) {
    MutexGuard lock(fifo->Mutex);
    if (fifo->List.Size >= fifo->Size) {
        syslog(LOG_DEBUG, "%s: Fifo(%p) is full, limit %d\n", __func__, static_cast<void*>(fifo),
               static_cast<int>(fifo->Size));
        return RESULT_FIFO_FULL;
    }
    return AddEntryAtListTail(&fifo->List, item);
}

void* GetItem(Fifo_t* fifo) {
    void* item = nullptr;
    MutexGuard lock(fifo->Mutex);
    RemoveEntryFromList(&fifo->List, &item);
    return item;
}

int IsFifoEmpty(Fifo_t* fifo) {
    MutexGuard lock(fifo->Mutex);
    return IsListEmpty(&fifo->List);
}

void FreeList(List_t* list, ReleaseFunc_t release) {
    syslog(LOG_DEBUG, "Freeing list %p, release function %p\n", static_cast<void*>(list),
           reinterpret_cast<void*>(release));
    if (list == nullptr) return;
    DropIndex(list);
    if (IsListEmpty(list)) {
        syslog(LOG_DEBUG, "List %p is empty\n", static_cast<void*>(list));
        return;
    }
    while (list->Head != nullptr) {
        void* item = nullptr;
        RemoveEntryFromList(list, &item);
        if (release != nullptr) {
            release(item);
            continue;
        }
        syslog(LOG_DEBUG, "%s: node %p freed from list\n", __func__, item);
        free(item);
    }
}
