// What the four builders have in common: the identifier, the record, the insertion.
#include "device_kinds.h"
#include "odd_values.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::Each;
using testing::ElementsAre;
using testing::IsEmpty;

template <class Kind>
class DeviceBuild : public KindTest<Kind> {};
TYPED_TEST_SUITE(DeviceBuild, DeviceKinds, KindNames);

TYPED_TEST(DeviceBuild, WithoutDeviceIdIsTurnedAway) {
    for (const OddValue& odd : oddTexts()) {
        SCOPED_TRACE(odd.label);
        this->give(this->path_, "DeviceID", odd);
        this->startOver();
        EXPECT_EQ(this->buildIt(), -1);
        EXPECT_THAT(logLines(),
                    ElementsAre(TypeParam::enter, TypeParam::nullDeviceId + this->pathText() + "\n",
                                TypeParam::blankReleased, this->exitLine(-1)));
        EXPECT_THAT(this->brokerCalls(), IsEmpty());
        this->expectNothingCached();
    }
}

TYPED_TEST(DeviceBuild, WithoutDeviceIdAndCloneSaysNull) {
    this->repository.eraseProperty(this->path_, "DeviceID");
    this->faults().add(this->answerNull(testbed::Entry::Clone, 0));
    EXPECT_EQ(this->buildIt(), -1);
    EXPECT_EQ(logLines()[1], TypeParam::nullDeviceId + std::string("NULL\n"));
    this->expectNothingCached();
}

TYPED_TEST(DeviceBuild, WithAnUncopiedDeviceIdIsTurnedAway) {
    {
        const auto fault = FailAllocation::nth(2);
        EXPECT_EQ(this->buildIt(), -1);
        EXPECT_EQ(fault.failures(), 1u);
    }
    EXPECT_THAT(logLines(),
                ElementsAre(TypeParam::enter, "WARNING strdup() failed to duplicate string X1\n",
                            TypeParam::nullDeviceId + this->pathText() + "\n",
                            TypeParam::blankReleased, this->exitLine(-1)));
    this->expectNothingCached();
}

TYPED_TEST(DeviceBuild, WithoutMemoryForTheRecordDoesNothing) {
    this->books().recordObjectCalls(true);
    {
        const auto fault = FailAllocation::nth(1);
        EXPECT_EQ(this->buildIt(), -2);
    }
    EXPECT_THAT(logLines(), ElementsAre(TypeParam::enter, TypeParam::noMemory, this->exitLine(-2)));
    EXPECT_THAT(this->books().calls(), IsEmpty());
    this->expectNothingCached();
}

TYPED_TEST(DeviceBuild, AcceptsAnEmptyDeviceId) {
    this->repository.setProperty(this->path_, "DeviceID", CimValue::string(""));
    EXPECT_EQ(this->buildIt(), 0);
    ASSERT_NE(this->record(), nullptr);
    EXPECT_STREQ(this->record()->DeviceID, "");
}

TYPED_TEST(DeviceBuild, TakesTheDeviceIdOfTheInstanceNotOfThePath) {
    this->repository.setProperty(this->path_, "DeviceID", CimValue::string("%s other %n"));
    EXPECT_EQ(this->buildIt(), 0);
    ASSERT_NE(this->record(), nullptr);
    EXPECT_STREQ(this->record()->DeviceID, "%s other %n");
    EXPECT_EQ(testbed::Broker::toPath(this->record()->*TypeParam::op), this->path_);
}

TYPED_TEST(DeviceBuild, TakesThePathThatIsHandedIn) {
    testbed::ObjectPath handedIn = this->path_;
    handedIn.key("Extra", CimValue::string("key"));
    const testbed::Instance instance = this->repository.get(this->path_).value();
    this->vendor.tie("CIM_SystemDevice", this->card.system, handedIn);
    TypeParam::build(&this->mi, this->ctx(), this->ctrl, this->broker.makeInstance(instance),
                     this->broker.makePath(this->path_));
    ASSERT_NE(this->record(), nullptr);
    EXPECT_EQ(testbed::Broker::toPath(this->record()->*TypeParam::op), this->path_);
    EXPECT_NE(testbed::Broker::toPath(this->record()->*TypeParam::op), handedIn);
}

TYPED_TEST(DeviceBuild, WithoutCloneOfThePathHasNone) {
    if (std::string(TypeParam::name) == "Volume") return;  // needs the path for its pool
    this->faults().add(this->answerNull(testbed::Entry::Clone, 0));
    EXPECT_EQ(this->buildIt(), 0);
    ASSERT_NE(this->record(), nullptr);
    EXPECT_EQ(this->record()->*TypeParam::op, nullptr);
    EXPECT_EQ(CapturedSyslog::countContaining("Op: NULL\n"), 1u);
}

