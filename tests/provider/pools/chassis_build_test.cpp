// One enclosure's record: from the vendor's instance into the controller's list.
#include "pools_fixture.h"

namespace plexortest {
namespace {

using testbed::Broker;
using testbed::CimValue;
using testing::ElementsAre;

class ChassisBuild : public EnclosureTest {
protected:
    void SetUp() override {
        EnclosureTest::SetUp();
        path = vendor.chassis(card, "C0_E");
    }

    Path path;
};

TEST_F(ChassisBuild, EveryFieldIsFilled) {
    const Path second = vendor.chassis(card, "C0_Enclosure2");
    set(second, "OperationalStatus", CimValue::uint16Array({5, 2}));
    ASSERT_EQ(buildChassis(second), 0);
    ASSERT_EQ(chassis().size(), 1u);
    const Chassis_t* record = chassis()[0];
    EXPECT_EQ(Broker::toPath(record->ChassisOp), second);
    EXPECT_STREQ(record->Tag, "C0_Enclosure2");
    EXPECT_STREQ(record->InternalTag, "Enclosure2");
    EXPECT_EQ(record->OperationalStatus, 5);
}

struct Tags {
    const char* name;
    const char* deviceId;
    const char* tag;
    const char* internalTag;
};

void PrintTo(const Tags& tags, std::ostream* out) {
    *out << tags.tag << " at " << tags.deviceId;
}

class ChassisInternalTag : public ChassisBuild, public testing::WithParamInterface<Tags> {};

TEST_P(ChassisInternalTag, IsTheTagWithoutTheControllersPrefix) {
    const Tags& tags = GetParam();
    free(ctrl->DeviceID);
    ctrl->DeviceID = ownedCopy(tags.deviceId);
    ASSERT_EQ(buildChassis(vendor.chassis(card, tags.tag)), 0);
    ASSERT_EQ(chassis().size(), 1u);
    EXPECT_STREQ(chassis()[0]->Tag, tags.tag);
    EXPECT_EQ(textOf(chassis()[0]->InternalTag), tags.internalTag);
}

INSTANTIATE_TEST_SUITE_P(All, ChassisInternalTag,
                         testing::Values(Tags{"Plain", "C0", "C0_Enclosure2", "Enclosure2"},
                                         Tags{"TwoUnderscores", "C0", "C0__7", "7"},
                                         Tags{"OnlyThePrefix", "C0", "C0", "absent"},
                                         Tags{"OnlyUnderscoresBehindIt", "C0", "C0___", "absent"},
                                         Tags{"OtherPrefix", "C0", "X1_Enclosure2", "absent"},
                                         Tags{"LongerControllerId", "C1", "C12_E", "2_E"},
                                         Tags{"NoUnderscore", "C0", "C0E2", "E2"},
                                         Tags{"InnerUnderscoresStay", "C0", "C0_a_b__", "a_b__"},
                                         Tags{"OtherLetterCase", "C0", "c0_Enclosure2", "absent"},
                                         Tags{"ShorterThanThePrefix", "C0", "C", "absent"},
                                         Tags{"PrefixNotAtTheStart", "C0", "_C0_E", "absent"},
                                         Tags{"EmptyTag", "C0", "", "absent"},
                                         Tags{"EmptyControllerId", "", "_E1", "E1"},
                                         Tags{"UnderscoreInControllerId", "C_", "C__1", "1"}),
                         [](const auto& param) { return param.param.name; });

TEST_F(ChassisBuild, Log) {
    ASSERT_EQ(buildChassis(path), 0);
    EXPECT_THAT(
        inventoryLog(),
        ElementsAre(debugLine("BuildSingleChassisInfo, enter...\n"),
                    debugLine("\nChassisOp: " + path.text() +
                              "\n\tTag               - C0_E"
                              "\n\tInternalTag       - E"
                              "\n\tOperationalStatus - 2\n"),
                    debugLine(formatted("BuildSingleChassisInfo: chassis %p added to the list\n",
                                        static_cast<void*>(chassis()[0]))),
                    debugLine("BuildSingleChassisInfo, EXIT(0).\n")));
}

TEST_F(ChassisBuild, AbsentInternalTagIsPrintedAsNull) {
    const Path foreign = vendor.chassis(card, "X1_E");
    ASSERT_EQ(buildChassis(foreign), 0);
    EXPECT_TRUE(logged(LOG_DEBUG, "\nChassisOp: " + foreign.text() +
                                      "\n\tTag               - X1_E"
                                      "\n\tInternalTag       - NULL"
                                      "\n\tOperationalStatus - 2\n"));
}

TEST_F(ChassisBuild, InternalTagThatCannotBeCopiedIsAbsent) {
    const auto fault = FailAllocation::strdupOf("E");
    EXPECT_EQ(buildChassis(path), 0);
    EXPECT_TRUE(logged(LOG_WARNING, "strdup() failed to duplicate string E\n"));
    ASSERT_EQ(chassis().size(), 1u);
    EXPECT_STREQ(chassis()[0]->Tag, "C0_E");
    EXPECT_EQ(chassis()[0]->InternalTag, nullptr);
}

TEST_F(ChassisBuild, InternalTagOfAVeryLongTag) {
    const std::string text = "C0_%s%n" + std::string(65536, 'x');
    set(path, "Tag", CimValue::string(text));
    EXPECT_EQ(buildChassis(path), 0);
    ASSERT_EQ(chassis().size(), 1u);
    EXPECT_EQ(chassis()[0]->InternalTag, text.substr(3));
}

}  // namespace
}  // namespace plexortest
