// Initialisation that fails: the provider stays loaded with an empty inventory, and the next
// factory call tries again.
#include <stdlib.h>

#include "entry_fixture.h"
#include "refresh_fixture.h"
#include "stop_at_line.h"

namespace {

using plexortest::Allocator;
using plexortest::CapturedSyslog;
using plexortest::FailAllocation;
using plexortest::LogLine;
using plexortest::VirtualClock;
using plexortest::WorkersHeld;
using testbed::Entry;

class EntryFailureTest : public plexortest::EntryTest {
protected:
    /// A rule for the calls of `entry` on one class.
    static testbed::FaultRule refuse(Entry entry, const char* className) {
        testbed::FaultRule rule = refusal(entry);
        rule.className = className;
        return rule;
    }
    /// What every failed initialisation has in common.
    void expectNoInventory() {
        const CMPIInstanceMI* made = nullptr;
        CMPIStatus status = {CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED, nullptr};
        VirtualClock::set(kStart + 99);
        books().clearCalls();
        CapturedSyslog::clear();

        made = callFactory(&status);

        ASSERT_NE(made, nullptr);
        EXPECT_EQ(made->ft, &instMIFT__);
        EXPECT_EQ(status.rc, CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED);
        EXPECT_EQ(initialized(), 0);
        EXPECT_EQ(controllers(), 0u);
        EXPECT_EQ(GetSystemName(), nullptr);
        EXPECT_EQ(GetHostName(), nullptr);
        EXPECT_EQ(GetSystemClassName(), nullptr);
        EXPECT_EQ(InitCompleteTime, kStart + 99);
        // The own context is given back, nothing was started.
        const std::vector<Entry> calls = upCalls();
        ASSERT_GE(calls.size(), 4u);
        EXPECT_EQ(calls[0], Entry::PrepareAttachThread);
        EXPECT_EQ(calls[1], Entry::AttachThread);
        EXPECT_EQ(calls[calls.size() - 2] == Entry::ContextFlush, plexortest::kContextHasFlush);
        EXPECT_EQ(calls.back(), Entry::DetachThread);
        EXPECT_EQ(countHere(Entry::PrepareAttachThread), 1u);
        EXPECT_EQ(CapturedSyslog::countContaining("InitPlexorThreads"), 0u);
        EXPECT_EQ(CapturedSyslog::countContaining("BuildControllerInfo"), 0u);
        EXPECT_EQ(CapturedSyslog::lines().back(), (LogLine{LOG_DEBUG, "PlexorInit: EXIT\n"}));
    }
    void expectNoIdentity(int rc) {
        expectNoInventory();
        EXPECT_TRUE(plexortest::loggedInOrder(
            {{LOG_DEBUG, "InitSystemInfo: entering...\n"},
             {LOG_ERR, plexortest::formatted("Cannot get system info, rc %d\n", rc)},
             {LOG_DEBUG, "PlexorInit: EXIT\n"}}));
        EXPECT_EQ(CapturedSyslog::countContaining("GetHHRCProfiles"), 0u);
        EXPECT_EQ(CapturedSyslog::countContaining("No instance of"), 0u);
    }
    void expectNoProfile(int rc) {
        expectNoInventory();
        EXPECT_TRUE(plexortest::loggedInOrder(
            {{LOG_DEBUG, "GetHHRCProfiles: entering...\n"},
             {LOG_INFO, plexortest::formatted(
                            "No instance of Host Hard RAID Controller is found, rc %d\n", rc)},
             {LOG_DEBUG, "PlexorInit: EXIT\n"}}));
        EXPECT_EQ(CapturedSyslog::countContaining("Cannot get system info"), 0u);
    }
};

TEST_F(EntryFailureTest, HostWithoutComputerSystem) {
    vendor.profile();
    expectNoIdentity(-100);
}

TEST_F(EntryFailureTest, HostThatCannotBeEnumerated) {
    presentVendor();
    faults().add(refuse(Entry::EnumerateInstances, "OMC_UnitaryComputerSystem"));
    expectNoIdentity(-100);
}

TEST_F(EntryFailureTest, HostWhosePathCannotBeMade) {
    presentVendor();
    testbed::FaultRule rule = refusal(Entry::NewObjectPath);
    rule.times = 1;
    faults().add(rule);
    expectNoIdentity(-2);
}

TEST_F(EntryFailureTest, HostWithoutTheProfile) {
    vendor.host();
    expectNoProfile(0);
}

TEST_F(EntryFailureTest, HostWithAnotherProfileOnly) {
    vendor.host();
    vendor.profile("Host Hard RAID Controller");
    expectNoProfile(0);
}

TEST_F(EntryFailureTest, ProfilesThatCannotBeEnumerated) {
    presentVendor();
    faults().add(refuse(Entry::EnumerateInstances, "CIM_RegisteredProfile"));
    expectNoProfile(0);
}

TEST_F(EntryFailureTest, ProfileClassWhosePathCannotBeMade) {
    presentVendor();
    testbed::FaultRule rule = refusal(Entry::NewObjectPath);
    rule.skip = 1;
    faults().add(rule);
    expectNoProfile(-2);
}

TEST_F(EntryFailureTest, MoreProfilesThanThereIsRoomFor) {
    vendor.host();
    for (char number = '1'; number <= '9'; number++) {
        vendor.profile("Host Hardware RAID Controller", std::string("profile-") + number);
    }
    expectNoProfile(-5);
}

// The identity goes only after the line has been written.
TEST_F(EntryFailureTest, IdentityIsReleasedAfterTheLine) {
    vendor.host();
    std::string during;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (!line.text.starts_with("No instance of")) return;
        during = GetSystemName() != nullptr ? GetSystemName() : "<null>";
    });
    callFactory();
    EXPECT_EQ(during, "host-uuid");
    EXPECT_EQ(GetSystemName(), nullptr);
}

