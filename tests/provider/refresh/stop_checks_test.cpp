// Where work that is under way looks for a stop: each look ends what it stands in front of. The
// stop is asked for in the middle of the work, by the same thread.
#include "reconcile_fixture.h"
#include "stop_at_line.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

using testbed::FaultRule;

class StopChecks : public ReconcileTest {
protected:
    void TearDown() override {
        BeginWork();
        ReconcileTest::TearDown();
    }
    /// A rule that asks for the stop while a walk is answered.
    FaultRule stopDuring(const std::string& resultClass) {
        FaultRule rule = walkOver(resultClass);
        rule.hook = [] { EXPECT_TRUE(quiesceWorkers()); };
        return rule;
    }
    static std::size_t linesWith(const char* part) { return CapturedSyslog::countContaining(part); }
    /// The initial inventory, on this thread.
    void buildInventory() {
        ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
        DoBuildDeviceInfoAsync(ctx(), GetItem(&__FIFO));
    }
};

TEST_F(StopChecks, TheUpdatesOfARefreshEndAtTheRunningOne) {
    for (const char* id : {"B0", "B1", "B2"}) addBattery(id);
    process(103);
    ASSERT_EQ(batteries().size(), 3u);
    setAllUpdateTimes(0);
    {
        const StopAtLine stop("Updating devices[", 2);
        process(103);
    }
    EXPECT_EQ(linesWith("Updating devices["), 2u);
    EXPECT_EQ(linesWith("CheckAndUpdateBatteryInfo: ENTER."), 2u) << "the running one ends";
}

TEST_F(StopChecks, TheDeletionsOfARefreshEndAtTheRunningOne) {
    for (const char* id : {"P0", "P1", "P2"}) addPort(id);
    process(102);
    clearVendor();
    setAllUpdateTimes(0);
    {
        const StopAtLine stop("Deleting devices[");
        process(102);
    }
    EXPECT_EQ(ports(), (Ids{"P1", "P2"}));
}

TEST_F(StopChecks, TheAdditionsOfARefreshEndAtTheRunningOne) {
    for (const char* id : {"P0", "P1", "P2"}) addPort(id);
    {
        const StopAtLine stop("Adding device ops[");
        process(102);
    }
    EXPECT_EQ(ports(), Ids{"P0"});
}

TEST_F(StopChecks, AWalkThatIsAnsweredDuringTheStopChangesNothing) {
    const Path gone = addPort("P0");
    addPort("P1");
    process(102);
    repository.remove(gone);
    addPort("P2");
    setAllUpdateTimes(0);
    clearLog();
    faults().add(stopDuring("CIM_SASSATAPort"));
    process(102);
    EXPECT_TRUE(StopRequested());
    EXPECT_EQ(ports(), (Ids{"P0", "P1"}));
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, "CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n"));
    EXPECT_EQ(linesWith(", removecount "), 0u);
    for (const char* step : {"Updating devices[", "Deleting devices[", "Adding device ops["}) {
        EXPECT_EQ(linesWith(step), 0u) << step;
    }
}

TEST_F(StopChecks, TheMatchingEndsAtTheRunningRecord) {
    for (int i = 0; i < 50; i++) addPort("P" + std::to_string(i));
    process(102);
    setAllUpdateTimes(0);
    clearLog();
    {
        const StopAtLine stop("dataArr[", 3);
        process(102);
    }
    EXPECT_EQ(linesWith("dataArr["), 50u + 3) << "added, and compared";
    EXPECT_EQ(ports().size(), 50u);
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, "CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n"));
}

TEST_F(StopChecks, TheWalkOverTheResultsEndsAtTheRunningOne) {
    for (int i = 0; i < 50; i++) addPort("P" + std::to_string(i));
    {
        const StopAtLine stop("OP ", 3);
        process(102);
    }
    EXPECT_EQ(linesWith("added to opArr["), 3u);
    EXPECT_EQ(ports(), Ids{});
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, "CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n"));
}

TEST_F(StopChecks, ThePoolWalkEndsAtTheRunningPool) {
    for (const char* id : {"L0", "L1", "L2"}) addPool(id);
    {
        const StopAtLine stop("BuildSinglePoolInfo: pool ");
        EXPECT_EQ(BuildPoolInfo(&mi, ctx(), ctrl), 0);
    }
    EXPECT_EQ(ctrl->PoolList->Size, 1u);
}

TEST_F(StopChecks, TheChainEndsAtTheRunningClass) {
    addOneOfEach();
    faults().add(stopDuring("CIM_StoragePool"));
    process(101);
    EXPECT_TRUE(StopRequested());
    EXPECT_EQ(linesWith(": Action 104, "), 1u);
    EXPECT_EQ(linesWith(": Action 100, "), 0u);
    EXPECT_EQ(linesWith(": Action 101, "), 0u);
    EXPECT_EQ(ctrl->PoolUpdateTime, kStart);
    EXPECT_EQ(ctrl->DiskUpdateTime, 0) << "not even as if it had been tried";
    EXPECT_EQ(ctrl->VolumeUpdateTime, 0);
}

TEST_F(StopChecks, TheDeviceWalkQueuesNothingMore) {
    for (const char* id : {"P0", "P1", "P2"}) addPort(id);
    {
        const StopAtLine stop("Added to FIFO: ", 2);
        EXPECT_EQ(BuildLogicalDeviceInfo(&mi, ctx(), ctrl), 0);
    }
    EXPECT_EQ(queuedItems(), 2u);
    EXPECT_EQ(linesWith("BuildLogicalDeviceInfo: (2)"), 2u);
}

// Nobody takes anything out of the queue here, so that both waits would go on for ever.

