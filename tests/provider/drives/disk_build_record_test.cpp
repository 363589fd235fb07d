// What a built drive's record holds, and where each field comes from.
#include "disk_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class DiskBuildRecord : public DiskTest {};

TEST_F(DiskBuildRecord, HoldsWhatTheVendorSays) {
    ASSERT_EQ(buildDisk(), 0);

    ASSERT_EQ(ctrl->DiskList->Size, 1u);
    EXPECT_EQ(testbed::Broker::toPath(disk()->DiskOp), objects_.drive);
    EXPECT_EQ(testbed::Broker::toPath(disk()->ExtentOp), objects_.extent);
    EXPECT_STREQ(disk()->DeviceID, "D1");
    EXPECT_STREQ(disk()->Name, "Disk D1");
    EXPECT_STREQ(disk()->FwVersion, "FW-D1");
    EXPECT_EQ(disk()->EnabledState, 3);
    EXPECT_EQ(disk()->OperationalStatus, 5);
    EXPECT_EQ(disk()->ExtentStatus, 16);
    EXPECT_EQ(disk()->NumberOfBlocks, 0x1'0000'0002u);
    EXPECT_EQ(disk()->ConsumableBlocks, 0xFFFF'FFFF'FFFF'FFFFu);
    EXPECT_EQ(disk()->Primordial, 1);
    EXPECT_EQ(disk()->SlotNumber, 4);
    EXPECT_STREQ(disk()->Chassis, "C0_32");
    EXPECT_STREQ(disk()->Pool, "P1");
    EXPECT_THAT(members(pool_), ElementsAre("D1"));
}

TEST_F(DiskBuildRecord, LeavesModelAndUpdateFlagAlone) {
    repository.setProperty(objects_.drive, "Model", CimValue::string("M"));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->Model, nullptr);
    EXPECT_EQ(disk()->UpdateEnabled, 0);
}

TEST_F(DiskBuildRecord, OwnsClonesOfBothPaths) {
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(books().liveClones(), 2u);

    broker.flushThread();
    EXPECT_EQ(testbed::Broker::toPath(disk()->DiskOp), objects_.drive);
    EXPECT_EQ(testbed::Broker::toPath(disk()->ExtentOp), objects_.extent);
    EXPECT_STREQ(disk()->FwVersion, "FW-D1");
    EXPECT_STREQ(disk()->Chassis, "C0_32");
    EXPECT_STREQ(disk()->Pool, "P1");
}

TEST_F(DiskBuildRecord, LeavesMissingTextsNull) {
    repository.eraseProperty(objects_.drive, "Name");
    repository.remove(objects_.software);
    repository.remove(chassis_);
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->Name, nullptr);
    EXPECT_EQ(disk()->FwVersion, nullptr);
    EXPECT_EQ(disk()->Chassis, nullptr);
    EXPECT_EQ(disk()->SlotNumber, 4);
}

TEST_F(DiskBuildRecord, WithoutPackageHasNoPlace) {
    repository.remove(objects_.package);
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->SlotNumber, 0);
    EXPECT_EQ(disk()->Chassis, nullptr);
}

TEST_F(DiskBuildRecord, WithoutSlotHasNoPlace) {
    repository.remove(objects_.slot);
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->SlotNumber, 0);
    EXPECT_EQ(disk()->Chassis, nullptr);
}

TEST_F(DiskBuildRecord, TakesTheChassisThatIsNotCached) {
    ASSERT_EQ(ctrl->ChassisList->Size, 0u);
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_STREQ(disk()->Chassis, "C0_32");
    EXPECT_EQ(CapturedSyslog::countContaining("FindChassisByTag"), 0u);
}

