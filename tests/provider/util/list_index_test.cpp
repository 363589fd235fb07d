// Looking up entries by their records' identifiers: short lists are walked, long ones have an
// index, which follows their changes. Either way all entries with the identifier are found, in the
// list's order.
#include <malloc.h>
#include <unistd.h>

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

std::size_t identifiersRead = 0;

const char* idOf(const void* record) {
    identifiersRead++;
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
    EXPECT_EQ(nullptr, KeptIndex(&list));
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

TEST_P(ListIndexTest, FindsTheOthersOfTheSameIdentifierWhenOneHasBeenRemoved) {
    Items twins;
    for (int i = 0; i < 4; i++) {
        twins.push_back(record("twin"));
        add({twins.back()});
        addOthers(GetParam() / 4);
    }
    EXPECT_EQ(twins, found("twin"));
    for (const std::size_t removed : {1u, 2u, 0u}) {
        ASSERT_EQ(0, RemoveEntryFromListByKey(&list, twins[removed]));
        twins.erase(twins.begin() + static_cast<std::ptrdiff_t>(removed));
        EXPECT_EQ(twins, found("twin"));
        twins.push_back(record("twin"));
        add({twins.back()});
        EXPECT_EQ(twins, found("twin"));
    }
}

TEST_P(ListIndexTest, WithoutMemoryItIsWalked) {
    addOthers(GetParam());
    Record* last = record("last");
    add({last});
    const FailAllocation failing = FailAllocation::from(1);
    EXPECT_EQ(Items{last}, found("last"));
    EXPECT_EQ(nullptr, KeptIndex(&list));
}

INSTANTIATE_TEST_SUITE_P(Walked, ListIndexTest, ::testing::Values(0, 1, 6));
INSTANTIATE_TEST_SUITE_P(Indexed, ListIndexTest, ::testing::Values(kMostWithoutIndex, 63, 64, 500));

class ListIndexMaking : public ListIndexTest {};

TEST_P(ListIndexMaking, IsMadeOnceAndThenKept) {
    addOthers(GetParam());
    const bool hasOne = GetParam() > kMostWithoutIndex;
    const FailAllocation counted = FailAllocation::none();
    found("id0");
    EXPECT_EQ(hasOne, KeptIndex(&list) != nullptr);
    const ListIndex_t* made = KeptIndex(&list);
    found("id1");
    found("nobody");
    EXPECT_EQ(made, KeptIndex(&list));
    EXPECT_EQ(hasOne ? 1u : 0u, counted.calls());
}

TEST_P(ListIndexMaking, TakesFortyBytesForEachEntryThatItIsMadeOf) {
    addOthers(GetParam());
    found("id0");
    ASSERT_EQ(GetParam() > kMostWithoutIndex, KeptIndex(&list) != nullptr);
    if (KeptIndex(&list) == nullptr) return;
    EXPECT_GE(malloc_usable_size(KeptIndex(&list)), 40 * GetParam());
    EXPECT_LE(malloc_usable_size(KeptIndex(&list)), 40 * GetParam() + 112);
}

TEST_P(ListIndexMaking, FollowsTheListUntilItsRoomIsUsedUp) {
    addOthers(GetParam());
    add({record("last")});
    const bool hasOne = GetParam() + 1 > kMostWithoutIndex;
    found("id0");
    const FailAllocation counted = FailAllocation::none();
    for (std::size_t i = 0; i < GetParam() / 2; i++) {
        Record* added = record("twin");
        ASSERT_EQ(0, AddEntryAtListTail(&list, added));
        EXPECT_EQ(Items{added}, found("twin"));
        ASSERT_EQ(0, RemoveEntryFromListByKey(&list, added));
        EXPECT_EQ(Items{}, found("twin"));
    }
    EXPECT_EQ(GetParam() / 2, counted.calls()) << "the entries";
    EXPECT_EQ(hasOne, KeptIndex(&list) != nullptr);
}

TEST_P(ListIndexMaking, SparesALookAtMostOthers) {
    addOthers(GetParam());
    found("id0");
    identifiersRead = 0;
    for (std::size_t i = 0; i < GetParam(); i++) found(("id" + std::to_string(i)).c_str());
    EXPECT_LE(identifiersRead / GetParam(), GetParam() > kMostWithoutIndex ? 4u : GetParam());
}

TEST_P(ListIndexMaking, IsMadeLargerNowAndThen) {
    addOthers(GetParam());
    found("id0");
    const FailAllocation counted = FailAllocation::none();
    constexpr std::size_t kMore = 2000;
    for (std::size_t i = 0; i < kMore; i++) {
        Record* added = numbered(GetParam() + i);
        ASSERT_EQ(0, AddEntryAtListTail(&list, added));
        ASSERT_EQ(Items{added}, found(added->id));
    }
    EXPECT_GT(counted.calls(), kMore);
    EXPECT_LE(counted.calls(), kMore + 8);
    for (void* item : items()) ASSERT_EQ(Items{item}, found(idOf(item)));
}

TEST_P(ListIndexMaking, IsNotThatOfAnotherIdentifier) {
    addOthers(GetParam());
    found("id0");
    const ListIndex_t* made = KeptIndex(&list);
    EntriesWithId entries(&list, "other", [](const void*) { return "other"; });
    Items all;
    while (const List_Entry_t* entry = entries.Next()) all.push_back(entry->Data);
    EXPECT_EQ(items(), all);
    EXPECT_EQ(made, KeptIndex(&list));
}

TEST_P(ListIndexMaking, IsForgottenWhereTheIdentifierOfWhatLeavesHasChanged) {
    addOthers(GetParam());
    for (const char* changed : {"other", static_cast<const char*>(nullptr)}) {
        Record* leaving = record("leaving");
        add({leaving});
        EXPECT_EQ(Items{leaving}, found("leaving"));
        leaving->id = changed;
        ASSERT_EQ(0, RemoveEntryFromListByKey(&list, leaving));
        leaving->id = "leaving";
        EXPECT_EQ(Items{}, found("leaving"));
    }
}

TEST_P(ListIndexMaking, IsGoneWhenTheListIsFreed) {
    addOthers(GetParam());
    found("id0");
    FreeList(&list, [](void*) {});
    EXPECT_EQ(nullptr, KeptIndex(&list));
    EXPECT_EQ(Items{}, found("id0"));
}

TEST_P(ListIndexMaking, IsGoneWhenAListThatSomebodyHasEmptiedByHandIsFreed) {
    addOthers(GetParam());
    found("id0");
    const List_t filled = list;
    list = {};
    EXPECT_EQ(GetParam() > kMostWithoutIndex, KeptIndex(&list) != nullptr);
    FreeList(&list, nullptr);
    EXPECT_EQ(nullptr, KeptIndex(&list));
    list = filled;
}

TEST_P(ListIndexMaking, IsGoneWhenTheLastEntryIs) {
    for (const bool byKey : {true, false}) {
        addOthers(GetParam());
        found("id0");
        while (list.Head != nullptr) {
            void* item = list.Head->Data;
            ASSERT_EQ(0, byKey ? RemoveEntryFromListByKey(&list, item)
                               : RemoveEntryFromList(&list, &item));
        }
        EXPECT_EQ(nullptr, KeptIndex(&list));
    }
}

TEST_P(ListIndexMaking, IsMadeAnewWhereSomebodyHasChangedTheListByHand) {
    addOthers(GetParam());
    Record* last = record("last");
    add({last});
    EXPECT_EQ(Items{last}, found("last"));
    List_Entry_t more = {nullptr, record("more")};
    List_Entry_t* const tail = list.Tail;
    tail->Next = list.Tail = &more;
    list.Size++;
    EXPECT_EQ(Items{more.Data}, found("more"));
    List_Entry_t other = {nullptr, record("other")};
    tail->Next = list.Tail = &other;
    EXPECT_EQ(Items{other.Data}, found("other"));
    EXPECT_EQ(Items{}, found("more"));
    tail->Next = nullptr;
    list.Tail = tail;
    list.Size--;
    EXPECT_EQ(Items{last}, found("last"));
    EXPECT_EQ(Items{}, found("other"));
    DropIndex(&list);
    EXPECT_EQ(KeptIndex(&list), nullptr) << "one made before is still there";
}

/// The status of a process that has one list with an index: 0 when that is found.
int statusWithOneIndex() {
    List_t list = {};
    Record record = {"one"};
    while (list.Size <= kMostWithoutIndex) AddEntryAtListTail(&list, &record);
    const EntriesWithId made(&list, "one", idOf);
    return KeptIndex(&list) != nullptr ? 0 : 1;
}

TEST(ListIndexes, TheOnlyOneIsFound) {
    // Other tests of this process may have left one.
    const std::string style = GTEST_FLAG_GET(death_test_style);
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(_exit(statusWithOneIndex()), ::testing::ExitedWithCode(0), "");
    GTEST_FLAG_SET(death_test_style, style);
}

TEST(ListIndexes, EachListHasItsOwn) {
    constexpr std::size_t kLists = 200;  // more than there are chains of them
    std::deque<Record> records;
    std::vector<List_t> lists(kLists);
    const auto found = [](List_t& list, const char* id) {
        EntriesWithId entries(&list, id, idOf);
        const List_Entry_t* entry = entries.Next();
        return entry != nullptr ? entry->Data : nullptr;
    };
    for (List_t& list : lists) {
        for (std::size_t i = 0; i <= kMostWithoutIndex; i++) {
            AddEntryAtListTail(&list, &records.emplace_back(Record{"one"}));
        }
        EXPECT_EQ(found(list, "one"), list.Head->Data);
    }
    for (std::size_t i = 0; i < kLists; i++) {
        List_t& freed = lists[i * 7 % kLists];  // in another order than they came
        EXPECT_EQ(found(freed, "one"), freed.Head->Data);
        FreeList(&freed, [](void*) {});
        EXPECT_EQ(KeptIndex(&freed), nullptr);
    }
}

TEST_P(ListIndexMaking, AWrongSizeLeadsNobodyBeyondTheEntriesOrTheIndex) {
    addOthers(GetParam() + 98);
    Record* last = record("last");
    add({last});
    const unsigned int size = list.Size;
    list.Size = size + 10;
    EXPECT_EQ(Items{last}, found("last"));
    DropIndex(&list);
    list.Size = size / 3;
    EXPECT_EQ(1u, found("id0").size());
    EXPECT_EQ(1u, found("id1").size());
    list.Size = size;
}

INSTANTIATE_TEST_SUITE_P(Sizes, ListIndexMaking,
                         ::testing::Values(1, kMostWithoutIndex, kMostWithoutIndex + 1, 100));

}  // namespace
}  // namespace plexortest
