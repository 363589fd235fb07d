// Every line that names a path: under each log mask it says the same or costs no text.
#include "masked_log.h"

#include "PlexorProviderIfc.h"
#include "controller_fixture.h"
#include "deliberate_leaks.h"
#include "devices_fixture.h"
#include "match_fixture.h"
#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::ObjectPath;

class MaskedQueries : public MaskedLog<VendorTest> {
protected:
    void SetUp() override {
        VendorTest::SetUp();
        source_ = broker.makePath(vendor.controller("C0").system);
        query_ = {"Caller", ctx(), source_, "CIM_SystemDevice", nullptr};
    }

    const CMPIObjectPath* source_ = nullptr;
    Query_t query_ = {};
};

TEST_F(MaskedQueries, ThatSucceed) {
    expectSameUnderMasks([&] { QueryAssociators(query_); });
    expectSameUnderMasks([&] { QueryAssociatorNames(query_); });
    expectSameUnderMasks([&] { QueryInstances("Caller", ctx(), source_); });
    expectSameUnderMasks([&] { QueryInstance("Caller", ctx(), source_); });
}

TEST_F(MaskedQueries, ThatFail) {
    for (const Entry entry : {Entry::Associators, Entry::AssociatorNames, Entry::EnumerateInstances,
                              Entry::GetInstance}) {
        faults().add(refusal(entry, CMPI_RC_ERR_FAILED, "busy"));
    }
    expectSameUnderMasks([&] { EXPECT_EQ(QueryAssociators(query_), nullptr); });
    expectSameUnderMasks([&] { EXPECT_EQ(QueryAssociatorNames(query_), nullptr); });
    expectSameUnderMasks([&] { EXPECT_EQ(QueryInstances("Caller", ctx(), source_), nullptr); });
    bool failed = false;
    expectSameUnderMasks([&] { QueryInstance("Caller", ctx(), source_, &failed); });
    EXPECT_TRUE(failed);
}

using MaskedController = MaskedLog<ControllerTest>;

TEST_F(MaskedController, IsBuilt) {
    addFullController(addProfile(), "C0");
    expectSameUnderMasks([&] { EXPECT_EQ(build(), 0); });
}

TEST_F(MaskedController, WithoutDeviceID) {
    const VendorController card = addFullController(addProfile(), "C0");
    unset(card.port, "DeviceID");
    expectSameUnderMasks([&] { EXPECT_EQ(build(), 0); });
    EXPECT_EQ(cached(), Texts{});
}

TEST_F(MaskedController, IsFoundThroughItsProfile) {
    vendor.profile(kProfileName, "P1");
    expectSameUnderMasks([&] {
        Array_t found = {};
        EXPECT_EQ(GetHHRCProfiles(&mi, ctx(), &found), 1);
    });
}

TEST_F(MaskedController, AsksForTheHost) {
    vendor.host();
    expectSameUnderMasks([&] {
        ReleaseSystemInfo();
        EXPECT_EQ(InitSystemInfo(&mi, ctx()), 0);
    });
}

class MaskedDevices : public MaskedLog<DevicesTest> {
protected:
    /// Builds on a controller that has no device yet, in a pool with a cached record if asked for.
    void expectSameBuild(BuildFunc_t builder, const Path& path, int rc = 0,
                         const std::optional<Path>& pool = {}) {
        expectSameUnderMasks([&] {
            FreeList(RaidControllerList, FreeController);
            ctrl = attach(newController("C0"));
            ctrl->ControllerOp = clonedPath(card.system);
            if (pool) {
                EXPECT_EQ(build(BuildSinglePoolInfo, *pool), 0);
            }
            EXPECT_EQ(build(builder, path), rc);
        });
    }
};

TEST_F(MaskedDevices, AreBuilt) {
    const Path pool = vendor.pool(card, "pool-1");
    const Path chassis = vendor.chassis(card, "C0_chassis");
    expectSameBuild(BuildSinglePoolInfo, pool);
    expectSameBuild(BuildSingleChassisInfo, chassis);
    expectSameBuild(BuildDiskInfo, vendor.drive(card, "d1", pool, chassis, 3).drive, 0, pool);
    expectSameBuild(BuildVolumeInfo, vendor.volume(card, "v1", pool).volume, 0, pool);
    expectSameBuild(BuildPortInfo, vendor.port(card, "p1"));
    expectSameBuild(BuildBatteryInfo, vendor.battery(card, "b1"));
}

TEST_F(MaskedDevices, WithoutAPool) {
    expectSameBuild(BuildDiskInfo, vendor.drive(card, "d1").drive, -1);
    // A volume that is turned away leaves its path behind, in each of the builds.
    const DeliberateLeaks leaks;
    expectLeftClones(kRuns);
    expectSameBuild(BuildVolumeInfo, vendor.volume(card, "v1").volume, -1);
}

TEST_F(MaskedDevices, WithoutWhatNamesThem) {
    const auto nameless = [&](const Path& path, const char* property) {
        unset(path, property);
        return path;
    };
    expectSameBuild(BuildSinglePoolInfo, nameless(vendor.pool(card, "pool-1"), "PoolID"), -1);
    expectSameBuild(BuildSingleChassisInfo, nameless(vendor.chassis(card, "C0_c"), "Tag"), -1);
    expectSameBuild(BuildPortInfo, nameless(vendor.port(card, "p1"), "DeviceID"), -1);
}

TEST_F(MaskedDevices, AreQueued) {
    addPorts(2);
    expectSameUnderMasks([&] {
        releaseTaken();
        EXPECT_EQ(BuildLogicalDeviceInfo(&mi, ctx(), ctrl), 0);
    });
}

using MaskedRequests = MaskedLog<ServeTest>;

TEST_F(MaskedRequests, AreServed) {
    attach(newController("C0"));
    expectSameUnderMasks([&] {
        EXPECT_EQ(client().enumerateInstanceNames(kController, "root/cimv2").rc, CMPI_RC_OK);
    });
}

TEST_F(MaskedRequests, ForAPathWithoutItsKey) {
    const ObjectPath path = {"root/cimv2", kController, {}};
    expectSameUnderMasks([&] { EXPECT_EQ(client().getInstance(path).rc, CMPI_RC_ERR_NOT_FOUND); });
    EXPECT_TRUE(logged(LOG_ERR, "Object path " + path.text() + " invalid\n"));
}

using MaskedMatch = MatchTest;

TEST_F(MaskedMatch, HasNoLinesOfComparisons) {
    cache("P0");
    for (const int last : {LOG_INFO, LOG_ERR}) {
        setlogmask(LOG_UPTO(last));
        ASSERT_EQ(match(resultsOf({"P0", "P1"})), 0);
        EXPECT_EQ(CapturedSyslog::countContaining("opArr[0]: class name"), 0u);
        free(std::exchange(devices_, nullptr));
        free(std::exchange(ops_, nullptr));
    }
}

}  // namespace
}  // namespace plexortest
