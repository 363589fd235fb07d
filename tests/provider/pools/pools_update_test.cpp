// The updates of cached pools and enclosures, which move one time stamp and nothing else.
#include <thread>

#include "pools_fixture.h"
#include "watched_calls.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class PoolsUpdate : public EnclosureTest {
protected:
    void SetUp() override {
        EnclosureTest::SetUp();
        poolPath = vendor.pool(card, "P1");
        chassisPath = vendor.chassis(card, "C0_E");
        ASSERT_EQ(buildPool(poolPath), 0);
        ASSERT_EQ(buildChassis(chassisPath), 0);
        VirtualClock::set(kStart + 60);
        startOver();
    }
    int updatePool(CMPIInstance* fresh = nullptr) {
        return CheckAndUpdatePoolInfo(&mi, ctx(), ctrl, pools()[0], fresh);
    }
    int updateChassis(CMPIInstance* fresh = nullptr) {
        return CheckAndUpdateChassisInfo(&mi, ctx(), ctrl, chassis()[0], fresh);
    }
    /// The controller's seven update times but for one.
    void expectOtherTimes(time_t RaidController_t::*moved) {
        for (time_t RaidController_t::*field :
             {&RaidController_t::ControllerUpdateTime, &RaidController_t::ChassisUpdateTime,
              &RaidController_t::PoolUpdateTime, &RaidController_t::VolumeUpdateTime,
              &RaidController_t::DiskUpdateTime, &RaidController_t::PortUpdateTime,
              &RaidController_t::BatteryUpdateTime}) {
            const bool isBuilt = field == &RaidController_t::PoolUpdateTime ||
                                 field == &RaidController_t::ChassisUpdateTime;
            EXPECT_EQ(ctrl->*field, field == moved ? kStart + 60 : isBuilt ? kStart : 0);
        }
    }
    /// Runs an update while another holds CtrlMutex; it must wait for that, and then write.
    void expectWaitsForMutex(const std::function<void()>& update, const char* enter,
                             const char* exit, time_t& time) {
        pthread_mutex_lock(&ctrl->CtrlMutex);
        std::thread updater(update);
        EXPECT_TRUE(eventually([&] { return CapturedSyslog::count(enter) == 1; }));
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
        EXPECT_EQ(__atomic_load_n(&time, __ATOMIC_RELAXED), kStart);
        EXPECT_EQ(CapturedSyslog::count(exit), 0u);
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        updater.join();
        EXPECT_EQ(time, kStart + 60);
    }

    Path poolPath, chassisPath;
};

class ChassisUpdate : public PoolsUpdate {};

TEST_F(PoolsUpdate, KeepsWhatWasBuilt) {
    set(poolPath, "TotalManagedSpace", CimValue::uint64(5000));
    set(poolPath, "RemainingManagedSpace", CimValue::uint64(1));
    set(poolPath, "Primordial", CimValue::boolean(true));
    set(poolPath, "OperationalStatus", CimValue::uint16Array({6}));
    EXPECT_EQ(updatePool(instanceAt(poolPath)), 0);
    const StoragePool_t* pool = pools()[0];
    EXPECT_EQ(pool->TotalManagedSpace, 1000u);
    EXPECT_EQ(pool->RemainingManagedSpace, 400u);
    EXPECT_EQ(pool->Primordial, 0);
    EXPECT_EQ(pool->OperationalStatus, 2);
    EXPECT_EQ(pool->LastUpdateTime, kStart);
    expectOtherTimes(&RaidController_t::PoolUpdateTime);
    EXPECT_THAT(books().calls(), IsEmpty());
}

TEST_F(PoolsUpdate, NeedsNoInstance) {
    pools()[0]->UpdateEnabled = 1;
    pools()[0]->LastUpdateTime = kStart + 1'000'000;
    EXPECT_EQ(updatePool(nullptr), 0);
    expectOtherTimes(&RaidController_t::PoolUpdateTime);
    EXPECT_EQ(pools()[0]->LastUpdateTime, kStart + 1'000'000);
}

TEST_F(PoolsUpdate, WithoutNeedItMovesNoTime) {
    pools()[0]->UpdateEnabled = 3;
    const UpdatesDeclined declined;
    EXPECT_EQ(updatePool(), 0);
    EXPECT_EQ(UpdatesDeclined::questions(), (std::vector<UpdatesDeclined::Question>{{kStart, 3}}));
    EXPECT_EQ(ctrl->PoolUpdateTime, kStart);
    EXPECT_EQ(inventoryLog().size(), 2u);
}

TEST_F(PoolsUpdate, Log) {
    EXPECT_EQ(updatePool(), 0);
    EXPECT_THAT(inventoryLog(), ElementsAre(debugLine("CheckAndUpdatePoolInfo: ENTER. pool - P1\n"),
                                            debugLine("CheckAndUpdatePoolInfo, exit.\n")));
}

TEST_F(PoolsUpdate, WritesTheTimeUnderTheControllersMutex) {
    expectWaitsForMutex([this] { updatePool(); }, "CheckAndUpdatePoolInfo: ENTER. pool - P1\n",
                        "CheckAndUpdatePoolInfo, exit.\n", ctrl->PoolUpdateTime);
}

TEST_F(ChassisUpdate, KeepsWhatWasBuilt) {
    set(chassisPath, "OperationalStatus", CimValue::uint16Array({6}));
    EXPECT_EQ(updateChassis(instanceAt(chassisPath)), 0);
    EXPECT_EQ(chassis()[0]->OperationalStatus, 2);
    EXPECT_EQ(chassis()[0]->LastUpdateTime, kStart);
    expectOtherTimes(&RaidController_t::ChassisUpdateTime);
    EXPECT_THAT(books().calls(), IsEmpty());
}

TEST_F(ChassisUpdate, NeedsNoInstance) {
    EXPECT_EQ(updateChassis(nullptr), 0);
    expectOtherTimes(&RaidController_t::ChassisUpdateTime);
}

TEST_F(ChassisUpdate, WithoutNeedItMovesNoTime) {
    chassis()[0]->UpdateEnabled = 3;
    const UpdatesDeclined declined;
    EXPECT_EQ(updateChassis(), 0);
    EXPECT_EQ(UpdatesDeclined::questions(), (std::vector<UpdatesDeclined::Question>{{kStart, 3}}));
    EXPECT_EQ(ctrl->ChassisUpdateTime, kStart);
    EXPECT_EQ(inventoryLog().size(), 2u);
}

TEST_F(ChassisUpdate, Log) {
    EXPECT_EQ(updateChassis(), 0);
    EXPECT_THAT(inventoryLog(), ElementsAre(debugLine("CheckAndUpdateChassisInfo, enter...\n"),
                                            debugLine("CheckAndUpdateChassisInfo, exit.\n")));
}

TEST_F(ChassisUpdate, WritesTheTimeUnderTheControllersMutex) {
    expectWaitsForMutex([this] { updateChassis(); }, "CheckAndUpdateChassisInfo, enter...\n",
                        "CheckAndUpdateChassisInfo, exit.\n", ctrl->ChassisUpdateTime);
}

}  // namespace
}  // namespace plexortest
