// Requests, factory calls and cleanups that meet on several threads.
#include <stdlib.h>

#include <atomic>
#include <iostream>
#include <optional>
#include <thread>
#include <vector>

#include "meeting_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::Gate;
using plexortest::GateOpener;
using plexortest::HurriedWaits;
using testbed::Entry;

using MeetingCallsTest = plexortest::MeetingTest;

TEST_F(MeetingCallsTest, TheReleaseWaitsForARequest) {
    load();
    Gate gate;
    const GateOpener opener(gate);
    auto request = requestHeldAt(Entry::NewInstance, gate);
    auto cleanup = cleanupThatWaits(true);
    EXPECT_EQ(CapturedSyslog::countContaining(" deleted\n"), 0u);
    gate.open();
    EXPECT_EQ(request.get(), 1u) << "complete";
    EXPECT_EQ(cleanup.get(), CMPI_RC_OK);
    EXPECT_EQ(controllers(), 0u);
}

TEST_F(MeetingCallsTest, TheReleaseWaitsForAGet) {
    load();
    testbed::InstanceClient client(broker, &mi);
    const auto drives = client.enumerateInstanceNames("Tovexa_PlexorStorageExtent").paths;
    ASSERT_EQ(drives.size(), 1u);
    Gate gate;
    const GateOpener opener(gate);
    faults().add(waitingAt(Entry::NewInstance, gate));
    auto get = std::async(std::launch::async,
                          [&] { return client.getInstance(drives[0]).instances.size(); });
    ASSERT_TRUE(gate.awaitArrivals(1));
    auto cleanup = cleanupThatWaits(true);
    EXPECT_EQ(CapturedSyslog::countContaining(" deleted\n"), 0u);
    gate.open();
    EXPECT_EQ(get.get(), 1u) << "complete";
    EXPECT_EQ(cleanup.get(), CMPI_RC_OK);
}

TEST_F(MeetingCallsTest, ARequestThatBeginsDuringACleanupFindsNothing) {
    load();
    std::size_t seen = 99;
    CapturedSyslog::onLine([&](const plexortest::LogLine& line) {
        if (line.text.starts_with("Controller Model C0")) seen = requestDrives().get();
    });
    testbed::InstanceClient(broker, &mi).cleanup(true);
    EXPECT_EQ(seen, 0u);
}

TEST_F(MeetingCallsTest, AHangingRequestKeepsWhatItUses) {
    load();
    Gate gate;
    auto request = requestHeldAt(Entry::NewInstance, gate);
    const RaidController_t* const used = firstController();
    plexortest::VirtualClock::advance(1000);
    const plexortest::GivenUpInventory givenUp;
    {
        const HurriedWaits hurry;
        EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(false), CMPI_RC_OK);
        EXPECT_LE(HurriedWaits::otherWaits().front(), std::chrono::seconds(30));
    }
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR).back(),
              "PlexorProviderCleanup: a request is still busy, the inventory stays in memory\n");
    EXPECT_EQ(controllers(), 0u);
    EXPECT_EQ(GetSystemName(), nullptr);
    EXPECT_STREQ(used->DeviceID, "C0");
    EXPECT_GT(books().liveClones(), 0u);
    gate.open();
    EXPECT_EQ(request.get(), 1u);
}

TEST_F(MeetingCallsTest, TerminatingItWaitsThreeSeconds) {
    load();
    Gate gate;
    auto request = requestHeldAt(Entry::NewInstance, gate);
    const plexortest::GivenUpInventory givenUp;
    {
        const HurriedWaits hurry;
        EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
        const auto waits = HurriedWaits::otherWaits();
        ASSERT_FALSE(waits.empty());
        EXPECT_LE(waits.front(), std::chrono::seconds(3));
        EXPECT_GE(waits.front(), std::chrono::seconds(2));
    }
    gate.open();
    request.get();
}

