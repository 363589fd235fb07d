// The status of a cached drive and its extent: watched at every update.
#include "disk_update_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testing::ElementsAre;
using testing::IsEmpty;

class DiskUpdateStatus : public DiskUpdateTest {};

TEST_F(DiskUpdateStatus, LogsAnUnchangedDrive) {
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(
        logLines(names()),
        ElementsAre("DEBUG CheckAndUpdateDiskInfo: ENTER. disk - Disk D1\n", kGetExtent, kGetPools,
                    "DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                    "DEBUG FindStoragePoolByID: found pool <pool> with P1 in list <pools>\n",
                    "DEBUG CheckAndUpdateDiskInfo, exit\n"));
    expectUnchanged();
}

TEST_F(DiskUpdateStatus, AsksTwoQueriesWithAFreshInstance) {
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(brokerCalls(), ElementsAre("getInstance " + kExtent,
                                           "associatorNames " + kExtent +
                                               " CIM_ConcreteComponent/CIM_StoragePool"));
}

TEST_F(DiskUpdateStatus, AsksThreeQueriesWithoutAFreshInstance) {
    ASSERT_EQ(updateDisk(nullptr), 0);
    EXPECT_THAT(brokerCalls(), ElementsAre("getInstance " + kDrive, "getInstance " + kExtent,
                                           "associatorNames " + kExtent +
                                               " CIM_ConcreteComponent/CIM_StoragePool"));
    expectUnchanged();
}

struct StatusChange {
    const char* label;
    std::uint16_t operational, extent;
    const char* line;
};

class DiskUpdateStatusChange : public DiskUpdateTest,
                               public testing::WithParamInterface<StatusChange> {};

TEST_P(DiskUpdateStatusChange, IsLoggedAndStored) {
    setStatus(GetParam().operational, GetParam().extent);
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_INFO), ElementsAre(GetParam().line));
    EXPECT_EQ(disk()->OperationalStatus, GetParam().operational);
    EXPECT_EQ(disk()->ExtentStatus, GetParam().extent);

    CapturedSyslog::clear();
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_INFO), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(
    Disk, DiskUpdateStatusChange,
    testing::Values(
        StatusChange{"Operational", 2, 16,
                     "CheckAndUpdateDiskInfo: disk D1 status changed. Old opStat 5 extStat 16, "
                     "new opStat 2 extStat 16\n"},
        StatusChange{"Extent", 5, 3,
                     "CheckAndUpdateDiskInfo: disk D1 status changed. Old opStat 5 extStat 16, "
                     "new opStat 5 extStat 3\n"},
        StatusChange{"Both", 6, 7,
                     "CheckAndUpdateDiskInfo: disk D1 status changed. Old opStat 5 extStat 16, "
                     "new opStat 6 extStat 7\n"},
        StatusChange{"Swapped", 16, 5,
                     "CheckAndUpdateDiskInfo: disk D1 status changed. Old opStat 5 extStat 16, "
                     "new opStat 16 extStat 5\n"}),
    [](const auto& given) { return given.param.label; });

TEST_F(DiskUpdateStatus, LogsTheChangeBetweenItsTwoQueries) {
    setStatus(2, 16);
    watchLog();
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(
        logWithLock(names()),
        ElementsAre(
            "free DEBUG CheckAndUpdateDiskInfo: ENTER. disk - Disk D1\n", "free " + kGetExtent,
            "held INFO CheckAndUpdateDiskInfo: disk D1 status changed. Old opStat 5 "
            "extStat 16, new opStat 2 extStat 16\n",
            "free " + kGetPools, "held DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
            "held DEBUG FindStoragePoolByID: found pool <pool> with P1 in list <pools>\n",
            "free DEBUG CheckAndUpdateDiskInfo, exit\n"));
}

TEST_F(DiskUpdateStatus, TakesMissingStatusAsZero) {
    repository.eraseProperty(objects_.drive, "OperationalStatus");
    repository.setProperty(objects_.extent, "ExtentStatus", CimValue::uint16(16));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_EQ(disk()->OperationalStatus, 0);
    EXPECT_EQ(disk()->ExtentStatus, 0);
}

TEST_F(DiskUpdateStatus, ChangesNothingWhenTheExtentCannotBeRead) {
    setStatus(2, 2);
    faults().add(refusal(Entry::GetInstance, CMPI_RC_ERR_FAILED, "gone"));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("GetInstance " + kExtent + " failed, status: rc 1, msg gone"));
    EXPECT_EQ(books().queries().size(), 2u) << "the pool is asked for all the same";
    expectUnchanged();
}

TEST_F(DiskUpdateStatus, ChangesNothingWhenTheExtentCameWithAFailure) {
    setStatus(2, 2);
    testbed::FaultRule rule = refusal(Entry::GetInstance);
    rule.keepResult = true;
    faults().add(rule);
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("GetInstance " + kExtent + " failed, status: rc 1, msg NULL"));
    expectUnchanged();
}

TEST_F(DiskUpdateStatus, ChangesNothingWhenTheExtentIsGone) {
    setStatus(2, 2);
    repository.remove(objects_.extent);
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("GetInstance " + kExtent + " failed, status: rc 6, msg "));
    expectUnchanged();
}

TEST_F(DiskUpdateStatus, ChangesNothingWhenTheExtentIsNullWithoutAnError) {
    setStatus(2, 2);
    faults().add(answerNull(Entry::GetInstance));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    EXPECT_EQ(books().queries().size(), 2u);
    expectUnchanged();
}

