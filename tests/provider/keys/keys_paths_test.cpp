// Filling object paths with the keys of the served classes.
#include <memory>
#include <string>
#include <vector>

#include "PlexorProviderIfc.h"
#include "keys_fake_path.h"
#include "provider_fixture.h"

namespace {

using plexortest::AddedKey;
using plexortest::Allocator;
using plexortest::CapturedSyslog;
using plexortest::FailAllocation;
using plexortest::LogLine;
using plexortest::ScriptedPath;

using Keys = std::vector<AddedKey>;
using Lines = std::vector<LogLine>;

class KeysPathsTest : public plexortest::ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        __SystemName = plexortest::ownedCopy("host1.example");
        __HostName = plexortest::ownedCopy("not used here");
        __SystemClassName = plexortest::ownedCopy("OMC_UnitaryComputerSystem");
        controller.reset(plexortest::newController("C0"));
        CapturedSyslog::clear();
    }
    void TearDown() override {
        controller.reset();
        ProviderTest::TearDown();
    }

    std::unique_ptr<RaidController_t, decltype(&FreeController)> controller{nullptr,
                                                                            FreeController};
    ScriptedPath path;
};

TEST_F(KeysPathsTest, ControllerHasCreationClassNameAndName) {
    FillControllerObjectPath(path.handle(), controller.get());
    EXPECT_EQ(path.added, (Keys{{"CreationClassName", "Tovexa_PlexorController"},
                                {"Name", "tvxControllerC0"}}));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_DEBUG, "FillControllerObjectPath: DeviceID - C0\n"}}));
}

TEST_F(KeysPathsTest, ControllersNameIsComposedAfterItsClassNameWasAdded) {
    CMPIObjectPath* real = broker.makePath({"root/cimv2", "Tovexa_PlexorController", {}});
    const auto copies = FailAllocation::none(Allocator::Strdup);
    std::vector<std::size_t> copiesBefore;
    testbed::FaultRule watch;
    watch.entry = testbed::Entry::PathAddKey;
    watch.hook = [&] { copiesBefore.push_back(copies.calls()); };
    faults().add(watch);
    FillControllerObjectPath(real, controller.get());
    EXPECT_EQ(copiesBefore, (std::vector<std::size_t>{0, 1}));
}

TEST_F(KeysPathsTest, SoftwareIdentityHasInstanceIdAlone) {
    FillSoftwareIdentityObjectPath(path.handle(), controller.get());
    EXPECT_EQ(path.added, (Keys{{"InstanceID", "tovexa:ControllerSoftwareC0"}}));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_DEBUG, "FillSoftwareIdentityObjectPath: DeviceID - C0\n"}}));
}

TEST_F(KeysPathsTest, LogicalDeviceHasTheFourKeysOfASystemDevice) {
    FillLogicalDeviceObjectPath(path.handle(), "tvxPortC0_p1", "Tovexa_PlexorSASSATAPort");
    EXPECT_EQ(path.added, (Keys{{"SystemCreationClassName", "OMC_UnitaryComputerSystem"},
                                {"SystemName", "host1.example"},
                                {"CreationClassName", "Tovexa_PlexorSASSATAPort"},
                                {"DeviceID", "tvxPortC0_p1"}}));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_DEBUG,
                      "FillLogicalDeviceObjectPath: ClassName - "
                      "Tovexa_PlexorSASSATAPort, DeviceID - tvxPortC0_p1\n"}}));
}

TEST_F(KeysPathsTest, LogicalDeviceWithoutHostIdentityHasNullSystemKeys) {
    ReleaseSystemInfo();
    FillLogicalDeviceObjectPath(path.handle(), "tvxPortC0_p1", "Tovexa_PlexorSASSATAPort");
    EXPECT_EQ(path.added, (Keys{{"SystemCreationClassName", std::nullopt},
                                {"SystemName", std::nullopt},
                                {"CreationClassName", "Tovexa_PlexorSASSATAPort"},
                                {"DeviceID", "tvxPortC0_p1"}}));
}

TEST_F(KeysPathsTest, FailedCopyAddsANullControllerName) {
    const auto fault = FailAllocation::nth(1, Allocator::Strdup);
    FillControllerObjectPath(path.handle(), controller.get());
    EXPECT_EQ(path.added,
              (Keys{{"CreationClassName", "Tovexa_PlexorController"}, {"Name", std::nullopt}}));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_DEBUG, "FillControllerObjectPath: DeviceID - C0\n"},
                     {LOG_WARNING, "strdup() failed to duplicate string tvxControllerC0\n"}}));
}

TEST_F(KeysPathsTest, FailedCopyAddsANullSoftwareInstanceId) {
    const auto fault = FailAllocation::nth(1, Allocator::Strdup);
    FillSoftwareIdentityObjectPath(path.handle(), controller.get());
    EXPECT_EQ(path.added, (Keys{{"InstanceID", std::nullopt}}));
    EXPECT_TRUE(plexortest::logged(
        LOG_WARNING, "strdup() failed to duplicate string tovexa:ControllerSoftwareC0\n"));
}

TEST_F(KeysPathsTest, NullDeviceIdIsPassedOn) {
    FillLogicalDeviceObjectPath(path.handle(), nullptr, "Tovexa_PlexorBattery");
    ASSERT_EQ(path.added.size(), 4u);
    EXPECT_EQ(path.added[3], (AddedKey{"DeviceID", std::nullopt}));
}

TEST_F(KeysPathsTest, RefusedKeysStopNothing) {
    path.addKeyStatus = CMPI_RC_ERR_FAILED;
    FillControllerObjectPath(path.handle(), controller.get());
    FillSoftwareIdentityObjectPath(path.handle(), controller.get());
    FillLogicalDeviceObjectPath(path.handle(), "tvxPortC0_p1", "Tovexa_PlexorSASSATAPort");
    EXPECT_EQ(path.added.size(), 7u);
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR), std::vector<std::string>{});
}

// The broker copies key values, so what the fillers have freed stays readable in the path.
TEST_F(KeysPathsTest, KeysOutliveTheFillersOwnCopies) {
    CMPIObjectPath* real = broker.makePath({"root/cimv2", "Tovexa_PlexorController", {}});
    FillControllerObjectPath(real, controller.get());
    EXPECT_EQ(testbed::Broker::toPath(real).text(),
              "root/cimv2:Tovexa_PlexorController.CreationClassName=\"Tovexa_PlexorController\","
              "Name=\"tvxControllerC0\"");
}

// A null text becomes a null key, which the path then carries.
TEST_F(KeysPathsTest, NullKeysReachTheBroker) {
    CMPIObjectPath* real = broker.makePath({"root/cimv2", "Tovexa_PlexorSoftwareIdentity", {}});
    const auto fault = FailAllocation::nth(1, Allocator::Strdup);
    FillSoftwareIdentityObjectPath(real, controller.get());
    const testbed::ObjectPath filled = testbed::Broker::toPath(real);
    const testbed::CimValue* key = filled.findKey("InstanceID");
    ASSERT_NE(key, nullptr);
    EXPECT_TRUE(key->isNull);
}

}  // namespace
