// What the builders of a pool's and of an enclosure's record have in common.
#include "enclosure_kinds.h"

namespace plexortest {
namespace {

using testbed::Broker;
using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

template <class Kind>
class EnclosureBuild : public EnclosureKindTest<Kind> {
protected:
    using Entry = testbed::Entry;

    /// "<text> held" or "<text> free" for the lines with that beginning, by what CtrlMutex is.
    void watchLines(std::vector<std::string> beginnings) {
        CapturedSyslog::onLine([this, beginnings = std::move(beginnings)](const LogLine& line) {
            for (const std::string& beginning : beginnings) {
                if (!line.text.starts_with(beginning)) continue;
                lines_.push_back(beginning + (isFree(this->ctrl->CtrlMutex) ? "free" : "held"));
            }
        });
    }
    std::vector<std::string> lines_;
};
TYPED_TEST_SUITE(EnclosureBuild, EnclosureKinds, KindNames);

TYPED_TEST(EnclosureBuild, StampsItsOwnTimesOnly) {
    VirtualClock::set(this->kStart + 9);
    ASSERT_EQ(this->build(), 0);
    ASSERT_EQ(this->records().size(), 1u);
    EXPECT_EQ(Broker::toPath(this->records()[0]->*TypeParam::op), this->path_);
    EXPECT_EQ(this->records()[0]->LastUpdateTime, this->kStart + 9);
    EXPECT_EQ(this->records()[0]->UpdateEnabled, 0);
    for (auto time : {&RaidController_t::ControllerUpdateTime, &RaidController_t::ChassisUpdateTime,
                      &RaidController_t::PoolUpdateTime, &RaidController_t::VolumeUpdateTime,
                      &RaidController_t::DiskUpdateTime, &RaidController_t::PortUpdateTime,
                      &RaidController_t::BatteryUpdateTime}) {
        EXPECT_EQ(this->ctrl->*time, time == TypeParam::updateTime ? this->kStart + 9 : 0);
    }
}

TYPED_TEST(EnclosureBuild, StampsTheRecordWhenItHasReadEverything) {
    time_t reads = 0;
    this->failOnly(this->watch(testbed::Entry::InstanceGetProperty, [&reads] {
        reads++;
        VirtualClock::advance(1);
    }));
    ASSERT_EQ(this->build(), 0);
    EXPECT_GE(reads, 2);
    EXPECT_EQ(this->records()[0]->LastUpdateTime, this->kStart + reads);
}

TYPED_TEST(EnclosureBuild, AsksTheBrokerNothing) {
    ASSERT_EQ(this->build(), 0);
    EXPECT_THAT(this->books().calls(), IsEmpty());
}

TYPED_TEST(EnclosureBuild, ReadsItsPropertiesInTheirOrder) {
    this->books().recordObjectCalls(true);
    ASSERT_EQ(this->build(), 0);
    EXPECT_EQ(this->propertiesRead(this->path_.className), TypeParam::properties());
}

TYPED_TEST(EnclosureBuild, RecordOwnsWhatItHolds) {
    ASSERT_EQ(this->build(), 0);
    // The controller's path and the record's.
    EXPECT_EQ(this->books().liveClones(), 2u);
    this->broker.flushThread();
    ASSERT_THAT(this->keys(), ElementsAre(TypeParam::id));
    const testbed::ObjectPath kept = Broker::toPath(this->records()[0]->*TypeParam::op);
    EXPECT_EQ(kept.findKey(TypeParam::keyName)->asString(), TypeParam::id);
}

TYPED_TEST(EnclosureBuild, AppendsWithoutLookingForDuplicates) {
    EXPECT_EQ(this->build(this->make("another")), 0);
    EXPECT_EQ(this->build(), 0);
    EXPECT_EQ(this->build(), 0);
    EXPECT_THAT(this->keys(), ElementsAre("another", TypeParam::id, TypeParam::id));
}

TYPED_TEST(EnclosureBuild, AppendsAndStampsUnderTheControllersMutex) {
    {
        const HolderUntilLogged holder(this->ctrl->CtrlMutex, TypeParam::dump, [this] {
            EXPECT_EQ((this->ctrl->*TypeParam::list)->Size, 0u);
            EXPECT_EQ(this->updateTime(), 0);
        });
        EXPECT_EQ(this->build(), 0);
    }
    EXPECT_EQ(this->records().size(), 1u);
    EXPECT_EQ(this->updateTime(), this->kStart);
    EXPECT_TRUE(isFree(this->ctrl->CtrlMutex));
}

TYPED_TEST(EnclosureBuild, ReadsWithoutTheControllersMutex) {
    std::size_t reads = 0;
    this->failOnly(this->watch(testbed::Entry::InstanceGetProperty, [&] {
        reads++;
        EXPECT_TRUE(isFree(this->ctrl->CtrlMutex));
    }));
    EXPECT_EQ(this->build(), 0);
    EXPECT_EQ(reads, TypeParam::properties().size());
}

TYPED_TEST(EnclosureBuild, SaysThatItWasAddedWithoutTheControllersMutex) {
    this->watchLines({"Data ", TypeParam::added});
    ASSERT_EQ(this->build(), 0);
    EXPECT_THAT(this->lines_, ElementsAre("Data held", TypeParam::added + std::string("free")));
}

TYPED_TEST(EnclosureBuild, SaysThatItWasNotAddedAndGoesWithoutTheControllersMutex) {
    this->watchLines({"Adding data ", TypeParam::notAdded, TypeParam::released});
    const auto fault = FailAllocation::nth(4);
    ASSERT_EQ(this->build(), -2);
    EXPECT_THAT(this->lines_,
                ElementsAre("Adding data held", TypeParam::notAdded + std::string("free"),
                            TypeParam::released + std::string("free")));
}

TYPED_TEST(EnclosureBuild, ClassMutexIsTheCallers) {
    pthread_mutex_lock(&(this->ctrl->*TypeParam::classMutex));
    EXPECT_EQ(this->build(), 0);
    pthread_mutex_unlock(&(this->ctrl->*TypeParam::classMutex));
}

TYPED_TEST(EnclosureBuild, VendorsTextsAreNoFormats) {
    ASSERT_EQ(this->build(this->make("C0_%s%n")), 0);
    EXPECT_THAT(this->keys(), ElementsAre("C0_%s%n"));
    EXPECT_EQ(CapturedSyslog::countContaining(" - C0_%s%n\n"), 1u);
}

TYPED_TEST(EnclosureBuild, VeryLongTexts) {
    const std::string text = "C0_" + std::string(65536, 'x');
    for (const std::string& property : TypeParam::mandatory()) {
        this->set(this->path_, property.c_str(), CimValue::string(text));
    }
    EXPECT_EQ(this->build(), 0);
    EXPECT_THAT(this->keys(), ElementsAre(text));
}

TYPED_TEST(EnclosureBuild, MaskedLinesCostNoCallForTheirTexts) {
    this->books().recordObjectCalls(true);
    setlogmask(LOG_UPTO(LOG_ERR));
    ASSERT_EQ(this->build(), 0);
    EXPECT_EQ(this->books().count(testbed::Entry::PathToString), 0u);
}

}  // namespace
}  // namespace plexortest
