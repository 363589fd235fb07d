// What the builders of a pool's and of an enclosure's record have in common when they fail.
#include "enclosure_kinds.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;

template <class Kind>
class EnclosureFailures : public EnclosureKindTest<Kind> {
protected:
    int buildWithoutPath() {
        return Kind::build(&this->mi, this->ctx(), this->ctrl, this->instanceAt(this->path_),
                           nullptr);
    }
};
TYPED_TEST_SUITE(EnclosureFailures, EnclosureKinds, KindNames);

TYPED_TEST(EnclosureFailures, MandatoryTextIsMissing) {
    for (const std::string& property : TypeParam::mandatory()) {
        this->make(TypeParam::id);
        this->unset(this->path_, property.c_str());
        this->startOver();
        EXPECT_EQ(this->build(), -1) << property;
        EXPECT_THAT(inventoryLog(),
                    ElementsAre(this->enter(), errorLine(this->rejected()), this->exiting(-1)));
        this->expectNothingLeft();
    }
}

TYPED_TEST(EnclosureFailures, MandatoryTextIsNoText) {
    for (const std::string& property : TypeParam::mandatory()) {
        this->make(TypeParam::id);
        for (const OddValue& odd : oddTexts()) {
            this->give(this->path_, property.c_str(), odd);
            this->startOver();
            EXPECT_EQ(this->build(), -1) << property << " " << odd.label;
            EXPECT_TRUE(logged(LOG_ERR, this->rejected()));
            this->expectNothingLeft();
        }
    }
}

TYPED_TEST(EnclosureFailures, RejectedWithoutPath) {
    this->unset(this->path_, TypeParam::mandatory().back().c_str());
    EXPECT_EQ(this->buildWithoutPath(), -1);
    EXPECT_TRUE(logged(LOG_ERR, TypeParam::rejected + std::string("NULL\n")));
    this->expectNothingLeft();
}

TYPED_TEST(EnclosureFailures, WithoutPathItIsStillCached) {
    EXPECT_EQ(this->buildWithoutPath(), 0);
    ASSERT_THAT(this->keys(), ElementsAre(TypeParam::id));
    EXPECT_EQ(this->records()[0]->*TypeParam::op, nullptr);
    EXPECT_EQ(CapturedSyslog::countContaining(TypeParam::dump + std::string("NULL\n")), 1u);
}

TYPED_TEST(EnclosureFailures, PathThatCannotBeCloned) {
    this->failOnly(this->answerNull(testbed::Entry::Clone));
    EXPECT_EQ(this->build(), 0);
    ASSERT_THAT(this->keys(), ElementsAre(TypeParam::id));
    EXPECT_EQ(this->records()[0]->*TypeParam::op, nullptr);
}

TYPED_TEST(EnclosureFailures, EveryAllocationInTurn) {
    for (const EnclosureShortage& shortage : TypeParam::shortages(this->rejected())) {
        SCOPED_TRACE(shortage.allocation);
        this->startOver();
        const auto fault = FailAllocation::nth(shortage.allocation);
        EXPECT_EQ(this->build(), shortage.result);
        EXPECT_EQ(fault.failures(), 1u);
        std::vector<LogLine> lines = {this->enter()};
        for (const std::string& text : shortage.lines) {
            const bool isCopy = text.starts_with("strdup()");
            lines.push_back(isCopy ? warningLine(text) : errorLine(text));
        }
        lines.push_back(this->exiting(shortage.result));
        EXPECT_TRUE(loggedInOrder(lines));
        this->expectNothingLeft();
    }
    const auto fault = FailAllocation::nth(5);
    EXPECT_EQ(this->build(), 0);
    EXPECT_EQ(fault.calls(), 4u);
}

TYPED_TEST(EnclosureFailures, NoMemoryAtAll) {
    const auto fault = FailAllocation::from(1);
    EXPECT_EQ(this->build(), -2);
    EXPECT_EQ(TypeParam::walk(&this->mi, this->ctx(), this->ctrl), -2);
    EXPECT_EQ(fault.calls(), 2u);
    this->expectNothingLeft();
}

TYPED_TEST(EnclosureFailures, StatusMayHoldAnything) {
    for (const OddValue& odd : oddArrays()) {
        this->give(this->path_, "OperationalStatus", odd);
        EXPECT_EQ(this->build(), 0) << odd.label;
        ASSERT_EQ(this->records().size(), 1u);
        EXPECT_EQ(this->records()[0]->OperationalStatus, 0) << odd.label;
        this->forgetAll();
    }
}

}  // namespace
}  // namespace plexortest