TEST_F(DiskUpdateStatus, NeverRereadsWhatTheBuildRead) {
    for (const char* name : {"Name", "DeviceID"})
        repository.setProperty(objects_.drive, name, CimValue::string("new"));
    repository.setProperty(objects_.drive, "EnabledState", CimValue::uint16(9));
    repository.setProperty(objects_.extent, "NumberOfBlocks", CimValue::uint64(1));
    repository.setProperty(objects_.extent, "ConsumableBlocks", CimValue::uint64(1));
    repository.setProperty(objects_.extent, "Primordial", CimValue::boolean(false));
    repository.setProperty(objects_.software, "VersionString", CimValue::string("new"));
    repository.setProperty(objects_.slot, "Number", CimValue::uint16(9));
    repository.remove(chassis_);
    setStatus(2, 2);
    ASSERT_EQ(updateDisk(), 0);

    EXPECT_EQ(disk()->OperationalStatus, 2);
    EXPECT_STREQ(disk()->Name, "Disk D1");
    EXPECT_STREQ(disk()->DeviceID, "D1");
    EXPECT_STREQ(disk()->FwVersion, "FW-D1");
    EXPECT_EQ(disk()->EnabledState, 3);
    EXPECT_EQ(disk()->NumberOfBlocks, 0x1'0000'0002u);
    EXPECT_EQ(disk()->ConsumableBlocks, 0xFFFF'FFFF'FFFF'FFFFu);
    EXPECT_EQ(disk()->Primordial, 1);
    EXPECT_EQ(disk()->SlotNumber, 4);
    EXPECT_STREQ(disk()->Chassis, "C0_32");
    EXPECT_EQ(disk()->LastUpdateTime, kStart);
}

// The fresh instance, when the caller has none.

class DiskUpdateFetch : public DiskUpdateTest {};

TEST_F(DiskUpdateFetch, UsesTheFetchedInstance) {
    setStatus(3, 16);
    ASSERT_EQ(updateDisk(nullptr), 0);
    EXPECT_EQ(disk()->OperationalStatus, 3);
    EXPECT_EQ(logLines()[1], kGetDrive);
}

TEST_F(DiskUpdateFetch, UsesTheGivenInstanceRatherThanAsking) {
    CMPIInstance* given = instanceAt(objects_.drive);
    setStatus(3, 16);
    ASSERT_EQ(updateDisk(given), 0);
    EXPECT_EQ(disk()->OperationalStatus, 5);
}

TEST_F(DiskUpdateFetch, FailingEndsTheUpdateWithAStamp) {
    setStatus(2, 2);
    faults().add(refusal(Entry::GetInstance, CMPI_RC_ERR_ACCESS_DENIED, "no entry"));
    ASSERT_EQ(updateDisk(nullptr), 0);
    EXPECT_THAT(logLines(),
                ElementsAre("DEBUG CheckAndUpdateDiskInfo: ENTER. disk - Disk D1\n", kGetDrive,
                            "ERR GetInstance " + kDrive + " failed, status: rc 2, msg no entry",
                            "DEBUG CheckAndUpdateDiskInfo, exit\n"));
    EXPECT_EQ(books().queries().size(), 1u);
    expectUnchanged();
}

TEST_F(DiskUpdateFetch, FailingWithoutMessageSaysNull) {
    faults().add(refusal(Entry::GetInstance, CMPI_RC_ERR_FAILED));
    ASSERT_EQ(updateDisk(nullptr), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("GetInstance " + kDrive + " failed, status: rc 1, msg NULL"));
    expectUnchanged();
}

TEST_F(DiskUpdateFetch, AnsweredNullEndsTheUpdateWithAStamp) {
    setStatus(2, 2);
    faults().add(answerNull(Entry::GetInstance));
    ASSERT_EQ(updateDisk(nullptr), 0);
    EXPECT_THAT(logLines(), ElementsAre("DEBUG CheckAndUpdateDiskInfo: ENTER. disk - Disk D1\n",
                                        kGetDrive, "DEBUG CheckAndUpdateDiskInfo, exit\n"));
    expectUnchanged();
}

TEST_F(DiskUpdateFetch, OfADriveWithoutExtentReadsNothingFurther) {
    setStatus(2, 2);
    CMPIObjectPath* extent = disk()->ExtentOp;
    disk()->ExtentOp = nullptr;
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(logLines(), ElementsAre("DEBUG CheckAndUpdateDiskInfo: ENTER. disk - Disk D1\n",
                                        "DEBUG CheckAndUpdateDiskInfo, exit\n"));
    EXPECT_THAT(brokerCalls(), IsEmpty());
    expectUnchanged();
    disk()->ExtentOp = extent;
}

TEST_F(DiskUpdateFetch, StampsAtTheEnd) {
    faults().add(watch(Entry::GetInstance, [] { VirtualClock::advance(2); }));
    faults().add(watch(Entry::AssociatorNames, [] { VirtualClock::advance(50); }));
    ASSERT_EQ(updateDisk(nullptr), 0);
    EXPECT_EQ(ctrl->DiskUpdateTime, kLater + 2 + 2 + 50);
}

TEST_F(DiskUpdateFetch, OfANamelessDriveIsTraced) {
    free(disk()->Name);
    disk()->Name = nullptr;
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_EQ(logLines()[0], "DEBUG CheckAndUpdateDiskInfo: ENTER. disk - NULL\n");
}

}  // namespace
}  // namespace plexortest
