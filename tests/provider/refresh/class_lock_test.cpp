// One device class whose refresh hangs in the vendor's provider, and all the others.
#include <dlfcn.h>
#include <time.h>

#include <atomic>
#include <future>
#include <thread>

#include "PlexorProviderCfgClassLock.h"
#include "real_waits.h"
#include "reconcile_fixture.h"
#include "worker_harness.h"

namespace {

// The monotonic clock of the provider's deadlines, ahead of the real one by that many seconds.
std::atomic<time_t> ahead = 0;

}  // namespace

// In front of the C library's. The waits themselves stay real: a deadline that is past is past.
extern "C" int clock_gettime(clockid_t clock, struct timespec* now) noexcept {
    static const auto real =
        reinterpret_cast<int (*)(clockid_t, struct timespec*)>(dlsym(RTLD_NEXT, "clock_gettime"));
    const int rc = real(clock, now);
    if (clock == CLOCK_MONOTONIC) now->tv_sec += ahead;
    return rc;
}

namespace plexortest {
namespace {

using testbed::FaultRule;

constexpr const char kPassedOver[] =
    "ClassLock: controller C0, CIM_Battery: a refresh has been under way for 30 secs, passed over "
    "until it ends\n";

class ClassLockTest : public ReconcileTest {
protected:
    void SetUp() override {
        ReconcileTest::SetUp();
        addBattery("B0");
        addPort("P0");
        process(103);
        process(102);
        setAllUpdateTimes(0);
        clearLog();
    }
    void TearDown() override {
        gate_.open();
        ahead = 0;
        ReconcileTest::TearDown();
    }
    /// A refresh of the batteries on a thread of its own, that hangs in its vendor call.
    std::future<void> hangingRefresh() {
        FaultRule rule = walkOver("CIM_Battery");
        rule.times = 1;
        rule.hook = [this] { gate_.pass(); };
        faults().add(rule);
        auto hanging = std::async(std::launch::async, [this] {
            const testbed::Broker::CallScope scope(broker);
            ProcessDeviceConfigChange(&mi, scope.context(), ctrl, 103);
        });
        EXPECT_TRUE(gate_.awaitArrivals(1));
        return hanging;
    }
    /// Builds the battery from a work item, as a worker does, on a thread of its own.
    std::future<void> buildElsewhere(const Path& battery) {
        auto* item = zeroed<Thread_Args_t>();
        item->Func = ProcessBuildLogicalDeviceInfo;
        item->Arg0 = reinterpret_cast<uintptr_t>(ctrl);
        item->Arg1 = reinterpret_cast<uintptr_t>(&mi);
        item->Arg3 = reinterpret_cast<uintptr_t>(clonedPath(battery));
        item->Arg4 = reinterpret_cast<uintptr_t>(clonedInstance(repository.get(battery).value()));
        item->Arg5 = 4;
        return std::async(std::launch::async, [this, item] {
            const testbed::Broker::CallScope scope(broker);
            ProcessBuildLogicalDeviceInfo(scope.context(), item);
        });
    }
    static std::size_t linesWith(const char* part) { return CapturedSyslog::countContaining(part); }

    Gate gate_;
};

TEST_F(ClassLockTest, AHungClassIsPassedOverAndTheOthersAreServed) {
    const auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    ahead = 30;
    addPort("P1");
    process(103);
    process(102);
    EXPECT_EQ(linesWith("Action 103"), 1u) << "the hung one's own";
    EXPECT_EQ(ctrl->BatteryUpdateTime, 0) << "it stays due";
    EXPECT_EQ(ports(), (Ids{"P0", "P1"}));
    EXPECT_EQ(timesLogged(LOG_ERR, kPassedOver), 1u);
}

TEST_F(ClassLockTest, ItIsToldOnceWhenItBeginsAndOnceWhenItEnds) {
    auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    ahead = 30;
    for (int i = 0; i < 5; i++) process(103);
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR), std::vector<std::string>{kPassedOver});
    ahead = 3600;
    gate_.open();
    hanging.get();
    const auto lines = CapturedSyslog::linesAt(LOG_ERR);
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_TRUE(
        lines[1].starts_with("ClassLock: controller C0, CIM_Battery: a refresh has ended after 36"))
        << lines[1];
    EXPECT_TRUE(lines[1].ends_with(" secs, served again\n")) << lines[1];
    addBattery("B1");
    setAllUpdateTimes(0);
    process(103);
    EXPECT_EQ(ctrl->BatteryList->Size, 2u);
}

TEST_F(ClassLockTest, ABuildThatHungIsToldOfWhenItEnds) {
    FaultRule rule;
    rule.entry = testbed::Entry::InstanceGetProperty;
    rule.times = 1;
    rule.keepResult = true;
    rule.hook = [this] { gate_.pass(); };
    const Path battery = addBattery("B1");
    faults().add(rule);
    auto hanging = buildElsewhere(battery);
    const GateOpener opener(gate_);
    ASSERT_TRUE(gate_.awaitArrivals(1));
    ahead = 30;
    process(103);
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR), std::vector<std::string>{kPassedOver});
    gate_.open();
    hanging.get();
    const auto lines = CapturedSyslog::linesAt(LOG_ERR);
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_TRUE(lines[1].ends_with(" secs, served again\n")) << lines[1];
}

