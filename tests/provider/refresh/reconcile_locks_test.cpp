// Which locks a refresh holds, and how refreshes of one controller get along with each other.
#include <errno.h>

#include "reconcile_fixture.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

class ReconcileLocks : public ReconcileTest {
protected:
    /// One letter for each mutex that somebody holds: Disk, Volume, Port, Battery, Pool (O),
    /// Chassis (H), CtrlMutex (C), the workers' mutex (T).
    std::string held() {
        const std::pair<char, pthread_mutex_t*> mutexes[] = {
            {'D', &ctrl->DiskCfgMutex}, {'V', &ctrl->VolumeCfgMutex},
            {'P', &ctrl->PortCfgMutex}, {'B', &ctrl->BatteryCfgMutex},
            {'O', &ctrl->PoolCfgMutex}, {'H', &ctrl->ChassisCfgMutex},
            {'C', &ctrl->CtrlMutex},    {'T', &PlexorThreadMutex}};
        std::string letters;
        for (const auto& [letter, mutex] : mutexes) {
            if (pthread_mutex_trylock(mutex) == EBUSY) {
                letters += letter;
            } else {
                pthread_mutex_unlock(mutex);
            }
        }
        return letters;
    }

    /// Notes what is held during every call of that entry.
    void watch(Entry entry, Ids& notes) {
        FaultRule rule;
        rule.entry = entry;
        rule.hook = [this, &notes] { notes.push_back(held()); };
        faults().add(rule);
    }
};

TEST_F(ReconcileLocks, OneClassMutexAtATimeAndNoOther) {
    Ids duringWalks;
    watch(Entry::Associators, duringWalks);
    process(101);
    process(102);
    process(103);
    process(105);
    EXPECT_EQ(duringWalks, (Ids{"O", "D", "V", "P", "B", "H"}));
    EXPECT_EQ(held(), "");
}

TEST_F(ReconcileLocks, TheClassMutexIsHeldForMatchingAndBuilding) {
    vendor.drive(card, "D0", addPool("pool0"), addChassis("C0_E0"));
    process(104);
    Ids duringKeys, duringQueries, duringNames;
    watch(Entry::EnumerationToArray, duringKeys);
    watch(Entry::Associators, duringQueries);
    watch(Entry::AssociatorNames, duringNames);

    process(100);

    EXPECT_EQ(duringKeys, Ids{"D"});
    // The walk, media, firmware and slot; package, chassis and pool.
    EXPECT_EQ(duringQueries, (Ids{"D", "D", "D", "D"}));
    EXPECT_EQ(duringNames, (Ids{"D", "D", "D"}));
    EXPECT_EQ(drives(), Ids{"D0"});
}

TEST_F(ReconcileLocks, TheClassMutexIsHeldForUpdatingToo) {
    addDrive("D0", addPool("pool0"));
    process(100);
    Ids duringExtent;
    watch(Entry::GetInstance, duringExtent);
    processDue(100);
    EXPECT_EQ(duringExtent, Ids{"D"});
}

TEST_F(ReconcileLocks, EveryMutexIsFreeAfterEveryKindOfOutcome) {
    process(102);
    EXPECT_EQ(held(), "") << "done";
    process(102);
    EXPECT_EQ(held(), "") << "not due";
    FaultRule refused = walkOver("CIM_Battery");
    refused.rc = CMPI_RC_ERR_FAILED;
    faults().add(refused);
    process(103);
    EXPECT_EQ(held(), "") << "refused";
    {
        addPort("P0");
        const auto fault = FailAllocation::nth(1);
        processDue(102);
    }
    EXPECT_EQ(held(), "") << "without memory";
}

