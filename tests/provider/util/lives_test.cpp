// A second initialisation in the same mapping, also beside a worker that the first left behind.
#include <dlfcn.h>
#include <pthread.h>

#include <atomic>
#include <chrono>
#include <functional>
#include <future>
#include <optional>
#include <thread>

#include "PlexorProviderCfg.h"
#include "entry_fixture.h"
#include "real_waits.h"
#include "watched_calls.h"
#include "worker_harness.h"

namespace {

std::atomic<int> nobodyDetached = 0;  // how often it was tried with a word that names no thread
std::atomic<pthread_t> latestDetached = 0;
std::function<void()> atDetach, atDetachState;  // called in the two functions below

}  // namespace

// In front of the C library's, of which some do not survive that.
extern "C" int pthread_detach(pthread_t thread) noexcept {
    static const auto real =
        reinterpret_cast<int (*)(pthread_t)>(dlsym(RTLD_NEXT, "pthread_detach"));
    if (thread == 0) ++nobodyDetached;
    latestDetached = thread;
    if (atDetach) atDetach();
    return real(thread);
}
extern "C" int pthread_attr_setdetachstate(pthread_attr_t* attributes, int state) noexcept {
    static const auto real = reinterpret_cast<int (*)(pthread_attr_t*, int)>(
        dlsym(RTLD_NEXT, "pthread_attr_setdetachstate"));
    if (atDetachState) atDetachState();
    return real(attributes, state);
}

namespace {

using plexortest::CapturedSyslog;
using plexortest::Gate;
using plexortest::GateOpener;
using plexortest::VirtualClock;
using testbed::Entry;

/// As the library is loaded: read before anything begins or ends.
const unsigned int lifeAtFirst = PresentLife();
const bool stoppedAtFirst = StopRequested();
const time_t completeAtFirst = InitCompleteTime;
const int initializedAtFirst = _ProviderInitialized;
const unsigned int inventoryAtFirst = ThreadActivityDone;
const unsigned int activeAtFirst = ActiveThreads;

TEST(LifeAtFirst, HasNotEnded) {
    EXPECT_EQ(lifeAtFirst, 1u);
    EXPECT_FALSE(stoppedAtFirst);
    EXPECT_EQ(completeAtFirst, 0) << "nothing has been initialised";
    EXPECT_EQ(initializedAtFirst, 0);
    EXPECT_EQ(inventoryAtFirst, 0u);
    EXPECT_EQ(activeAtFirst, 0u);
}

class LivesTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        presentVendor();
    }
    void TearDown() override {
        // What the stuck worker of a first life keeps is its own.
        gate_.open();
        EXPECT_TRUE(plexortest::WorkersMeet::untilIdle());
        givenUp_.reset();
        EntryTest::TearDown();
    }
    testbed::Response drives() {
        return testbed::InstanceClient(broker, &mi)
            .enumerateInstances("Tovexa_PlexorStorageExtent");
    }
    CMPIrc cleanUp() { return PlexorProviderCleanup(&mi, ctx(), 1).rc; }
    /// Lets the next walk over the batteries wait at the gate.
    void holdBatteryWalk() {
        testbed::FaultRule rule;
        rule.entry = Entry::Associators;
        rule.resultClass = "CIM_Battery";
        rule.times = 1;
        rule.hook = [this] {
            stuck_ = pthread_self();
            gate_.pass();
        };
        faults().add(rule);
    }
    /// Makes a worker of this life hang in a refresh of the batteries, then ends the life.
    void endLifeWithAStuckWorker() {
        holdBatteryWalk();
        VirtualClock::advance(100);
        testbed::InstanceClient(broker, &mi).enumerateInstances("Tovexa_PlexorBattery");
        ASSERT_TRUE(gate_.awaitArrivals(1));
        givenUp_.emplace();
        const plexortest::HurriedWaits hurry;
        EXPECT_EQ(cleanUp(), CMPI_RC_OK);
    }
    static std::size_t times(const std::string& line) { return CapturedSyslog::count(line); }

    Gate gate_;
    std::atomic<pthread_t> stuck_ = 0;  // the worker that hangs in the walk over the batteries
    std::optional<plexortest::GivenUpInventory> givenUp_;
};

TEST_F(LivesTest, TheSecondServesAndRefreshesCompletely) {
    callFactory();
    ASSERT_TRUE(inventoryTaken());
    settleWorkers();
    ASSERT_EQ(cleanUp(), CMPI_RC_OK);
    EXPECT_EQ(TerminateThread, 1u);
    EXPECT_EQ(plexortest::threadActivityDone(), 1u) << "kept for whoever looks at it";

    callFactory();
    EXPECT_TRUE(plexortest::eventually([this] { return drives().instances.size() == 1; }));
    EXPECT_TRUE(plexortest::eventually([] { return times("DoBuildDeviceInfoAsync done.") == 2; }));
    vendor.battery(vendor.controller("C0"), "b2");
    VirtualClock::advance(100);
    testbed::InstanceClient client(broker, &mi);
    EXPECT_TRUE(plexortest::eventually(
        [&] { return client.enumerateInstances("Tovexa_PlexorBattery").instances.size() == 2; }));
    EXPECT_EQ(TerminateThread, 1u);
}

