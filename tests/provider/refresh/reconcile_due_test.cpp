// When a class is refreshed on a worker: the first three seconds, the interval, and its log line.
#include "reconcile_fixture.h"

namespace plexortest {
namespace {

class ReconcileDue : public ReconcileTest {
protected:
    /// The line about one class; `end` is ", skip" or nothing.
    std::string classLine(int action, time_t last, time_t now, const pthread_mutex_t& locker,
                          const char* end = "") const {
        return formatted(
            "ProcessDeviceConfigChange(%p): Action %d, last %lu, now %lu, interval %ld secs, "
            "ctrl C0, locker %p%s",
            reinterpret_cast<void*>(pthread_self()), action, static_cast<unsigned long>(last),
            static_cast<unsigned long>(now), static_cast<long>(now - last),
            static_cast<const void*>(&locker), end);
    }
};

TEST_F(ReconcileDue, NothingInTheFirstThreeSeconds) {
    addOneOfEach();
    setAllUpdateTimes(77);
    for (const time_t sinceStart : {0, 1, 2}) {
        InitCompleteTime = kStart - sinceStart;
        clearLog();
        EXPECT_EQ(process(101), 0);
        ASSERT_EQ(CapturedSyslog::lines().size(), 2u);
        EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, ENTER(101)...\n"));
        EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, EXIT\n"));
    }
    EXPECT_TRUE(books().queries().empty());
    for (auto field : kClassTimes) EXPECT_EQ(ctrl->*field, 77);
    EXPECT_EQ(pools(), Ids{});
}

TEST_F(ReconcileDue, FromTheThirdSecondOn) {
    addPort("P0");
    InitCompleteTime = kStart - 3;
    EXPECT_EQ(process(102), 0);
    EXPECT_EQ(ports(), Ids{"P0"});
}

TEST_F(ReconcileDue, AStartInTheFutureIsWithinTheThreeSeconds) {
    InitCompleteTime = kStart + 3600;
    EXPECT_EQ(process(102), 0);
    EXPECT_TRUE(books().queries().empty());
}

TEST_F(ReconcileDue, NotDueBelowTheInterval) {
    ctrl->PortUpdateTime = kStart - 19;
    EXPECT_EQ(process(102), 0);
    EXPECT_TRUE(books().queries().empty());
    EXPECT_EQ(ctrl->PortUpdateTime, kStart - 19);
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, classLine(102, kStart - 19, kStart, ctrl->PortCfgMutex, ", skip")));
    EXPECT_EQ(CapturedSyslog::lines().size(), 3u);
}

TEST_F(ReconcileDue, DueFromTheIntervalOn) {
    ctrl->PortUpdateTime = kStart - 20;
    EXPECT_EQ(process(102), 0);
    EXPECT_EQ(walks().size(), 1u);
    EXPECT_EQ(ctrl->PortUpdateTime, kStart);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, classLine(102, kStart - 20, kStart, ctrl->PortCfgMutex)));
}

TEST_F(ReconcileDue, AnotherIntervalMovesTheLimit) {
    StateUpdateInterval = 45;
    ctrl->PortUpdateTime = kStart - 44;
    process(102);
    EXPECT_TRUE(books().queries().empty());
    ctrl->PortUpdateTime = kStart - 45;
    process(102);
    EXPECT_EQ(walks().size(), 1u);
}

TEST_F(ReconcileDue, UpdateTimeInTheFutureIsNotDue) {
    ctrl->PortUpdateTime = kStart + 5;
    EXPECT_EQ(process(102), 0);
    EXPECT_TRUE(books().queries().empty());
    EXPECT_TRUE(
        loggedOnce(LOG_DEBUG, classLine(102, kStart + 5, kStart, ctrl->PortCfgMutex, ", skip")));
}

TEST_F(ReconcileDue, ASecondRefreshRightAfterTheFirstIsSkipped) {
    EXPECT_EQ(process(102), 0);
    EXPECT_EQ(process(102), 0);
    EXPECT_EQ(walks().size(), 1u);
}

TEST_F(ReconcileDue, EachClassOfTheChainIsTestedForItself) {
    addOneOfEach();
    setAllUpdateTimes(kStart - 100);
    ctrl->PoolUpdateTime = kStart - 5;

    EXPECT_EQ(process(101), 0);

    EXPECT_EQ(walks(),
              (Ids{"CIM_SystemDevice>CIM_DiskDrive", "CIM_SystemDevice>CIM_StorageVolume"}));
    EXPECT_EQ(ctrl->PoolUpdateTime, kStart - 5);
    EXPECT_EQ(ctrl->DiskUpdateTime, kStart);
    EXPECT_EQ(ctrl->VolumeUpdateTime, kStart);
}

TEST_F(ReconcileDue, TheRequestedClassItselfMayBeSkipped) {
    setAllUpdateTimes(kStart - 100);
    ctrl->VolumeUpdateTime = kStart - 5;
    EXPECT_EQ(process(101), 0);
    EXPECT_EQ(walks(),
              (Ids{"CIM_HostedStoragePool>CIM_StoragePool", "CIM_SystemDevice>CIM_DiskDrive"}));
    EXPECT_EQ(ctrl->VolumeUpdateTime, kStart - 5);
}

TEST_F(ReconcileDue, EveryClassNamesItsOwnMutex) {
    setAllUpdateTimes(kStart - 30);
    for (const int action : {101, 102, 103, 105}) process(action);

    const pthread_mutex_t* const mutexes[] = {&ctrl->DiskCfgMutex, &ctrl->VolumeCfgMutex,
                                              &ctrl->PortCfgMutex, &ctrl->BatteryCfgMutex,
                                              &ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex};
    for (int i = 0; i < 6; i++) {
        EXPECT_TRUE(loggedOnce(LOG_DEBUG, classLine(100 + i, kStart - 30, kStart, *mutexes[i])))
            << i;
    }
}

TEST_F(ReconcileDue, TheLineComesBeforeTheQuery) {
    ASSERT_EQ(process(102), 0);
    const int line = lineNumber(classLine(102, 0, kStart, ctrl->PortCfgMutex));
    const int query = lineNumber(formatted(
        "ProcessDeviceConfigChange, CIM Query - Associators: %s (assocClass: CIM_SystemDevice, "
        "resultClass: CIM_SASSATAPort)",
        kSystemText));
    ASSERT_NE(line, -1);
    EXPECT_EQ(query, line + 1);
    EXPECT_EQ(CapturedSyslog::lines()[static_cast<std::size_t>(query)].priority, LOG_DEBUG);
}

TEST_F(ReconcileDue, TheStampIsTheTimeWhenTheRefreshEnded) {
    testbed::FaultRule slow = walkOver("CIM_SASSATAPort");
    slow.hook = [] { VirtualClock::advance(7); };
    faults().add(slow);

    ASSERT_EQ(process(102), 0);

    EXPECT_EQ(ctrl->PortUpdateTime, kStart + 7);
}

TEST_F(ReconcileDue, TheTimeIsReadAnewForEachClass) {
    // What the slow walk over the pools takes makes the drives due.
    setAllUpdateTimes(kStart - 100);
    ctrl->DiskUpdateTime = kStart - 15;
    testbed::FaultRule slow = walkOver("CIM_StoragePool");
    slow.hook = [] { VirtualClock::advance(10); };
    faults().add(slow);

    ASSERT_EQ(process(100), 0);

    EXPECT_EQ(ctrl->DiskUpdateTime, kStart + 10);
}

}  // namespace
}  // namespace plexortest
