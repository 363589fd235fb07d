// Threads that the manager cancels while they are inside the provider.
#include <pthread.h>
#include <sched.h>

#include <sstream>

#include "PlexorProviderIfcTurns.h"
#include "PlexorProviderLock.h"
#include "PlexorProviderUtilLife.h"
#include "beside.h"
#include "deliberate_leaks.h"
#include "meeting_fixture.h"
#include "sanitizers.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::Gate;
using plexortest::GateOpener;
using testbed::Entry;

class CancelledTest : public plexortest::MeetingTest {
protected:
#ifdef PLEXOR_ADDRESS_SANITIZER
    void SetUp() override {
        MeetingTest::SetUp();
        GTEST_SKIP() << "this sanitizer does not follow a thread out of the frames that it leaves";
    }
#endif
    template <typename Call>
    static pthread_t start(Call& call) {
        pthread_t thread = 0;
        EXPECT_EQ(pthread_create(
                      &thread, nullptr,
                      [](void* that) -> void* {
                          (*static_cast<Call*>(that))();
                          return nullptr;
                      },
                      &call),
                  0);
        return thread;
    }
    static void cancelAndJoin(pthread_t thread) {
        EXPECT_EQ(pthread_cancel(thread), 0);
        void* result = nullptr;
        EXPECT_EQ(pthread_join(thread, &result), 0);
        EXPECT_EQ(result, PTHREAD_CANCELED);
    }
    /// Calls the factory on a thread that is cancelled once it has its controller, after `before`.
    template <typename Before>
    void cancelFactoryWithItsController(Before before) {
        CapturedSyslog::onLine([before](const plexortest::LogLine& line) {
            if (line.text != "BuildControllerInfo, EXIT(0).\n") return;
            before();
            cancelHere();
        });
        auto factory = [this] {
            const testbed::Broker::CallScope scope(broker);
            PlexorProvider_Create_InstanceMI(broker.handle(), scope.context(), nullptr);
        };
        const pthread_t thread = start(factory);
        void* result = nullptr;
        EXPECT_EQ(pthread_join(thread, &result), 0);
        EXPECT_EQ(result, PTHREAD_CANCELED);
        CapturedSyslog::onLine(nullptr);
    }
    static unsigned int active() {
        const plexortest::WorkersHeld held;
        return ActiveThreads;
    }
    /// What a cancellation of this thread meets here.
    static void cancelHere() {
        pthread_cancel(pthread_self());
        pthread_testcancel();
    }
    /// Ends the worker as a manager does; the provider joins it.
    void cancelWorker(int index) {
        EXPECT_EQ(pthread_cancel(PlexorThreads[index]), 0);
    }
};

TEST_F(CancelledTest, AnIdleWorkerLeavesTheOtherAtWork) {
    load();
    cancelWorker(0);
    EXPECT_TRUE(plexortest::eventually([this] {
        plexortest::VirtualClock::advance(100);
        return requestDrives().get() == 1 &&
               CapturedSyslog::countContaining("ProcessDeviceConfigChange, EXIT") > 1;
    }));
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(CapturedSyslog::countContaining("still busy"), 0u);
}

TEST_F(CancelledTest, ABuilderMayBeLeftWhileItReleasesWhatItTurnedAway) {
    load();
    CapturedSyslog::onLine([](const plexortest::LogLine& line) {
        if (line.text == "Battery NULL deleted\n") cancelHere();
    });
    auto build = [this] {
        const plexortest::DeliberateLeaks leaks;  // the record of which it tells
        BuildBatteryInfo(&mi, nullptr, firstController(), nullptr, nullptr);
    };
    const pthread_t thread = start(build);
    void* result = nullptr;
    EXPECT_EQ(pthread_join(thread, &result), 0);
    EXPECT_EQ(result, PTHREAD_CANCELED);
    CapturedSyslog::onLine({});
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
}

TEST_F(CancelledTest, WhatAnInventoryLeavesOutComesWithARefresh) {
    CapturedSyslog::onLine([](const plexortest::LogLine& line) {
        if (line.text == "BuildLogicalDeviceInfo, enter...\n") cancelHere();
    });
    callFactory();
    EXPECT_TRUE(plexortest::eventually(
        [] { return CapturedSyslog::countContaining("BuildLogicalDeviceInfo, enter...") > 0; }));
    EXPECT_TRUE(plexortest::eventually([this] {
        plexortest::VirtualClock::advance(100);
        return requestDrives().get() == 1;
    }));
    CapturedSyslog::onLine(nullptr);
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(CapturedSyslog::countContaining("still busy"), 0u);
}

StoragePool_t* firstPool(const RaidController_t* ctrl) {
    return static_cast<StoragePool_t*>(ctrl->PoolList->Head->Data);
}

/// Whether every drive that a pool of the controller has as a member has its record: the request
/// for a volume waits for it.
bool everyMemberHasARecord(RaidController_t* ctrl) {
    MutexGuard lock(ctrl->CtrlMutex);
    for (const List_Entry_t* pool = ctrl->PoolList->Head; pool != nullptr; pool = pool->Next) {
        const auto* drives = static_cast<StoragePool_t*>(pool->Data)->Drives;
        for (const List_Entry_t* member = drives->Head; member != nullptr; member = member->Next) {
            const auto* id = static_cast<const char*>(member->Data);
            if (FindDiskByDeviceID(ctrl, id) == nullptr) return false;
        }
    }
    return true;
}

