// When a request's wish for a refresh is turned down, and what it says about it.
#include <future>

#include "refresh_fixture.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

constexpr time_t RaidController_t::*kUpdateTimes[] = {
    &RaidController_t::DiskUpdateTime,      &RaidController_t::VolumeUpdateTime,
    &RaidController_t::PortUpdateTime,      &RaidController_t::BatteryUpdateTime,
    &RaidController_t::PoolUpdateTime,      &RaidController_t::ChassisUpdateTime,
    &RaidController_t::ControllerUpdateTime};

class RequestRefreshGate : public RefreshTest {
protected:
    void SetUp() override {
        RefreshTest::SetUp();
        ctrl = attach(newController("C0"));
        setAllUpdateTimes(kStart - 1000);
        ThreadActivityDone = 1;
        clearLog();
    }
    void setAllUpdateTimes(time_t time) {
        for (auto field : kUpdateTimes) ctrl->*field = time;
    }
    int request(int action) { return HandleDeviceConfigChange(&mi, ctx(), ctrl, action); }
    /// How many items are in the queue when the ports have been asked for at that time too.
    unsigned int queuedAfterRequestAt(time_t time) {
        VirtualClock::set(time);
        request(102);
        return queuedItems();
    }

    RaidController_t* ctrl = nullptr;
};

TEST_F(RequestRefreshGate, EntryIsTracedFirst) {
    EXPECT_EQ(request(102), 0);
    const auto lines = CapturedSyslog::lines();
    ASSERT_FALSE(lines.empty());
    EXPECT_EQ(lines[0].text, "HandleDeviceConfigChange: ENTER. ctrl C0, action 102\n");
    EXPECT_EQ(lines[0].priority, LOG_DEBUG);
}

TEST_F(RequestRefreshGate, BeforeTheInventoryIsDoneNothingIsQueued) {
    ThreadActivityDone = 0;
    EXPECT_EQ(request(101), 0);
    EXPECT_EQ(queuedItems(), 0u);
    const auto lines = CapturedSyslog::linesAt(LOG_DEBUG);
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(CapturedSyslog::lines().size(), 2u);
    EXPECT_EQ(lines[1],
              "HandleDeviceConfigChange: BuildDeviceInfoAsync is still running, skip action 101\n");
}

TEST_F(RequestRefreshGate, BeforeTheInventoryIsDoneAWrongActionIsSkippedToo) {
    ThreadActivityDone = 0;
    EXPECT_EQ(request(106), 0);
    EXPECT_TRUE(loggedOnce(
        LOG_DEBUG,
        "HandleDeviceConfigChange: BuildDeviceInfoAsync is still running, skip action 106\n"));
    EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
}

TEST_F(RequestRefreshGate, LooksUnderTheWorkersMutexWhetherTheInventoryIsDone) {
    ThreadActivityDone = 0;
    pthread_mutex_lock(&PlexorThreadMutex);
    auto answer = std::async(std::launch::async, [this] { return request(102); });
    EXPECT_TRUE(eventually([] {
        return loggedOnce(LOG_DEBUG, "HandleDeviceConfigChange: ENTER. ctrl C0, action 102\n");
    }));
    EXPECT_EQ(answer.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    ThreadActivityDone = 1;
    pthread_mutex_unlock(&PlexorThreadMutex);
    EXPECT_EQ(answer.get(), 0);
    EXPECT_EQ(queuedItems(), 1u) << "it is done by the time of the look";
}

TEST_F(RequestRefreshGate, WrongActionsAreIgnored) {
    for (const int action : {106, 107, 99, 0, -1, 1000}) {
        SCOPED_TRACE(action);
        clearLog();
        EXPECT_EQ(request(action), 0);
        EXPECT_EQ(queuedItems(), 0u);
        EXPECT_EQ(CapturedSyslog::lines().size(), 2u);
        EXPECT_TRUE(loggedOnce(
            LOG_ERR, formatted("HandleDeviceConfigChange: wrong action %d, ignored\n", action)));
    }
}

TEST_F(RequestRefreshGate, SkipLineShowsBothTimes) {
    ctrl->VolumeUpdateTime = kStart - 19;
    EXPECT_EQ(request(101), 0);
    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_EQ(CapturedSyslog::lines().size(), 2u);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG,
                           "HandleDeviceConfigChange: ctrl C0, action 101, last 1699999981, "
                           "now 1700000000, skip\n"));
}

