// The idle timer: what moves it, and how far.
#include <limits>
#include <string>

#include "entry_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::LogLine;
using plexortest::VirtualClock;

class UnloadTimerTest : public plexortest::EntryTest {
protected:
    testbed::InstanceClient client() { return {broker, &mi}; }
};

TEST_F(UnloadTimerTest, IsFiveMinutesFromNow) {
    ResetNextUnloadTime();
    EXPECT_EQ(NextUnloadTime, kStart + 300);
    EXPECT_EQ(IdleTimeBeforeTerminating, 5u);
    VirtualClock::advance(17);
    ResetNextUnloadTime();
    EXPECT_EQ(NextUnloadTime, kStart + 17 + 300);
}

TEST_F(UnloadTimerTest, FollowsTheIdleTimeUpToTenMinutes) {
    struct Case {
        unsigned int minutes, kept;
        time_t ahead;
    };
    const Case cases[] = {
        {0, 0, 0},
        {1, 1, 60},
        {9, 9, 540},
        {10, 10, 600},
        {11, 10, 600},
        {25, 10, 600},
        {0x80000000u, 10, 600},
        {std::numeric_limits<unsigned int>::max(), 10, 600},
    };
    for (const Case& tried : cases) {
        SCOPED_TRACE(tried.minutes);
        IdleTimeBeforeTerminating = tried.minutes;
        ResetNextUnloadTime();
        EXPECT_EQ(IdleTimeBeforeTerminating, tried.kept);
        EXPECT_EQ(NextUnloadTime, kStart + tried.ahead);
    }
}

TEST_F(UnloadTimerTest, MovesBackwardsTooWhenTheClockDoes) {
    NextUnloadTime = kStart + 10000;
    ResetNextUnloadTime();
    EXPECT_EQ(NextUnloadTime, kStart + 300);
}

TEST_F(UnloadTimerTest, LogsNothing) {
    IdleTimeBeforeTerminating = 25;
    ResetNextUnloadTime();
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(UnloadTimerTest, EveryServedOperationResetsIt) {
    VirtualClock::set(kStart + 1000);
    client().enumerateInstanceNames("Tovexa_PlexorController");
    EXPECT_EQ(NextUnloadTime, kStart + 1300);
    VirtualClock::set(kStart + 2000);
    client().enumerateInstances("Tovexa_PlexorBattery");
    EXPECT_EQ(NextUnloadTime, kStart + 2300);
    VirtualClock::set(kStart + 3000);
    client().getInstance({"root/cimv2", "Tovexa_PlexorController", {}});
    EXPECT_EQ(NextUnloadTime, kStart + 3300);
    // What is not served resets it as well.
    VirtualClock::set(kStart + 4000);
    client().getInstance({"root/cimv2", "CIM_StorageVolume", {}});
    EXPECT_EQ(NextUnloadTime, kStart + 4300);
}

TEST_F(UnloadTimerTest, RequestClampsAnIdleTimeThatWasChanged) {
    IdleTimeBeforeTerminating = 25;
    client().enumerateInstanceNames("Tovexa_PlexorController");
    EXPECT_EQ(IdleTimeBeforeTerminating, 10u);
    EXPECT_EQ(NextUnloadTime, kStart + 600);
}

}  // namespace
