// Releasing device records: what is logged, what goes when, what stays.
#include <stdlib.h>

#include "fake_path.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

using RecordRelease = ProviderTest;

std::vector<LogLine> onlyLine(const std::string& text) {
    return {{LOG_DEBUG, text}};
}

TEST_F(RecordRelease, NullIsIgnored) {
    for (const ReleaseFunc_t release :
         {FreeVolume, FreeDisk, FreePort, FreeBattery, FreeChassis, FreePool, FreeController}) {
        release(nullptr);
    }
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(RecordRelease, VolumeIsLoggedWithNameAndElementName) {
    FreeVolume(newVolume("V0", "P0"));
    EXPECT_EQ(CapturedSyslog::lines(), onlyLine("Volume Name V0 (Volume V0) deleted\n"));
}

TEST_F(RecordRelease, DiskIsLoggedWithItsName) {
    FreeDisk(newDisk("D0", "P0", "C0_1"));
    EXPECT_EQ(CapturedSyslog::lines(), onlyLine("Disk D0 deleted\n"));
}

TEST_F(RecordRelease, PortIsLoggedWithItsName) {
    FreePort(newPort("S0"));
    EXPECT_EQ(CapturedSyslog::lines(), onlyLine("Port S0 deleted\n"));
}

TEST_F(RecordRelease, BatteryIsLoggedWithItsID) {
    FreeBattery(newBattery("B0"));
    EXPECT_EQ(CapturedSyslog::lines(), onlyLine("Battery B0 deleted\n"));
}

TEST_F(RecordRelease, ChassisIsLoggedWithItsTag) {
    FreeChassis(newChassis("C0_1", "1"));
    EXPECT_EQ(CapturedSyslog::lines(), onlyLine("Chassis C0_1 deleted\n"));
}

TEST_F(RecordRelease, PoolIsLoggedWithItsPoolIDAndDrainsItsMembers) {
    StoragePool_t* pool = newPool("P0");
    addMember(pool, "D0");
    addMember(pool, "D1");
    const void* list = &pool->_Drives;
    FreePool(pool);
    EXPECT_TRUE(logged(LOG_DEBUG, "Pool Pool P0 deleted\n"));
    EXPECT_TRUE(logged(LOG_DEBUG, formatted("Freeing list %p, release function %p\n", list,
                                            reinterpret_cast<void*>(free))));
    EXPECT_EQ(CapturedSyslog::countContaining(formatted("removed from list %p, size", list)), 2u);
    EXPECT_EQ(CapturedSyslog::countContaining("freed from list"), 0u);
}

TEST_F(RecordRelease, PoolWithoutMembersHasAnEmptyList) {
    StoragePool_t* pool = newPool("P0");
    const void* list = &pool->_Drives;
    FreePool(pool);
    EXPECT_TRUE(logged(LOG_DEBUG, formatted("List %p is empty\n", list)));
}

TEST_F(RecordRelease, RecordsWithoutAnyTextAreReleased) {
    FreeVolume(zeroed<StorageVolume_t>());
    FreeDisk(zeroed<DiskDrive_t>());
    FreePort(zeroed<SASSATAPort_t>());
    FreeBattery(zeroed<Battery_t>());
    FreeChassis(zeroed<Chassis_t>());
    auto* pool = zeroed<StoragePool_t>();
    pool->Drives = &pool->_Drives;
    FreePool(pool);
    EXPECT_EQ(CapturedSyslog::countContaining(" deleted\n"), 6u);
    EXPECT_TRUE(logged(LOG_DEBUG, "Volume NULL (NULL) deleted\n"));
    EXPECT_TRUE(logged(LOG_DEBUG, "Battery NULL deleted\n"));
}

TEST_F(RecordRelease, TextsAreOnlyArgumentsNeverFormats) {
    FreeBattery(newBattery("%s%n"));
    EXPECT_EQ(CapturedSyslog::lines(), onlyLine("Battery %s%n deleted\n"));
}

TEST_F(RecordRelease, PathsAreReleasedThroughTheBroker) {
    const testbed::ObjectPath path{"root/sample", "Sample_Thing", {}};
    StorageVolume_t* volume = newVolume("V0");
    volume->VolumeOp = clonedPath(path);
    DiskDrive_t* disk = newDisk("D0");
    disk->DiskOp = clonedPath(path);
    disk->ExtentOp = clonedPath(path);
    SASSATAPort_t* port = newPort("S0");
    port->PortOp = clonedPath(path);
    Battery_t* battery = newBattery("B0");
    battery->BatteryOp = clonedPath(path);
    Chassis_t* chassis = newChassis("C0_1");
    chassis->ChassisOp = clonedPath(path);
    StoragePool_t* pool = newPool("P0");
    pool->PoolOp = clonedPath(path);
    ASSERT_EQ(books().liveClones(), 7u);
    FreeVolume(volume);
    EXPECT_EQ(books().liveClones(), 6u);
    FreeDisk(disk);
    EXPECT_EQ(books().liveClones(), 4u);
    FreePort(port);
    EXPECT_EQ(books().liveClones(), 3u);
    FreeBattery(battery);
    EXPECT_EQ(books().liveClones(), 2u);
    FreeChassis(chassis);
    EXPECT_EQ(books().liveClones(), 1u);
    FreePool(pool);
    EXPECT_EQ(books().liveClones(), 0u);
}

// A released field is null before the next one is released; the path goes last.

TEST_F(RecordRelease, VolumesPathGoesAfterItsTexts) {
    StorageVolume_t* volume = newVolume("V0", "P0");
    FakePath path([&] {
        EXPECT_EQ(volume->ElementName, nullptr);
        EXPECT_EQ(volume->RaidLevel, nullptr);
        EXPECT_EQ(volume->DeviceID, nullptr);
        EXPECT_EQ(volume->Name, nullptr);
        EXPECT_EQ(volume->FromPool, nullptr);
    });
    volume->VolumeOp = &path.path;
    FreeVolume(volume);
    EXPECT_EQ(path.released, 1);
}

TEST_F(RecordRelease, DisksPathsGoAfterItsTextsTheExtentsLast) {
    DiskDrive_t* disk = newDisk("D0", "P0", "C0_1");
    FakePath extent([&] { EXPECT_EQ(disk->DiskOp, nullptr); });
    FakePath path([&] {
        EXPECT_EQ(disk->FwVersion, nullptr);
        EXPECT_EQ(disk->Name, nullptr);
        EXPECT_EQ(disk->DeviceID, nullptr);
        EXPECT_EQ(disk->Pool, nullptr);
        EXPECT_EQ(disk->Chassis, nullptr);
        EXPECT_EQ(extent.released, 0);
    });
    disk->DiskOp = &path.path;
    disk->ExtentOp = &extent.path;
    FreeDisk(disk);
    EXPECT_EQ(path.released, 1);
    EXPECT_EQ(extent.released, 1);
}

TEST_F(RecordRelease, DisksModelIsNotReleased) {
    DiskDrive_t* disk = newDisk("D0");
    char* model = ownedCopy("somebody else's");
    disk->Model = model;
    FreeDisk(disk);
    EXPECT_STREQ(model, "somebody else's");
    free(model);
}

TEST_F(RecordRelease, PortsPathGoesAfterItsTexts) {
    SASSATAPort_t* port = newPort("S0");
    FakePath path([&] {
        EXPECT_EQ(port->PortName, nullptr);
        EXPECT_EQ(port->DeviceID, nullptr);
    });
    port->PortOp = &path.path;
    FreePort(port);
    EXPECT_EQ(path.released, 1);
}

TEST_F(RecordRelease, BatterysPathGoesAfterItsID) {
    Battery_t* battery = newBattery("B0");
    FakePath path([&] { EXPECT_EQ(battery->DeviceID, nullptr); });
    battery->BatteryOp = &path.path;
    FreeBattery(battery);
    EXPECT_EQ(path.released, 1);
}

TEST_F(RecordRelease, ChassisPathGoesAfterItsTags) {
    Chassis_t* chassis = newChassis("C0_1", "1");
    FakePath path([&] {
        EXPECT_EQ(chassis->Tag, nullptr);
        EXPECT_EQ(chassis->InternalTag, nullptr);
    });
    chassis->ChassisOp = &path.path;
    FreeChassis(chassis);
    EXPECT_EQ(path.released, 1);
}

TEST_F(RecordRelease, PoolsPathGoesAfterItsMembersAndTexts) {
    StoragePool_t* pool = newPool("P0");
    addMember(pool, "D0");
    FakePath path([&] {
        EXPECT_EQ(pool->_Drives.Size, 0u);
        EXPECT_EQ(pool->PoolID, nullptr);
        EXPECT_EQ(pool->InstanceID, nullptr);
    });
    pool->PoolOp = &path.path;
    FreePool(pool);
    EXPECT_EQ(path.released, 1);
}

TEST_F(RecordRelease, NeedsNoMemory) {
    StoragePool_t* pool = newPool("P0");
    addMember(pool, "D0");
    DiskDrive_t* disk = newDisk("D0", "P0", "C0_1");
    const auto fault = FailAllocation::from(1);
    FreePool(pool);
    FreeDisk(disk);
    EXPECT_EQ(fault.calls(), 0u);
}

}  // namespace
}  // namespace plexortest