TEST_F(MeetingCallsTest, ACleanupEndsTheInitialisationAfterItsVendorCall) {
    Gate gate;
    const GateOpener opener(gate);
    auto factory = factoryHeldAtTheProfiles(gate);
    auto cleanup = cleanupThatWaits(true);
    gate.open();
    EXPECT_NE(factory.get(), nullptr);
    EXPECT_EQ(cleanup.get(), CMPI_RC_OK);
    EXPECT_EQ(books().count(Entry::Associators), 0u) << "nothing more is asked";
    EXPECT_EQ(CapturedSyslog::countContaining("thread 0 created"), 0u);
    EXPECT_EQ(CapturedSyslog::countContaining("No instance of Host Hard RAID Controller"), 0u);
    EXPECT_EQ(initialized(), 0);
    EXPECT_EQ(controllers(), 0u);
    EXPECT_EQ(GetSystemName(), nullptr);
}

TEST_F(MeetingCallsTest, AFactoryCallThatWaitsForItsTurnLeavesWithTheCleanup) {
    Gate gate;
    const GateOpener opener(gate);
    auto first = factoryHeldAtTheProfiles(gate);
    auto second = callFactoryElsewhere();
    ASSERT_TRUE(plexortest::eventually(
        [] { return CapturedSyslog::count("PlexorInit: ENTER...\n") == 2; }));
    EXPECT_TRUE(stillWaits(second));
    auto cleanup = cleanUpElsewhere(true);
    EXPECT_NE(second.get(), nullptr) << "before the first has its answer";
    gate.open();
    first.get();
    EXPECT_EQ(cleanup.get(), CMPI_RC_OK);
    EXPECT_EQ(initialized(), 0);
    EXPECT_EQ(CapturedSyslog::count("InitSystemInfo: entering...\n"), 1u);
}

TEST_F(MeetingCallsTest, AFactoryCallDuringACleanupBuildsAnewAfterIt) {
    load();
    std::future<CMPIInstanceMI*> factory;
    CapturedSyslog::onLine([&](const plexortest::LogLine& line) {
        if (line.text.starts_with("Controller Model C0")) factory = callFactoryElsewhere();
    });
    testbed::InstanceClient(broker, &mi).cleanup(true);
    factory.get();
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 1u);
    CapturedSyslog::onLine(nullptr);
    EXPECT_TRUE(plexortest::eventually([this] { return requestDrives().get() == 1; }));
}

TEST_F(MeetingCallsTest, AnInitialisationThatHangsIsGivenUp) {
    Gate gate;
    testbed::FaultRule slow = waitingAt(Entry::Associators, gate);
    slow.assocClass = "CIM_Realizes";
    faults().add(slow);
    auto factory = callFactoryElsewhere();
    ASSERT_TRUE(gate.awaitArrivals(1));
    const plexortest::GivenUpInventory givenUp;
    {
        const HurriedWaits hurry;
        EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    }
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR).back(),
              "PlexorProviderCleanup: a factory call is still busy, the inventory stays in "
              "memory\n");
    // Its answer comes when the next life has begun, and changes nothing there.
    callFactory();
    EXPECT_EQ(controllers(), 1u);
    gate.open();
    factory.get();
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(CapturedSyslog::countContaining("thread 0 created"), 1u);
    EXPECT_TRUE(plexortest::eventually([this] { return requestDrives().get() == 1; }));
}

TEST_F(MeetingCallsTest, NineCleanupsAtOnceAreOne) {
    load();
    Gate gate;
    plexortest::VirtualClock::onSleep([&gate](unsigned int) { gate.pass(); });
    std::vector<std::future<CMPIrc>> cleanups;
    for (int i = 0; i < 9; i++) cleanups.push_back(cleanUpElsewhere(true));
    ASSERT_TRUE(cleanupsInside(9));
    ASSERT_TRUE(gate.awaitArrivals(1));
    for (const auto& cleanup : cleanups) EXPECT_TRUE(stillWaits(cleanup));
    gate.open();
    for (auto& cleanup : cleanups) EXPECT_EQ(cleanup.get(), CMPI_RC_OK);
    EXPECT_EQ(CapturedSyslog::countContaining("Controller Model C0"), 1u);
    EXPECT_EQ(CapturedSyslog::count("PlexorProviderCleanup: EXIT\n"), 9u);
    int exitWaits = 0;
    for (const plexortest::Sleep& sleep : plexortest::VirtualClock::sleeps()) {
        if (sleep.seconds == 3) exitWaits++;
    }
    EXPECT_EQ(exitWaits, 1);
}