TEST_F(RequestRefreshGate, DueFromTheIntervalOn) {
    ctrl->PortUpdateTime = kStart;
    EXPECT_EQ(queuedAfterRequestAt(kStart + 19), 0u);
    EXPECT_EQ(queuedAfterRequestAt(kStart + 20), 1u);
    EXPECT_EQ(queuedAfterRequestAt(kStart + 21), 2u);
}

TEST_F(RequestRefreshGate, AnotherIntervalMovesTheLimit) {
    StateUpdateInterval = 45;
    ctrl->PortUpdateTime = kStart;
    EXPECT_EQ(queuedAfterRequestAt(kStart + 44), 0u);
    EXPECT_EQ(queuedAfterRequestAt(kStart + 45), 1u);
}

TEST_F(RequestRefreshGate, UpdateTimeInTheFutureIsNotDue) {
    ctrl->BatteryUpdateTime = kStart + 3600;
    EXPECT_EQ(request(103), 0);
    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG,
                           "HandleDeviceConfigChange: ctrl C0, action 103, last 1700003600, "
                           "now 1700000000, skip\n"));
}

TEST_F(RequestRefreshGate, NeverRefreshedIsDue) {
    ctrl->DiskUpdateTime = 0;
    EXPECT_EQ(request(100), 0);
    EXPECT_EQ(queuedItems(), 1u);
}

TEST_F(RequestRefreshGate, TheRequestItselfMovesNoUpdateTime) {
    for (int action = 100; action <= 105; action++) request(action);
    for (auto field : kUpdateTimes) EXPECT_EQ(ctrl->*field, kStart - 1000);
}

TEST_F(RequestRefreshGate, TakesNoLockOfTheController) {
    pthread_mutex_t* const mutexes[] = {
        &ctrl->CtrlMutex,       &ctrl->DiskCfgMutex, &ctrl->VolumeCfgMutex, &ctrl->PortCfgMutex,
        &ctrl->BatteryCfgMutex, &ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex};
    for (pthread_mutex_t* mutex : mutexes) pthread_mutex_lock(mutex);
    auto done = std::async(std::launch::async, [this] {
        for (int action = 100; action <= 105; action++) request(action);
    });
    const auto status = done.wait_for(kGenerousLimit);
    for (pthread_mutex_t* mutex : mutexes) pthread_mutex_unlock(mutex);
    EXPECT_EQ(status, std::future_status::ready);
    EXPECT_EQ(queuedItems(), 6u);
}

TEST_F(RequestRefreshGate, LeavesTheWorkersMutexFree) {
    request(102);
    ASSERT_EQ(pthread_mutex_trylock(&PlexorThreadMutex), 0);
    pthread_mutex_unlock(&PlexorThreadMutex);
    ThreadActivityDone = 0;
    request(102);
    ASSERT_EQ(pthread_mutex_trylock(&PlexorThreadMutex), 0);
    pthread_mutex_unlock(&PlexorThreadMutex);
}

/// An action and the update time that it goes by.
struct ActionTime {
    int action;
    time_t RaidController_t::*updateTime;
};

class RequestRefreshTimes : public RequestRefreshGate,
                            public ::testing::WithParamInterface<ActionTime> {};

TEST_P(RequestRefreshTimes, ItsOwnTimeTurnsItDown) {
    ctrl->*GetParam().updateTime = kStart - 19;
    EXPECT_EQ(request(GetParam().action), 0);
    EXPECT_EQ(queuedItems(), 0u);
}

TEST_P(RequestRefreshTimes, NoOtherTimeTurnsItDown) {
    setAllUpdateTimes(kStart);
    ctrl->*GetParam().updateTime = kStart - 20;
    EXPECT_EQ(request(GetParam().action), 0);
    EXPECT_EQ(queuedItems(), 1u);
}

INSTANTIATE_TEST_SUITE_P(RequestRefresh, RequestRefreshTimes,
                         ::testing::Values(ActionTime{100, &RaidController_t::DiskUpdateTime},
                                           ActionTime{101, &RaidController_t::VolumeUpdateTime},
                                           ActionTime{102, &RaidController_t::PortUpdateTime},
                                           ActionTime{103, &RaidController_t::BatteryUpdateTime},
                                           ActionTime{104, &RaidController_t::PoolUpdateTime},
                                           ActionTime{105, &RaidController_t::ChassisUpdateTime}),
                         [](const auto& test) { return std::to_string(test.param.action); });

}  // namespace
}  // namespace plexortest