TEST_F(ReconcileLocks, AClassThatCannotBeLockedIsPassedOver) {
    addVolume("V0", addPool("pool0"));
    // A mutex that refuses a second lock of its owner instead of waiting for ever.
    pthread_mutexattr_t attributes;
    pthread_mutexattr_init(&attributes);
    pthread_mutexattr_settype(&attributes, PTHREAD_MUTEX_ERRORCHECK);
    pthread_mutex_destroy(&ctrl->DiskCfgMutex);
    pthread_mutex_init(&ctrl->DiskCfgMutex, &attributes);
    pthread_mutexattr_destroy(&attributes);
    ASSERT_EQ(pthread_mutex_lock(&ctrl->DiskCfgMutex), 0);

    EXPECT_EQ(process(101), 0);

    EXPECT_EQ(walks(),
              (Ids{"CIM_HostedStoragePool>CIM_StoragePool", "CIM_SystemDevice>CIM_StorageVolume"}));
    EXPECT_EQ(ctrl->DiskUpdateTime, 0);
    EXPECT_EQ(ctrl->VolumeUpdateTime, kStart);
    EXPECT_EQ(CapturedSyslog::countContaining("Action 100"), 0u);
    EXPECT_EQ(pthread_mutex_unlock(&ctrl->DiskCfgMutex), 0) << "released by somebody else";
}

/// The same with two workers and refreshes that arrive as requests.
class ReconcileTwoWorkers : public ReconcileLocks {
protected:
    void SetUp() override {
        ReconcileLocks::SetUp();
        ThreadActivityDone = 1;
        addPort("P0");
        addBattery("B0");
    }
    int request(int action) { return HandleDeviceConfigChange(&mi, ctx(), ctrl, action); }
    /// Holds walks over that class at the gate.
    /// Asks for a refresh of the ports that comes as far as its walk, and waits there.
    void holdRefreshOfPorts(Gate& gate) {
        FaultRule rule = walkOver("CIM_SASSATAPort");
        rule.hook = [&gate] { gate.pass(); };
        faults().add(rule);
        ASSERT_EQ(request(102), 0);
        ASSERT_TRUE(gate.awaitArrivals(1));
    }
    std::size_t countOfLists() {
        pthread_mutex_lock(&ctrl->CtrlMutex);
        const std::size_t count = ctrl->PortList->Size + ctrl->BatteryList->Size;
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        return count;
    }
};

/// Two workers, which may pass the gate at the end of the scope at the latest.
struct WorkersAtAGate {
    explicit WorkersAtAGate(const CMPIContext* creator) : first(creator, 0), second(creator, 1) {}
    Gate gate;
    Worker first, second;
    GateOpener opener{gate};
};

TEST_F(ReconcileTwoWorkers, TheSameClassIsRefreshedOnce) {
    WorkersAtAGate workers(ctx());
    holdRefreshOfPorts(workers.gate);
    ASSERT_EQ(request(102), 0);
    // The other worker has taken the second request and waits for the class.
    ASSERT_TRUE(eventually(
        [] { return timesLogged(LOG_DEBUG, "ProcessDeviceConfigChange, ENTER(102)...\n") == 2; }));
    workers.gate.open();
    ASSERT_TRUE(workersComeToRest());

    EXPECT_EQ(walks().size(), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining(", skip"), 1u);
    workers.first.stop();
    workers.second.stop();
    EXPECT_EQ(ports(), Ids{"P0"});
}

TEST_F(ReconcileTwoWorkers, DifferentClassesDoNotWaitForEachOther) {
    WorkersAtAGate workers(ctx());
    holdRefreshOfPorts(workers.gate);
    ASSERT_EQ(request(103), 0);
    EXPECT_TRUE(eventually([this] { return countOfLists() == 1; })) << "the battery";
    workers.gate.open();
    EXPECT_TRUE(eventually([this] { return countOfLists() == 2; })) << "and the port";
    ASSERT_TRUE(workersComeToRest());
}

TEST_F(ReconcileTwoWorkers, ReadersAreNotHeldUpByASlowWalk) {
    Gate gate;
    Worker worker(ctx(), 0);
    const GateOpener opener(gate);
    holdRefreshOfPorts(gate);
    EXPECT_EQ(held(), "P");
    gate.open();
    ASSERT_TRUE(workersComeToRest());
}

}  // namespace
}  // namespace plexortest