TEST_F(LivesTest, ARefreshWaitsForTheSecondsOwnInventory) {
    callFactory();
    ASSERT_TRUE(inventoryTaken());
    settleWorkers();
    ASSERT_EQ(cleanUp(), CMPI_RC_OK);
    testbed::FaultRule rule;
    rule.entry = Entry::Associators;
    rule.assocClass = "CIM_HostedStoragePool";
    rule.times = 1;
    rule.hook = [this] { gate_.pass(); };
    faults().add(rule);
    callFactory();
    RaidController_t* const ctrl = firstController();
    ctrl->BatteryUpdateTime = 0;
    ASSERT_TRUE(gate_.awaitArrivals(1));
    EXPECT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 103), 0);
    EXPECT_EQ(times("HandleDeviceConfigChange: BuildDeviceInfoAsync is still running, skip action "
                    "103\n"),
              1u);
}

TEST_F(LivesTest, TheSecondIsCompleteBesideAStuckWorkerOfTheFirst) {
    callFactory();
    ASSERT_TRUE(inventoryTaken());
    settleWorkers();
    endLifeWithAStuckWorker();
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR).back(),
              "PlexorProviderCleanup: a worker is still busy, the inventory stays in memory\n");
    const std::size_t given = books().liveClones();
    EXPECT_GT(given, 0u);

    latestDetached = 0;
    callFactory();
    ASSERT_TRUE(plexortest::eventually([] { return times("DoBuildDeviceInfoAsync done.") == 2; }))
        << "the stuck worker is not waited for";
    EXPECT_EQ(latestDetached, stuck_) << "nobody will join it any more";
    EXPECT_EQ(drives().instances.size(), 1u);
    EXPECT_GT(books().liveClones(), given);

    // It comes back when the second life has long begun: it leaves, touching nothing.
    const std::size_t exits = CapturedSyslog::countContaining(" exiting...\n");
    gate_.open();
    EXPECT_TRUE(plexortest::eventually(
        [&] { return CapturedSyslog::countContaining(" exiting...\n") == exits + 1; }));
    EXPECT_EQ(drives().instances.size(), 1u);
}

TEST_F(LivesTest, AWorkerWhoseWordWasResetIsNotDetachedByTheNextLife) {
    callFactory();
    ASSERT_TRUE(inventoryTaken());
    settleWorkers();
    endLifeWithAStuckWorker();
    PlexorThreads[0] = PlexorThreads[1] = 0;
    callFactory();
    ASSERT_TRUE(plexortest::eventually([] { return times("DoBuildDeviceInfoAsync done.") == 2; }));
    gate_.open();
    EXPECT_EQ(pthread_join(stuck_, nullptr), 0);
    EXPECT_EQ(nobodyDetached, 0);
    EXPECT_EQ(drives().instances.size(), 1u);
}

/// What a life stores or starts is there before its stop begins, or not at all.
class LifeStopTest : public plexortest::EntryTest {
protected:
    /// Asks for the stop on a thread of its own, and notes whether that thread has to wait. Only
    /// the first time.
    void stopMeanwhile() {
        if (stop_.valid()) return;
        stop_ = std::async(std::launch::async, RequestStop);
        waited_ = stop_.wait_for(std::chrono::milliseconds(50)) == std::future_status::timeout;
    }
    void stopWhileAListGrows() {
        CapturedSyslog::onLine([this](const plexortest::LogLine& line) {
            if (line.text.starts_with("Adding data ")) stopMeanwhile();
        });
    }
    bool stopHadToWait() {
        EXPECT_TRUE(stop_.valid()) << "nobody has stopped";
        if (stop_.valid()) stop_.wait();
        return waited_;
    }

private:
    std::future<void> stop_;
    bool waited_ = false;
};

TEST_F(LifeStopTest, EndsItsMembersAndNobodyElse) {
    EXPECT_FALSE(LifeGuard().MemberOfEnded());
    {
        const LifeMember always;
        const LifeMember unlessEnded(LifeMember::When::kUnlessEnded);
        EXPECT_FALSE(LifeGuard().MemberOfEnded()) << "it stands";
        RequestStop();
        EXPECT_TRUE(LifeGuard().MemberOfEnded());
    }
    EXPECT_FALSE(LifeGuard().MemberOfEnded());
    {
        const LifeMember unlessEnded(LifeMember::When::kUnlessEnded);
        EXPECT_FALSE(LifeGuard().MemberOfEnded()) << "it has ended";
        const LifeMember always;
        EXPECT_TRUE(LifeGuard().MemberOfEnded());
    }
    BeginWork();
    const LifeMember unlessEnded(LifeMember::When::kUnlessEnded);
    RequestStop();
    EXPECT_TRUE(LifeGuard().MemberOfEnded());
}

