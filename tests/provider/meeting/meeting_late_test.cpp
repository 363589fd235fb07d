// Calls that come back, or come in, when a cleanup no longer waits for them.
#include <thread>

#include "library_pins.h"
#include "meeting_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::Gate;
using plexortest::GateOpener;
using plexortest::GivenUpInventory;
using plexortest::HurriedWaits;
using plexortest::libraryPins;
using plexortest::VirtualClock;
using testbed::Entry;

class LateCallsTest : public plexortest::MeetingTest {
protected:
    /// A cleanup whose waits are hurried.
    void cleanUpSoon() {
        const HurriedWaits hurry;
        EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    }
    static bool servesOneDrive(LateCallsTest& test) {
        return plexortest::eventually([&test] { return test.requestDrives().get() == 1; });
    }
    static std::size_t givenUpLines() { return CapturedSyslog::countContaining("still busy"); }
};

TEST_F(LateCallsTest, AnInitialisationThatHangsBeforeItsWorkersLeavesTheNextLifeAlone) {
    Gate gate;
    testbed::FaultRule slow = waitingAt(Entry::PrepareAttachThread, gate);
    slow.skip = 1;  // the factory's own
    faults().add(slow);
    auto late = callFactoryElsewhere();
    ASSERT_TRUE(gate.awaitArrivals(1));
    const GivenUpInventory givenUp;
    cleanUpSoon();
    EXPECT_EQ(givenUpLines(), 1u);

    callFactory();
    ASSERT_TRUE(inventoryTaken());
    settleWorkers();
    gate.open();
    late.get();
    EXPECT_EQ(CapturedSyslog::countContaining("thread 0 created"), 1u);
    EXPECT_TRUE(IsFifoEmpty(&__FIFO));
    EXPECT_TRUE(plexortest::WorkersMeet::letMeet(2)) << "both workers are this life's";
    EXPECT_EQ(CapturedSyslog::count("DoBuildDeviceInfoAsync done."), 1u);
    EXPECT_EQ(requestDrives().get(), 1u);
    EXPECT_EQ(firstController()->DiskList->Size, 1u);
    const HurriedWaits watched(HurriedWaits::Joins);
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(HurriedWaits::joins().size(), 2u) << "it still knows its workers";
}

TEST_F(LateCallsTest, ACleanupOvertakesAFactoryCallThatWaitsForARequest) {
    Gate gate;
    auto request = requestHeldAt(Entry::ResultReturnDone, gate);
    auto overtaken = callFactoryElsewhere();
    ASSERT_TRUE(plexortest::eventually(
        [] { return CapturedSyslog::count("PlexorInit: ENTER...\n") == 1; }));
    EXPECT_TRUE(stillWaits(overtaken));
    cleanUpSoon();
    EXPECT_NE(overtaken.get(), nullptr);
    EXPECT_EQ(initialized(), 0);
    EXPECT_EQ(CapturedSyslog::count("InitSystemInfo: entering...\n"), 0u);

    callFactory();
    gate.open();
    request.get();
    EXPECT_EQ(controllers(), 1u);
    EXPECT_TRUE(servesOneDrive(*this));
    EXPECT_EQ(CapturedSyslog::countContaining("thread 0 created"), 1u);
}

TEST_F(LateCallsTest, OneFactoryCallWaitsForAHangingRequestAndNoneAfterIt) {
    Gate gate;
    const GateOpener opener(gate);
    auto request = requestHeldAt(Entry::ResultReturnDone, gate);
    faults().add(refusal(Entry::EnumerateInstances));
    {
        const HurriedWaits watched;
        callFactory();
        EXPECT_FALSE(HurriedWaits::otherWaits().empty());
    }
    ASSERT_EQ(initialized(), 0) << "no host was found";
    faults().clear();
    {
        const HurriedWaits watched;
        callFactory();
        EXPECT_TRUE(HurriedWaits::otherWaits().empty());
    }
    ASSERT_NE(initialized(), 0);
    gate.open();
    request.get();
    EXPECT_TRUE(servesOneDrive(*this));
}

TEST_F(LateCallsTest, AHangingRequestCostsItsOwnLifeOnly) {
    load();
    Gate gate;
    auto request = requestHeldAt(Entry::NewInstance, gate);
    const GivenUpInventory givenUp;
    const int pins = libraryPins();
    cleanUpSoon();
    ASSERT_EQ(givenUpLines(), 1u);
    EXPECT_GT(libraryPins(), pins) << "it is inside the library";
    const std::size_t clones = books().liveClones();

    {
        const HurriedWaits watched;
        callFactory();
        EXPECT_TRUE(HurriedWaits::otherWaits().empty()) << "the next life does not wait for it";
    }
    ASSERT_TRUE(servesOneDrive(*this));
    plexortest::WorkersMeet::untilIdle();
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(givenUpLines(), 1u);
    EXPECT_EQ(books().liveClones(), clones) << "released, as if nobody hung";
    gate.open();
    EXPECT_EQ(request.get(), 1u);
}