TEST_F(ClassLockTest, APoolWalkThatHungIsToldOfWhenItEnds) {
    addPool("pool0");
    FaultRule rule;
    rule.entry = testbed::Entry::InstanceGetProperty;
    rule.times = 1;
    rule.keepResult = true;
    rule.hook = [this] { gate_.pass(); };
    faults().add(rule);
    auto hanging = std::async(std::launch::async, [this] {
        const testbed::Broker::CallScope scope(broker);
        BuildPoolInfo(&mi, scope.context(), ctrl);
    });
    const GateOpener opener(gate_);
    ASSERT_TRUE(gate_.awaitArrivals(1));
    ahead = 30;
    process(104);
    gate_.open();
    hanging.get();
    const auto lines = CapturedSyslog::linesAt(LOG_ERR);
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0],
              "ClassLock: controller C0, CIM_StoragePool: a refresh has been under way for 30 "
              "secs, passed over until it ends\n");
    EXPECT_TRUE(lines[1].ends_with(" secs, served again\n")) << lines[1];
}

TEST_F(ClassLockTest, NobodyWaitsForALogThatHangs) {
    const auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    ahead = 30;
    std::future<void> ports;
    std::atomic<bool> served = false;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text != kPassedOver) return;
        ports = std::async(std::launch::async, [&] {
            const testbed::Broker::CallScope scope(broker);
            ProcessDeviceConfigChange(&mi, scope.context(), ctrl, 102);
            served = true;
        });
        EXPECT_TRUE(eventually([&] { return served.load(); }));
    });
    process(103);
    CapturedSyslog::onLine(nullptr);
    EXPECT_TRUE(served);
}

TEST_F(ClassLockTest, UntilThenTheSecondWaits) {
    auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    ahead = 28;
    auto waiting = std::async(std::launch::async, [this] {
        const testbed::Broker::CallScope scope(broker);
        ProcessDeviceConfigChange(&mi, scope.context(), ctrl, 103);
    });
    // Not by a limit of the future's: that would be one of the clock that is ahead.
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    EXPECT_EQ(linesWith("Action 103"), 1u);
    gate_.open();
    hanging.get();
    waiting.get();
    EXPECT_EQ(linesWith("Action 103"), 2u);
    EXPECT_EQ(linesWith(", skip"), 1u) << "the second finds it not due";
    EXPECT_EQ(linesWith("ClassLock"), 0u);
}

TEST_F(ClassLockTest, AWaiterLooksForAStopEverySecond) {
    const auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    const HurriedWaits hurry(HurriedWaits::Conditions);
    auto waiting = std::async(std::launch::async, [this] {
        const testbed::Broker::CallScope scope(broker);
        ProcessDeviceConfigChange(&mi, scope.context(), ctrl, 103);
    });
    EXPECT_TRUE(eventually([] { return HurriedWaits::otherWaits().size() > 10; }));
    RequestStop();
    waiting.get();
    for (const auto wait : HurriedWaits::otherWaits()) EXPECT_LE(wait, std::chrono::seconds(1));
}

TEST_F(ClassLockTest, AWaitEndsAtAStop) {
    const auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    auto waiting = std::async(std::launch::async, [this] {
        const testbed::Broker::CallScope scope(broker);
        ProcessDeviceConfigChange(&mi, scope.context(), ctrl, 103);
    });
    EXPECT_EQ(waiting.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    RequestStop();
    waiting.get();
    EXPECT_EQ(linesWith("Action 103"), 1u);
}

TEST_F(ClassLockTest, AnHourOfAHungClassKeepsNobodyElseFromFollowingTheHardware) {
    const auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    for (int minute = 1; minute <= 60; minute++) {
        ahead = 60 * minute;
        VirtualClock::advance(60);
        addPort("Q" + std::to_string(minute));
        const std::size_t queries = associatorQueries().size();
        process(103);
        process(102);
        process(101);
        EXPECT_EQ(ctrl->PortList->Size, static_cast<unsigned int>(minute) + 1);
        EXPECT_EQ(associatorQueries().size(), queries + 4) << "ports, pools, drives, volumes";
    }
    EXPECT_EQ(timesLogged(LOG_ERR, kPassedOver), 1u);
}

TEST_F(ClassLockTest, ADeviceOfTheInventoryIsNotPassedOverHoweverLongItTakes) {
    auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    ahead = 3600;
    auto building = buildElsewhere(addBattery("B1"));
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    EXPECT_EQ(linesWith("BuildBatteryInfo, ENTER..."), 0u);
    gate_.open();
    hanging.get();
    building.get();
    EXPECT_EQ(linesWith("BuildBatteryInfo, ENTER..."), 2u) << "B0 came with the refresh";
    EXPECT_EQ(linesWith("ClassLock"), 0u);
}

TEST_F(ClassLockTest, ADeviceThatStillWaitsForItsClassAtAStopIsNotBuilt) {
    const auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    const std::size_t clones = books().liveClones();
    auto building = buildElsewhere(addBattery("B1"));
    EXPECT_EQ(building.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    RequestStop();
    building.get();
    EXPECT_EQ(linesWith("BuildBatteryInfo, ENTER..."), 0u);
    EXPECT_EQ(books().liveClones(), clones) << "the item's are released";
}

TEST_F(ClassLockTest, NothingIsServedAgainAfterAStop) {
    auto hanging = hangingRefresh();
    const GateOpener opener(gate_);
    ahead = 30;
    process(103);
    RequestStop();
    gate_.open();
    hanging.get();
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR), std::vector<std::string>{kPassedOver});
}

}  // namespace
}  // namespace plexortest
