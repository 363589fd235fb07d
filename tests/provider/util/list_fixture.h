// A list with a few items to put into it.
#pragma once

#include <stdlib.h>

#include <vector>

#include "provider_fixture.h"

namespace plexortest {

class ListTest : public ProviderTest {
protected:
    using Items = std::vector<void*>;

    void TearDown() override {
        // By hand: what is tested must not also tidy up.
        while (list.Head != nullptr) {
            List_Entry_t* entry = list.Head;
            list.Head = entry->Next;
            free(entry);
        }
        ProviderTest::TearDown();
    }

    /// Appends without the functions under test.
    void fill(const Items& items) {
        for (void* item : items) append(list, item);
    }

    /// The items from head to tail.
    Items items() const {
        Items found;
        for (List_Entry_t* entry = list.Head; entry != nullptr; entry = entry->Next) {
            found.push_back(entry->Data);
        }
        return found;
    }

    /// The last entry that is reached from the head; null for an empty list.
    List_Entry_t* lastEntry() const {
        List_Entry_t* entry = list.Head;
        while (entry != nullptr && entry->Next != nullptr) entry = entry->Next;
        return entry;
    }

    /// Content, size and tail of a list in order.
    void expectList(const Items& expected) const {
        EXPECT_EQ(items(), expected);
        EXPECT_EQ(list.Size, expected.size());
        EXPECT_EQ(list.Tail, lastEntry());
    }

    List_t list = {};
    int a = 0, b = 0, c = 0;
};

}  // namespace plexortest
