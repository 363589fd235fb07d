// Popping the front of a list, and removing an item by its pointer.
#include "list_fixture.h"

namespace plexortest {
namespace {

class ListRemove : public ListTest {
protected:
    LogLine removing(const void* first, const void* second) const {
        return {LOG_DEBUG, formatted("Removing data %p from list %p\n", first, second)};
    }
    LogLine removed(const void* data, int size) const {
        return {LOG_DEBUG, formatted("Data %p removed from list %p, size %d\n", data,
                                     static_cast<const void*>(&list), size)};
    }
};

class ListPop : public ListRemove {};
class ListRemoveByKey : public ListRemove {};

TEST_F(ListPop, TakesTheFront) {
    fill({&a, &b, &c});
    void* item = nullptr;
    EXPECT_EQ(RemoveEntryFromList(&list, &item), 0);
    EXPECT_EQ(item, &a);
    expectList({&b, &c});
}

TEST_F(ListPop, OneOfTwoLeavesTheOtherAsHeadAndTail) {
    fill({&a, &b});
    void* item = nullptr;
    EXPECT_EQ(RemoveEntryFromList(&list, &item), 0);
    expectList({&b});
    EXPECT_EQ(list.Head, list.Tail);
}

TEST_F(ListPop, LastOneLeavesNoHeadAndNoTail) {
    fill({&a});
    void* item = nullptr;
    EXPECT_EQ(RemoveEntryFromList(&list, &item), 0);
    EXPECT_EQ(item, &a);
    EXPECT_EQ(list.Head, nullptr);
    EXPECT_EQ(list.Tail, nullptr);
    EXPECT_EQ(list.Size, 0u);
}

TEST_F(ListPop, WithNowhereToPutItTheFrontStays) {
    fill({&a, &b});
    EXPECT_EQ(RemoveEntryFromList(&list, nullptr), -1);
    expectList({&a, &b});
    EXPECT_TRUE(
        logged(LOG_DEBUG, formatted("Removing data %p from list %p\n", static_cast<void*>(nullptr),
                                    static_cast<void*>(&list))));
}

TEST_F(ListPop, EmptyListGivesNull) {
    void* item = &b;
    EXPECT_EQ(RemoveEntryFromList(&list, &item), 0);
    EXPECT_EQ(item, nullptr);
    EXPECT_EQ(list.Size, 0u);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{removing(&b, &list)}));
}

TEST_F(ListPop, EmptiedListWithAStaleTailGivesNull) {
    fill({&a});
    ASSERT_EQ(RemoveEntryFromListByKey(&list, &a), 0);
    void* item = &b;
    EXPECT_EQ(RemoveEntryFromList(&list, &item), 0);
    EXPECT_EQ(item, nullptr);
    EXPECT_EQ(list.Size, 0u);
}

TEST_F(ListPop, NullListIsAnErrorAndLeavesTheSlotAlone) {
    void* item = &b;
    EXPECT_EQ(RemoveEntryFromList(nullptr, &item), -1);
    EXPECT_EQ(item, &b);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{removing(&b, nullptr),
                                    {LOG_ERR, "RemoveEntryFromList: list is NULL\n"}}));
}

TEST_F(ListPop, LogsWhatTheSlotHeldAndThenWhatWasRemoved) {
    fill({&a, &b});
    void* item = &c;
    RemoveEntryFromList(&list, &item);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{removing(&c, &list), removed(&a, 1)}));
}

TEST_F(ListRemoveByKey, FirstOfSeveralLeavesTheTail) {
    fill({&a, &b, &c});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &a), 0);
    expectList({&b, &c});
}

TEST_F(ListRemoveByKey, MiddleLeavesHeadAndTail) {
    fill({&a, &b, &c});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &b), 0);
    expectList({&a, &c});
}

TEST_F(ListRemoveByKey, LastMovesTheTailBack) {
    fill({&a, &b, &c});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &c), 0);
    expectList({&a, &b});
}

TEST_F(ListRemoveByKey, SecondOfTwoLeavesOne) {
    fill({&a, &b});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &b), 0);
    expectList({&a});
    EXPECT_EQ(AddEntryAtListTail(&list, &c), 0);
    expectList({&a, &c});
}

