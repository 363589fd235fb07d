// Pools that cannot be cached, or not wholly.
#include "pools_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

const LogLine kEnter = debugLine("BuildSinglePoolInfo, enter...\n");

LogLine exiting(int rc) {
    return debugLine(formatted("BuildSinglePoolInfo, EXIT(%d).\n", rc));
}

class PoolsFailures : public EnclosureTest {
protected:
    void SetUp() override {
        EnclosureTest::SetUp();
        path = vendor_.pool(vendor, "P1");
    }
    /// No record, no clone but the controller's, no time stamp.
    void expectNothingLeft() {
        EXPECT_THAT(pools(), IsEmpty());
        EXPECT_EQ(books().liveClones(), 1u);
        EXPECT_EQ(ctrl->PoolUpdateTime, 0);
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
    }
    LogLine rejected() const {
        return errorLine("NULL InstanceID or PoolID for pool " + path.text() + "\n");
    }

    Path path;
};

TEST_F(PoolsFailures, MandatoryTextIsMissing) {
    for (const char* property : {"InstanceID", "PoolID"}) {
        vendor_.pool(vendor, "P1");
        unset(path, property);
        startOver();
        EXPECT_EQ(buildPool(path), -1) << property;
        EXPECT_THAT(inventoryLog(), ElementsAre(kEnter, rejected(), exiting(-1)));
        expectNothingLeft();
    }
}

TEST_F(PoolsFailures, MandatoryTextIsNoText) {
    for (const char* property : {"InstanceID", "PoolID"}) {
        vendor_.pool(vendor, "P1");
        for (const BadValue& bad : notTexts()) {
            set(path, property, bad.value);
            startOver();
            EXPECT_EQ(buildPool(path), -1) << property << " " << bad.name;
            EXPECT_TRUE(logged(LOG_ERR, rejected().text));
            expectNothingLeft();
        }
    }
}

TEST_F(PoolsFailures, RejectedWithoutPath) {
    unset(path, "PoolID");
    EXPECT_EQ(BuildSinglePoolInfo(&mi, ctx(), ctrl, instanceAt(path), nullptr), -1);
    EXPECT_TRUE(logged(LOG_ERR, "NULL InstanceID or PoolID for pool NULL\n"));
    expectNothingLeft();
}

TEST_F(PoolsFailures, WithoutPathItIsStillCached) {
    EXPECT_EQ(BuildSinglePoolInfo(&mi, ctx(), ctrl, instanceAt(path), nullptr), 0);
    ASSERT_EQ(pools().size(), 1u);
    EXPECT_EQ(pools()[0]->PoolOp, nullptr);
    EXPECT_EQ(CapturedSyslog::countContaining("\nPoolOp: NULL\n\tInstanceID            - P1\n"),
              1u);
}

TEST_F(PoolsFailures, PathThatCannotBeCloned) {
    failOnly(answerNull(Entry::Clone));
    EXPECT_EQ(buildPool(path), 0);
    ASSERT_EQ(pools().size(), 1u);
    EXPECT_EQ(pools()[0]->PoolOp, nullptr);
    EXPECT_STREQ(pools()[0]->InstanceID, "P1");
}

struct Shortage {
    std::size_t allocation;
    int result;
    std::vector<LogLine> lines;
};

