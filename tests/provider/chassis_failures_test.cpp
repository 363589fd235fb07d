// Enclosures that cannot be cached, or not wholly.
#include "pools_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

const LogLine kEnter = debugLine("BuildSingleChassisInfo, enter...\n");

LogLine exiting(int rc) {
    return debugLine(formatted("BuildSingleChassisInfo, EXIT(%d).\n", rc));
}

class ChassisFailures : public EnclosureTest {
protected:
    void SetUp() override {
        EnclosureTest::SetUp();
        path = vendor_.chassis(vendor, "C0_E");
    }
    void expectNothingLeft() {
        EXPECT_THAT(chassis(), IsEmpty());
        EXPECT_EQ(books().liveClones(), 1u);
        EXPECT_EQ(ctrl->ChassisUpdateTime, 0);
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
    }
    LogLine rejected() const { return errorLine("NULL tag for chassis " + path.text() + "\n"); }

    Path path;
};

TEST_F(ChassisFailures, TagIsMissing) {
    unset(path, "Tag");
    EXPECT_EQ(buildChassis(path), -1);
    EXPECT_THAT(inventoryLog(), ElementsAre(kEnter, rejected(), exiting(-1)));
    expectNothingLeft();
}

TEST_F(ChassisFailures, TagIsNoText) {
    for (const BadValue& bad : notTexts()) {
        set(path, "Tag", bad.value);
        startOver();
        EXPECT_EQ(buildChassis(path), -1) << bad.name;
        EXPECT_TRUE(logged(LOG_ERR, rejected().text));
        expectNothingLeft();
    }
}

TEST_F(ChassisFailures, RejectedWithoutPath) {
    unset(path, "Tag");
    EXPECT_EQ(BuildSingleChassisInfo(&mi, ctx(), ctrl, instanceAt(path), nullptr), -1);
    EXPECT_TRUE(logged(LOG_ERR, "NULL tag for chassis NULL\n"));
    expectNothingLeft();
}

TEST_F(ChassisFailures, WithoutPathItIsStillCached) {
    EXPECT_EQ(BuildSingleChassisInfo(&mi, ctx(), ctrl, instanceAt(path), nullptr), 0);
    ASSERT_EQ(chassis().size(), 1u);
    EXPECT_EQ(chassis()[0]->ChassisOp, nullptr);
    EXPECT_EQ(CapturedSyslog::countContaining("\nChassisOp: NULL\n\tTag               - C0_E\n"),
              1u);
}

TEST_F(ChassisFailures, PathThatCannotBeCloned) {
    failOnly(answerNull(Entry::Clone));
    EXPECT_EQ(buildChassis(path), 0);
    ASSERT_EQ(chassis().size(), 1u);
    EXPECT_EQ(chassis()[0]->ChassisOp, nullptr);
    EXPECT_STREQ(chassis()[0]->InternalTag, "E");
}

struct Shortage {
    std::size_t allocation;
    int result;
    std::vector<LogLine> lines;
};

TEST_F(ChassisFailures, EveryAllocationInTurn) {
    const std::string copyFailed = "strdup() failed to duplicate string ";
    const Shortage shortages[] = {
        {1, -2, {errorLine("BuildSingleChassisInfo, failed to allocate memory for Chassis_t\n")}},
        {2, -1, {warningLine(copyFailed + "C0_E\n"), rejected()}},
        {4, -2, {errorLine("BuildSingleChassisInfo: failed to add chassis to list, rc -2.\n")}},
    };
    for (const Shortage& shortage : shortages) {
        SCOPED_TRACE(shortage.allocation);
        startOver();
        const auto fault = FailAllocation::nth(shortage.allocation);
        EXPECT_EQ(buildChassis(path), shortage.result);
        EXPECT_EQ(fault.failures(), 1u);
        std::vector<LogLine> lines = {kEnter};
        lines.insert(lines.end(), shortage.lines.begin(), shortage.lines.end());
        lines.push_back(exiting(shortage.result));
        EXPECT_TRUE(loggedInOrder(lines));
        expectNothingLeft();
    }
    const auto fault = FailAllocation::nth(5);
    EXPECT_EQ(buildChassis(path), 0);
    EXPECT_EQ(fault.calls(), 4u);
}

TEST_F(ChassisFailures, InternalTagThatCannotBeCopiedIsAbsent) {
    const auto fault = FailAllocation::strdupOf("E");
    EXPECT_EQ(buildChassis(path), 0);
    EXPECT_TRUE(logged(LOG_WARNING, "strdup() failed to duplicate string E\n"));
    ASSERT_EQ(chassis().size(), 1u);
    EXPECT_STREQ(chassis()[0]->Tag, "C0_E");
    EXPECT_EQ(chassis()[0]->InternalTag, nullptr);
}

TEST_F(ChassisFailures, StatusMayHoldAnything) {
    for (const BadValue& bad : notNumberArrays()) {
        set(path, "OperationalStatus", bad.value);
        EXPECT_EQ(buildChassis(path), 0) << bad.name;
        ASSERT_EQ(chassis().size(), 1u);
        EXPECT_EQ(chassis()[0]->OperationalStatus, 0) << bad.name;
        forgetAll();
    }
    unset(path, "OperationalStatus");
    EXPECT_EQ(buildChassis(path), 0);
    EXPECT_EQ(chassis()[0]->OperationalStatus, 0);
}

TEST_F(ChassisFailures, TextsThatAreFormatsOrVeryLong) {
    const std::string text = "C0_%s%n" + std::string(65536, 'x');
    set(path, "Tag", CimValue::string(text));
    EXPECT_EQ(buildChassis(path), 0);
    ASSERT_EQ(chassis().size(), 1u);
    EXPECT_EQ(chassis()[0]->Tag, text);
    EXPECT_EQ(chassis()[0]->InternalTag, text.substr(3));
}

}  // namespace
}  // namespace plexortest
