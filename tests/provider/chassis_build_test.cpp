// One enclosure's record: from the vendor's instance into the controller's list.
#include "pools_fixture.h"

namespace plexortest {
namespace {

using testbed::Broker;
using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class ChassisBuild : public EnclosureTest {};

TEST_F(ChassisBuild, EveryFieldIsFilled) {
    const Path path = vendor_.chassis(vendor, "C0_Enclosure2");
    set(path, "OperationalStatus", CimValue::uint16Array({5, 2}));
    VirtualClock::set(kStart + 9);
    ASSERT_EQ(buildChassis(path), 0);
    ASSERT_EQ(chassis().size(), 1u);
    const Chassis_t* record = chassis()[0];
    EXPECT_EQ(Broker::toPath(record->ChassisOp), path);
    EXPECT_STREQ(record->Tag, "C0_Enclosure2");
    EXPECT_STREQ(record->InternalTag, "Enclosure2");
    EXPECT_EQ(record->OperationalStatus, 5);
    EXPECT_EQ(record->LastUpdateTime, kStart + 9);
    EXPECT_EQ(record->UpdateEnabled, 0);
    EXPECT_EQ(ctrl->ChassisUpdateTime, kStart + 9);
    EXPECT_EQ(ctrl->ControllerUpdateTime, 0);
    EXPECT_EQ(ctrl->PoolUpdateTime, 0);
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
    ASSERT_EQ(buildChassis(vendor_.chassis(vendor, tags.tag)), 0);
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

TEST_F(ChassisBuild, AsksTheBrokerNothing) {
    ASSERT_EQ(buildChassis(vendor_.chassis(vendor, "C0_E")), 0);
    EXPECT_THAT(books().calls(), IsEmpty());
}

TEST_F(ChassisBuild, RecordOwnsWhatItHolds) {
    ASSERT_EQ(buildChassis(vendor_.chassis(vendor, "C0_E")), 0);
    EXPECT_EQ(books().liveClones(), 2u);
    broker.flushThread();
    EXPECT_STREQ(chassis()[0]->Tag, "C0_E");
    EXPECT_EQ(Broker::toPath(chassis()[0]->ChassisOp).findKey("Tag")->asString(), "C0_E");
}

TEST_F(ChassisBuild, AppendsWithoutLookingForDuplicates) {
    const Path path = vendor_.chassis(vendor, "C0_E");
    EXPECT_EQ(buildChassis(vendor_.chassis(vendor, "C0_A")), 0);
    EXPECT_EQ(buildChassis(path), 0);
    EXPECT_EQ(buildChassis(path), 0);
    Texts tags;
    for (const Chassis_t* record : chassis()) tags.push_back(record->Tag);
    EXPECT_THAT(tags, ElementsAre("C0_A", "C0_E", "C0_E"));
}

TEST_F(ChassisBuild, Log) {
    const Path path = vendor_.chassis(vendor, "C0_E");
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
    const Path path = vendor_.chassis(vendor, "X1_E");
    ASSERT_EQ(buildChassis(path), 0);
    EXPECT_TRUE(logged(LOG_DEBUG, "\nChassisOp: " + path.text() +
                                      "\n\tTag               - X1_E"
                                      "\n\tInternalTag       - NULL"
                                      "\n\tOperationalStatus - 2\n"));
}

TEST_F(ChassisBuild, AppendsAndStampsUnderTheControllersMutex) {
    const Path path = vendor_.chassis(vendor, "C0_E");
    {
        const HolderUntilLogged holder(ctrl->CtrlMutex, "\nChassisOp: ", [this] {
            EXPECT_EQ(ctrl->ChassisList->Size, 0u);
            EXPECT_EQ(ctrl->ChassisUpdateTime, 0);
        });
        EXPECT_EQ(buildChassis(path), 0);
    }
    EXPECT_EQ(chassis().size(), 1u);
    EXPECT_EQ(ctrl->ChassisUpdateTime, kStart);
    EXPECT_TRUE(isFree(ctrl->CtrlMutex));
}

TEST_F(ChassisBuild, ClassMutexIsTheCallers) {
    pthread_mutex_lock(&ctrl->ChassisCfgMutex);
    EXPECT_EQ(buildChassis(vendor_.chassis(vendor, "C0_E")), 0);
    pthread_mutex_unlock(&ctrl->ChassisCfgMutex);
}

TEST_F(ChassisBuild, MaskedLinesCostNoCallForTheirTexts) {
    books().recordObjectCalls(true);
    setlogmask(LOG_UPTO(LOG_ERR));
    ASSERT_EQ(buildChassis(vendor_.chassis(vendor, "C0_E")), 0);
    EXPECT_EQ(books().count(Entry::PathToString), 0u);
}

}  // namespace
}  // namespace plexortest