TEST_F(PoolsFailures, EveryAllocationInTurn) {
    const std::string copyFailed = "strdup() failed to duplicate string ";
    const Shortage shortages[] = {
        {1, -2, {errorLine("BuildSinglePoolInfo, failed to allocate memory for StoragePool_t\n")}},
        {2, -1, {warningLine(copyFailed + "P1\n"), rejected()}},
        {3, -1, {warningLine(copyFailed + "Pool P1\n"), rejected()}},
        {4, -2, {errorLine("BuildSinglePoolInfo: failed to add pool to list, rc -2.\n")}},
    };
    for (const Shortage& shortage : shortages) {
        SCOPED_TRACE(shortage.allocation);
        startOver();
        const auto fault = FailAllocation::nth(shortage.allocation);
        EXPECT_EQ(buildPool(path), shortage.result);
        EXPECT_EQ(fault.failures(), 1u);
        std::vector<LogLine> lines = {kEnter};
        lines.insert(lines.end(), shortage.lines.begin(), shortage.lines.end());
        lines.push_back(exiting(shortage.result));
        EXPECT_TRUE(loggedInOrder(lines));
        expectNothingLeft();
    }
    const auto fault = FailAllocation::nth(5);
    EXPECT_EQ(buildPool(path), 0);
    EXPECT_EQ(fault.calls(), 4u);
}

TEST_F(PoolsFailures, NoMemoryAtAll) {
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(buildPool(path), -2);
    EXPECT_EQ(BuildPoolInfo(&mi, ctx(), ctrl), -2);
    EXPECT_EQ(fault.calls(), 2u);
    expectNothingLeft();
}

TEST_F(PoolsFailures, OtherPropertiesMayBeMissing) {
    for (const char* property :
         {"TotalManagedSpace", "RemainingManagedSpace", "Primordial", "OperationalStatus"}) {
        unset(path, property);
    }
    EXPECT_EQ(buildPool(path), 0);
    ASSERT_EQ(pools().size(), 1u);
    EXPECT_EQ(pools()[0]->TotalManagedSpace, 0u);
    EXPECT_EQ(pools()[0]->RemainingManagedSpace, 0u);
    EXPECT_EQ(pools()[0]->Primordial, 0);
    EXPECT_EQ(pools()[0]->OperationalStatus, 0);
}

TEST_F(PoolsFailures, OtherPropertiesMayHoldAnything) {
    for (const BadValue& bad : notNumbers()) {
        for (const char* property : {"TotalManagedSpace", "RemainingManagedSpace", "Primordial"}) {
            set(path, property, bad.value);
        }
        EXPECT_EQ(buildPool(path), 0) << bad.name;
        ASSERT_EQ(pools().size(), 1u);
        EXPECT_EQ(pools()[0]->TotalManagedSpace, 0u) << bad.name;
        EXPECT_EQ(pools()[0]->RemainingManagedSpace, 0u) << bad.name;
        EXPECT_EQ(pools()[0]->Primordial, 0) << bad.name;
        EXPECT_EQ(pools()[0]->OperationalStatus, 2) << bad.name;
        forgetAll();
    }
    for (const BadValue& bad : notNumberArrays()) {
        set(path, "OperationalStatus", bad.value);
        EXPECT_EQ(buildPool(path), 0) << bad.name;
        ASSERT_EQ(pools().size(), 1u);
        EXPECT_EQ(pools()[0]->OperationalStatus, 0) << bad.name;
        forgetAll();
    }
}

TEST_F(PoolsFailures, NarrowNumbersAreNumbers) {
    set(path, "TotalManagedSpace", CimValue::uint32(4'000'000'000u));
    set(path, "RemainingManagedSpace", CimValue::uint16(65'535));
    EXPECT_EQ(buildPool(path), 0);
    EXPECT_EQ(pools()[0]->TotalManagedSpace, 4'000'000'000u);
    EXPECT_EQ(pools()[0]->RemainingManagedSpace, 65'535u);
}

TEST_F(PoolsFailures, VeryLongAndEmptyTexts) {
    const std::string text(65536, 'p');
    set(path, "PoolID", CimValue::string(text));
    set(path, "InstanceID", CimValue::string(""));
    EXPECT_EQ(buildPool(path), 0);
    ASSERT_EQ(pools().size(), 1u);
    EXPECT_EQ(pools()[0]->PoolID, text);
    EXPECT_STREQ(pools()[0]->InstanceID, "");
}

}  // namespace
}  // namespace plexortest