TEST_F(LifeStopTest, WaitsUntilAControllerIsInTheList) {
    const testbed::ObjectPath profile = vendor.profile();
    vendor.controller("C0", profile);
    Array_t profiles = {};
    profiles.Array[profiles.Count++] = broker.makeInstance(repository.get(profile).value());
    stopWhileAListGrows();
    BuildControllerInfo(&mi, ctx(), &profiles);
    EXPECT_TRUE(stopHadToWait());
    EXPECT_EQ(controllers(), 1u);
}

TEST_F(LifeStopTest, DoesNotWaitForAManagerThatHangsInTheHostsNames) {
    vendor.host();
    testbed::FaultRule rule;
    rule.entry = Entry::InstanceGetProperty;
    rule.hook = [this] { stopMeanwhile(); };
    faults().add(rule);
    EXPECT_EQ(InitSystemInfo(&mi, ctx()), -100);
    EXPECT_FALSE(stopHadToWait());
    EXPECT_EQ(GetSystemName(), nullptr) << "they are not this life's any more";
    EXPECT_EQ(GetHostName(), nullptr);
    EXPECT_EQ(GetSystemClassName(), nullptr);
}

TEST_F(LifeStopTest, WaitsUntilTheThreadsArePrepared) {
    // Only what a member of a life starts is refused when it is over.
    const LifeMember member;
    atDetachState = [this] { stopMeanwhile(); };
    InitPlexorThreads(ctx());
    atDetachState = nullptr;
    EXPECT_TRUE(stopHadToWait());
    CleanupPlexorThreads();
}

TEST_F(LifeStopTest, WaitsUntilAThreadIsStarted) {
    presentVendor();
    callFactory();
    ASSERT_TRUE(inventoryTaken());
    settleWorkers();
    Gate gate;
    testbed::FaultRule rule = waitingAt(Entry::Associators, gate);
    rule.resultClass = "CIM_Battery";
    faults().add(rule);
    VirtualClock::advance(100);
    testbed::InstanceClient(broker, &mi).enumerateInstances("Tovexa_PlexorBattery");
    ASSERT_TRUE(gate.awaitArrivals(1));
    const plexortest::GivenUpInventory givenUp;
    {
        const plexortest::HurriedWaits hurry;
        EXPECT_EQ(PlexorProviderCleanup(&mi, ctx(), 1).rc, CMPI_RC_OK);
    }
    atDetach = [this] { stopMeanwhile(); };
    callFactory();
    atDetach = nullptr;
    EXPECT_TRUE(stopHadToWait());
    // Whatever had been queued before the stop came.
    EXPECT_EQ(PlexorProviderCleanup(&mi, ctx(), 1).rc, CMPI_RC_OK);
    gate.open();
    EXPECT_TRUE(plexortest::WorkersMeet::untilIdle());
}

TEST_F(LifeStopTest, WaitsUntilTheNamesOfAHostWithoutAVendorAreReleased) {
    vendor.host();
    const char* name = nullptr;
    testbed::FaultRule profiles;
    profiles.entry = Entry::EnumerateInstances;
    profiles.keepResult = true;
    profiles.hook = [&name] { name = GetSystemName(); };
    faults().add(profiles);
    {
        const plexortest::FreeWatch watch([&](const void* block) {
            if (block != nullptr && block == name) stopMeanwhile();
        });
        callFactory();
    }
    EXPECT_NE(name, nullptr);
    EXPECT_TRUE(stopHadToWait());
}

TEST_F(LifeStopTest, WaitsUntilTheHostsNamesAreStored) {
    vendor.host();
    // What an earlier, incomplete reading has left is released before.
    __HostName = plexortest::ownedCopy("left over");
    {
        const plexortest::FreeWatch watch([this, left = __HostName](const void* block) {
            if (block == left) stopMeanwhile();
        });
        InitSystemInfo(&mi, ctx());
    }
    EXPECT_TRUE(stopHadToWait());
    EXPECT_STREQ(GetSystemName(), "host-uuid");
}

TEST_F(LifeStopTest, WaitsUntilAnItemIsQueued) {
    // Only what a member of a life queues is refused when it is over.
    const LifeMember member;
    stopWhileAListGrows();
    EXPECT_EQ(QueueItem(plexortest::zeroed<Thread_Args_t>()), 0);
    EXPECT_TRUE(stopHadToWait());
}

}  // namespace
