// Which classes a refresh goes through, and in which order.
#include "reconcile_fixture.h"

namespace plexortest {
namespace {

constexpr const char* kPools = "CIM_HostedStoragePool>CIM_StoragePool";
constexpr const char* kDrives = "CIM_SystemDevice>CIM_DiskDrive";
constexpr const char* kVolumes = "CIM_SystemDevice>CIM_StorageVolume";
constexpr const char* kPorts = "CIM_SystemDevice>CIM_SASSATAPort";
constexpr const char* kBatteries = "CIM_SystemDevice>CIM_Battery";
constexpr const char* kChassis = "CIM_SystemPackaging>CIM_Chassis";

struct Chain {
    int action;
    std::vector<std::string> walks;
    std::vector<time_t RaidController_t::*> stamped;
};

class ReconcileChain : public ReconcileTest, public ::testing::WithParamInterface<Chain> {};

TEST_P(ReconcileChain, WalksDependenciesFirst) {
    EXPECT_EQ(process(GetParam().action), 0);
    EXPECT_EQ(walks(), GetParam().walks);
    EXPECT_EQ(associatorQueries(), GetParam().walks);
}

TEST_P(ReconcileChain, StampsWhatItWentThroughAndNothingElse) {
    EXPECT_EQ(process(GetParam().action), 0);
    for (auto field : kClassTimes) {
        const bool isStamped =
            std::count(GetParam().stamped.begin(), GetParam().stamped.end(), field) != 0;
        EXPECT_EQ(ctrl->*field, isStamped ? kStart : 0);
    }
    EXPECT_EQ(ctrl->ControllerUpdateTime, 0);
}

TEST_P(ReconcileChain, TracesEntryAndExit) {
    EXPECT_EQ(process(GetParam().action), 0);
    const auto lines = CapturedSyslog::lines();
    ASSERT_GE(lines.size(), 2u);
    EXPECT_EQ(lines.front().text,
              formatted("ProcessDeviceConfigChange, ENTER(%d)...\n", GetParam().action));
    EXPECT_EQ(lines.front().priority, LOG_DEBUG);
    EXPECT_EQ(lines.back().text, "ProcessDeviceConfigChange, EXIT\n");
    EXPECT_EQ(lines.back().priority, LOG_DEBUG);
}

using Ctrl = RaidController_t;

INSTANTIATE_TEST_SUITE_P(
    Reconcile, ReconcileChain,
    ::testing::Values(
        Chain{100, {kPools, kDrives}, {&Ctrl::PoolUpdateTime, &Ctrl::DiskUpdateTime}},
        Chain{101,
              {kPools, kDrives, kVolumes},
              {&Ctrl::PoolUpdateTime, &Ctrl::DiskUpdateTime, &Ctrl::VolumeUpdateTime}},
        Chain{102, {kPorts}, {&Ctrl::PortUpdateTime}},
        Chain{103, {kBatteries}, {&Ctrl::BatteryUpdateTime}},
        Chain{104, {kPools}, {&Ctrl::PoolUpdateTime}},
        Chain{105, {kChassis}, {&Ctrl::ChassisUpdateTime}},
        // Codes without a row, the stop mark and "nothing" among them: an empty chain.
        Chain{106, {}, {}}, Chain{0, {}, {}}, Chain{99, {}, {}}, Chain{107, {}, {}}),
    [](const auto& test) { return std::to_string(test.param.action); });

class ReconcileOrder : public ReconcileTest {};

TEST_F(ReconcileOrder, EveryWalkIsMadeOnTheControllersSystem) {
    ASSERT_EQ(process(101), 0);
    const auto queries = books().queries();
    ASSERT_EQ(queries.size(), 3u);
    for (const auto& query : queries) {
        EXPECT_EQ(query.path, kSystemText);
        EXPECT_FALSE(query.hasPropertyList);
    }
}

TEST_F(ReconcileOrder, AVolumesPoolAndDrivesAreThereBeforeIt) {
    addOneOfEach();
    ASSERT_EQ(process(101), 0);

    EXPECT_EQ(pools(), Ids{"pool0"});
    EXPECT_EQ(drives(), Ids{"D0"});
    EXPECT_EQ(volumes(), Ids{"V0"});
    EXPECT_EQ(ports(), Ids{});
    EXPECT_EQ(batteries(), Ids{});
    EXPECT_EQ(chassis(), Ids{});
    // The drive found its pool, as pools came first.
    auto* pool = static_cast<StoragePool_t*>(ctrl->PoolList->Head->Data);
    EXPECT_EQ(pool->Drives->Size, 1u);
}

TEST_F(ReconcileOrder, EachActionBuildsItsOwnKind) {
    addOneOfEach();
    process(102);
    process(103);
    process(105);
    EXPECT_EQ(ports(), Ids{"P0"});
    EXPECT_EQ(batteries(), Ids{"B0"});
    EXPECT_EQ(chassis(), Ids{"C0_E0"});
    process(104);
    EXPECT_EQ(pools(), Ids{"pool0"});
    EXPECT_EQ(drives(), Ids{});
    process(100);
    EXPECT_EQ(drives(), Ids{"D0"});
    EXPECT_EQ(volumes(), Ids{});
}

TEST_F(ReconcileOrder, ControllersAreRefreshedApart) {
    addOneOfEach();
    RaidController_t* const other = attach(newController("C1"));
    const VendorController array = vendor.controller("C1");
    other->ControllerOp = clonedPath(array.system);
    vendor.port(array, "P9");

    process(102);
    EXPECT_EQ(other->PortList->Size, 0u);
    EXPECT_EQ(other->PortUpdateTime, 0);
    ProcessDeviceConfigChange(&mi, ctx(), other, 102);

    EXPECT_EQ(ports(), Ids{"P0"});
    EXPECT_EQ(ids(other->PortList, &SASSATAPort_t::DeviceID), Ids{"P9"});
}

}  // namespace
}  // namespace plexortest
