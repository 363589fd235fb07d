// Queueing the initial inventory, and its work function.
#include "real_waits.h"
#include "refresh_fixture.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

constexpr time_t RaidController_t::*kAllTimes[] = {
    &RaidController_t::BatteryUpdateTime,   &RaidController_t::PortUpdateTime,
    &RaidController_t::DiskUpdateTime,      &RaidController_t::VolumeUpdateTime,
    &RaidController_t::PoolUpdateTime,      &RaidController_t::ChassisUpdateTime,
    &RaidController_t::ControllerUpdateTime};

class InventoryAsync : public RefreshTest {
protected:
    RaidController_t* cachedController(const char* id) {
        RaidController_t* ctrl = attach(newController(id));
        card = vendor.controller(id);
        ctrl->ControllerOp = clonedPath(card.system);
        clearLog();
        return ctrl;
    }
    /// Runs the queued work function on this thread, which no other worker helps.
    void runQueued() {
        auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
        ASSERT_NE(item, nullptr);
        clearLog();
        item->Func(ctx(), item);
    }
    void buildInventory() {
        ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
        runQueued();
    }
    void fillQueue() {
        for (int i = 0; i < 20; i++) {
            auto* item = zeroed<Thread_Args_t>();
            item->Func = [](CMPIContext*, void* args) { free(args); };
            ASSERT_EQ(PutItem(&__FIFO, item), 0);
        }
    }

    VendorController card;  // the latest
};

TEST_F(InventoryAsync, OneItemIsQueued) {
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    ASSERT_EQ(queuedItems(), 1u);
    auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
    EXPECT_EQ(item->Func, &DoBuildDeviceInfoAsync);
    EXPECT_EQ(item->Arg0, reinterpret_cast<uintptr_t>(&mi));
    for (const uintptr_t unused : {item->Arg1, item->Arg2, item->Arg3, item->Arg4, item->Arg5}) {
        EXPECT_EQ(unused, 0u);
    }
    free(item);
    EXPECT_EQ(ThreadActivityDone, 0u);
}

TEST_F(InventoryAsync, TheInterfaceIsHandedOnToEachDevice) {
    cachedController("C0");
    vendor.battery(card, "b1");
    uintptr_t handed = 0;
    VirtualClock::onSleep([&](unsigned int) {
        auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
        if (item == nullptr) return;
        handed = item->Arg1;
        item->Func(ctx(), item);
    });
    buildInventory();
    EXPECT_EQ(handed, reinterpret_cast<uintptr_t>(&mi));
}

TEST_F(InventoryAsync, OneWorkerIsWokenWithoutTheMutex) {
    const WakeUpCounter wakeUps;
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    EXPECT_EQ(WakeUpCounter::signals(), 1);
    EXPECT_EQ(WakeUpCounter::broadcasts(), 0);
    EXPECT_EQ(WakeUpCounter::underMutex(), 0);
}

TEST_F(InventoryAsync, NoMemoryForTheItem) {
    const WakeUpCounter wakeUps;
    {
        const auto fault = FailAllocation::nth(1);
        EXPECT_EQ(BuildDeviceInfoAsync(&mi, ctx()), -2);
    }
    EXPECT_TRUE(loggedOnce(LOG_ERR, "BuildDeviceInfoAsync, failed to allocate threadArgs\n"));
    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_EQ(WakeUpCounter::signals(), 0);
}

TEST_F(InventoryAsync, NoMemoryInTheQueue) {
    {
        const auto fault = FailAllocation::nth(2);
        EXPECT_EQ(BuildDeviceInfoAsync(&mi, ctx()), -2);
    }
    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
}

TEST_F(InventoryAsync, FullQueueMeansNoInventoryAndNoRefreshEver) {
    RaidController_t* const ctrl = cachedController("C0");
    fillQueue();
    const WakeUpCounter wakeUps;

    EXPECT_EQ(BuildDeviceInfoAsync(&mi, ctx()), -6);

    EXPECT_TRUE(loggedOnce(LOG_ERR, "BuildDeviceInfoAsync, failed to put threadArgs in FIFO\n"));
    EXPECT_EQ(queuedItems(), 20u);
    EXPECT_EQ(WakeUpCounter::signals(), 0);
    {
        Worker worker(ctx());
        ASSERT_TRUE(eventually([] { return queuedItems() == 0; }));
        ASSERT_TRUE(workersComeToRest());
    }
    EXPECT_EQ(ThreadActivityDone, 0u);
    VirtualClock::advance(1000);
    clearLog();
    EXPECT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 100), 0);
    EXPECT_TRUE(loggedOnce(
        LOG_DEBUG,
        "HandleDeviceConfigChange: BuildDeviceInfoAsync is still running, skip action 100\n"));
    EXPECT_EQ(queuedItems(), 0u);
}

TEST_F(InventoryAsync, EveryControllerInOrderPoolsChassisDevices) {
    cachedController("C0");
    cachedController("C1");
    buildInventory();

    std::vector<std::string> walks;
    for (const auto& call : books().queries()) {
        EXPECT_EQ(call.entry, Entry::Associators);
        walks.push_back(call.path.substr(call.path.size() - 3, 2) + " " +
                        call.assocClass.value_or("NULL") + ">" + call.resultClass.value_or("NULL"));
    }
    EXPECT_EQ(walks,
              (std::vector<std::string>{
                  "C0 CIM_HostedStoragePool>CIM_StoragePool", "C0 CIM_SystemPackaging>CIM_Chassis",
                  "C0 CIM_SystemDevice>NULL", "C1 CIM_HostedStoragePool>CIM_StoragePool",
                  "C1 CIM_SystemPackaging>CIM_Chassis", "C1 CIM_SystemDevice>NULL"}));
}

