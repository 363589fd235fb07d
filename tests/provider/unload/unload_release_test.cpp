// The clean-up that is agreed to: what goes, in which order, and what comes after it.
#include <thread>
#include <vector>

#include "PlexorProviderCfg.h"
#include "entry_fixture.h"
#include "worker_harness.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::Gate;
using plexortest::GateOpener;
using plexortest::LogLine;
using plexortest::VirtualClock;
using plexortest::WorkersHeld;
using testbed::Entry;

/// What can be seen of the provider at one moment of the clean-up.
struct Glimpse {
    unsigned int controllers;
    bool hasIdentity;
    bool terminating;
    int initialized;

    bool operator==(const Glimpse&) const = default;
};

void PrintTo(const Glimpse& glimpse, std::ostream* out) {
    *out << glimpse.controllers << " controllers, identity " << glimpse.hasIdentity
         << ", terminating " << glimpse.terminating << ", initialized " << glimpse.initialized;
}

class UnloadReleaseTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        presentVendor();
        callFactory();
        ASSERT_EQ(controllers(), 1u);
        settleWorkers();
        CapturedSyslog::clear();
        books().clearCalls();
    }
    static Glimpse glimpse() {
        return {controllers(), GetSystemName() != nullptr, terminating(), initialized()};
    }
    CMPIStatus cleanUp(bool terminate = false) {
        return PlexorProviderCleanup(&mi, ctx(), static_cast<CMPIBoolean>(terminate));
    }
};

TEST_F(UnloadReleaseTest, FreesInventoryIdentityAndWorkers) {
    EXPECT_EQ(glimpse(), (Glimpse{1, true, false, 1}));
    const CMPIStatus status = cleanUp();
    EXPECT_EQ(status.rc, 0);
    EXPECT_EQ(status.msg, nullptr);
    EXPECT_EQ(glimpse(), (Glimpse{0, false, true, 0}));
    EXPECT_EQ(GetHostName(), nullptr);
    EXPECT_EQ(GetSystemClassName(), nullptr);
    EXPECT_EQ(books().liveClones(), 0u);
    EXPECT_TRUE(plexortest::logged(LOG_DEBUG, "Thread 0 exiting...\n"));
    EXPECT_TRUE(plexortest::logged(LOG_DEBUG, "Thread 1 exiting...\n"));
    EXPECT_EQ(books().count(Entry::DetachThread), 2u);
}

TEST_F(UnloadReleaseTest, BeginsAndEndsWithItsOwnLines) {
    cleanUp();
    const std::vector<LogLine> lines = linesHere();
    EXPECT_EQ(lines.front(), (LogLine{LOG_DEBUG, "PlexorProviderCleanup: ENTER...\n"}));
    EXPECT_EQ(lines.back(), (LogLine{LOG_DEBUG, "PlexorProviderCleanup: EXIT\n"}));
    EXPECT_EQ(CapturedSyslog::countContaining("idle timer"), 0u);
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR), std::vector<std::string>{});
}

TEST_F(UnloadReleaseTest, InventoryThenIdentityThenWorkersThenTheMark) {
    std::vector<Glimpse> seen;
    // While a controller goes; then in the sleep that gives the workers time to leave.
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text == "Controller Model C0 (C0) deleted\n") seen.push_back(glimpse());
    });
    VirtualClock::onSleep([&](unsigned int) { seen.push_back(glimpse()); });
    cleanUp();
    EXPECT_EQ(seen, (std::vector<Glimpse>{{0, true, false, 1}, {0, false, true, 1}}));
}

TEST_F(UnloadReleaseTest, TheMarkGoesBeforeTheExitIsLogged) {
    int atExit = -1;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text == "PlexorProviderCleanup: EXIT\n") atExit = initialized();
    });
    cleanUp();
    EXPECT_EQ(atExit, 0);
}

TEST_F(UnloadReleaseTest, ControllersGoThroughTheListsRelease) {
    cleanUp();
    EXPECT_TRUE(plexortest::loggedInOrder({
        {LOG_DEBUG, "PlexorProviderCleanup: ENTER...\n"},
        {LOG_DEBUG, plexortest::formatted("Freeing list %p, release function %p\n",
                                          static_cast<void*>(RaidControllerList),
                                          reinterpret_cast<void*>(FreeController))},
        {LOG_DEBUG, "Controller Model C0 (C0) deleted\n"},
        {LOG_DEBUG, "PlexorProviderCleanup: EXIT\n"},
    }));
}

TEST_F(UnloadReleaseTest, SleepsThreeSecondsOnce) {
    cleanUp();
    std::vector<unsigned int> slept;
    for (const plexortest::Sleep& sleep : VirtualClock::sleeps()) {
        if (sleep.thread == std::this_thread::get_id()) slept.push_back(sleep.seconds);
    }
    EXPECT_EQ(slept, (std::vector<unsigned int>{3}));
}

TEST_F(UnloadReleaseTest, TerminatingReleasesTheSame) {
    ResetNextUnloadTime();
    EXPECT_EQ(cleanUp(true).rc, 0);
    EXPECT_EQ(glimpse(), (Glimpse{0, false, true, 0}));
    EXPECT_EQ(books().liveClones(), 0u);
}

TEST_F(UnloadReleaseTest, LeavesTheTimerAsItWas) {
    NextUnloadTime = kStart - 77;
    cleanUp();
    EXPECT_EQ(NextUnloadTime, kStart - 77);
    EXPECT_EQ(IdleTimeBeforeTerminating, 5u);
}

