// The factory that succeeds: what it does in which order, what it leaves, and later calls.
#include <unistd.h>

#include <cstring>
#include <regex>

#include "PlexorProviderCfg.h"
#include "entry_fixture.h"
#include "refresh_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::currentProcessLine;
using plexortest::formatted;
using plexortest::LogLine;
using plexortest::VirtualClock;
using plexortest::WorkersHeld;
using testbed::Entry;

class EntryFactoryTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        presentVendor();
    }
    /// Lines of this thread with that beginning.
    static std::vector<LogLine> linesHere(const std::string& beginning) {
        std::vector<LogLine> lines = EntryTest::linesHere();
        std::erase_if(lines,
                      [&](const LogLine& line) { return !line.text.starts_with(beginning); });
        return lines;
    }
};

TEST_F(EntryFactoryTest, LogsItsStepsInOrder) {
    callFactory();
    EXPECT_TRUE(plexortest::loggedInOrder({
        {LOG_DEBUG, "PlexorProviderInit\n"},
        {LOG_DEBUG, "PlexorInit: ENTER...\n"},
        {LOG_DEBUG, currentProcessLine()},
        {LOG_DEBUG, "InitSystemInfo: entering...\n"},
        {LOG_DEBUG, "GetHHRCProfiles: entering...\n"},
        {LOG_DEBUG, "GetHHRCProfiles: exiting, RC 1.\n"},
        {LOG_DEBUG, "BuildControllerInfo, enter...\n"},
        {LOG_DEBUG, "BuildControllerInfo, EXIT(0).\n"},
        {LOG_ERR, "InitPlexorThreads: Sample interval was set to 20 secs\n"},
        {LOG_DEBUG, "InitPlexorThreads: thread 0 created\n"},
        {LOG_DEBUG, "InitPlexorThreads: thread 1 created\n"},
        {LOG_DEBUG, "PlexorInit: EXIT\n"},
    }));
}

TEST_F(EntryFactoryTest, BeginsAndEndsWithItsOwnLines) {
    callFactory();
    const std::vector<LogLine> lines = EntryTest::linesHere();
    ASSERT_GE(lines.size(), 5u);
    EXPECT_EQ(lines[0], (LogLine{LOG_DEBUG, "PlexorProviderInit\n"}));
    EXPECT_EQ(lines[2], (LogLine{LOG_DEBUG, "PlexorInit: ENTER...\n"}));
    EXPECT_EQ(lines[3], (LogLine{LOG_DEBUG, currentProcessLine()}));
    EXPECT_EQ(lines.back(), (LogLine{LOG_DEBUG, "PlexorInit: EXIT\n"}));
}

TEST_F(EntryFactoryTest, SaysWhenItWasBuilt) {
    callFactory();
    const std::vector<LogLine> lines = linesHere("PlexorProvider: built on ");
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_EQ(lines[0].priority, LOG_DEBUG);
    // As in "Mar  7 2024 09:05:00".
    const std::regex form(
        "PlexorProvider: built on (Jan|Feb|Mar|Apr|May|Jun|Jul|Aug|Sep|Oct|Nov|Dec) "
        "[ 123][0-9] 20[0-9]{2} [0-2][0-9]:[0-5][0-9]:[0-6][0-9]\n");
    EXPECT_TRUE(std::regex_match(lines[0].text, form)) << lines[0].text;
}

TEST_F(EntryFactoryTest, MakesItsUpCallsOnAContextOfItsOwn) {
    const WorkersHeld held;
    callFactory();
    std::vector<Entry> calls = upCalls();
    // The thread is the manager's: without a context entry it is not flushed.
    if (!plexortest::kContextHasFlush) calls.insert(calls.end() - 1, Entry::ContextFlush);
    EXPECT_EQ(calls, (std::vector<Entry>{
                         Entry::PrepareAttachThread,
                         Entry::AttachThread,  //
                         Entry::NewObjectPath,
                         Entry::EnumerateInstances,  // the host
                         Entry::NewObjectPath,
                         Entry::EnumerateInstances,  // the profiles
                         Entry::Associators,         // port controllers
                         Entry::Associators,         // computer system
                         Entry::Associators,         // package
                         Entry::Associators,         // software
                         Entry::PrepareAttachThread,
                         Entry::PrepareAttachThread,  // the workers'
                         Entry::ContextFlush,
                         Entry::DetachThread,
                     }));
}