TEST_F(LateCallsTest, ARequestThatWasGivenUpQueuesNothingForTheNextLife) {
    load();
    Gate gate;
    VirtualClock::advance(1000);
    auto request = requestHeldAt(Entry::NewInstance, gate);
    const GivenUpInventory givenUp;
    cleanUpSoon();
    callFactory();
    ASSERT_TRUE(plexortest::eventually(
        [] { return CapturedSyslog::count("DoBuildDeviceInfoAsync done.") == 1; }));
    settleWorkers();
    gate.open();
    request.get();
    EXPECT_TRUE(plexortest::WorkersMeet::untilIdle());
    EXPECT_EQ(CapturedSyslog::countContaining("ProcessDeviceConfigChange, ENTER"), 0u);
}

TEST_F(LateCallsTest, ACleanupDoesNotWaitForRequestsThatComeAfterIt) {
    load();
    Gate before, after;
    auto first = requestHeldAt(Entry::NewInstance, before);
    auto cleanup = cleanupThatWaits(true);
    const GateOpener opener(after);
    auto second = requestHeldAt(Entry::ResultReturnDone, after);
    const int pins = libraryPins();
    before.open();
    EXPECT_EQ(first.get(), 1u);
    EXPECT_EQ(cleanup.get(), CMPI_RC_OK);
    EXPECT_EQ(givenUpLines(), 0u);
    EXPECT_GT(libraryPins(), pins) << "the second is still inside the library";
    after.open();
    EXPECT_EQ(second.get(), 0u);
}

TEST_F(LateCallsTest, AQuietCleanupLetsTheLibraryGo) {
    load();
    const int pins = libraryPins();
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(libraryPins(), pins);
}

TEST_F(LateCallsTest, ATerminatingCleanupHurriesTheOneThatIsUnderWay) {
    load();
    Gate gate;
    auto request = requestHeldAt(Entry::NewInstance, gate);
    VirtualClock::advance(1000);
    auto idle = cleanupThatWaits(false);
    const GivenUpInventory givenUp;
    {
        const HurriedWaits hurry;
        EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
        EXPECT_EQ(idle.get(), CMPI_RC_OK);
        ASSERT_FALSE(HurriedWaits::otherWaits().empty());
        EXPECT_LE(HurriedWaits::otherWaits().front(), std::chrono::seconds(3));
    }
    EXPECT_EQ(givenUpLines(), 1u);
    gate.open();
    request.get();
}

TEST_F(LateCallsTest, ATerminatingCleanupHurriesOneThatWaitsForAWorker) {
    load();
    Gate gate;
    testbed::FaultRule slow = waitingAt(Entry::Associators, gate);
    slow.resultClass = "CIM_DiskDrive";
    faults().add(slow);
    VirtualClock::advance(1000);
    requestDrives().get();
    ASSERT_TRUE(gate.awaitArrivals(1));
    VirtualClock::advance(1000);
    auto idle = cleanupThatWaits(false);
    const GivenUpInventory givenUp;
    const auto begin = std::chrono::steady_clock::now();
    cleanUpSoon();
    EXPECT_EQ(idle.get(), CMPI_RC_OK);
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(20))
        << "its own 30 seconds";
    EXPECT_EQ(givenUpLines(), 1u);
    gate.open();
    EXPECT_TRUE(plexortest::WorkersMeet::untilIdle());
}

TEST_F(LateCallsTest, AnIdleCleanupJoinsATerminatingOne) {
    load();
    Gate gate;
    const GateOpener opener(gate);
    auto request = requestHeldAt(Entry::NewInstance, gate);
    auto terminating = cleanupThatWaits(true);
    auto idle = cleanUpElsewhere(false);
    ASSERT_TRUE(cleanupsInside(2));
    EXPECT_TRUE(stillWaits(idle)) << "it was not refused";
    gate.open();
    request.get();
    EXPECT_EQ(terminating.get(), CMPI_RC_OK);
    EXPECT_EQ(idle.get(), CMPI_RC_OK);
    EXPECT_EQ(CapturedSyslog::countContaining("idle timer("), 0u);
}

}  // namespace