TEST_F(StopChecks, TheWaitForTheQueueToDrainEnds) {
    addPort("P0");
    int sleeps = 0;
    VirtualClock::onSleep([&sleeps](unsigned int) {
        sleeps++;
        EXPECT_TRUE(sleeps != 3 || quiesceWorkers());
        if (sleeps == 50) ReleaseDeviceItem(static_cast<Thread_Args_t*>(GetItem(&__FIFO)));
    });
    EXPECT_EQ(BuildLogicalDeviceInfo(&mi, ctx(), ctrl), 0);
    EXPECT_EQ(sleeps, 3);
    EXPECT_EQ(queuedItems(), 1u);
}

TEST_F(StopChecks, TheWaitForRoomInTheQueueEndsAndTheDeviceIsDropped) {
    for (int i = 0; i < 22; i++) addPort("P" + std::to_string(i));
    int sleeps = 0;
    VirtualClock::onSleep([&sleeps](unsigned int) {
        sleeps++;
        EXPECT_TRUE(sleeps != 3 || quiesceWorkers());
        if (sleeps >= 50) ReleaseDeviceItem(static_cast<Thread_Args_t*>(GetItem(&__FIFO)));
    });
    EXPECT_EQ(BuildLogicalDeviceInfo(&mi, ctx(), ctrl), 0);
    EXPECT_EQ(sleeps, 3);
    EXPECT_EQ(linesWith("FIFO full, waiting..."), 3u);
    EXPECT_EQ(linesWith("Added to FIFO: "), 20u) << "nothing is said of the dropped one";
    EXPECT_EQ(queuedItems(), 20u);
    EXPECT_EQ(books().liveClones(), 1u + 2 * 20) << "the controller's path and the queue's";
}

TEST_F(StopChecks, TheInventoryEndsWithTheRunningController) {
    RaidController_t* const second = attach(newController("C1"));
    second->ControllerOp = clonedPath(vendor.controller("C1").system);
    faults().add(stopDuring("CIM_Chassis"));
    buildInventory();
    EXPECT_TRUE(StopRequested());
    EXPECT_EQ(linesWith("BuildPoolInfo, ENTER"), 1u);
    EXPECT_EQ(second->ControllerUpdateTime, 0);
    EXPECT_EQ(associatorQueries(),
              (Ids{"CIM_HostedStoragePool>CIM_StoragePool", "CIM_SystemPackaging>CIM_Chassis"}));
}

TEST_F(StopChecks, AnInventoryThatBeginsAfterTheStopAsksNothing) {
    addOneOfEach();
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    EXPECT_TRUE(quiesceWorkers());
    books().clearCalls();
    DoBuildDeviceInfoAsync(ctx(), GetItem(&__FIFO));
    EXPECT_EQ(associatorQueries(), Ids{});
    EXPECT_EQ(linesWith("BuildPoolInfo, ENTER"), 0u);
    EXPECT_EQ(ctrl->ControllerUpdateTime, 0) << "not even as if it had been asked";
    EXPECT_EQ(CapturedSyslog::count("DoBuildDeviceInfoAsync done."), 1u);
}

TEST_F(StopChecks, AnInventoryThatOutlivesItsLifeLeavesTheNextOnesGateClosed) {
    const LifeMember member;
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    auto* const item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
    EXPECT_TRUE(quiesceWorkers());
    BeginWork();
    DoBuildDeviceInfoAsync(ctx(), item);
    EXPECT_EQ(threadActivityDone(), 0u);
    EXPECT_FALSE(InventoryDone());
}

TEST_F(StopChecks, NeitherAClassNorAnObjectIsAskedForAfterTheStop) {
    const CMPIObjectPath* path = broker.makePath(system_);
    bool failed = false;
    ASSERT_NE(QueryInstances("ACaller", ctx(), path), nullptr);
    ASSERT_NE(QueryInstance("ACaller", ctx(), path, &failed), nullptr);
    EXPECT_TRUE(quiesceWorkers());
    startOver();
    EXPECT_EQ(QueryInstances("ACaller", ctx(), path), nullptr);
    EXPECT_EQ(QueryInstance("ACaller", ctx(), path, &failed), nullptr);
    EXPECT_EQ(queries(), Texts{});
    EXPECT_FALSE(failed) << "nobody has been asked";
}

TEST_F(StopChecks, TheReadingOfIdentitiesEndsAtTheRunningOne) {
    for (int i = 0; i < 50; i++) addPort("P" + std::to_string(i));
    process(102);
    setAllUpdateTimes(0);
    clearLog();
    int read = 0;
    FaultRule third =
        watch(Entry::PathGetKey, [&read] { EXPECT_TRUE(++read != 3 || quiesceWorkers()); });
    third.name = "DeviceID";
    faults().add(third);
    process(102);
    EXPECT_EQ(read, 3);
    EXPECT_EQ(ports().size(), 50u);
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, "CrossoutDuplicatedEntries EXITED, rc -100, remove 0, add 0\n"));
}

TEST_F(StopChecks, ADriveWhosePoolIsNoLongerAskedForIsTurnedAwayInSilence) {
    const Path drive = addDrive("D0", addPool("pool0"));
    FaultRule candidates = watch(Entry::AssociatorNames, [] { EXPECT_TRUE(quiesceWorkers()); });
    candidates.assocClass = "CIM_ConcreteComponent";
    faults().add(candidates);
    EXPECT_EQ(BuildDiskInfo(&mi, ctx(), ctrl, instanceAt(drive), broker.makePath(drive)), -1);
    EXPECT_TRUE(StopRequested());
    EXPECT_EQ(ctrl->DiskList->Size, 0u);
    EXPECT_EQ(linesWith("No pool associated with disk "), 0u) << "nobody knows";
}

}  // namespace
}  // namespace plexortest