TEST_F(EntryFactoryTest, LeavesNothingOfTheBrokersBehindOnItsThread) {
    // The workers' contexts are made on this thread too, and outlive the call.
    const std::size_t before = books().live();
    const WorkersHeld held;
    callFactory();
    // Two clones for each controller, and the two contexts.
    EXPECT_EQ(books().liveClones(), 2u);
    EXPECT_EQ(books().live(), before + 2 + 2);
}

TEST_F(EntryFactoryTest, BuildsTheControllersAndQueuesTheirDevices) {
    {
        const WorkersHeld held;
        const CMPIInstanceMI* made = callFactory();
        ASSERT_EQ(controllers(), 1u);
        const RaidController_t* ctrl = firstController();
        EXPECT_STREQ(ctrl->DeviceID, "C0");
        EXPECT_EQ(ctrl->VolumeList->Size, 0u);
        EXPECT_EQ(ctrl->DiskList->Size, 0u);
        ASSERT_EQ(__FIFO.List.Size, 1u);
        const auto* item = static_cast<const Thread_Args_t*>(__FIFO.List.Head->Data);
        EXPECT_EQ(item->Func, DoBuildDeviceInfoAsync);
        EXPECT_EQ(item->Arg0, reinterpret_cast<uintptr_t>(made));
        EXPECT_EQ(ThreadActivityDone, 0u);
    }
    ASSERT_TRUE(inventoryTaken());
    const RaidController_t* ctrl = firstController();
    EXPECT_EQ(ctrl->VolumeList->Size, 1u);
    EXPECT_EQ(ctrl->DiskList->Size, 1u);
    EXPECT_EQ(ctrl->PortList->Size, 1u);
    EXPECT_EQ(ctrl->BatteryList->Size, 1u);
    EXPECT_EQ(ctrl->PoolList->Size, 1u);
}

TEST_F(EntryFactoryTest, StartsTheWorkersBeforeItQueuesTheirWork) {
    const WorkersHeld held;
    std::vector<unsigned int> queued;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text.starts_with("InitPlexorThreads: ")) queued.push_back(__FIFO.List.Size);
    });
    callFactory();
    EXPECT_EQ(queued, (std::vector<unsigned int>{0, 0, 0})) << "the interval and two workers";
    EXPECT_EQ(__FIFO.List.Size, 1u);
}

TEST_F(EntryFactoryTest, LogsItsExitWhenItsContextIsGone) {
    std::vector<Entry> before;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text == "PlexorInit: EXIT\n") before = upCalls();
    });
    const WorkersHeld held;
    callFactory();
    ASSERT_GE(before.size(), 2u);
    EXPECT_EQ(before.back(), Entry::DetachThread);
    // The thread is the manager's: without a context entry it is not flushed.
    EXPECT_EQ(before[before.size() - 2] == Entry::ContextFlush, plexortest::kContextHasFlush);
}

TEST_F(EntryFactoryTest, ReadsTheHostsIdentity) {
    callFactory();
    EXPECT_STREQ(GetSystemName(), "host-uuid");
    EXPECT_STREQ(GetHostName(), "host");
    EXPECT_STREQ(GetSystemClassName(), "OMC_UnitaryComputerSystem");
}

TEST_F(EntryFactoryTest, IsInitialisedFromTheStartOfInitialisation) {
    int during = -1;
    testbed::FaultRule watch;
    watch.entry = Entry::EnumerateInstances;
    watch.className = "OMC_UnitaryComputerSystem";
    watch.hook = [&] { during = initialized(); };
    faults().add(watch);
    EXPECT_EQ(initialized(), 0);
    callFactory();
    EXPECT_EQ(during, 1);
    EXPECT_EQ(initialized(), 1);
}

