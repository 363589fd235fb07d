// What the build of one drive asks of the broker and writes to the log, in order.
#include "disk_fixture.h"

namespace plexortest {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;

class DiskBuildTrace : public DiskTest {};

TEST_F(DiskBuildTrace, AsksSixQueriesInOrder) {
    ASSERT_EQ(buildDisk(), 0);
    const Texts expected = {
        "associators " + kDrive + " CIM_MediaPresent/NULL",
        "associators " + kDrive + " CIM_ElementSoftwareIdentity/CIM_SoftwareIdentity",
        "associatorNames " + kDrive + " CIM_Realizes/CIM_PhysicalPackage",
        "associators " + kPackage + " CIM_PackageInConnector/CIM_Slot",
        "associatorNames " + kSlot + " CIM_Container/CIM_Chassis",
        "associatorNames " + kExtent + " CIM_ConcreteComponent/CIM_StoragePool",
    };
    EXPECT_THAT(brokerCalls(), ElementsAreArray(expected));
}

TEST_F(DiskBuildTrace, LogsEveryStepInOrder) {
    ASSERT_EQ(buildDisk(), 0);
    const std::string dump = "\nDiskOp: " + kDrive + "\nExtentOp: " + kExtent +
                             "\n"
                             "\tDeviceID          - D1\n"
                             "\tName              - Disk D1\n"
                             "\tFirmwareVersion   - FW-D1\n"
                             "\tNumberOfBlocks    - 4294967298\n"
                             "\tConsumableBlocks  - 18446744073709551615\n"
                             "\tPrimordial        - 1\n"
                             "\tEnabledState      - 3\n"
                             "\tOperationalStatus - 5\n"
                             "\tSlot              - 4\n"
                             "\tChassis           - C0_32\n";
    const Texts expected = {
        "DEBUG BuildDiskInfo, ENTER...\n",
        "DEBUG BuildDiskInfo, CIM Query - Associators: " + kDrive +
            " (assocClass: CIM_MediaPresent, resultClass: NULL)",
        "DEBUG BuildDiskInfo, CIM Query - Associators: " + kDrive +
            " (assocClass: CIM_ElementSoftwareIdentity, resultClass: CIM_SoftwareIdentity)",
        "DEBUG BuildDiskInfo, CIM Query - AssociatorNames: " + kDrive +
            " (assocClass: CIM_Realizes, resultClass: CIM_PhysicalPackage)",
        "DEBUG CIM_PhysicalPackage(Physical Drive): " + kPackage + "\n",
        "DEBUG BuildDiskInfo, CIM Query - Associators: " + kPackage +
            " (assocClass: CIM_PackageInConnector, resultClass: CIM_Slot)",
        "DEBUG BuildDiskInfo, CIM Query - AssociatorNames: " + kSlot +
            " (assocClass: CIM_Container, resultClass: CIM_Chassis)",
        "INFO " + dump,
        "DEBUG BuildDiskInfo, CIM Query - AssociatorNames: " + kExtent +
            " (assocClass: CIM_Container, resultClass: CIM_Chassis)",
        "DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
        "DEBUG FindStoragePoolByID: found pool <pool> with P1 in list <pools>\n",
        "DEBUG BuildDiskInfo: found a pool <pool> with ID P1\n",
        "DEBUG Adding data <member> to the list <members> at the tail\n",
        "DEBUG Data <member> added to the list <members>, size 1\n",
        "DEBUG Adding data <disk> to the list <disks> at the tail\n",
        "DEBUG Data <disk> added to the list <disks>, size 1\n",
        "DEBUG BuildDiskInfo: disk <disk> added to the list <disks>\n",
        "DEBUG BuildDiskInfo, EXIT(0).\n",
    };
    EXPECT_THAT(logLines(names()), ElementsAreArray(expected));
}

TEST_F(DiskBuildTrace, DumpSaysNoChassis) {
    repository.remove(chassis_);
    ASSERT_EQ(buildDisk(), 0);
    const Texts dumps = CapturedSyslog::linesAt(LOG_INFO);
    ASSERT_EQ(dumps.size(), 1u);
    EXPECT_THAT(dumps[0], testing::EndsWith("\tSlot              - 4\n"
                                            "\tChassis           - No Chassis\n"));
}

TEST_F(DiskBuildTrace, DumpShowsZeroSlotWithoutPlace) {
    repository.remove(objects_.package);
    ASSERT_EQ(buildDisk(), 0);
    const Texts dumps = CapturedSyslog::linesAt(LOG_INFO);
    ASSERT_EQ(dumps.size(), 1u);
    EXPECT_THAT(dumps[0], testing::EndsWith("\tSlot              - 0\n"
                                            "\tChassis           - No Chassis\n"));
    EXPECT_EQ(CapturedSyslog::countContaining("CIM_PhysicalPackage(Physical Drive)"), 0u);
}

TEST_F(DiskBuildTrace, DumpNamesAbsentPathsNull) {
    testbed::FaultRule everyClone;
    everyClone.entry = testbed::Entry::Clone;
    faults().add(everyClone);
    EXPECT_EQ(buildDisk(), -1);
    ASSERT_EQ(CapturedSyslog::linesAt(LOG_INFO).size(), 1u);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_INFO)[0],
                testing::StartsWith("\nDiskOp: NULL\nExtentOp: NULL\n\tDeviceID          - D1\n"));
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("No pool associated with disk NULL\n"));
}

