// Unloading while the workers are at it: no work function sees records that are being released.
#include <future>

#include "instance_client.h"
#include "real_waits.h"
#include "workers_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

class WorkersUnload : public WorkersCardTest {
protected:
    void SetUp() override {
        WorkersCardTest::SetUp();
        card = vendor.controller("C0");
        for (int i = 0; i < 3; i++) vendor.port(card, "P" + std::to_string(i));
        startWorkers();
        setThreadActivityDone(1);
    }
    CMPIrc unload() {
        running_ = false;
        return testbed::InstanceClient(broker, &mi).cleanup(true);
    }
    /// Starts an unload on a thread of its own and waits until it has asked the workers to stop.
    std::future<CMPIrc> beginUnload() {
        auto unloading = std::async(std::launch::async, [this] { return unload(); });
        EXPECT_TRUE(eventually(StopRequested));
        return unloading;
    }
    static bool releaseHasBegun() {
        return CapturedSyslog::countContaining("Freeing list") != 0 ||
               CapturedSyslog::countContaining("Controller Model C0 (C0) deleted") != 0;
    }
};

TEST_F(WorkersUnload, AnIdleProviderIsReleasedAndItsWorkersLeave) {
    ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(unload(), CMPI_RC_OK);
    EXPECT_TRUE(releaseHasBegun());
    EXPECT_EQ(exitLines(), 2u);
    EXPECT_EQ(books().liveClones(), 0u);
    EXPECT_EQ(RaidControllerList->Size, 0u);
}

TEST_F(WorkersUnload, TheReleaseWaitsForARunningItem) {
    Gate gate;
    const GateOpener opener(gate);
    bool intact = false;
    ASSERT_EQ(tasks_.queue([&](CMPIContext*, void*) {
        gate.pass();
        intact = !releaseHasBegun() && RaidControllerList->Size == 1;
    }),
              0);
    ASSERT_TRUE(gate.awaitArrivals(1));

    auto unloading = beginUnload();
    EXPECT_EQ(unloading.wait_for(std::chrono::milliseconds(30)), std::future_status::timeout);
    EXPECT_FALSE(releaseHasBegun());
    gate.open();
    EXPECT_EQ(unloading.get(), CMPI_RC_OK);

    EXPECT_TRUE(intact);
    EXPECT_EQ(exitLines(), 2u) << "both were idle when they were asked to leave";
}

TEST_F(WorkersUnload, TheReleaseWaitsForARefreshInAVendorCall) {
    Gate gate;
    const GateOpener opener(gate);
    holdRefreshOfPorts(gate);

    auto unloading = beginUnload();
    EXPECT_FALSE(releaseHasBegun());
    gate.open();
    EXPECT_EQ(unloading.get(), CMPI_RC_OK);
    EXPECT_EQ(books().liveClones(), 0u);
    EXPECT_EQ(exitLines(), 2u);
}

TEST_F(WorkersUnload, QueuedWorkIsDiscardedWithItsClones) {
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(2, gate);
    ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    for (int i = 0; i < 4; i++) tasks_.queue([](CMPIContext*, void*) {});
    const testbed::ObjectPath path{"root/sample", "Sample_SASSATAPort", {}};
    CMPIInstance* const instance = broker.makeInstance({path, {}});
    auto* item = static_cast<Thread_Args_t*>(calloc(1, sizeof(Thread_Args_t)));
    item->Func = ProcessBuildLogicalDeviceInfo;
    item->Arg0 = reinterpret_cast<uintptr_t>(ctrl);
    item->Arg3 = reinterpret_cast<uintptr_t>(clonedPath(path));
    item->Arg4 = reinterpret_cast<uintptr_t>(instance->ft->clone(instance, nullptr));
    item->Arg5 = 2;
    ASSERT_EQ(PutItem(&__FIFO, item), 0);

    auto unloading = beginUnload();
    gate.open();
    EXPECT_EQ(unloading.get(), CMPI_RC_OK);

    EXPECT_EQ(tasks_.ended(), 2);
    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_EQ(books().liveClones(), 0u);
    EXPECT_EQ(books().count(Entry::Associators), 0u);
}

TEST_F(WorkersUnload, TheOrderOfTheReleases) {
    ASSERT_EQ(unload(), CMPI_RC_OK);
    const int controller = lineNumber("Controller Model C0 (C0) deleted\n");
    const int thread = lineNumber("Thread 0 exiting...\n");
    const int exit = lineNumber("PlexorProviderCleanup: EXIT\n");
    ASSERT_NE(controller, -1);
    EXPECT_LT(controller, thread) << "the inventory goes before the workers";
    EXPECT_LT(thread, exit);
}

TEST_F(WorkersUnload, AStuckWorkersRecordsAreGivenUpNotReleased) {
    ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    ASSERT_TRUE(workersComeToRest());
    ASSERT_EQ(ctrl->PortList->Size, 3u);
    VirtualClock::advance(20);
    Gate gate;
    const GateOpener opener(gate);
    holdRefreshOfPorts(gate);
    List_Entry_t* const givenUp = RaidControllerList->Head;
    {
        const HurriedWaits hurry;
        EXPECT_EQ(unload(), CMPI_RC_OK);
    }

    EXPECT_EQ(RaidControllerList->Size, 0u);
    EXPECT_FALSE(releaseHasBegun());
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR).back(),
              "PlexorProviderCleanup: a worker is still busy, the inventory stays in memory\n");
    EXPECT_EQ(std::string(ctrl->DeviceID), "C0");
    EXPECT_EQ(ctrl->PortList->Size, 3u);

    // What it was stuck in ends one day; its records are still there for it.
    gate.open();
    ASSERT_TRUE(workersComeToRest());
    pthread_attr_init(&PlexorThreadAttr);
    CleanupPlexorThreads();
    EXPECT_EQ(exitLines(), 2u);
    FreeController(ctrl);
    free(givenUp);
}

}  // namespace
}  // namespace plexortest
