// When the clean-up is refused, and that a refusal changes nothing.
#include <string>
#include <vector>

#include "entry_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::LogLine;
using plexortest::VirtualClock;

// As the library is loaded: read before any test sets them.
const time_t initialUnloadTime = NextUnloadTime;
const unsigned int initialIdleMinutes = IdleTimeBeforeTerminating;

TEST(UnloadTime, IsLongPastBeforeTheFirstRequestAndTheIdleTimeFiveMinutes) {
    EXPECT_EQ(initialUnloadTime, 0);
    EXPECT_EQ(initialIdleMinutes, 5u);
}

class UnloadRefusalTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        __SystemName = plexortest::ownedCopy("host-uuid");
        plexortest::attach(plexortest::newController("C0"));
        plexortest::attach(firstController(), plexortest::newVolume("v1"));
        __atomic_store_n(&_ProviderInitialized, 1, __ATOMIC_RELAXED);
        CapturedSyslog::clear();
    }
    CMPIStatus cleanUp(bool terminate) {
        return instMIFT__.cleanup(&mi, ctx(), static_cast<CMPIBoolean>(terminate));
    }
    void expectRefusal() {
        const CMPIStatus status = cleanUp(false);
        EXPECT_EQ(status.rc, 50);
        EXPECT_EQ(status.msg, nullptr);
    }
    void expectUnload(bool terminate = false) {
        const CMPIStatus status = cleanUp(terminate);
        EXPECT_EQ(status.rc, 0);
        EXPECT_EQ(status.msg, nullptr);
        EXPECT_EQ(controllers(), 0u);
    }
};

TEST_F(UnloadRefusalTest, WithinTheIdleTimeItIsRefused) {
    ResetNextUnloadTime();
    expectRefusal();
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{{LOG_DEBUG, "PlexorProviderCleanup: ENTER...\n"},
                                    {LOG_DEBUG,
                                     "PlexorProviderCleanup: idle timer(5) has not expired, "
                                     "don't unload\n"}}));
}

TEST_F(UnloadRefusalTest, TheLineCarriesTheMinutesNotTheRest) {
    IdleTimeBeforeTerminating = 7;
    ResetNextUnloadTime();
    VirtualClock::advance(400);
    expectRefusal();
    EXPECT_TRUE(plexortest::logged(
        LOG_DEBUG, "PlexorProviderCleanup: idle timer(7) has not expired, don't unload\n"));
}

TEST_F(UnloadRefusalTest, ARefusalChangesNothing) {
    ResetNextUnloadTime();
    const RaidController_t* ctrl = firstController();
    expectRefusal();
    EXPECT_EQ(controllers(), 1u);
    EXPECT_EQ(firstController(), ctrl);
    EXPECT_STREQ(ctrl->DeviceID, "C0");
    EXPECT_EQ(ctrl->VolumeList->Size, 1u);
    EXPECT_STREQ(GetSystemName(), "host-uuid");
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(NextUnloadTime, kStart + 300);
    EXPECT_EQ(IdleTimeBeforeTerminating, 5u);
    EXPECT_FALSE(terminating());
    EXPECT_TRUE(VirtualClock::sleeps().empty());
    EXPECT_TRUE(books().calls().empty());
}

TEST_F(UnloadRefusalTest, TheIdleTimeIsNotLookedAtUntilTheNextRequest) {
    ResetNextUnloadTime();
    IdleTimeBeforeTerminating = 0;
    expectRefusal();
    EXPECT_EQ(IdleTimeBeforeTerminating, 0u);
    EXPECT_TRUE(plexortest::logged(
        LOG_DEBUG, "PlexorProviderCleanup: idle timer(0) has not expired, don't unload\n"));
}

TEST_F(UnloadRefusalTest, TheLastSecondIsStillRefused) {
    ResetNextUnloadTime();
    VirtualClock::advance(299);
    expectRefusal();
    VirtualClock::advance(1);
    expectUnload();
}

TEST_F(UnloadRefusalTest, AskedAgainItIsRefusedAgain) {
    ResetNextUnloadTime();
    for (int i = 0; i < 3; i++) expectRefusal();
    VirtualClock::advance(1000);
    expectUnload();
}

TEST_F(UnloadRefusalTest, BeforeAnyRequestItIsAgreed) {
    EXPECT_EQ(NextUnloadTime, 0);
    expectUnload();
}

TEST_F(UnloadRefusalTest, TerminatingUnloadsWithinTheIdleTime) {
    ResetNextUnloadTime();
    expectUnload(true);
}

TEST_F(UnloadRefusalTest, AnythingButFalseIsTerminating) {
    ResetNextUnloadTime();
    const CMPIStatus status = instMIFT__.cleanup(&mi, ctx(), CMPIBoolean{0x80});
    EXPECT_EQ(status.rc, 0);
}

TEST_F(UnloadRefusalTest, EmptyInventoryUnloadsWithinTheIdleTime) {
    FreeList(RaidControllerList, FreeController);
    ResetNextUnloadTime();
    expectUnload();
}

// Times are compared as signed values.
TEST_F(UnloadRefusalTest, TimesBeforeTheEpochCompareAsSuch) {
    VirtualClock::set(-5);
    NextUnloadTime = 10;
    expectRefusal();
    NextUnloadTime = -4;
    expectRefusal();
    NextUnloadTime = -5;
    expectUnload();
}

TEST_F(UnloadRefusalTest, ARequestKeepsTheProviderForFiveMinutes) {
    testbed::InstanceClient client(broker, &mi);
    VirtualClock::set(kStart + 10'000);
    client.enumerateInstanceNames("Tovexa_PlexorController");
    VirtualClock::advance(299);
    EXPECT_EQ(client.cleanup(false), 50);
    EXPECT_EQ(client.enumerateInstanceNames("Tovexa_PlexorController").paths.size(), 1u);
    VirtualClock::advance(299);
    EXPECT_EQ(client.cleanup(false), 50);
    VirtualClock::advance(1);
    EXPECT_EQ(client.cleanup(false), 0);
}

}  // namespace
