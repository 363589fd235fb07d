// Looking up entries by their records' identifiers: short lists are walked, long ones have an
// index. Either way all entries with the identifier are found, in the list's order.
#include <deque>
#include <string>

#include "PlexorProviderUtilIndex.h"
#include "allocation_faults.h"
#include "list_fixture.h"

namespace plexortest {
namespace {

constexpr std::size_t kMostWithoutIndex = 32;

struct Record {
    const char* id;
};

const char* idOf(const void* record) {
    return static_cast<const Record*>(record)->id;
}

/// The parameter is how many entries there are besides those of a test.
class ListIndexTest : public ListTest, public ::testing::WithParamInterface<std::size_t> {
protected:
    void TearDown() override {
        DropIndex(&list);
        ListTest::TearDown();
    }

    Record* record(const char* id) { return &records_.emplace_back(Record{id}); }
    Record* numbered(std::size_t number) {
        return record(texts_.emplace_back("id" + std::to_string(number)).c_str());
    }
    void add(const Items& items) {
        for (void* item : items) ASSERT_EQ(0, AddEntryAtListTail(&list, item));
    }
    /// Entries "id0", "id1" and so on.
    void addOthers(std::size_t number) {
        for (std::size_t i = 0; i < number; i++) add({numbered(i)});
    }
    Items found(const char* id) {
        Items items;
        EntriesWithId entries(&list, id, idOf);
        while (const List_Entry_t* entry = entries.Next()) items.push_back(entry->Data);
        return items;
    }

private:
    std::deque<Record> records_;
    std::deque<std::string> texts_;
};

TEST_P(ListIndexTest, AnEmptyListHasNothing) {
    EXPECT_EQ(Items{}, found("id0"));
    EXPECT_EQ(Items{}, found(nullptr));
}

TEST_P(ListIndexTest, FindsEachEntry) {
    addOthers(GetParam());
    for (void* item : items()) EXPECT_EQ(Items{item}, found(idOf(item)));
}

TEST_P(ListIndexTest, FindsAllWithTheSameIdentifierInTheirOrder) {
    Record *first = record("twin"), *second = record("twin"), *third = record("twin");
    add({first});
    addOthers(GetParam() / 2);
    add({second});
    addOthers(GetParam() / 2);
    add({third});
    EXPECT_EQ((Items{first, second, third}), found("twin"));
    EXPECT_EQ((Items{first, second, third}), found("twin")) << "once more";
}

TEST_P(ListIndexTest, FindsAllWhereAllHaveTheSameIdentifier) {
    for (std::size_t i = 0; i < GetParam(); i++) add({record("twin")});
    EXPECT_EQ(items(), found("twin"));
}

TEST_P(ListIndexTest, ComparesIdentifiersWithCaseAndAsAWhole) {
    addOthers(GetParam());
    add({record("Disk1")});
    for (const char* other : {"disk1", "Disk", "Disk10", "isk1", "", "id"})
        EXPECT_EQ(Items{}, found(other)) << other;
    EXPECT_EQ(1u, found("Disk1").size());
}

TEST_P(ListIndexTest, FindsAnEmptyIdentifier) {
    addOthers(GetParam());
    Record* nameless = record("");
    add({nameless});
    EXPECT_EQ(Items{nameless}, found(""));
}

TEST_P(ListIndexTest, PassesOverARecordWithoutAnIdentifier) {
    add({record(nullptr)});
    addOthers(GetParam());
    Record* wanted = record("wanted");
    add({record(nullptr), wanted, record(nullptr)});
    EXPECT_EQ(Items{wanted}, found("wanted"));
    EXPECT_EQ(Items{}, found(""));
}

TEST_P(ListIndexTest, NoIdentifierIsThatOfAllEntries) {
    addOthers(GetParam());
    add({record(nullptr), record("last")});
    EXPECT_EQ(items(), found(nullptr));
    EXPECT_EQ(nullptr, list.Index);
}

TEST_P(ListIndexTest, FindsWhatHasBeenAddedSince) {
    addOthers(GetParam());
    EXPECT_EQ(Items{}, found("new"));
    Record *front = record("new"), *back = record("new");
    ASSERT_EQ(0, AddEntryAtListTail(&list, back));
    EXPECT_EQ(Items{back}, found("new"));
    ASSERT_EQ(0, AddEntryAtListHead(&list, front));
    EXPECT_EQ((Items{front, back}), found("new"));
}

TEST_P(ListIndexTest, DoesNotFindWhatHasBeenRemovedSince) {
    Record *first = record("first"), *middle = record("middle"), *last = record("last");
    add({first});
    addOthers(GetParam());
    add({middle, record("another"), last});
    for (Record* removed : {middle, last}) {
        EXPECT_EQ(Items{removed}, found(removed->id));
        ASSERT_EQ(0, RemoveEntryFromListByKey(&list, removed));
        EXPECT_EQ(Items{}, found(removed->id));
    }
    EXPECT_EQ(Items{first}, found("first"));
    void* popped = nullptr;
    ASSERT_EQ(0, RemoveEntryFromList(&list, &popped));
    EXPECT_EQ(first, popped);
    EXPECT_EQ(Items{}, found("first"));
    EXPECT_EQ(1u, found("another").size());
}

TEST_P(ListIndexTest, WithoutMemoryItIsWalked) {
    addOthers(GetParam());
    Record* last = record("last");
    add({last});
    const FailAllocation failing = FailAllocation::from(1);
    EXPECT_EQ(Items{last}, found("last"));
    EXPECT_EQ(nullptr, list.Index);
}

INSTANTIATE_TEST_SUITE_P(Walked, ListIndexTest, ::testing::Values(0, 1, 6));
INSTANTIATE_TEST_SUITE_P(Indexed, ListIndexTest, ::testing::Values(kMostWithoutIndex, 63, 64, 500));

class ListIndexMaking : public ListIndexTest {};

TEST_P(ListIndexMaking, IsMadeOnceAndThenKept) {
    addOthers(GetParam());
    const bool hasOne = GetParam() > kMostWithoutIndex;
    const FailAllocation counted = FailAllocation::none();
    found("id0");
    EXPECT_EQ(hasOne, list.Index != nullptr);
    const ListIndex_t* made = list.Index;
    found("id1");
    found("nobody");
    EXPECT_EQ(made, list.Index);
    EXPECT_EQ(hasOne ? 1u : 0u, counted.calls());
}

TEST_P(ListIndexMaking, IsGoneWhenTheListIsFreed) {
    addOthers(GetParam());
    found("id0");
    FreeList(&list, [](void*) {});
    EXPECT_EQ(nullptr, list.Index);
    EXPECT_EQ(Items{}, found("id0"));
}

TEST_P(ListIndexMaking, AWrongSizeLeadsNobodyBeyondTheEntriesOrTheIndex) {
    addOthers(GetParam() + 10);
    Record* last = record("last");
    add({last});
    const unsigned int size = list.Size;
    list.Size = size + 10;
    EXPECT_EQ(Items{last}, found("last"));
    DropIndex(&list);
    list.Size = size - 10;
    EXPECT_EQ(1u, found("id0").size());
    list.Size = size;
}

INSTANTIATE_TEST_SUITE_P(Sizes, ListIndexMaking,
                         ::testing::Values(1, kMostWithoutIndex, kMostWithoutIndex + 1, 100));

}  // namespace
}  // namespace plexortest
