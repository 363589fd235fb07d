// The whole way: the factory finds two controllers, the workers build their inventory, clients read
// it all the while, and it follows the hardware.
#include <algorithm>

#include "instance_client.h"
#include "inventory_vendor.h"
#include "refresh_fixture.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using Ids = std::vector<std::string>;

constexpr const char* kClasses[] = {"Tovexa_PlexorController",    "Tovexa_PlexorSoftwareIdentity",
                                    "Tovexa_PlexorStorageVolume", "Tovexa_PlexorStorageExtent",
                                    "Tovexa_PlexorSASSATAPort",   "Tovexa_PlexorBattery"};

class InventoryFactory : public RefreshTest {
protected:
    void TearDown() override {
        if (served_ != nullptr) {
            awaitRest();
            EXPECT_EQ(testbed::InstanceClient(broker, served_).cleanup(true), CMPI_RC_OK);
            EXPECT_EQ(books().live(testbed::ObjectKind::Context), 1u) << "a worker stayed behind";
        }
        RefreshTest::TearDown();
    }

    void callFactory() {
        CMPIStatus status = {CMPI_RC_OK, nullptr};
        served_ = PlexorProvider_Create_InstanceMI(broker.handle(), ctx(), &status);
        ASSERT_NE(served_, nullptr);
    }
    void awaitInventory() {
        ASSERT_TRUE(eventually([] { return threadActivityDone() == 1; }));
        ASSERT_TRUE(workersComeToRest());
    }
    /// For slow sanitizers: as long as it takes, within reason.
    static void awaitRest() {
        for (int i = 0; i < 10 && !(threadActivityDone() && workersComeToRest()); i++) continue;
    }

    static RaidController_t* controller(int index) {
        const List_Entry_t* entry = RaidControllerList->Head;
        while (index-- > 0) entry = entry->Next;
        return static_cast<RaidController_t*>(entry->Data);
    }
    template <class Record>
    static Ids sorted(RaidController_t* ctrl, const List_t* list, char* Record::*id) {
        Ids found;
        pthread_mutex_lock(&ctrl->CtrlMutex);
        for (const List_Entry_t* entry = list->Head; entry != nullptr; entry = entry->Next) {
            found.push_back(static_cast<Record*>(entry->Data)->*id);
        }
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        std::sort(found.begin(), found.end());
        return found;
    }
    testbed::InstanceClient served() { return {broker, served_}; }

    /// Asks for all classes, names, instances and one of them, as one client does.
    static void readEverything(testbed::InstanceClient client, std::atomic<int>& failures) {
        for (const char* name : kClasses) {
            const auto names = client.enumerateInstanceNames(name);
            const auto all = client.enumerateInstances(name);
            if (names.rc != CMPI_RC_OK || all.rc != CMPI_RC_OK) ++failures;
            if (names.paths.empty()) continue;
            const auto one = client.getInstance(names.paths.back());
            // It may have been pulled out since.
            if (one.rc != CMPI_RC_OK && one.rc != CMPI_RC_ERR_NOT_FOUND) ++failures;
        }
    }

    TwoControllers vendor_{repository};
    CMPIInstanceMI* served_ = nullptr;
};

TEST_F(InventoryFactory, ControllersAreThereAtOnceDevicesSoon) {
    Gate gate;
    testbed::FaultRule hold;
    hold.entry = testbed::Entry::Associators;
    hold.resultClass = "CIM_StoragePool";
    hold.times = 2;  // a controller each; a refresh may come when the gate is gone
    hold.hook = [&] { gate.pass(); };
    faults().add(hold);
    {
        const GateOpener opener(gate);
        callFactory();
        EXPECT_EQ(served().enumerateInstanceNames("Tovexa_PlexorController").paths.size(), 2u);
        EXPECT_EQ(served().enumerateInstanceNames("Tovexa_PlexorStorageVolume").paths.size(), 0u);
        EXPECT_EQ(threadActivityDone(), 0u);
    }
    awaitInventory();
    // Two of them a controller.
    EXPECT_EQ(served().enumerateInstanceNames("Tovexa_PlexorStorageVolume").paths.size(), 4u);
}