// For the sanitizers: everything at once, at any moment. With PLEXOR_LONG ten minutes with a vendor
// that takes up to five seconds for an answer: then cleanups give up what is still used.
TEST_F(MeetingCallsTest, EverythingAtOnce) {
    const bool isLong = getenv("PLEXOR_LONG") != nullptr;
    const auto end = std::chrono::steady_clock::now() +
                     (isLong ? std::chrono::seconds(600) : std::chrono::seconds(1));
    faults().setLatency(std::chrono::milliseconds(0), std::chrono::milliseconds(isLong ? 5000 : 3));
    CapturedSyslog::discard(true);
    std::atomic<bool> over = false;
    std::atomic<std::size_t> requests = 0, factories = 0, cleanups = 0;
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; i++) {
        threads.emplace_back([&] {
            for (; !over; ++requests) {
                EXPECT_LE(testbed::InstanceClient(broker, &mi)
                              .enumerateInstances("Tovexa_PlexorStorageExtent")
                              .instances.size(),
                          1u);
                std::this_thread::sleep_for(std::chrono::milliseconds(1));
            }
        });
    }
    for (int i = 0; i < 3; i++) {
        threads.emplace_back([&] {
            for (; !over; ++factories) {
                const testbed::Broker::CallScope scope(broker);
                EXPECT_NE(
                    PlexorProvider_Create_InstanceMI(broker.handle(), scope.context(), nullptr),
                    nullptr);
                std::this_thread::sleep_for(std::chrono::milliseconds(1));
            }
        });
        threads.emplace_back([&, i] {
            for (; !over; ++cleanups) {
                EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
                std::this_thread::sleep_for(std::chrono::milliseconds((isLong ? 1500 : 5) * i));
            }
        });
    }
    std::this_thread::sleep_until(end);
    over = true;
    for (std::thread& thread : threads) thread.join();
    faults().setLatency(std::chrono::milliseconds(0), std::chrono::milliseconds(0));
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(controllers(), 0u);
    EXPECT_TRUE(plexortest::WorkersMeet::untilIdle());
    if (isLong) expectLeftClones(books().liveClones());
    std::cout << requests << " requests, " << factories << " factory calls, " << cleanups
              << " cleanups, " << books().liveClones() << " clones given up" << std::endl;
}

TEST_F(MeetingCallsTest, ACleanupFromWithinTheSearchGivesTheSearchUp) {
    std::optional<plexortest::GivenUpInventory> givenUp;
    testbed::FaultRule asked;
    asked.entry = Entry::EnumerateInstances;
    asked.className = "CIM_RegisteredProfile";
    asked.times = 1;
    asked.hook = [this, &givenUp] {
        givenUp.emplace();
        const plexortest::HurriedWaits watched;
        EXPECT_EQ(PlexorProviderCleanup(&mi, ctx(), 1).rc, CMPI_RC_OK);
        EXPECT_TRUE(plexortest::HurriedWaits::otherWaits().empty()) << "it would wait for itself";
    };
    faults().add(asked);
    callFactory();
    EXPECT_EQ(initialized(), 0);
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR),
              std::vector<std::string>{"PlexorProviderCleanup: a factory call is still busy, the "
                                       "inventory stays in memory\n"});

    CapturedSyslog::clear();
    load();
    EXPECT_EQ(requestDrives().get(), 1u);
}

TEST_F(MeetingCallsTest, AFactoryCallThatHasNotComeToItsTurnIsGivenUp) {
    Gate gate;
    const GateOpener opener(gate);
    CapturedSyslog::onLine([&gate](const plexortest::LogLine& line) {
        if (line.text == "PlexorInit: ENTER...\n") gate.pass();
    });
    auto late = callFactoryElsewhere();
    ASSERT_TRUE(gate.awaitArrivals(1));
    {
        const plexortest::HurriedWaits hurry;
        EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    }
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR),
              std::vector<std::string>{"PlexorProviderCleanup: a factory call is still busy, the "
                                       "inventory stays in memory\n"});
    gate.open();
    EXPECT_NE(late.get(), nullptr);
    EXPECT_EQ(initialized(), 0) << "its life has ended";
    CapturedSyslog::onLine(nullptr);
    load();
    EXPECT_EQ(controllers(), 1u);
}

}  // namespace
