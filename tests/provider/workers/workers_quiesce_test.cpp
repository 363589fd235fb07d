// The quiet stop: work in progress ends, none begins, and both within limits.
#include <future>

#include "real_waits.h"
#include "workers_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testbed::FaultRule;

class WorkersQuiesce : public WorkersCardTest {
protected:
    void SetUp() override {
        WorkersCardTest::SetUp();
        startWorkers();
    }
    /// A quiet stop that has begun before the gate opens; whether it ends well.
    static bool quietOnceOpened(Gate& gate) {
        auto quiet = std::async(std::launch::async, quiesceWorkers);
        EXPECT_TRUE(eventually(StopRequested));
        gate.open();
        return quiet.get();
    }
};

TEST_F(WorkersQuiesce, IdleWorkersNeedNoWaiting) {
    const HurriedWaits hurry;
    EXPECT_FALSE(StopRequested());
    EXPECT_TRUE(quiesceWorkers());
    EXPECT_TRUE(StopRequested());
    EXPECT_TRUE(HurriedWaits::otherWaits().empty());
    EXPECT_EQ(exitLines(), 0u) << "they stay, to be stopped later";
}

TEST_F(WorkersQuiesce, ItWaitsForEveryRunningItem) {
    Gate first, second;
    const GateOpener firstOpener(first), secondOpener(second);
    occupyWorkers(1, first);
    occupyWorkers(1, second);

    auto quiet = std::async(std::launch::async, quiesceWorkers);
    ASSERT_TRUE(eventually(StopRequested));
    EXPECT_EQ(quiet.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    first.open();
    ASSERT_TRUE(eventually([this] { return tasks_.ended() == 1; }));
    EXPECT_EQ(quiet.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    second.open();
    EXPECT_TRUE(quiet.get());
    EXPECT_EQ(tasks_.ended(), 2);
}

TEST_F(WorkersQuiesce, AHurryThatComesBetweenALookAndTheWaitIsNotLost) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(1, gate);
    static std::future<void> hurrying;
    hurrying = {};
    EXPECT_FALSE(QuiesceWorkers([] {
        if (hurrying.valid()) return Deadline::Now();
        const Deadline late = Deadline::In(3600);
        hurrying = std::async(std::launch::async, WakeQuiesce);
        hurrying.wait_for(std::chrono::milliseconds(50));
        return late;
    }));
    hurrying.get();
    gate.open();
    EXPECT_TRUE(eventually([this] { return tasks_.ended() == 1; }));
}

TEST_F(WorkersQuiesce, AnItemRunsUntilItsThreadIsFlushed) {
    if (!kContextHasFlush) GTEST_SKIP() << "no context entry to hold up";
    Gate gate;
    const GateOpener opener(gate);
    faults().add(watch(Entry::ContextFlush, [&] { gate.pass(); }));
    tasks_.queue([](CMPIContext*, void*) {});
    ASSERT_TRUE(gate.awaitArrivals(1));

    auto quiet = std::async(std::launch::async, quiesceWorkers);
    ASSERT_TRUE(eventually(StopRequested));
    EXPECT_EQ(quiet.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    gate.open();
    EXPECT_TRUE(quiet.get());
}

TEST_F(WorkersQuiesce, NoItemBeginsInThisLifeNorByItsWorkersInTheNext) {
    const HurriedWaits hurry(HurriedWaits::Conditions);
    ASSERT_TRUE(quiesceWorkers());
    tasks_.queue([](CMPIContext*, void*) {});
    pthread_cond_broadcast(&PlexorThreadCond);
    const std::size_t looks = HurriedWaits::workWaits().size();
    ASSERT_TRUE(eventually([&] { return HurriedWaits::workWaits().size() >= looks + 10; }));
    const std::size_t idle = idleLines();
    ASSERT_TRUE(eventually([&] { return HurriedWaits::workWaits().size() >= looks + 30; }));
    EXPECT_EQ(idleLines(), idle) << "not even a worker that looks into the queue by itself";
    EXPECT_EQ(tasks_.ended(), 0);
    EXPECT_EQ(queuedItems(), 1u);

    BeginWork();
    EXPECT_FALSE(StopRequested());
    EXPECT_TRUE(eventually([] { return exitLines() == 2; })) << "their life is over";
    EXPECT_EQ(queuedItems(), 1u);
    running_ = false;
    CleanupPlexorThreads();
}

TEST_F(WorkersQuiesce, WhatIsQueuedBehindARunningItemDoesNotBegin) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(2, gate);
    for (int i = 0; i < 5; i++) tasks_.queue([](CMPIContext*, void*) {});

    ASSERT_TRUE(quietOnceOpened(gate));
    EXPECT_EQ(tasks_.ended(), 2);
    EXPECT_EQ(queuedItems(), 5u);
    running_ = false;
    CleanupPlexorThreads();
}

TEST_F(WorkersQuiesce, AStuckItemIsWaitedForThirtySecondsInAll) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(1, gate);
    const HurriedWaits hurry;

    EXPECT_FALSE(quiesceWorkers());

    const auto waits = HurriedWaits::otherWaits();
    ASSERT_FALSE(waits.empty());
    EXPECT_LE(waits[0], std::chrono::seconds(30));
    EXPECT_GE(waits[0], std::chrono::seconds(29));
    gate.open();
    EXPECT_TRUE(eventually([this] { return tasks_.ended() == 1; }));
    EXPECT_TRUE(quiesceWorkers()) << "asked again when it has ended";
}