TEST_F(CancelledTest, ADriveThatIsDeletedLeavesItsPoolAllTheSame) {
    load();
    RaidController_t* const ctrl = firstController();
    CapturedSyslog::onLine([](const plexortest::LogLine& line) {
        if (line.text.find(" removed from controller ") != std::string::npos) cancelHere();
    });
    auto remove = [ctrl] { DeleteDisk(ctrl, ctrl->DiskList->Head->Data); };
    EXPECT_EQ(pthread_join(start(remove), nullptr), 0);
    CapturedSyslog::onLine(nullptr);
    EXPECT_EQ(ctrl->DiskList->Size, 0u);
    EXPECT_TRUE(everyMemberHasARecord(ctrl));
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
}

TEST_F(CancelledTest, ADriveThatJoinsItsPoolGetsIntoTheListAllTheSame) {
    load();
    RaidController_t* const ctrl = firstController();
    EXPECT_EQ(DeleteDisk(ctrl, ctrl->DiskList->Head->Data), RESULT_OK);
    std::ostringstream joined;
    joined << " added to the list " << firstPool(ctrl)->Drives << ',';
    CapturedSyslog::onLine([text = joined.str()](const plexortest::LogLine& line) {
        if (line.text.find(text) != std::string::npos) cancelHere();
    });
    plexortest::VirtualClock::advance(100);
    requestDrives().get();
    EXPECT_TRUE(plexortest::eventually(
        [&joined] { return CapturedSyslog::countContaining(joined.str()) > 0; }));
    EXPECT_TRUE(plexortest::eventually([] { return active() == 0; }));
    CapturedSyslog::onLine(nullptr);
    EXPECT_EQ(ctrl->DiskList->Size, 1u);
    EXPECT_TRUE(everyMemberHasARecord(ctrl));
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
}

TEST_F(CancelledTest, ABusyWorkerIsCountedNoLonger) {
    load();
    static std::atomic<pthread_t> busy;
    busy = 0;
    auto* item = plexortest::zeroed<Thread_Args_t>();
    item->Func = [](CMPIContext*, void* args) {
        free(args);
        busy = pthread_self();
        // Not in a call that a thread sanitizer watches: it takes no notice of locks after leaving
        // one in this way.
        for (;; sched_yield()) pthread_testcancel();
    };
    PutItem(&__FIFO, item);
    pthread_cond_signal(&PlexorThreadCond);
    ASSERT_TRUE(plexortest::eventually([] { return busy != 0; }));
    EXPECT_EQ(active(), 1u);
    EXPECT_EQ(pthread_cancel(busy), 0);
    EXPECT_TRUE(plexortest::eventually([] { return active() == 0; }));
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(CapturedSyslog::countContaining("still busy"), 0u);
}

TEST_F(CancelledTest, ACleanupThatWaitsForAnotherOneIsForgotten) {
    load();
    Gate gate;
    const GateOpener opener(gate);
    auto request = requestHeldAt(Entry::NewInstance, gate);
    auto cleanup = cleanupThatWaits(true);
    auto second = [this] { PlexorProviderCleanup(&mi, nullptr, 1); };
    const pthread_t waiting = start(second);
    ASSERT_TRUE(cleanupsInside(2));
    EXPECT_TRUE(stillWaits(cleanup));
    cancelAndJoin(waiting);
    gate.open();
    request.get();
    EXPECT_EQ(cleanup.get(), CMPI_RC_OK);
}

TEST_F(CancelledTest, AnInitialisationCanBeTriedAgain) {
    std::optional<plexortest::GivenUpInventory> givenUp;
    cancelFactoryWithItsController([&givenUp] { givenUp.emplace(); });
    EXPECT_EQ(initialized(), 0);
    EXPECT_EQ(controllers(), 0u);
    givenUp.reset();
    EXPECT_EQ(books().liveClones(), 0u);

    load();
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(requestDrives().get(), 1u);
}

TEST_F(CancelledTest, AnInitialisationIsTakenBackWhileItsLifeIsHeldStill) {
    std::optional<plexortest::GivenUpInventory> givenUp;
    {
        const plexortest::Beside others([] {
            plexortest::touch(_ProviderInitialized);
            const LifeGuard life;
            // Read plainly, as nobody but who holds the life still may.
            static_cast<void>(*static_cast<List_Entry_t* volatile*>(&RaidControllerList->Head));
        });
        cancelFactoryWithItsController([&givenUp] { givenUp.emplace(); });
    }
    EXPECT_EQ(controllers(), 0u);
}

TEST_F(CancelledTest, ACleanupWaitsToItsEndForThoseThatWaitForIt) {
    Gate end;
    bool ended = false;
    auto cleanUp = [&] {
        std::optional<CleanupTurn> turn(std::in_place, 60, nullptr);
        end.pass();
        pthread_cancel(pthread_self());
        turn.reset();
        ended = true;
        pthread_testcancel();
    };
    const pthread_t first = start(cleanUp);
    ASSERT_TRUE(end.awaitArrivals(1));
    auto second = std::async(std::launch::async, [] { return CleanupTurn(60, nullptr).Taken(); });
    EXPECT_TRUE(stillWaits(second));
    end.open();
    EXPECT_FALSE(second.get());
    void* result = nullptr;
    EXPECT_EQ(pthread_join(first, &result), 0);
    EXPECT_EQ(result, PTHREAD_CANCELED) << "behind its end";
    EXPECT_TRUE(ended);
}

TEST_F(CancelledTest, AnInitialisationOfAnEndedLifeLeavesTheInventoryToItsCleanup) {
    cancelFactoryWithItsController(RequestStop);
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(initialized(), 0);
    EXPECT_EQ(controllers(), 0u);
}

}  // namespace