TYPED_TEST(DeviceBuild, AppendsAtTheTail) {
    ASSERT_EQ(this->buildIt(), 0);
    void* first = this->record();
    ASSERT_EQ(this->build(TypeParam::build, TypeParam::make(this->vendor, this->card, "X2")), 0);
    ASSERT_EQ(this->list()->Size, 2u);
    EXPECT_EQ(this->list()->Head->Data, first);
    auto* second = static_cast<typename TypeParam::Record*>(this->list()->Tail->Data);
    EXPECT_STREQ(second->DeviceID, "X2");
}

TYPED_TEST(DeviceBuild, AfterTheOnlyRecordWasDeletedAppendsAnew) {
    ASSERT_EQ(this->buildIt(), 0);
    ASSERT_EQ(TypeParam::remove(this->ctrl, this->record()), 0);
    ASSERT_EQ(this->buildIt(), 0);
    ASSERT_EQ(this->list()->Size, 1u);
    EXPECT_STREQ(this->record()->DeviceID, "X1");
}

TYPED_TEST(DeviceBuild, StampsItsOwnTimesOnly) {
    VirtualClock::advance(17);
    ASSERT_EQ(this->buildIt(), 0);
    EXPECT_EQ(this->updateTime(), this->kStart + 17);
    EXPECT_EQ(this->record()->LastUpdateTime, this->kStart + 17);
    EXPECT_EQ(this->record()->UpdateEnabled, 0);
    EXPECT_THAT(this->otherTimes(), Each(0));
}

TYPED_TEST(DeviceBuild, StampsTheRecordWhenItHasReadEverything) {
    int reads = 0;
    this->faults().add(this->watch(testbed::Entry::InstanceGetProperty, [&reads] {
        reads++;
        VirtualClock::advance(1);
    }));
    ASSERT_EQ(this->buildIt(), 0);
    EXPECT_GE(reads, 3);
    EXPECT_EQ(this->record()->LastUpdateTime, this->kStart + reads);
}

TYPED_TEST(DeviceBuild, OwnsWhatItKeeps) {
    ASSERT_EQ(this->buildIt(), 0);
    this->broker.flushThread();
    EXPECT_STREQ(this->record()->DeviceID, "X1");
    EXPECT_EQ(testbed::Broker::toPath(this->record()->*TypeParam::op), this->path_);
}

TYPED_TEST(DeviceBuild, ReadsOddStatusAsZero) {
    for (const OddValue& odd : oddArrays()) {
        SCOPED_TRACE(odd.label);
        this->give(this->path_, "OperationalStatus", odd);
        ASSERT_EQ(this->buildIt(), 0);
        EXPECT_EQ(this->record()->OperationalStatus, 0);
        ASSERT_EQ(TypeParam::remove(this->ctrl, this->record()), 0);
    }
}

TYPED_TEST(DeviceBuild, ReadsTheFirstStatus) {
    this->repository.setProperty(this->path_, "OperationalStatus",
                                 CimValue::uint16Array({12, 2, 2}));
    ASSERT_EQ(this->buildIt(), 0);
    EXPECT_EQ(this->record()->OperationalStatus, 12);
}

TYPED_TEST(DeviceBuild, SurvivesABrokerThatRefusesEveryRead) {
    for (testbed::Entry entry : {testbed::Entry::InstanceGetProperty, testbed::Entry::Clone,
                                 testbed::Entry::PathToString, testbed::Entry::StringGetCharPtr})
        this->faults().add(this->refusal(entry));
    EXPECT_EQ(this->buildIt(), -1);
    EXPECT_EQ(logLines()[1], TypeParam::nullDeviceId + std::string("NULL\n"));
    this->expectNothingCached();
}

TYPED_TEST(DeviceBuild, SurvivesABrokerThatShowsAllPropertiesAsNull) {
    testbed::Instance instance = this->repository.get(this->path_).value();
    for (auto& [name, value] : instance.properties)
        if (name != "DeviceID") value = CimValue::null(value.type);
    this->repository.put(instance);
    EXPECT_EQ(this->buildIt(), 0);
    EXPECT_STREQ(this->record()->DeviceID, "X1");
    EXPECT_EQ(this->record()->OperationalStatus, 0);
}

}  // namespace
}  // namespace plexortest