TEST_F(ListRemoveByKey, OnlyOneLeavesTheTailAsItWas) {
    fill({&a});
    const auto tail = reinterpret_cast<uintptr_t>(list.Tail);
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &a), 0);
    EXPECT_EQ(list.Head, nullptr);
    EXPECT_EQ(list.Size, 0u);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(list.Tail), tail);
}

TEST_F(ListRemoveByKey, RemovesTheFirstOfEqualItemsOnly) {
    fill({&a, &b, &a, &b});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &b), 0);
    expectList({&a, &a, &b});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &a), 0);
    expectList({&a, &b});
}

TEST_F(ListRemoveByKey, ComparesPointersNotContents) {
    fill({&a});
    ASSERT_EQ(a, b);
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &b), -3);
    expectList({&a});
}

TEST_F(ListRemoveByKey, MissingItemIsNotFound) {
    fill({&a, &b});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &c), -3);
    expectList({&a, &b});
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{removing(&list, &c)}));
}

TEST_F(ListRemoveByKey, NothingIsFoundInAnEmptyList) {
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &a), -3);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{removing(&list, &a)}));
}

TEST_F(ListRemoveByKey, NothingIsFoundInAnEmptiedList) {
    fill({&a});
    ASSERT_EQ(RemoveEntryFromListByKey(&list, &a), 0);
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &a), -3);
    EXPECT_EQ(list.Size, 0u);
}

TEST_F(ListRemoveByKey, NullArgumentsAreRefused) {
    fill({&a});
    EXPECT_EQ(RemoveEntryFromListByKey(nullptr, &a), -1);
    EXPECT_EQ(RemoveEntryFromListByKey(&list, nullptr), -1);
    EXPECT_EQ(RemoveEntryFromListByKey(nullptr, nullptr), -1);
    expectList({&a});
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{removing(nullptr, &a), removing(&list, nullptr),
                                    removing(nullptr, nullptr)}));
}

TEST_F(ListRemoveByKey, NullKeyIsRefusedInAnEmptyListToo) {
    EXPECT_EQ(RemoveEntryFromListByKey(&list, nullptr), -1);
}

// Unlike the pop, it names the list first and the item second.
TEST_F(ListRemoveByKey, LogsTheListBeforeTheKey) {
    fill({&a, &b});
    RemoveEntryFromListByKey(&list, &a);
    RemoveEntryFromListByKey(&list, &b);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{removing(&list, &a), removed(&a, 1),
                                                             removing(&list, &b), removed(&b, 0)}));
}

TEST_F(ListRemoveByKey, ItemIsNotReleased) {
    char* item = ownedCopy("kept");
    fill({&a, item});
    EXPECT_EQ(RemoveEntryFromListByKey(&list, item), 0);
    EXPECT_STREQ(item, "kept");
    free(item);
}

TEST_F(ListRemove, NoRemovalNeedsMemory) {
    fill({&a, &b, &c});
    const auto fault = FailAllocation::from(1);
    void* item = nullptr;
    EXPECT_EQ(RemoveEntryFromList(&list, &item), 0);
    EXPECT_EQ(RemoveEntryFromListByKey(&list, &c), 0);
    expectList({&b});
    EXPECT_EQ(fault.calls(), 0u);
}

TEST_F(ListTest, IsEmptyByItsSizeNotByItsHead) {
    List_Entry_t entry = {nullptr, &a};
    List_t headless = {}, sizeless = {};
    headless.Size = 1;
    sizeless.Head = sizeless.Tail = &entry;
    EXPECT_EQ(IsListEmpty(&headless), 0);
    EXPECT_EQ(IsListEmpty(&sizeless), 1);
}

TEST_F(ListTest, IsEmptyWhenItsSizeIsZero) {
    EXPECT_EQ(IsListEmpty(&list), 1);
    fill({&a});
    EXPECT_EQ(IsListEmpty(&list), 0);
    fill({&b});
    EXPECT_EQ(IsListEmpty(&list), 0);
    RemoveEntryFromListByKey(&list, &b);
    RemoveEntryFromListByKey(&list, &a);
    EXPECT_EQ(IsListEmpty(&list), 1);
}

}  // namespace
}  // namespace plexortest
