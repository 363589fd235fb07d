// Draining a list.
#include "list_fixture.h"
#include "watched_calls.h"

namespace plexortest {
namespace {

class ListFree : public ListTest {
protected:
    void SetUp() override {
        ListTest::SetUp();
        running = this;
    }
    static void release(void* item) { running->released.push_back(item); }
    static void releaseUnlinked(void* item) {
        EXPECT_EQ(running->list.Size, 0u);
        EXPECT_EQ(running->list.Head, nullptr);
        release(item);
    }

    static const void* address(ReleaseFunc_t function) {
        return reinterpret_cast<const void*>(function);
    }
    LogLine freeing(const List_t* freed, ReleaseFunc_t function) const {
        return {LOG_DEBUG, formatted("Freeing list %p, release function %p\n",
                                     static_cast<const void*>(freed), address(function))};
    }
    LogLine removed(const void* data, int size) const {
        return {LOG_DEBUG, formatted("Data %p removed from list %p, size %d\n", data,
                                     static_cast<const void*>(&list), size)};
    }
    LogLine nodeFreed(const void* item) const {
        return {LOG_DEBUG, formatted("FreeList: node %p freed from list\n", item)};
    }

    Items released;
    static inline ListFree* running = nullptr;  // the test whose release function is called
};

TEST_F(ListFree, HandsEveryItemToTheReleaseFunctionInOrder) {
    fill({&a, &b, &c});
    FreeList(&list, release);
    EXPECT_EQ(released, (Items{&a, &b, &c}));
}

TEST_F(ListFree, LeavesAnEmptyListThatCanBeUsedAgain) {
    fill({&a, &b});
    FreeList(&list, release);
    EXPECT_EQ(list.Head, nullptr);
    EXPECT_EQ(list.Tail, nullptr);
    EXPECT_EQ(list.Size, 0u);
    EXPECT_EQ(AddEntryAtListTail(&list, &c), 0);
    expectList({&c});
}

// The items here are no heap blocks: freeing one would end the test.
TEST_F(ListFree, WithAReleaseFunctionNoItemIsFreed) {
    fill({&a, &b});
    FreeList(&list, release);
    EXPECT_EQ(CapturedSyslog::countContaining("freed from list"), 0u);
    EXPECT_TRUE(loggedInOrder({freeing(&list, release), removed(&a, 1), removed(&b, 0)}));
}

TEST_F(ListFree, ItemIsUnlinkedBeforeItIsReleased) {
    fill({&a});
    FreeList(&list, releaseUnlinked);
    EXPECT_EQ(released, Items{&a});
}

TEST_F(ListFree, WithoutAReleaseFunctionItemsAreFreed) {
    char* first = ownedCopy("first");
    char* second = ownedCopy("second");
    fill({first, second});
    const void* firstAddress = first;
    const void* secondAddress = second;
    FreeList(&list, nullptr);
    expectList({});
    EXPECT_TRUE(
        loggedInOrder({freeing(&list, nullptr), removed(firstAddress, 1), nodeFreed(firstAddress),
                       removed(secondAddress, 0), nodeFreed(secondAddress)}));
    EXPECT_EQ(CapturedSyslog::countContaining("freed from list"), 2u);
}

TEST_F(ListFree, SaysThatANodeIsFreedBeforeItIs) {
    char* const item = ownedCopy("item");
    fill({item});
    bool said = false;
    const FreeWatch watch([&](const void* block) {
        if (block == item) said = logged(LOG_DEBUG, nodeFreed(item).text);
    });
    FreeList(&list, nullptr);
    EXPECT_TRUE(said);
}

TEST_F(ListFree, FreeMayBeGivenAsReleaseFunction) {
    fill({ownedCopy("first")});
    FreeList(&list, free);
    expectList({});
    EXPECT_TRUE(logged(LOG_DEBUG, freeing(&list, free).text));
    EXPECT_EQ(CapturedSyslog::countContaining("freed from list"), 0u);
}

TEST_F(ListFree, NullListIsOnlyLogged) {
    FreeList(nullptr, release);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{freeing(nullptr, release)}));
}

TEST_F(ListFree, EmptyListIsOnlyLogged) {
    FreeList(&list, release);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  freeing(&list, release),
                  {LOG_DEBUG, formatted("List %p is empty\n", static_cast<void*>(&list))}}));
    EXPECT_EQ(released, Items{});
}

TEST_F(ListFree, EmptiedListWithAStaleTailIsEmpty) {
    fill({&a});
    ASSERT_EQ(RemoveEntryFromListByKey(&list, &a), 0);
    FreeList(&list, release);
    EXPECT_EQ(released, Items{});
    EXPECT_TRUE(logged(LOG_DEBUG, formatted("List %p is empty\n", static_cast<void*>(&list))));
}

TEST_F(ListFree, NeedsNoMemory) {
    fill({&a, &b});
    const auto fault = FailAllocation::from(1);
    FreeList(&list, release);
    EXPECT_EQ(released, (Items{&a, &b}));
    EXPECT_EQ(fault.calls(), 0u);
}

}  // namespace
}  // namespace plexortest
