// Words that threads share without a lock, or under one that others hold for longer. What this
// finds, the thread sanitizer tells: a thread beside the provider's touches them all the time and
// orders nothing by that.
#include <stdlib.h>

#include <optional>
#include <thread>

#include "PlexorProviderLock.h"
#include "PlexorProviderUtil.h"
#include "PlexorProviderUtilLife.h"
#include "beside.h"
#include "entry_fixture.h"
#include "real_waits.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

void touchAll(RaidController_t* ctrl) {
    for (time_t RaidController_t::*word :
         {&RaidController_t::ControllerUpdateTime, &RaidController_t::ChassisUpdateTime,
          &RaidController_t::PoolUpdateTime, &RaidController_t::VolumeUpdateTime,
          &RaidController_t::DiskUpdateTime, &RaidController_t::PortUpdateTime,
          &RaidController_t::BatteryUpdateTime}) {
        touch(ctrl->*word);
    }
}

class SharedWordsTest : public EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        presentVendor();
        // Its lock would order what it tells of.
        CapturedSyslog::discard(true);
    }
    void TearDown() override {
        CapturedSyslog::discard(false);
        EntryTest::TearDown();
    }
    void load() {
        callFactory();
        ASSERT_TRUE(inventoryTaken());
        settleWorkers();
    }
    /// How many workers.
    static std::size_t haveLeft() {
        return CapturedSyslog::count("Thread 0 exiting...\n") +
               CapturedSyslog::count("Thread 1 exiting...\n");
    }
    CMPIrc cleanUp(bool terminating) {
        return testbed::InstanceClient(broker, &mi).cleanup(terminating);
    }
    void askForAllClasses() {
        testbed::InstanceClient client(broker, &mi);
        for (const char* name :
             {"Tovexa_PlexorController", "Tovexa_PlexorStorageExtent", "Tovexa_PlexorStorageVolume",
              "Tovexa_PlexorSASSATAPort", "Tovexa_PlexorBattery"}) {
            client.enumerateInstances(name);
        }
    }
    /// In a refresh of the batteries.
    void holdAWorker(Gate& gate) {
        FaultRule walk = waitingAt(Entry::Associators, gate);
        walk.resultClass = "CIM_Battery";
        faults().add(walk);
        VirtualClock::advance(100);
        askForAllClasses();
        ASSERT_TRUE(gate.awaitArrivals(1));
    }
};

TEST_F(SharedWordsTest, ALifeSharesItsOwn) {
    const Beside others([] {
        touch(_ProviderInitialized);
        touch(InitCompleteTime);
        touch(StateUpdateInterval);
        touch(NextUnloadTime);
        touch(IdleTimeBeforeTerminating);
        touch(Broker);
        touch(waitDebug);
    });
    load();
    __atomic_store_n(&IdleTimeBeforeTerminating, 99u, __ATOMIC_RELAXED);
    for (int i = 0; i < 3; i++) {
        VirtualClock::advance(100);
        askForAllClasses();
        EXPECT_TRUE(WorkersMeet::untilIdle());
    }
    EXPECT_EQ(cleanUp(false), CMPI_RC_DO_NOT_UNLOAD);
    EXPECT_EQ(cleanUp(true), CMPI_RC_OK);
}

TEST_F(SharedWordsTest, ADebuggersMarkIsShared) {
    setenv("WAIT_PROC", "1", 1);
    VirtualClock::onSleep([](unsigned int) { __atomic_store_n(&waitDebug, 0, __ATOMIC_RELAXED); });
    {
        const Beside others([] { touch(waitDebug); });
        callFactory();
    }
    unsetenv("WAIT_PROC");
    EXPECT_GE(VirtualClock::sleeps().size(), 1u);
    ASSERT_TRUE(inventoryTaken());
}

TEST_F(SharedWordsTest, AnInventorySharesTheTimesOfItsClasses) {
    Gate gate;
    const GateOpener opener(gate);
    FaultRule first = waitingAt(Entry::Associators, gate);
    first.assocClass = "CIM_HostedStoragePool";
    faults().add(first);
    callFactory();
    ASSERT_TRUE(gate.awaitArrivals(1));
    RaidController_t* const ctrl = firstController();
    const Beside others([ctrl] { touchAll(ctrl); });
    gate.open();
    ASSERT_TRUE(inventoryTaken());
    settleWorkers();
}

