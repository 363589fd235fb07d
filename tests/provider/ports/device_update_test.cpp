// What the four updaters have in common: the answer, the stamp, the lock.
#include "device_kinds.h"
#include "watched_calls.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::Each;

template <class Kind>
class DeviceUpdate : public KindTest<Kind> {};
TYPED_TEST_SUITE(DeviceUpdate, DeviceKinds, KindNames);

TYPED_TEST(DeviceUpdate, StampsItsOwnTimesOnly) {
    ASSERT_EQ(this->buildIt(), 0);
    const time_t built = this->record()->LastUpdateTime;
    VirtualClock::advance(25);
    CMPIInstance* fresh = this->instanceAt(this->path_);
    EXPECT_EQ(this->update(TypeParam::update, this->record(), fresh), 0);
    EXPECT_EQ(this->updateTime(), built + 25);
    EXPECT_EQ(this->record()->LastUpdateTime, built);
    EXPECT_THAT(this->otherTimes(), Each(0));
    EXPECT_EQ(this->list()->Size, 1u);
}

TYPED_TEST(DeviceUpdate, IgnoresTheUpdateFlagAndTheTimeSinceTheLast) {
    ASSERT_EQ(this->buildIt(), 0);
    for (unsigned char enabled : {0, 1, 255}) {
        this->record()->UpdateEnabled = enabled;
        VirtualClock::advance(1);
        EXPECT_EQ(this->update(TypeParam::update, this->record(), nullptr), 0);
        EXPECT_EQ(this->updateTime(), VirtualClock::now());
    }
}

TYPED_TEST(DeviceUpdate, StampsEvenWhenTheBrokerRefusesEverything) {
    ASSERT_EQ(this->buildIt(), 0);
    VirtualClock::advance(9);
    for (testbed::Entry entry : {testbed::Entry::GetInstance, testbed::Entry::AssociatorNames})
        this->faults().add(this->refusal(entry));
    EXPECT_EQ(this->update(TypeParam::update, this->record(), nullptr), 0);
    EXPECT_EQ(this->updateTime(), VirtualClock::now());
}

TYPED_TEST(DeviceUpdate, StampsUnderTheLock) {
    ASSERT_EQ(this->buildIt(), 0);
    const time_t built = this->updateTime();
    VirtualClock::advance(5);
    std::atomic<bool> begun = false;
    this->whileLockIsTaken(
        [&](const CMPIContext* context) {
            CMPIInstance* fresh = this->instanceAt(this->path_);
            begun = true;
            EXPECT_EQ(TypeParam::update(&this->mi, context, this->ctrl, this->record(), fresh), 0);
        },
        [&] { return begun.load(); }, [&] { EXPECT_EQ(this->updateTime(), built); });
    EXPECT_EQ(this->updateTime(), built + 5);
}

TYPED_TEST(DeviceUpdate, WithoutNeedItOnlySaysThatItWasHere) {
    ASSERT_EQ(this->buildIt(), 0);
    const time_t built = this->record()->LastUpdateTime;
    const auto status = this->record()->OperationalStatus;
    this->record()->UpdateEnabled = 3;
    this->repository.setProperty(this->path_, "OperationalStatus", CimValue::uint16Array({6}));
    VirtualClock::advance(25);
    this->startOver();
    const UpdatesDeclined declined;
    EXPECT_EQ(this->update(TypeParam::update, this->record(), nullptr), 0);
    EXPECT_EQ(UpdatesDeclined::questions(), (std::vector<UpdatesDeclined::Question>{{built, 3}}));
    EXPECT_EQ(this->updateTime(), built);
    EXPECT_EQ(this->record()->OperationalStatus, status);
    EXPECT_THAT(this->brokerCalls(), testing::IsEmpty());
    ASSERT_EQ(logLines().size(), 2u);
    EXPECT_EQ(logLines()[1], TypeParam::updated);
}

TYPED_TEST(DeviceUpdate, NeedsNoInterface) {
    ASSERT_EQ(this->buildIt(), 0);
    EXPECT_EQ(TypeParam::update(nullptr, this->ctx(), this->ctrl, this->record(),
                                this->instanceAt(this->path_)),
              0);
}

// Those that fetch the instance when they are given none.

template <class Kind>
class DeviceUpdateFetch : public KindTest<Kind> {};
using FetchingKinds = testing::Types<DiskKind, VolumeKind, BatteryKind>;
TYPED_TEST_SUITE(DeviceUpdateFetch, FetchingKinds, KindNames);

TYPED_TEST(DeviceUpdateFetch, StampsInAHoldOfTheLockOfItsOwn) {
    ASSERT_EQ(this->buildIt(), 0);
    this->repository.setProperty(this->path_, "OperationalStatus", CimValue::uint16Array({6}));
    CMPIInstance* fresh = this->instanceAt(this->path_);
    VirtualClock::advance(25);
    std::vector<std::pair<int, time_t>> atEnds;  // status and stamp at the end of each hold
    {
        const HoldWatch watch(this->ctrl->CtrlMutex, [&] {
            atEnds.push_back({this->record()->OperationalStatus, this->updateTime()});
        });
        EXPECT_EQ(this->update(TypeParam::update, this->record(), fresh), 0);
    }
    ASSERT_GE(atEnds.size(), 2u);
    const std::pair<int, time_t> stamped = {6, this->kStart + 25};
    EXPECT_EQ(atEnds.back(), stamped);
    atEnds.pop_back();
    EXPECT_THAT(atEnds, Each(std::pair<int, time_t>{6, this->kStart}));
}

TYPED_TEST(DeviceUpdateFetch, ReadsOddStatusAsZero) {
    ASSERT_EQ(this->buildIt(), 0);
    for (const OddValue& odd : oddArrays()) {
        SCOPED_TRACE(odd.label);
        this->record()->OperationalStatus = 6;
        this->give(this->path_, "OperationalStatus", odd);
        CMPIInstance* fresh = this->instanceAt(this->path_);
        ASSERT_EQ(this->update(TypeParam::update, this->record(), fresh), 0);
        EXPECT_EQ(this->record()->OperationalStatus, 0);
    }
}

TYPED_TEST(DeviceUpdateFetch, LogsAFailureThatCameWithAnInstanceAndUsesTheInstance) {
    ASSERT_EQ(this->buildIt(), 0);
    this->repository.setProperty(this->path_, "OperationalStatus", CimValue::uint16Array({6}));
    testbed::FaultRule rule = this->refusal(testbed::Entry::GetInstance);
    rule.keepResult = true;
    rule.times = 1;
    this->faults().add(rule);
    ASSERT_EQ(this->update(TypeParam::update, this->record(), nullptr), 0);
    EXPECT_TRUE(
        logged(LOG_ERR, "GetInstance " + this->pathText() + " failed, status: rc 1, msg NULL"));
    EXPECT_EQ(this->record()->OperationalStatus, 6);
}

}  // namespace
}  // namespace plexortest