TEST_F(DiskBuildRecord, TakesTheFirstOfSeveralObjects) {
    const VendorDrive other =
        vendor.drive(card, "D2", poolPath_, vendor.chassis(card, "C0_33"), 11);
    vendor.tie("CIM_MediaPresent", objects_.drive, other.extent);
    vendor.tie("CIM_ElementSoftwareIdentity", other.software, objects_.drive);
    vendor.tie("CIM_Realizes", other.package, objects_.drive);
    vendor.tie("CIM_PackageInConnector", other.slot, objects_.package);
    vendor.tie("CIM_Container", vendor.chassis(card, "C0_34"), objects_.slot);

    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(testbed::Broker::toPath(disk()->ExtentOp), objects_.extent);
    EXPECT_EQ(disk()->NumberOfBlocks, 0x1'0000'0002u);
    EXPECT_STREQ(disk()->FwVersion, "FW-D1");
    EXPECT_EQ(disk()->SlotNumber, 4);
    EXPECT_STREQ(disk()->Chassis, "C0_32");
}

TEST_F(DiskBuildRecord, TakesTheTagFromTheChassisPath) {
    repository.setProperty(chassis_, "Tag", CimValue::string("property"));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_STREQ(disk()->Chassis, "C0_32");
}

TEST_F(DiskBuildRecord, TakesThePoolFromThePoolPath) {
    repository.setProperty(poolPath_, "InstanceID", CimValue::string("property"));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "P1");
}

TEST_F(DiskBuildRecord, IgnoresPropertiesOfOtherObjects) {
    repository.eraseProperty(objects_.extent, "Primordial");
    repository.setProperty(objects_.drive, "Primordial", CimValue::boolean(true));
    repository.setProperty(objects_.drive, "NumberOfBlocks", CimValue::uint64(1));
    repository.setProperty(objects_.drive, "ExtentStatus", CimValue::uint16Array({1}));
    repository.setProperty(objects_.extent, "OperationalStatus", CimValue::uint16Array({1}));
    repository.setProperty(objects_.extent, "Name", CimValue::string("extent"));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->Primordial, 0);
    EXPECT_EQ(disk()->NumberOfBlocks, 0x1'0000'0002u);
    EXPECT_EQ(disk()->ExtentStatus, 16);
    EXPECT_EQ(disk()->OperationalStatus, 5);
    EXPECT_STREQ(disk()->Name, "Disk D1");
}

TEST_F(DiskBuildRecord, ReadsTheDrivesPropertiesInOrder) {
    books().recordObjectCalls(true);
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(propertiesRead("Sample_DiskDrive"),
                ElementsAre("DeviceID", "Name", "EnabledState", "OperationalStatus"));
}

TEST_F(DiskBuildRecord, ReadsTheExtentsPropertiesInOrder) {
    books().recordObjectCalls(true);
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(propertiesRead("Sample_StorageExtent"),
                ElementsAre("NumberOfBlocks", "ConsumableBlocks", "Primordial", "ExtentStatus"));
}

TEST_F(DiskBuildRecord, StampsTheRecordBeforeThePoolIsAskedFor) {
    using testbed::Entry;
    faults().add(
        along("CIM_Container", watch(Entry::AssociatorNames, [] { VirtualClock::advance(3); })));
    faults().add(along("CIM_ConcreteComponent",
                       watch(Entry::AssociatorNames, [] { VirtualClock::advance(40); })));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->LastUpdateTime, kStart + 3);
    EXPECT_EQ(ctrl->DiskUpdateTime, kStart + 43);
}

TEST_F(DiskBuildRecord, ReleasesTheRecordsOfATurnedAwayDrive) {
    repository.remove(poolPath_);
    EXPECT_EQ(buildDisk(), -1);
    expectNothingCached();
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_DEBUG), testing::Contains("Disk D1 deleted\n"));
}

TEST_F(DiskBuildRecord, OfAnAlreadyListedMemberJoinsOnce) {
    AddDiskToPool(pool_, "D1");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(members(pool_), ElementsAre("D1"));
}

}  // namespace
}  // namespace plexortest