TEST_F(EntryFactoryTest, NeverWritesItsStatus) {
    CMPIString* const message = broker.makeString("untouched");
    CMPIStatus status = {CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED, message};
    callFactory(&status);
    callFactory(&status);
    EXPECT_EQ(status.rc, CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED);
    EXPECT_EQ(status.msg, message);
}

TEST_F(EntryFactoryTest, AlwaysReturnsTheSameInterface) {
    CMPIInstanceMI* first = callFactory();
    EXPECT_NE(first, nullptr);
    EXPECT_EQ(callFactory(), first);
    unloadAndForget();
    EXPECT_EQ(callFactory(), first);
}

TEST_F(EntryFactoryTest, NotesWhenItFinished) {
    // Seven seconds go by in the middle.
    testbed::FaultRule slow;
    slow.entry = Entry::EnumerateInstances;
    slow.className = "CIM_RegisteredProfile";
    slow.hook = [] {
        EXPECT_EQ(InitCompleteTime, 0);
        VirtualClock::advance(7);
    };
    faults().add(slow);
    const WorkersHeld held;
    callFactory();
    EXPECT_EQ(InitCompleteTime, kStart + 7);
}

TEST_F(EntryFactoryTest, DoesNotMoveTheUnloadTime) {
    callFactory();
    EXPECT_EQ(NextUnloadTime, 0);
    EXPECT_EQ(IdleTimeBeforeTerminating, 5u);
}

class EntrySecondCallTest : public EntryFactoryTest {
protected:
    void SetUp() override {
        EntryFactoryTest::SetUp();
        made = callFactory();
        ASSERT_TRUE(inventoryTaken());
        ASSERT_TRUE(plexortest::eventually([] {
            const WorkersHeld held;
            return ActiveThreads == 0;
        }));
        CapturedSyslog::clear();
        books().clearCalls();
    }
    CMPIInstanceMI* made = nullptr;
};

TEST_F(EntrySecondCallTest, LogsTheBuildAndTheProcessAndNoMore) {
    EXPECT_EQ(callFactory(), made);
    const std::vector<LogLine> lines = EntryTest::linesHere();
    ASSERT_EQ(lines.size(), 4u);
    EXPECT_EQ(lines[0], (LogLine{LOG_DEBUG, "PlexorProviderInit\n"}));
    EXPECT_TRUE(lines[1].text.starts_with("PlexorProvider: built on ")) << lines[1].text;
    EXPECT_EQ(lines[2], (LogLine{LOG_DEBUG, "PlexorInit: ENTER...\n"}));
    EXPECT_EQ(lines[3], (LogLine{LOG_DEBUG, currentProcessLine()}));
}

TEST_F(EntrySecondCallTest, AsksTheBrokerNothingAndBuildsNothing) {
    const pthread_t first = PlexorThreads[0], second = PlexorThreads[1];
    const RaidController_t* ctrl = firstController();
    callFactory();
    EXPECT_TRUE(books().calls().empty());
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(firstController(), ctrl);
    EXPECT_TRUE(pthread_equal(first, PlexorThreads[0]));
    EXPECT_TRUE(pthread_equal(second, PlexorThreads[1]));
    EXPECT_EQ(initialized(), 1);
}

TEST_F(EntrySecondCallTest, MovesTheTimeOfCompletion) {
    VirtualClock::set(kStart + 1234);
    callFactory();
    EXPECT_EQ(InitCompleteTime, kStart + 1234);
}

TEST_F(EntrySecondCallTest, StoresTheBrokerItIsGiven) {
    testbed::Repository otherRepository;
    testbed::Broker other(otherRepository);
    const testbed::Broker::CallScope scope(other);
    PlexorProvider_Create_InstanceMI(other.handle(), scope.context(), nullptr);
    EXPECT_EQ(::Broker, other.handle());
    EXPECT_TRUE(other.books().calls().empty());
    callFactory();
    EXPECT_EQ(::Broker, broker.handle());
}

TEST_F(EntryFactoryTest, FirstCallStoresTheBrokerToo) {
    ::Broker = nullptr;
    callFactory();
    EXPECT_EQ(::Broker, broker.handle());
}

}  // namespace
