// Releasing a controller with everything under it.
#include <stdlib.h>

#include "fake_path.h"
#include "provider_fixture.h"
#include "watched_calls.h"

namespace plexortest {
namespace {

class ControllerRelease : public ProviderTest {
protected:
    static LogLine freeing(const List_t* list, ReleaseFunc_t release) {
        return {LOG_DEBUG,
                formatted("Freeing list %p, release function %p\n", static_cast<const void*>(list),
                          reinterpret_cast<void*>(release))};
    }
    static LogLine empty(const List_t* list) {
        return {LOG_DEBUG, formatted("List %p is empty\n", static_cast<const void*>(list))};
    }
    const LogLine kDeleted = {LOG_DEBUG, "Controller Model C0 (C0) deleted\n"};
};

TEST_F(ControllerRelease, EmptyListsAreLoggedInOrder) {
    RaidController_t* ctrl = newController("C0");
    const std::vector<LogLine> expected = {freeing(&ctrl->__VolumeList, FreeVolume),
                                           empty(&ctrl->__VolumeList),
                                           freeing(&ctrl->__DiskList, FreeDisk),
                                           empty(&ctrl->__DiskList),
                                           freeing(&ctrl->__PoolList, FreePool),
                                           empty(&ctrl->__PoolList),
                                           freeing(&ctrl->__PortList, FreePort),
                                           empty(&ctrl->__PortList),
                                           freeing(&ctrl->__BatteryList, FreeBattery),
                                           empty(&ctrl->__BatteryList),
                                           freeing(&ctrl->__ChassisList, FreeChassis),
                                           empty(&ctrl->__ChassisList),
                                           kDeleted};
    FreeController(ctrl);
    EXPECT_EQ(CapturedSyslog::lines(), expected);
}

TEST_F(ControllerRelease, DevicesGoFirstKindByKind) {
    RaidController_t* ctrl = newController("C0");
    attach(ctrl, newChassis("C0_1"));
    attach(ctrl, newBattery("B0"));
    attach(ctrl, newPort("S0"));
    attach(ctrl, newPool("P0"));
    attach(ctrl, newDisk("D0", "P0"));
    attach(ctrl, newDisk("D1", "P0"));
    attach(ctrl, newVolume("V0", "P0"));
    FreeController(ctrl);
    EXPECT_TRUE(loggedInOrder({{LOG_DEBUG, "Volume Name V0 (Volume V0) deleted\n"},
                               {LOG_DEBUG, "Disk D0 deleted\n"},
                               {LOG_DEBUG, "Disk D1 deleted\n"},
                               {LOG_DEBUG, "Pool Pool P0 deleted\n"},
                               {LOG_DEBUG, "Port S0 deleted\n"},
                               {LOG_DEBUG, "Battery B0 deleted\n"},
                               {LOG_DEBUG, "Chassis C0_1 deleted\n"},
                               kDeleted}));
    EXPECT_EQ(CapturedSyslog::countContaining(" deleted\n"), 8u);
}

TEST_F(ControllerRelease, PathsGoLastThePortControllersAfterTheSystems) {
    RaidController_t* ctrl = newController("C0");
    FakePath port([&] { EXPECT_EQ(ctrl->ControllerOp, nullptr); });
    FakePath system([&] {
        EXPECT_EQ(ctrl->BundleVersion, nullptr);
        EXPECT_EQ(ctrl->DriverVersion, nullptr);
        EXPECT_EQ(ctrl->BiosVersion, nullptr);
        EXPECT_EQ(ctrl->FirmwareVersion, nullptr);
        EXPECT_EQ(ctrl->Model, nullptr);
        EXPECT_EQ(ctrl->DeviceID, nullptr);
        EXPECT_EQ(port.released, 0);
        EXPECT_TRUE(logged(LOG_DEBUG, kDeleted.text));
    });
    ctrl->PortControllerOp = &port.path;
    ctrl->ControllerOp = &system.path;
    FreeController(ctrl);
    EXPECT_EQ(system.released, 1);
    EXPECT_EQ(port.released, 1);
}

TEST_F(ControllerRelease, MutexesAreDestroyedTheControllersOwnLast) {
    RaidController_t* ctrl = newController("C0");
    const std::vector<const void*> expected = {
        &ctrl->DiskCfgMutex, &ctrl->VolumeCfgMutex,  &ctrl->PortCfgMutex, &ctrl->BatteryCfgMutex,
        &ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex, &ctrl->CtrlMutex};
    FakePath port([] { EXPECT_TRUE(DestroyWatch::destroyed().empty()) << "paths go before"; });
    ctrl->PortControllerOp = &port.path;
    const DestroyWatch watch;
    FreeController(ctrl);
    EXPECT_EQ(DestroyWatch::destroyed(), expected);
    EXPECT_EQ(port.released, 1);
}

TEST_F(ControllerRelease, TakesNoLock) {
    RaidController_t* ctrl = newController("C0");
    bool unlocked = true;
    const auto probe = [&] {
        for (pthread_mutex_t* mutex :
             {&ctrl->CtrlMutex, &ctrl->DiskCfgMutex, &ctrl->PoolCfgMutex}) {
            if (pthread_mutex_trylock(mutex) != 0) {
                unlocked = false;
            } else {
                pthread_mutex_unlock(mutex);
            }
        }
    };
    FakePath system(probe);
    ctrl->ControllerOp = &system.path;
    CapturedSyslog::onLine([&](const LogLine&) { probe(); });
    FreeController(ctrl);
    EXPECT_TRUE(unlocked);
    EXPECT_EQ(system.released, 1);
}

TEST_F(ControllerRelease, ControllerThatWasOnlyBegunIsReleased) {
    RaidController_t* ctrl = newController("C0");
    for (char** text : {&ctrl->DeviceID, &ctrl->Model, &ctrl->FirmwareVersion, &ctrl->BiosVersion,
                        &ctrl->DriverVersion, &ctrl->BundleVersion}) {
        free(*text);
        *text = nullptr;
    }
    FreeController(ctrl);
    EXPECT_TRUE(logged(LOG_DEBUG, "Controller NULL (NULL) deleted\n"));
}

TEST_F(ControllerRelease, IsAReleaseFunctionOfTheControllerList) {
    attach(newController("C0"));
    attach(newController("C1"));
    FreeList(RaidControllerList, FreeController);
    EXPECT_EQ(RaidControllerList->Size, 0u);
    EXPECT_TRUE(loggedInOrder({kDeleted, {LOG_DEBUG, "Controller Model C1 (C1) deleted\n"}}));
}

TEST_F(ControllerRelease, PathsOfTheWholeTreeAreReleased) {
    const testbed::ObjectPath path{"root/sample", "Sample_Thing", {}};
    RaidController_t* ctrl = newController("C0");
    ctrl->PortControllerOp = clonedPath(path);
    ctrl->ControllerOp = clonedPath(path);
    attach(ctrl, newPool("P0"))->PoolOp = clonedPath(path);
    DiskDrive_t* disk = attach(ctrl, newDisk("D0", "P0"));
    disk->DiskOp = clonedPath(path);
    disk->ExtentOp = clonedPath(path);
    ASSERT_EQ(books().liveClones(), 5u);
    FreeController(ctrl);
    EXPECT_EQ(books().liveClones(), 0u);
}

}  // namespace
}  // namespace plexortest