TEST_F(WorkersQuiesce, ARefreshUnderWayAsksNothingMoreAndTouchesNoRecord) {
    vendor.port(card, "P0");
    vendor.battery(card, "B0");
    ASSERT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    ASSERT_EQ(ctrl->PortList->Size, 1u);
    repository.clearInstances();
    vendor.controller("C0");
    books().clearCalls();
    ASSERT_TRUE(quiesceWorkers());

    ctrl->PortUpdateTime = 0;
    EXPECT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    EXPECT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl, 101), 0);

    EXPECT_TRUE(books().queries().empty());
    EXPECT_EQ(ctrl->PortList->Size, 1u);
}

TEST_F(WorkersQuiesce, AWalkThatAnswersDuringTheStopChangesNothing) {
    const testbed::ObjectPath gone = vendor.port(card, "P0");
    ASSERT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    ASSERT_EQ(ctrl->PortList->Size, 1u);
    repository.remove(gone);
    for (const char* id : {"P1", "P2"}) vendor.port(card, id);
    VirtualClock::advance(100);
    books().clearCalls();
    setThreadActivityDone(1);
    Gate gate;
    const GateOpener opener(gate);
    holdRefreshOfPorts(gate);

    ASSERT_TRUE(quietOnceOpened(gate));

    EXPECT_EQ(associatorQueries(), std::vector<std::string>{"CIM_SystemDevice>CIM_SASSATAPort"});
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, "CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n"));
    ASSERT_EQ(ctrl->PortList->Size, 1u);
    EXPECT_STREQ(static_cast<SASSATAPort_t*>(ctrl->PortList->Head->Data)->DeviceID, "P0");
}

TEST_F(WorkersQuiesce, AnInventoryUnderWayIsGivenUp) {
    // More ports than fit into the queue, and a worker that does not get on with the first.
    for (int i = 0; i < 60; i++) vendor.port(card, "P" + std::to_string(i));
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(1, gate);
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    ASSERT_TRUE(eventually([] {
        return timesLogged(LOG_ERR, "BuildLogicalDeviceInfo: FIFO full, waiting...\n") > 2;
    }));

    ASSERT_TRUE(quietOnceOpened(gate));
    EXPECT_EQ(activeThreads(), 0u);
    EXPECT_EQ(ctrl->PortList->Size, 0u);
    EXPECT_EQ(queuedItems(), 20u);

    running_ = false;
    CleanupPlexorThreads();
    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_EQ(books().liveClones(), 1u) << "the controller's path";
}

TEST_F(WorkersQuiesce, ALimitThatIsBroughtForwardDuringTheWaitHoldsFromThen) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(1, gate);
    static int asked;
    asked = 0;
    const auto shrinking = [] {
        asked++;
        return Deadline::In(asked == 1 ? 30 : 3);
    };
    const HurriedWaits hurry(HurriedWaits::Conditions);
    EXPECT_FALSE(QuiesceWorkers(shrinking));
    const auto waits = HurriedWaits::otherWaits();
    ASSERT_EQ(waits.size(), 2u);
    EXPECT_GT(waits[0], std::chrono::seconds(29));
    EXPECT_LE(waits[1], std::chrono::seconds(3));
    gate.open();
    EXPECT_TRUE(eventually([this] { return tasks_.ended() == 1; }));
}

TEST_F(WorkersQuiesce, AnItemOfAnEarlierLifeIsNotWaitedFor) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(1, gate);
    BeginWork();
    const HurriedWaits hurry(HurriedWaits::Conditions);
    EXPECT_TRUE(quiesceWorkers());
    EXPECT_TRUE(HurriedWaits::otherWaits().empty());
    EXPECT_EQ(tasks_.ended(), 0);
    gate.open();
    EXPECT_TRUE(eventually([this] { return tasks_.ended() == 1; }));
}

}  // namespace
}  // namespace plexortest
