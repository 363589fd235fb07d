// Properties of drive, extent, slot and firmware that are missing, null or of another type.
#include "disk_fixture.h"
#include "odd_values.h"

namespace plexortest {
namespace {

using testbed::CimValue;

/// A property that is read, and how its value is seen in the record.
struct DiskNumber {
    const char* property;
    bool ofExtent;
    bool isArray;
    std::uint64_t (*value)(const DiskDrive_t* disk);
};

constexpr DiskNumber kDiskNumbers[] = {
    {"EnabledState", false, false,
     [](const DiskDrive_t* disk) -> std::uint64_t { return disk->EnabledState; }},
    {"OperationalStatus", false, true,
     [](const DiskDrive_t* disk) -> std::uint64_t { return disk->OperationalStatus; }},
    {"NumberOfBlocks", true, false,
     [](const DiskDrive_t* disk) -> std::uint64_t { return disk->NumberOfBlocks; }},
    {"ConsumableBlocks", true, false,
     [](const DiskDrive_t* disk) -> std::uint64_t { return disk->ConsumableBlocks; }},
    {"Primordial", true, false,
     [](const DiskDrive_t* disk) -> std::uint64_t { return disk->Primordial; }},
    {"ExtentStatus", true, true,
     [](const DiskDrive_t* disk) -> std::uint64_t { return disk->ExtentStatus; }},
};

class DiskBuildValues : public DiskTest, public testing::WithParamInterface<DiskNumber> {
protected:
    const Path& owner() const { return GetParam().ofExtent ? objects_.extent : objects_.drive; }
};

TEST_P(DiskBuildValues, CountAsZeroWhenOdd) {
    for (const OddValue& odd : GetParam().isArray ? oddArrays() : oddNumbers()) {
        SCOPED_TRACE(odd.label);
        give(owner(), GetParam().property, odd);
        ASSERT_EQ(buildDisk(), 0);
        EXPECT_EQ(GetParam().value(disk()), 0u);
        EXPECT_STREQ(disk()->DeviceID, "D1");
        ASSERT_EQ(DeleteDisk(ctrl, disk()), 0);
    }
}

INSTANTIATE_TEST_SUITE_P(Disk, DiskBuildValues, testing::ValuesIn(kDiskNumbers),
                         [](const auto& given) { return given.param.property; });

class DiskBuildOddities : public DiskTest {};

TEST_F(DiskBuildOddities, StatusIsTheFirstElement) {
    repository.setProperty(objects_.drive, "OperationalStatus", CimValue::uint16Array({6, 5, 4}));
    repository.setProperty(objects_.extent, "ExtentStatus", CimValue::uint16Array({9, 8}));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->OperationalStatus, 6);
    EXPECT_EQ(disk()->ExtentStatus, 9);
}

TEST_F(DiskBuildOddities, AreNullWhenOdd) {
    for (const OddValue& odd : oddTexts()) {
        SCOPED_TRACE(odd.label);
        give(objects_.drive, "Name", odd);
        give(objects_.software, "VersionString", odd);
        ASSERT_EQ(buildDisk(), 0);
        EXPECT_EQ(disk()->Name, nullptr);
        EXPECT_EQ(disk()->FwVersion, nullptr);
        ASSERT_EQ(DeleteDisk(ctrl, disk()), 0);
    }
}

TEST_F(DiskBuildOddities, MayBeEmptyOrVeryLong) {
    const std::string longText(64 * 1024, 'n');
    repository.setProperty(objects_.drive, "Name", CimValue::string(longText));
    repository.setProperty(objects_.software, "VersionString", CimValue::string(""));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_EQ(disk()->Name, longText);
    EXPECT_STREQ(disk()->FwVersion, "");
}

TEST_F(DiskBuildOddities, OddSlotNumbersCountAsZero) {
    for (const OddValue& odd : oddNumbers()) {
        SCOPED_TRACE(odd.label);
        give(objects_.slot, "Number", odd);
        ASSERT_EQ(buildDisk(), 0);
        EXPECT_EQ(disk()->SlotNumber, 0);
        EXPECT_STREQ(disk()->Chassis, "C0_32");
        ASSERT_EQ(DeleteDisk(ctrl, disk()), 0);
    }
}

}  // namespace
}  // namespace plexortest
