// The refresh test that every updater asks, and the controllers' own update.
#include <thread>

#include "controller_fixture.h"
#include "watched_calls.h"

namespace plexortest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class ControllerUpdate : public ControllerTest {
protected:
    void SetUp() override {
        ControllerTest::SetUp();
        card = addFullController(addProfile(), "C0");
        ASSERT_EQ(build(), 0);
        ctrl = controllers()[0];
        startOver();
    }
    int update() { return CheckAndUpdateControllerInfo(&mi, ctx(), ctrl, nullptr, nullptr); }

    VendorController card;
    RaidController_t* ctrl = nullptr;
};

TEST(ControllerNeedUpdate, IsAlwaysOne) {
    VirtualClock::set(1'000'000);
    for (const time_t time :
         {time_t{0}, time_t{-1}, time_t{999'999}, time_t{1'000'000}, time_t{2'000'000'000}}) {
        for (const unsigned char enabled : {0, 1, 255}) EXPECT_EQ(NeedUpdate(time, enabled), 1);
    }
}

TEST_F(ControllerUpdate, MovesTheTimeAlone) {
    set(card.system, "OperationalStatus", testbed::CimValue::uint16Array({6}));
    set(card.package, "Model", testbed::CimValue::string("another"));
    VirtualClock::set(kStart + 77);
    EXPECT_EQ(update(), 0);
    EXPECT_EQ(ctrl->ControllerUpdateTime, kStart + 77);
    EXPECT_EQ(summary(ctrl), "Model C0 FW-C0 BIOS-C0 DRV-C0 PKG-C0 5 2");
    for (const time_t time :
         {ctrl->ChassisUpdateTime, ctrl->PoolUpdateTime, ctrl->VolumeUpdateTime,
          ctrl->DiskUpdateTime, ctrl->PortUpdateTime, ctrl->BatteryUpdateTime}) {
        EXPECT_EQ(time, 0);
    }
    EXPECT_THAT(books().calls(), IsEmpty());
}

TEST_F(ControllerUpdate, ThatIsDeclinedMovesNothing) {
    const time_t built = ctrl->ControllerUpdateTime;
    ctrl->UpdateEnabled = 3;
    VirtualClock::set(kStart + 77);
    const UpdatesDeclined declined;
    EXPECT_EQ(update(), 0);
    EXPECT_EQ(UpdatesDeclined::questions(), (std::vector<UpdatesDeclined::Question>{{built, 3}}));
    EXPECT_EQ(ctrl->ControllerUpdateTime, built);
}

TEST_F(ControllerUpdate, DeviceAndInstanceAreIgnored) {
    VirtualClock::advance(1);
    EXPECT_EQ(CheckAndUpdateControllerInfo(nullptr, nullptr, ctrl, ctrl, instanceAt(card.system)),
              0);
    EXPECT_EQ(ctrl->ControllerUpdateTime, kStart + 1);
}

TEST_F(ControllerUpdate, Trace) {
    EXPECT_EQ(update(), 0);
    EXPECT_THAT(inventoryLog(), ElementsAre(debugLine("CheckAndUpdateControllerInfo, enter...\n"),
                                            debugLine("CheckAndUpdateControllerInfo, exit.\n")));
}

TEST_F(ControllerUpdate, WritesTheTimeUnderTheControllersMutex) {
    VirtualClock::advance(5);
    pthread_mutex_lock(&ctrl->CtrlMutex);
    std::thread updater([this] { update(); });
    EXPECT_TRUE(eventually(
        [] { return CapturedSyslog::count("CheckAndUpdateControllerInfo, enter...\n") == 1; }));
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
    EXPECT_EQ(__atomic_load_n(&ctrl->ControllerUpdateTime, __ATOMIC_RELAXED), kStart);
    EXPECT_EQ(CapturedSyslog::count("CheckAndUpdateControllerInfo, exit.\n"), 0u);
    pthread_mutex_unlock(&ctrl->CtrlMutex);
    updater.join();
    EXPECT_EQ(ctrl->ControllerUpdateTime, kStart + 5);
    EXPECT_TRUE(isFree(ctrl->CtrlMutex));
}

}  // namespace
}  // namespace plexortest