TEST_F(EntryFailureTest, IsTakenBackBeforeTheContextGoes) {
    std::vector<int> initializedThen;
    testbed::FaultRule watch;
    for (const Entry entry : {Entry::ContextFlush, Entry::DetachThread}) {
        watch.entry = entry;
        watch.hook = [&] { initializedThen.push_back(initialized()); };
        faults().add(watch);
    }
    // A flush that is no call of the context is not seen here.
    const std::vector<int> expected(plexortest::kContextHasFlush ? 2 : 1, 0);
    callFactory();
    EXPECT_EQ(initializedThen, expected) << "no identity";
    vendor.host();
    initializedThen.clear();
    callFactory();
    EXPECT_EQ(initializedThen, expected) << "no profile";
}

TEST_F(EntryFailureTest, NextCallTriesAgain) {
    vendor.host();
    CMPIInstanceMI* first = callFactory();
    ASSERT_EQ(initialized(), 0);
    vendor.controller("C0", vendor.profile());
    EXPECT_EQ(callFactory(), first);
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(CapturedSyslog::count("PlexorInit: EXIT\n"), 2u);
}

// In a failed state requests are served from nothing, and nothing keeps the provider loaded.
TEST_F(EntryFailureTest, WithoutTheProfileRequestsFindNothingAndUnloadIsAgreed) {
    vendor.host();
    testbed::InstanceClient client(broker, callFactory());
    const char* const classes[] = {"Tovexa_PlexorController",    "Tovexa_PlexorSoftwareIdentity",
                                   "Tovexa_PlexorStorageVolume", "Tovexa_PlexorStorageExtent",
                                   "Tovexa_PlexorSASSATAPort",   "Tovexa_PlexorBattery"};
    for (const char* className : classes) {
        SCOPED_TRACE(className);
        EXPECT_EQ(client.enumerateInstanceNames(className).rc, 0);
        EXPECT_TRUE(client.enumerateInstanceNames(className).paths.empty());
        const testbed::Response response = client.enumerateInstances(className);
        EXPECT_EQ(response.rc, 0);
        EXPECT_EQ(response.doneCalls, 1);
        EXPECT_TRUE(response.instances.empty());
    }
    // The requests have set the idle timer; an empty inventory does not care.
    EXPECT_GT(NextUnloadTime, VirtualClock::now());
    EXPECT_EQ(client.cleanup(false), 0);
}

TEST_F(EntryFailureTest, ControllersThatCannotBeBuiltFailNothing) {
    presentVendor();
    // The first zero-filled block is the first controller.
    const auto fault = FailAllocation::nth(1, Allocator::Calloc);
    callFactory();
    EXPECT_TRUE(plexortest::loggedInOrder(
        {{LOG_ERR, "BuildControllerInfo, failed to allocate memory for RaidController_t\n"},
         {LOG_DEBUG, "BuildControllerInfo, EXIT(-2).\n"},
         {LOG_DEBUG, "InitPlexorThreads: thread 0 created\n"},
         {LOG_DEBUG, "InitPlexorThreads: thread 1 created\n"},
         {LOG_DEBUG, "PlexorInit: EXIT\n"}}));
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 0u);
    EXPECT_STREQ(GetSystemName(), "host-uuid");
    ASSERT_TRUE(inventoryTaken());
}

TEST_F(EntryFailureTest, ProfileWithoutControllersIsInitialised) {
    vendor.host();
    vendor.profile();
    callFactory();
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 0u);
    ASSERT_TRUE(inventoryTaken());
}

// The queue cannot be full when the factory runs first; it can when a stop left work in it.
TEST_F(EntryFailureTest, FullQueueFailsNothing) {
    presentVendor();
    const WorkersHeld held;
    for (unsigned int i = 0; i < __FIFO.Size; i++) {
        PutItem(&__FIFO, plexortest::zeroed<Thread_Args_t>());
    }
    callFactory();
    EXPECT_TRUE(plexortest::loggedInOrder(
        {{LOG_ERR, "BuildDeviceInfoAsync, failed to put threadArgs in FIFO\n"},
         {LOG_DEBUG, "PlexorInit: EXIT\n"}}));
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 1u);
    // Items without a function are not freed by the workers: take them out again.
    while (void* item = GetItem(&__FIFO)) free(item);
}

TEST_F(EntryFailureTest, AStopWhenNoProfileIsFoundLeavesTheIdentityToTheCleanup) {
    vendor.host();
    {
        const plexortest::StopAtLine stop(
            "No instance of Host Hard RAID Controller is found, rc 0\n");
        callFactory();
    }
    EXPECT_NE(__SystemName, nullptr);
    EXPECT_EQ(initialized(), 1) << "so is the mark";
    EXPECT_EQ(testbed::InstanceClient(broker, &mi).cleanup(true), CMPI_RC_OK);
    EXPECT_EQ(__SystemName, nullptr);
    EXPECT_EQ(initialized(), 0);
}

}  // namespace
