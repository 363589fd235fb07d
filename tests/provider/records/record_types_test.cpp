// The records' fields and the numbers of the enumerations, as clients and the vendor know them.
#include <malloc.h>

#include <type_traits>

#include "PlexorProviderCfg.h"
#include "fake_path.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

template <typename Field, typename Expected>
constexpr bool kIs = std::is_same_v<Field, Expected>;

// NumberOfBlocks and its like must not be cut to 32 bits on the way.
static_assert(kIs<decltype(StorageVolume_t::NumberOfBlocks), CMPIUint64>);
static_assert(kIs<decltype(StorageVolume_t::ConsumableBlocks), CMPIUint64>);
static_assert(kIs<decltype(DiskDrive_t::NumberOfBlocks), CMPIUint64>);
static_assert(kIs<decltype(DiskDrive_t::ConsumableBlocks), CMPIUint64>);
static_assert(kIs<decltype(StoragePool_t::TotalManagedSpace), CMPIUint64>);
static_assert(kIs<decltype(StoragePool_t::RemainingManagedSpace), CMPIUint64>);
static_assert(kIs<decltype(StorageVolume_t::NameFormat), CMPIUint16>);
static_assert(kIs<decltype(StorageVolume_t::ExtentStripeLength), CMPIUint16>);
static_assert(kIs<decltype(StorageVolume_t::DeltaReservation), CMPIUint8>);
static_assert(kIs<decltype(StorageVolume_t::Primordial), CMPIBoolean>);
static_assert(kIs<decltype(DiskDrive_t::SlotNumber), CMPIUint16>);
static_assert(kIs<decltype(SASSATAPort_t::UsageRestriction), CMPIUint16>);
static_assert(kIs<decltype(Battery_t::BatteryStatus), CMPIUint16>);
static_assert(kIs<decltype(RaidController_t::HealthState), CMPIUint16>);
static_assert(kIs<decltype(RaidController_t::UpdateEnabled), unsigned char>);
static_assert(kIs<decltype(RaidController_t::ControllerUpdateTime), time_t>);
static_assert(kIs<decltype(List_t::Size), unsigned int>);
static_assert(sizeof(List_t) == 3 * sizeof(void*), "others have lists of their own");
static_assert(kIs<decltype(Fifo_t::Size), unsigned int>);
static_assert(kIs<decltype(Array_t::Count), unsigned int>);
static_assert(sizeof(Array_t::Array) / sizeof(void*) == 8);
static_assert(sizeof(CMPIUint16) == 2 && sizeof(CMPIUint64) == 8 && sizeof(CMPIBoolean) == 1);

TEST(RecordTypes, ARecordTakesItsSizeAndNotMuchMore) {
    auto* volume = NewRecord<StorageVolume_t>();
    ASSERT_NE(volume, nullptr);
    EXPECT_LT(malloc_usable_size(volume), sizeof *volume + 32);
    free(volume);
}

TEST(RecordTypes, OperationalStatusHasItsCimNumbers) {
    const int values[] = {
        OPSTATUS_UNKNOWN,    OPSTATUS_OTHER,           OPSTATUS_OK,
        OPSTATUS_DEGRADED,   OPSTATUS_STRESSED,        OPSTATUS_PREDICTIVE_FAILURE,
        OPSTATUS_ERROR,      OPSTATUS_NON_RECOVERABLE, OPSTATUS_STARTING,
        OPSTATUS_STOPPING,   OPSTATUS_STOPPED,         OPSTATUS_IN_SERVICE,
        OPSTATUS_NO_CONTACT, OPSTATUS_LOST_COM,        OPSTATUS_ABORTED,
        OPSTATUS_DORMANT,    OPSTATUS_SUP_ENT_ERR,     OPSTATUS_COMPLETED,
        OPSTATUS_POWER_MODE};
    int expected = 0;
    for (const int value : values) EXPECT_EQ(value, expected++);
    EXPECT_EQ(expected, 19);
}

TEST(RecordTypes, HealthStateHasItsCimNumbers) {
    EXPECT_EQ(HEALTHSTATE_UNKNOWN, 0);
    EXPECT_EQ(HEALTHSTATE_OK, 5);
    EXPECT_EQ(HEALTHSTATE_WARNING, 10);
    EXPECT_EQ(HEALTHSTATE_MINOR, 15);
    EXPECT_EQ(HEALTHSTATE_MAJOR, 20);
    EXPECT_EQ(HEALTHSTATE_CRIT, 25);
    EXPECT_EQ(HEALTHSTATE_FAILED, 30);
}

class PathAccessors : public ProviderTest {};

TEST_F(PathAccessors, GiveTheDevicesOwnPath) {
    FakePath path, other;
    StorageVolume_t volume = {};
    DiskDrive_t disk = {};
    SASSATAPort_t port = {};
    Battery_t battery = {};
    StoragePool_t pool = {};
    Chassis_t chassis = {};
    volume.VolumeOp = disk.DiskOp = port.PortOp = &path.path;
    battery.BatteryOp = pool.PoolOp = chassis.ChassisOp = &path.path;
    disk.ExtentOp = &other.path;
    EXPECT_EQ(GetVolumeOp(&volume), &path.path);
    EXPECT_EQ(GetDiskOp(&disk), &path.path);
    EXPECT_EQ(GetPortOp(&port), &path.path);
    EXPECT_EQ(GetBatteryOp(&battery), &path.path);
    EXPECT_EQ(GetPoolOp(&pool), &path.path);
    EXPECT_EQ(GetChassisOp(&chassis), &path.path);
}

TEST_F(PathAccessors, GiveNullForARecordWithoutPath) {
    const StorageVolume_t volume = {};
    EXPECT_EQ(GetVolumeOp(&volume), nullptr);
    const RaidController_t ctrl = {};
    EXPECT_EQ(GetControllerOp(&ctrl), nullptr);
}

TEST_F(PathAccessors, ServeEveryKindOfDevice) {
    FakePath path;
    DiskDrive_t disk = {};
    disk.DiskOp = &path.path;
    for (const GetOpFunc_t accessor :
         {GetVolumeOp, GetDiskOp, GetPortOp, GetBatteryOp, GetPoolOp, GetChassisOp}) {
        EXPECT_EQ(accessor(&disk), &path.path);
    }
}

TEST_F(PathAccessors, GiveTheControllersSystemNotItsPort) {
    FakePath port, system;
    RaidController_t ctrl = {};
    ctrl.PortControllerOp = &port.path;
    ctrl.ControllerOp = &system.path;
    EXPECT_EQ(GetControllerOp(&ctrl), &system.path);
}

TEST_F(PathAccessors, ControllerListIsEmptyAtFirst) {
    ASSERT_NE(RaidControllerList, nullptr);
    EXPECT_EQ(RaidControllerList->Size, 0u);
    EXPECT_EQ(RaidControllerList->Head, nullptr);
}

}  // namespace
}  // namespace plexortest
