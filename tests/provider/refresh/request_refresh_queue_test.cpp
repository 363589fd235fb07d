// What a request for a refresh puts into the queue, how it wakes a worker, and the work function.
#include "PlexorProviderCfgItems.h"
#include "real_waits.h"
#include "refresh_fixture.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

class RequestRefreshQueue : public RefreshTest {
protected:
    void SetUp() override {
        RefreshTest::SetUp();
        ctrl = attach(newController("C0"));
        ThreadActivityDone = 1;
        clearLog();
    }
    int request(int action) { return HandleDeviceConfigChange(&mi, ctx(), ctrl, action); }
    Thread_Args_t* onlyItem() {
        EXPECT_EQ(queuedItems(), 1u);
        return static_cast<Thread_Args_t*>(GetItem(&__FIFO));
    }
    void fillQueue(int items) {
        for (int i = 0; i < items; i++) {
            ASSERT_EQ(PutItem(&__FIFO, zeroed<Thread_Args_t>()), 0);
        }
        clearLog();
    }

    RaidController_t* ctrl = nullptr;
};

TEST_F(RequestRefreshQueue, ItemCarriesWhatTheWorkerNeeds) {
    ASSERT_EQ(request(101), 0);
    Thread_Args_t* const item = onlyItem();
    ASSERT_NE(item, nullptr);
    EXPECT_EQ(item->Func, &DoDeviceConfigChange);
    EXPECT_EQ(item->Arg0, reinterpret_cast<uintptr_t>(&mi));
    EXPECT_EQ(item->Arg1, 0u);
    EXPECT_EQ(item->Arg2, reinterpret_cast<uintptr_t>(ctrl));
    EXPECT_EQ(item->Arg3, 101u);
    EXPECT_EQ(item->Arg4, 0u);
    EXPECT_EQ(item->Arg5, 0u);
    const auto work = TakeWork<RefreshWork>(item);
    EXPECT_EQ(work.mi, &mi);
    EXPECT_EQ(work.ctrl, ctrl);
    EXPECT_EQ(work.action, 101);
}

TEST_F(RequestRefreshQueue, ExitIsTracedLast) {
    ASSERT_EQ(request(103), 0);
    const auto lines = CapturedSyslog::lines();
    EXPECT_EQ(lines.back().text, "HandleDeviceConfigChange, exit...\n");
    EXPECT_EQ(lines.back().priority, LOG_DEBUG);
}

TEST_F(RequestRefreshQueue, OneWorkerIsWokenWithoutTheMutex) {
    const WakeUpCounter wakeUps;
    ASSERT_EQ(request(102), 0);
    EXPECT_EQ(WakeUpCounter::signals(), 1);
    EXPECT_EQ(WakeUpCounter::broadcasts(), 0);
    EXPECT_EQ(WakeUpCounter::underMutex(), 0);
}

TEST_F(RequestRefreshQueue, NobodyIsWokenForASkippedRequest) {
    ctrl->PortUpdateTime = kStart;
    const WakeUpCounter wakeUps;
    ASSERT_EQ(request(102), 0);
    ThreadActivityDone = 0;
    ASSERT_EQ(request(103), 0);
    EXPECT_EQ(WakeUpCounter::signals() + WakeUpCounter::broadcasts(), 0);
}

TEST_F(RequestRefreshQueue, RequestsPileUpInOrder) {
    for (const int action : {102, 100, 102, 101}) ASSERT_EQ(request(action), 0);
    for (const unsigned action : {102u, 100u, 102u, 101u}) {
        auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
        EXPECT_EQ(item->Arg3, action);
        free(item);
    }
}

TEST_F(RequestRefreshQueue, TheTwentiethPlaceIsTaken) {
    fillQueue(19);
    EXPECT_EQ(request(102), 0);
    EXPECT_EQ(queuedItems(), 20u);
}

TEST_F(RequestRefreshQueue, FullQueueDropsTheRequest) {
    fillQueue(20);
    const WakeUpCounter wakeUps;

    EXPECT_EQ(request(102), -6);

    EXPECT_EQ(queuedItems(), 20u);
    EXPECT_EQ(WakeUpCounter::signals() + WakeUpCounter::broadcasts(), 0);
    EXPECT_EQ(CapturedSyslog::lines().back().text, "HandleDeviceConfigChange, exit...\n");
    EXPECT_EQ(ctrl->PortUpdateTime, 0);
}

TEST_F(RequestRefreshQueue, NoMemoryForTheItemQueuesNothing) {
    const auto fault = FailAllocation::nth(1);
    EXPECT_EQ(request(102), 0) << "the next request asks for it again";
    EXPECT_EQ(fault.failures(), 1u);
    EXPECT_EQ(queuedItems(), 0u);
}

TEST_F(RequestRefreshQueue, NoMemoryInTheQueueIsAnswered) {
    const WakeUpCounter wakeUps;
    {
        const auto fault = FailAllocation::nth(2);
        EXPECT_EQ(request(102), -2);
    }
    EXPECT_EQ(queuedItems(), 0u);
    // Only a full queue keeps the workers asleep.
    EXPECT_EQ(WakeUpCounter::signals(), 1);
    EXPECT_EQ(CapturedSyslog::lines().back().text, "HandleDeviceConfigChange, exit...\n");
}

TEST_F(RequestRefreshQueue, WorkFunctionRefreshesWhatTheItemNames) {
    const VendorController array = vendor.controller("C0");
    vendor.battery(array, "B0");
    ctrl->ControllerOp = clonedPath(array.system);
    ASSERT_EQ(request(103), 0);
    Thread_Args_t* const item = onlyItem();
    clearLog();

    DoDeviceConfigChange(ctx(), item);

    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, ENTER(103)...\n"));
    EXPECT_EQ(associatorQueries(), std::vector<std::string>{"CIM_SystemDevice>CIM_Battery"});
    EXPECT_EQ(ctrl->BatteryList->Size, 1u);
}

TEST_F(RequestRefreshQueue, AWorkerRefreshesWithItsOwnContext) {
    const VendorController array = vendor.controller("C0");
    vendor.battery(array, "B0");
    ctrl->ControllerOp = clonedPath(array.system);
    Worker worker(ctx());

    ASSERT_EQ(request(103), 0);
    ASSERT_TRUE(eventually([&] { return books().count(testbed::Entry::ContextFlush) == 1; }));
    ASSERT_TRUE(workersComeToRest());
    worker.stop();

    // The broker takes note of a foreign context; the fixture looks at that at the end.
    const auto queries = books().queries();
    ASSERT_FALSE(queries.empty());
    for (const auto& query : queries) EXPECT_NE(query.thread, std::this_thread::get_id());
    EXPECT_EQ(ctrl->BatteryList->Size, 1u);
}

}  // namespace
}  // namespace plexortest