TEST_F(InventoryAsync, AnEntryWithoutControllerIsPassedOver) {
    RaidController_t* const first = cachedController("C0");
    int placeholder = 0;
    ASSERT_EQ(AddEntryAtListTail(RaidControllerList, &placeholder), 0);
    List_Entry_t* const empty = RaidControllerList->Tail;
    empty->Data = nullptr;
    RaidController_t* const last = cachedController("C1");

    buildInventory();

    EXPECT_EQ(first->ControllerUpdateTime, kStart);
    EXPECT_EQ(last->ControllerUpdateTime, kStart);
    EXPECT_EQ(ThreadActivityDone, 1u);
    empty->Data = &placeholder;
    EXPECT_EQ(RemoveEntryFromListByKey(RaidControllerList, &placeholder), 0);
}

TEST_F(InventoryAsync, AllSevenTimesAreSetToTheEndOfEachControllersWalk) {
    RaidController_t* const first = cachedController("C0");
    RaidController_t* const second = cachedController("C1");
    FaultRule slow;
    slow.entry = Entry::Associators;
    slow.hook = [] { VirtualClock::advance(2); };
    faults().add(slow);
    buildInventory();
    for (auto field : kAllTimes) {
        EXPECT_EQ(first->*field, kStart + 6);
        EXPECT_EQ(second->*field, kStart + 12);
    }
}

TEST_F(InventoryAsync, AllSevenTimesAreOneReadingOfTheClock) {
    RaidController_t* const ctrl = cachedController("C0");
    VirtualClock::stepAtEachReading(1);
    buildInventory();
    VirtualClock::stepAtEachReading(0);
    EXPECT_EQ(VirtualClock::now(), kStart + 1);
    for (auto field : kAllTimes) EXPECT_EQ(ctrl->*field, kStart);
}

TEST_F(InventoryAsync, TheTimesAreWrittenWithoutTheControllersMutex) {
    RaidController_t* const ctrl = cachedController("C0");
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    pthread_mutex_lock(&ctrl->CtrlMutex);
    {
        Worker worker(ctx());
        EXPECT_TRUE(eventually([] { return threadActivityDone() == 1; }));
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        EXPECT_TRUE(workersComeToRest());
    }
    for (auto field : kAllTimes) EXPECT_EQ(ctrl->*field, kStart);
}

TEST_F(InventoryAsync, DoneIsSetAtTheEndUnderTheMutexAndToldToAll) {
    cachedController("C0");
    std::vector<unsigned int> during;
    FaultRule look;
    look.entry = Entry::Associators;
    look.hook = [&] { during.push_back(threadActivityDone()); };
    faults().add(look);
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    const WakeUpCounter wakeUps;
    runQueued();

    EXPECT_EQ(during, (std::vector<unsigned int>{0, 0, 0}));
    EXPECT_EQ(threadActivityDone(), 1u);
    EXPECT_EQ(WakeUpCounter::broadcasts(), 1);
    EXPECT_EQ(WakeUpCounter::underMutex(), 1);
    EXPECT_EQ(CapturedSyslog::lines().back().text, "DoBuildDeviceInfoAsync done.");
    EXPECT_EQ(CapturedSyslog::lines().back().priority, LOG_DEBUG);
}

TEST_F(InventoryAsync, WithoutControllersItIsDoneAtOnce) {
    buildInventory();
    EXPECT_EQ(ThreadActivityDone, 1u);
    EXPECT_TRUE(books().queries().empty());
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "DoBuildDeviceInfoAsync done."));
}

TEST_F(InventoryAsync, RefusedWalksAreDoneAsWell) {
    RaidController_t* const ctrl = cachedController("C0");
    FaultRule refused;
    refused.entry = Entry::Associators;
    refused.rc = CMPI_RC_ERR_FAILED;
    faults().add(refused);
    buildInventory();
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR).size(), 3u);
    EXPECT_EQ(ThreadActivityDone, 1u);
    for (auto field : kAllTimes) EXPECT_EQ(ctrl->*field, kStart);
}

TEST_F(InventoryAsync, RequestsAreSkippedWhileItRunsAndServedAfterIt) {
    RaidController_t* const ctrl = cachedController("C0");
    for (int i = 0; i < 30; i++) vendor.port(card, "P" + std::to_string(i));
    Gate gate;
    FaultRule hold;
    hold.entry = Entry::Associators;
    hold.resultClass = "CIM_Chassis";
    hold.hook = [&] { gate.pass(); };
    faults().add(hold);
    Worker first(ctx(), 0);
    Worker second(ctx(), 1);
    const GateOpener opener(gate);
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    ASSERT_TRUE(gate.awaitArrivals(1));

    EXPECT_EQ(threadActivityDone(), 0u);
    EXPECT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    EXPECT_TRUE(loggedOnce(
        LOG_DEBUG,
        "HandleDeviceConfigChange: BuildDeviceInfoAsync is still running, skip action 102\n"));
    EXPECT_EQ(queuedItems(), 0u);

    gate.open();
    ASSERT_TRUE(eventually([] { return threadActivityDone() == 1; }));
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(ctrl->PortList->Size, 30u);
    VirtualClock::advance(20);
    books().clearCalls();
    EXPECT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(associatorQueries(), std::vector<std::string>{"CIM_SystemDevice>CIM_SASSATAPort"});
}

}  // namespace
}  // namespace plexortest
