// The quiet stop: work in progress ends, none begins, and both within limits.
#include <future>

#include "real_waits.h"
#include "workers_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testbed::FaultRule;

class WorkersQuiesce : public WorkersTest {
protected:
    void SetUp() override {
        WorkersTest::SetUp();
        array_ = vendor_.controller("C0");
        ctrl_ = attach(newController("C0"));
        ctrl_->ControllerOp = clonedPath(array_.system);
        startWorkers();
    }
    /// Makes a worker run an item that ends when the gate opens.
    void occupyWorker(Gate& gate) {
        ASSERT_EQ(tasks_.queue([&](CMPIContext*, void*) { gate.pass(); }), 0);
    }
    VendorObjects vendor_{repository};
    VendorController array_;
    RaidController_t* ctrl_ = nullptr;
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
    occupyWorker(first);
    ASSERT_TRUE(first.awaitArrivals(1));
    occupyWorker(second);
    ASSERT_TRUE(second.awaitArrivals(1));

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

TEST_F(WorkersQuiesce, AnItemRunsUntilItsThreadIsFlushed) {
    if (!kContextHasFlush) GTEST_SKIP() << "no context entry to hold up";
    Gate gate;
    const GateOpener opener(gate);
    FaultRule slowFlush;
    slowFlush.entry = Entry::ContextFlush;
    slowFlush.hook = [&] { gate.pass(); };
    faults().add(slowFlush);
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
    EXPECT_TRUE(eventually([this] { return exitLines() == 2; })) << "their life is over";
    EXPECT_EQ(queuedItems(), 1u);
    running_ = false;
    CleanupPlexorThreads();
}

TEST_F(WorkersQuiesce, WhatIsQueuedBehindARunningItemDoesNotBegin) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorker(gate);
    occupyWorker(gate);
    ASSERT_TRUE(gate.awaitArrivals(2));
    for (int i = 0; i < 5; i++) tasks_.queue([](CMPIContext*, void*) {});

    auto quiet = std::async(std::launch::async, quiesceWorkers);
    ASSERT_TRUE(eventually(StopRequested));
    gate.open();
    ASSERT_TRUE(quiet.get());
    EXPECT_EQ(tasks_.ended(), 2);
    EXPECT_EQ(queuedItems(), 5u);
    running_ = false;
    CleanupPlexorThreads();
}

TEST_F(WorkersQuiesce, AStuckItemIsWaitedForThirtySecondsInAll) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorker(gate);
    ASSERT_TRUE(gate.awaitArrivals(1));
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
    vendor_.port(array_, "P0");
    vendor_.battery(array_, "B0");
    ASSERT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl_, 102), 0);
    ASSERT_EQ(ctrl_->PortList->Size, 1u);
    repository.clearInstances();
    vendor_.controller("C0");
    books().clearCalls();
    ASSERT_TRUE(quiesceWorkers());

    ctrl_->PortUpdateTime = 0;
    EXPECT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl_, 102), 0);
    EXPECT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl_, 101), 0);

    EXPECT_TRUE(books().queries().empty());
    EXPECT_EQ(ctrl_->PortList->Size, 1u);
}

TEST_F(WorkersQuiesce, AWalkThatAnswersDuringTheStopChangesNothing) {
    const testbed::ObjectPath gone = vendor_.port(array_, "P0");
    ASSERT_EQ(ProcessDeviceConfigChange(&mi, ctx(), ctrl_, 102), 0);
    ASSERT_EQ(ctrl_->PortList->Size, 1u);
    repository.remove(gone);
    for (const char* id : {"P1", "P2"}) vendor_.port(array_, id);
    VirtualClock::advance(100);
    books().clearCalls();
    setThreadActivityDone(1);
    Gate gate;
    const GateOpener opener(gate);
    FaultRule slow;
    slow.entry = Entry::Associators;
    slow.hook = [&] { gate.pass(); };
    faults().add(slow);
    ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl_, 102), 0);
    ASSERT_TRUE(gate.awaitArrivals(1));

    auto quiet = std::async(std::launch::async, quiesceWorkers);
    ASSERT_TRUE(eventually(StopRequested));
    gate.open();
    ASSERT_TRUE(quiet.get());

    EXPECT_EQ(associatorQueries(), std::vector<std::string>{"CIM_SystemDevice>CIM_SASSATAPort"});
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, "CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n"));
    ASSERT_EQ(ctrl_->PortList->Size, 1u);
    EXPECT_STREQ(static_cast<SASSATAPort_t*>(ctrl_->PortList->Head->Data)->DeviceID, "P0");
}

TEST_F(WorkersQuiesce, AnInventoryUnderWayIsGivenUp) {
    // More ports than fit into the queue, and a worker that does not get on with the first.
    for (int i = 0; i < 60; i++) vendor_.port(array_, "P" + std::to_string(i));
    Gate gate;
    const GateOpener opener(gate);
    occupyWorker(gate);
    ASSERT_TRUE(gate.awaitArrivals(1));
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    ASSERT_TRUE(eventually([] {
        return timesLogged(LOG_ERR, "BuildLogicalDeviceInfo: FIFO full, waiting...\n") > 2;
    }));

    auto quiet = std::async(std::launch::async, quiesceWorkers);
    ASSERT_TRUE(eventually(StopRequested));
    gate.open();
    ASSERT_TRUE(quiet.get());
    EXPECT_EQ(activeThreads(), 0u);
    EXPECT_EQ(ctrl_->PortList->Size, 0u);
    EXPECT_EQ(queuedItems(), 20u);

    running_ = false;
    CleanupPlexorThreads();
    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_EQ(books().liveClones(), 1u) << "the controller's path";
}

}  // namespace
}  // namespace plexortest