TEST_F(DiskBuildTrace, TakesVendorTextsAsTexts) {
    repository.setProperty(objects_.drive, "Name", testbed::CimValue::string("%s%n%d"));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_INFO)[0],
                testing::HasSubstr("\tName              - %s%n%d\n"));
}

TEST_F(DiskBuildTrace, OfADriveWithoutMediaStopsThere) {
    repository.remove(objects_.extent);
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(logLines(), ElementsAre("DEBUG BuildDiskInfo, ENTER...\n",
                                        "DEBUG BuildDiskInfo, CIM Query - Associators: " + kDrive +
                                            " (assocClass: CIM_MediaPresent, resultClass: NULL)",
                                        "ERR Disk D1 no media present\n", "DEBUG Disk D1 deleted\n",
                                        "DEBUG BuildDiskInfo, EXIT(-1).\n"));
    EXPECT_EQ(books().queries().size(), 1u);
    expectNothingCached();
}

TEST_F(DiskBuildTrace, OfADriveWithoutFirmwareGoesOn) {
    repository.remove(objects_.software);
    EXPECT_EQ(buildDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("Disk D1 firmware version no available\n"));
    EXPECT_EQ(books().queries().size(), 6u);
}

TEST_F(DiskBuildTrace, OfADriveWithoutPlaceIsSilentAboutIt) {
    repository.remove(objects_.package);
    EXPECT_EQ(buildDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    EXPECT_EQ(books().queries().size(), 4u);
}

TEST_F(DiskBuildTrace, OfADriveWithoutSlotIsSilentAboutIt) {
    repository.remove(objects_.slot);
    EXPECT_EQ(buildDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    EXPECT_EQ(books().queries().size(), 5u);
}

TEST_F(DiskBuildTrace, OfADriveWithoutPoolEndsWithTheRefusal) {
    repository.remove(poolPath_);
    EXPECT_EQ(buildDisk(), -1);
    Texts lines = logLines();
    ASSERT_GE(lines.size(), 4u);
    lines.erase(lines.begin(), lines.end() - 4);
    EXPECT_THAT(lines, ElementsAre("DEBUG BuildDiskInfo, CIM Query - AssociatorNames: " + kExtent +
                                       " (assocClass: CIM_Container, resultClass: CIM_Chassis)",
                                   "ERR No pool associated with disk " + kDrive + "\n",
                                   "DEBUG Disk D1 deleted\n", "DEBUG BuildDiskInfo, EXIT(-1).\n"));
    expectNothingCached();
}

// The arguments that the builder tests itself.

struct MissingArgument {
    const char* name;
    bool instance, path, controller;
};

class DiskBuildArguments : public DiskTest, public testing::WithParamInterface<MissingArgument> {};

TEST_P(DiskBuildArguments, AreRefusedWhenNull) {
    const MissingArgument& given = GetParam();
    const CMPIInstance* inst = given.instance ? instanceAt(objects_.drive) : nullptr;
    const CMPIObjectPath* path = given.path ? broker.makePath(objects_.drive) : nullptr;
    EXPECT_EQ(BuildDiskInfo(&mi, ctx(), given.controller ? ctrl : nullptr, inst, path), -1);
    EXPECT_THAT(logLines(),
                ElementsAre("DEBUG BuildDiskInfo, ENTER...\n", "DEBUG BuildDiskInfo, EXIT(-1).\n"));
    EXPECT_THAT(brokerCalls(), IsEmpty());
    expectNothingCached();
}

INSTANTIATE_TEST_SUITE_P(Disk, DiskBuildArguments,
                         testing::Values(MissingArgument{"NoInstance", false, true, true},
                                         MissingArgument{"NoPath", true, false, true},
                                         MissingArgument{"NoController", true, true, false}),
                         [](const auto& given) { return given.param.name; });

TEST_F(DiskBuildTrace, NeedsNoInterface) {
    EXPECT_EQ(BuildDiskInfo(nullptr, ctx(), ctrl, instanceAt(objects_.drive),
                            broker.makePath(objects_.drive)),
              0);
    EXPECT_NE(disk(), nullptr);
}

}  // namespace
}  // namespace plexortest