TEST_F(InventoryFactory, EveryDeviceOfBothControllersIsCached) {
    callFactory();
    awaitInventory();
    ASSERT_EQ(RaidControllerList->Size, 2u);
    for (int i = 0; i < 2; i++) {
        RaidController_t* const ctrl = controller(i);
        const std::string id = i == 0 ? "C0" : "C1";
        EXPECT_EQ(std::string(ctrl->DeviceID), id);
        EXPECT_EQ(sorted(ctrl, ctrl->PoolList, &StoragePool_t::InstanceID),
                  (Ids{id + "-free", id + "-pool"}));
        EXPECT_EQ(sorted(ctrl, ctrl->ChassisList, &Chassis_t::Tag), Ids{id + "_E0"});
        EXPECT_EQ(sorted(ctrl, ctrl->DiskList, &DiskDrive_t::DeviceID),
                  (Ids{id + "D0", id + "D1", id + "D2", id + "D3"}));
        EXPECT_EQ(sorted(ctrl, ctrl->VolumeList, &StorageVolume_t::DeviceID),
                  (Ids{id + "V0", id + "V1"}));
        EXPECT_EQ(sorted(ctrl, ctrl->PortList, &SASSATAPort_t::DeviceID),
                  (Ids{id + "P0", id + "P1", id + "P2"}));
        EXPECT_EQ(sorted(ctrl, ctrl->BatteryList, &Battery_t::DeviceID), Ids{id + "B0"});
        EXPECT_EQ(ctrl->ControllerUpdateTime, ctrl->DiskUpdateTime);
        EXPECT_NE(ctrl->ControllerUpdateTime, 0);
    }
    // Two controllers' paths; per controller two pools, a chassis, 4 x 2 + 2 + 3 + 1 device paths.
    EXPECT_EQ(books().liveClones(), 2u * 2 + 2 * (2 + 1 + 4 * 2 + 2 + 3 + 1));
}

TEST_F(InventoryFactory, RequestsMakeTheCacheFollowTheHardware) {
    callFactory();
    awaitInventory();
    ASSERT_TRUE(repository.remove(VendorObjects::devicePath("CIM_StorageVolume", "C0V0")));
    ASSERT_TRUE(repository.remove(VendorObjects::devicePath("CIM_DiskDrive", "C1D3")));
    vendor_.addDrive(0, "C0D9");
    vendor_.addVolume(1, "C1V9");
    VirtualClock::advance(20);

    // Answered from the cache as it stands.
    EXPECT_EQ(served().enumerateInstances("Tovexa_PlexorStorageVolume").instances.size(), 4u);
    ASSERT_TRUE(workersComeToRest());

    RaidController_t* const first = controller(0);
    RaidController_t* const second = controller(1);
    EXPECT_EQ(sorted(first, first->VolumeList, &StorageVolume_t::DeviceID), Ids{"C0V1"});
    EXPECT_EQ(sorted(second, second->VolumeList, &StorageVolume_t::DeviceID),
              (Ids{"C1V0", "C1V1", "C1V9"}));
    EXPECT_EQ(sorted(first, first->DiskList, &DiskDrive_t::DeviceID),
              (Ids{"C0D0", "C0D1", "C0D2", "C0D3", "C0D9"}));
    EXPECT_EQ(sorted(second, second->DiskList, &DiskDrive_t::DeviceID),
              (Ids{"C1D0", "C1D1", "C1D2"}));
    EXPECT_EQ(served().enumerateInstances("Tovexa_PlexorStorageVolume").instances.size(), 4u);
}

TEST_F(InventoryFactory, ReadersOfAllClassesWhileItIsBuiltAndChanges) {
    std::atomic<bool> stop = false;
    std::atomic<int> failures = 0, rounds = 0;
    callFactory();
    // No lock of the log between the threads: it would order them and hide their races.
    CapturedSyslog::discard(true);
    std::vector<std::thread> readers;
    for (int i = 0; i < 3; i++) {
        readers.emplace_back([&] {
            while (!stop) {
                readEverything(served(), failures);
                ++rounds;
            }
        });
    }
    // Drives and volumes come and go while the readers' requests keep the refreshes coming.
    for (int step = 0; step < 10; step++) {
        const std::string drive = "C0N" + std::to_string(step);
        const auto path = vendor_.addDrive(0, drive);
        const auto volume = vendor_.addVolume(1, "C1N" + std::to_string(step));
        const int before = rounds;
        VirtualClock::advance(20);
        eventually([&] { return rounds >= before + 4; });
        repository.setProperty(volume, "ElementName", CimValue::string("renamed"));
        if (step % 2 == 0) {
            repository.remove(path);
            repository.remove(volume);
        }
    }
    stop = true;
    for (std::thread& reader : readers) reader.join();
    EXPECT_EQ(failures, 0);

    awaitRest();
    // At rest and due, one more request per class brings the cache to what the vendor has.
    VirtualClock::advance(40);
    for (const char* name : kClasses) {
        served().enumerateInstances(name);
        awaitRest();
    }
    CapturedSyslog::discard(false);
    RaidController_t* const first = controller(0);
    RaidController_t* const second = controller(1);
    EXPECT_EQ(sorted(first, first->DiskList, &DiskDrive_t::DeviceID),
              (Ids{"C0D0", "C0D1", "C0D2", "C0D3", "C0N1", "C0N3", "C0N5", "C0N7", "C0N9"}));
    EXPECT_EQ(sorted(second, second->VolumeList, &StorageVolume_t::DeviceID),
              (Ids{"C1N1", "C1N3", "C1N5", "C1N7", "C1N9", "C1V0", "C1V1"}));
}

}  // namespace
}  // namespace plexortest
