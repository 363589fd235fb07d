// Adding to a list, at either end.
#include "list_fixture.h"

namespace plexortest {
namespace {

struct AddFunction {
    const char* name;
    int (*add)(List_t* list, void* data);
    const char* where;  // how the log calls that end
    bool inFront;
};

void PrintTo(const AddFunction& function, std::ostream* out) {
    *out << function.name;
}

class ListAdd : public ListTest, public ::testing::WithParamInterface<AddFunction> {
protected:
    int add(void* data) { return GetParam().add(&list, data); }

    LogLine adding(const void* data, const void* to) const {
        return {LOG_DEBUG,
                formatted("Adding data %p to the list %p at the %s\n", data, to, GetParam().where)};
    }
    LogLine added(const void* data, int size) const {
        return {LOG_DEBUG, formatted("Data %p added to the list %p, size %d\n", data,
                                     static_cast<const void*>(&list), size)};
    }
};

INSTANTIATE_TEST_SUITE_P(BothEnds, ListAdd,
                         ::testing::Values(AddFunction{"Head", AddEntryAtListHead, "head", true},
                                           AddFunction{"Tail", AddEntryAtListTail, "tail", false}),
                         [](const auto& instance) { return std::string(instance.param.name); });

TEST_P(ListAdd, FirstItemIsHeadAndTail) {
    EXPECT_EQ(add(&a), 0);
    expectList({&a});
    ASSERT_NE(list.Head, nullptr);
    EXPECT_EQ(list.Head, list.Tail);
    EXPECT_EQ(list.Head->Next, nullptr);
}

TEST_P(ListAdd, FurtherItemsStandInOrder) {
    EXPECT_EQ(add(&a), 0);
    EXPECT_EQ(add(&b), 0);
    EXPECT_EQ(add(&c), 0);
    expectList(GetParam().inFront ? Items{&c, &b, &a} : Items{&a, &b, &c});
}

TEST_P(ListAdd, OneItemMayBeAddedTwice) {
    EXPECT_EQ(add(&a), 0);
    EXPECT_EQ(add(&a), 0);
    expectList({&a, &a});
}

TEST_P(ListAdd, LogsBeforeAndAfter) {
    add(&a);
    add(&b);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{adding(&a, &list), added(&a, 1),
                                                             adding(&b, &list), added(&b, 2)}));
}

TEST_P(ListAdd, NullItemChangesNothing) {
    fill({&a});
    EXPECT_EQ(add(nullptr), 0);
    expectList({&a});
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{adding(nullptr, &list)}));
}

TEST_P(ListAdd, NullItemAllocatesNothing) {
    const auto fault = FailAllocation::none();
    EXPECT_EQ(add(nullptr), 0);
    EXPECT_EQ(fault.calls(), 0u);
}

TEST_P(ListAdd, NullListIsRefused) {
    EXPECT_EQ(GetParam().add(nullptr, &a), -1);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{adding(&a, nullptr)}));
}

TEST_P(ListAdd, NullItemGoesBeforeNullList) {
    EXPECT_EQ(GetParam().add(nullptr, nullptr), 0);
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{adding(nullptr, nullptr)}));
}

TEST_P(ListAdd, FailedAllocationLeavesTheListAlone) {
    fill({&a, &b});
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(add(&c), -2);
    EXPECT_EQ(fault.failures(), 1u);
    expectList({&a, &b});
    EXPECT_EQ(CapturedSyslog::lines(), (std::vector<LogLine>{adding(&c, &list)}));
}

TEST_P(ListAdd, FailedAllocationLeavesAnEmptyListEmpty) {
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(add(&a), -2);
    expectList({});
}

TEST_P(ListAdd, OneEntryIsAllocatedForEachItem) {
    const auto fault = FailAllocation::none();
    add(&a);
    add(&b);
    EXPECT_EQ(fault.calls(), 2u);
}

// Removing the only entry by key leaves Tail on the freed entry.
TEST_P(ListAdd, TailOfAnEmptiedListIsNotTouched) {
    fill({&a});
    ASSERT_EQ(RemoveEntryFromListByKey(&list, &a), 0);
    EXPECT_EQ(add(&b), 0);
    expectList({&b});
    EXPECT_EQ(add(&c), 0);
    expectList(GetParam().inFront ? Items{&c, &b} : Items{&b, &c});
}

TEST_P(ListAdd, ListWithoutHeadIsEmptyWhateverItsTailSays) {
    List_Entry_t elsewhere = {nullptr, &a};
    list.Tail = &elsewhere;
    EXPECT_EQ(add(&b), 0);
    expectList({&b});
    EXPECT_EQ(elsewhere.Next, nullptr);
}

TEST_P(ListAdd, AListThatSomebodyMadeWithoutATailGetsOne) {
    List_Entry_t made = {nullptr, &a};
    list = {};
    list.Head = &made;
    list.Size = 1;
    EXPECT_EQ(add(&b), 0);
    ASSERT_NE(list.Tail, nullptr);
    EXPECT_EQ(list.Tail->Data, &b);
    EXPECT_EQ(list.Head, list.Tail);
    EXPECT_EQ(list.Head->Next, GetParam().inFront ? &made : nullptr);
    EXPECT_EQ(list.Size, 2u);
    free(list.Head);
    list = {};
}

TEST_F(ListTest, BothEndsMayBeMixed) {
    AddEntryAtListTail(&list, &b);
    AddEntryAtListHead(&list, &a);
    AddEntryAtListTail(&list, &c);
    expectList({&a, &b, &c});
}

}  // namespace
}  // namespace plexortest