TEST_F(UnloadReleaseTest, AsksTheBrokerNothing) {
    cleanUp();
    EXPECT_TRUE(upCalls().empty());
}

TEST_F(UnloadReleaseTest, AgainItFindsNothingAndAgrees) {
    cleanUp();
    EXPECT_EQ(cleanUp().rc, 0);
    EXPECT_EQ(glimpse(), (Glimpse{0, false, true, 0}));
}

TEST_F(UnloadReleaseTest, TheFactoryBuildsAnewAfterwards) {
    unloadAndForget();
    CapturedSyslog::clear();
    callFactory();
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 1u);
    EXPECT_STREQ(GetSystemName(), "host-uuid");
    EXPECT_TRUE(plexortest::logged(LOG_DEBUG, "PlexorInit: EXIT\n"));
    ASSERT_TRUE(inventoryTaken());
    EXPECT_EQ(firstController()->VolumeList->Size, 1u);
}

TEST_F(UnloadReleaseTest, RequestsAfterItFindNothing) {
    cleanUp();
    testbed::InstanceClient client(broker, &mi);
    const testbed::Response response = client.enumerateInstances("Tovexa_PlexorController");
    EXPECT_EQ(response.rc, 0);
    EXPECT_TRUE(response.instances.empty());
}

TEST_F(UnloadReleaseTest, WorkLeftInTheQueueIsDropped) {
    auto* item = plexortest::zeroed<Thread_Args_t>();
    item->Func = ProcessBuildLogicalDeviceInfo;
    item->Arg0 = reinterpret_cast<uintptr_t>(firstController());
    item->Arg3 = reinterpret_cast<uintptr_t>(clonedPath({"root/sample", "CIM_Battery", {}}));
    item->Arg4 = reinterpret_cast<uintptr_t>(clonedInstance({{"root/sample", "X", {}}, {}}));
    PutItem(&__FIFO, item);
    cleanUp();
    EXPECT_TRUE(IsFifoEmpty(&__FIFO));
    EXPECT_EQ(books().liveClones(), 0u);
}

// The manager's answer must wait: what a worker is reading must not go under its hands.
TEST_F(UnloadReleaseTest, WaitsForTheWorkThatIsRunning) {
    Gate gate;
    testbed::FaultRule slow = waitingAt(Entry::Associators, gate);
    slow.assocClass = "CIM_SystemDevice";
    faults().add(slow);
    const GateOpener opener(gate);
    VirtualClock::advance(100);
    testbed::InstanceClient client(broker, &mi);
    client.enumerateInstances("Tovexa_PlexorBattery");
    ASSERT_TRUE(gate.awaitArrivals(1));

    std::atomic<bool> freed = false;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text.starts_with("Controller Model C0")) freed = true;
    });
    std::thread manager([&] { client.cleanup(true); });
    EXPECT_TRUE(plexortest::eventually(
        [] { return CapturedSyslog::count("PlexorProviderCleanup: ENTER...\n") == 1; }));
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_FALSE(freed);

    gate.open();
    manager.join();
    EXPECT_TRUE(freed);
    EXPECT_EQ(controllers(), 0u);
    EXPECT_EQ(books().liveClones(), 0u);
}

// Workers that are so slow to begin that the call to stop comes before their first wait.
class UnloadEarlyTest : public plexortest::EntryTest {};

TEST_F(UnloadEarlyTest, WorkersThatBeginOnlyNowLeaveToo) {
    presentVendor();
    Gate gate;
    testbed::FaultRule slow;
    slow.entry = Entry::AttachThread;
    slow.skip = 1;  // the factory's own
    slow.hook = [&gate] { gate.pass(); };
    faults().add(slow);
    const GateOpener opener(gate);
    callFactory();
    ASSERT_TRUE(gate.awaitArrivals(2));
    VirtualClock::onSleep([&gate](unsigned int) { gate.open(); });
    EXPECT_EQ(PlexorProviderCleanup(&mi, ctx(), 1).rc, 0);
    EXPECT_TRUE(plexortest::logged(LOG_DEBUG, "Thread 0 exiting...\n"));
    EXPECT_TRUE(plexortest::logged(LOG_DEBUG, "Thread 1 exiting...\n"));
    EXPECT_EQ(books().liveClones(), 0u);
}

// Clean-up of a provider whose initialisation failed: no workers, no identity, no list.
class UnloadOfNothingTest : public plexortest::EntryTest {};

TEST_F(UnloadOfNothingTest, IsAgreedAtOnce) {
    callFactory();
    ASSERT_EQ(initialized(), 0);
    ResetNextUnloadTime();
    CapturedSyslog::clear();
    EXPECT_EQ(PlexorProviderCleanup(&mi, ctx(), 0).rc, 0);
    EXPECT_TRUE(plexortest::loggedInOrder({
        {LOG_DEBUG, "PlexorProviderCleanup: ENTER...\n"},
        {LOG_DEBUG,
         plexortest::formatted("List %p is empty\n", static_cast<void*>(RaidControllerList))},
        {LOG_DEBUG, "PlexorProviderCleanup: EXIT\n"},
    }));
    EXPECT_TRUE(terminating());
}

TEST_F(UnloadOfNothingTest, NullArgumentsAreNotLookedAt) {
    EXPECT_EQ(PlexorProviderCleanup(nullptr, nullptr, 0).rc, 0);
}

}  // namespace