TEST_F(SharedWordsTest, RefreshesShareTheTimesOfTheirClasses) {
    load();
    RaidController_t* const ctrl = firstController();
    const Beside others([ctrl] {
        touchAll(ctrl);
        touch(StateUpdateInterval);
    });
    for (int i = 0; i < 3; i++) {
        VirtualClock::advance(100);
        askForAllClasses();
        EXPECT_TRUE(WorkersMeet::untilIdle());
        CheckAndUpdateControllerInfo(&mi, ctx(), ctrl, nullptr, nullptr);
    }
}

TEST_F(SharedWordsTest, NamesAreReadWhileTheyComeAndGo) {
    const Beside others([] {
        GetSystemName();
        GetHostName();
        GetSystemClassName();
    });
    for (int i = 0; i < 5; i++) {
        EXPECT_EQ(InitSystemInfo(&mi, ctx()), 0);
        others.awaitRound();
        ReleaseSystemInfo();
        others.awaitRound();

        EXPECT_EQ(InitSystemInfo(&mi, ctx()), 0);
        const auto names = {__SystemName, __HostName, __SystemClassName};
        others.awaitRound();
        GiveUpSystemInfo();
        others.awaitRound();
        for (char* name : names) free(name);
    }
}

TEST_F(SharedWordsTest, AWordThatWasResetIsForgottenBesideAWorkerThatWasLeftBehind) {
    // What a worker says last comes before its last look.
    CapturedSyslog::discard(false);
    load();
    Gate gate;
    const GateOpener opener(gate);
    holdAWorker(gate);
    // One that is busy when it is told to leave stays for another wake-up.
    ASSERT_TRUE(eventually([] {
        const WorkersHeld held;
        return IsFifoEmpty(&__FIFO) && ActiveThreads == 1;
    }));
    std::optional<GivenUpInventory> givenUp(std::in_place);
    {
        const HurriedWaits hurry;
        EXPECT_EQ(cleanUp(true), CMPI_RC_OK);
    }
    ASSERT_TRUE(eventually([] { return haveLeft() == 1; }));
    gate.open();
    // On a thread of its own, which orders nothing for the one that calls the factory.
    std::thread host([] {
        for (bool reset = false; !reset; std::this_thread::yield()) {
            const MutexGuard lock(PlexorThreadMutex);
            reset = ActiveThreads == 0;
            if (reset) StoreShared(TerminateThread, 0u);
        }
    });
    while (LoadShared(TerminateThread) != 0) std::this_thread::yield();
    callFactory();
    host.join();
    EXPECT_TRUE(inventoryTaken());
    EXPECT_TRUE(eventually([] { return haveLeft() == 2; })) << "after which the broker may go";
}

// Read plainly, as nobody but who holds the life still may.

TEST_F(SharedWordsTest, AnInitialisationMarksItselfWhileItsLifeIsHeldStill) {
    const Beside others([] {
        const LifeGuard life;
        static_cast<void>(*static_cast<volatile int*>(&_ProviderInitialized));
    });
    callFactory();
    ASSERT_TRUE(inventoryTaken());
}

TEST_F(SharedWordsTest, AnInventoryOpensItsGateWhileItsLifeIsHeldStill) {
    const Beside others([] {
        const LifeGuard life;
        static_cast<void>(*static_cast<volatile unsigned int*>(&ThreadActivityDone));
    });
    callFactory();
    ASSERT_TRUE(inventoryTaken());
}

TEST_F(SharedWordsTest, ARefusedCleanupLooksForControllersWhileTheLifeIsHeldStill) {
    load();
    askForAllClasses();
    settleWorkers();
    const Beside others([] {
        const LifeGuard life;
        auto* const head = static_cast<List_Entry_t* volatile*>(&RaidControllerList->Head);
        auto* const size = static_cast<volatile unsigned int*>(&RaidControllerList->Size);
        *head = *head;
        *size = *size;
    });
    for (int i = 0; i < 20; i++) EXPECT_EQ(cleanUp(false), CMPI_RC_DO_NOT_UNLOAD);
}

TEST_F(SharedWordsTest, AnInventoryIsGivenUpWhileItsLifeIsHeldStill) {
    load();
    Gate gate;
    const GateOpener opener(gate);
    holdAWorker(gate);
    std::optional<GivenUpInventory> givenUp(std::in_place);
    {
        const Beside others([] {
            const LifeGuard life;
            static_cast<void>(*static_cast<List_Entry_t* volatile*>(&RaidControllerList->Head));
        });
        const HurriedWaits hurry;
        EXPECT_EQ(cleanUp(true), CMPI_RC_OK);
    }
    EXPECT_EQ(controllers(), 0u);
    gate.open();
    EXPECT_TRUE(WorkersMeet::untilIdle());
}

}  // namespace
}  // namespace plexortest
