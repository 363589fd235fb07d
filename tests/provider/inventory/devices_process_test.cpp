// The work function of a device's item: builder, mutex, and what becomes of the item.
#include "PlexorProviderCfgItems.h"
#include "devices_fixture.h"

namespace plexortest {
namespace {

using testing::IsEmpty;

/// The four kinds, and what differs between them.
struct ProcessedKind {
    const char* name;
    uintptr_t code;
    testbed::ObjectPath (*add)(VendorObjects& objects, const VendorController& controller);
    pthread_mutex_t RaidController_t::*classMutex;
    List_t* RaidController_t::*list;
    time_t RaidController_t::*updateTime;
    const char* builder;
    std::size_t paths;  ///< that a record owns
};

void PrintTo(const ProcessedKind& kind, std::ostream* out) {
    *out << kind.name;
}

testbed::ObjectPath addVolume(VendorObjects& objects, const VendorController& controller) {
    return objects.volume(controller, "x", objects.pool(controller, "P1")).volume;
}
testbed::ObjectPath addPort(VendorObjects& objects, const VendorController& controller) {
    return objects.port(controller, "x");
}
testbed::ObjectPath addDrive(VendorObjects& objects, const VendorController& controller) {
    return objects.drive(controller, "x", objects.pool(controller, "P1")).drive;
}
testbed::ObjectPath addBattery(VendorObjects& objects, const VendorController& controller) {
    return objects.battery(controller, "x");
}

const ProcessedKind kProcessedKinds[] = {
    {"Volume", 1, addVolume, &RaidController_t::VolumeCfgMutex, &RaidController_t::VolumeList,
     &RaidController_t::VolumeUpdateTime, "BuildVolumeInfo", 1},
    {"Port", 2, addPort, &RaidController_t::PortCfgMutex, &RaidController_t::PortList,
     &RaidController_t::PortUpdateTime, "BuildPortInfo", 1},
    {"Drive", 3, addDrive, &RaidController_t::DiskCfgMutex, &RaidController_t::DiskList,
     &RaidController_t::DiskUpdateTime, "BuildDiskInfo", 2},
    {"Battery", 4, addBattery, &RaidController_t::BatteryCfgMutex, &RaidController_t::BatteryList,
     &RaidController_t::BatteryUpdateTime, "BuildBatteryInfo", 1},
};

constexpr pthread_mutex_t RaidController_t::*kClassMutexes[] = {
    &RaidController_t::DiskCfgMutex, &RaidController_t::VolumeCfgMutex,
    &RaidController_t::PortCfgMutex, &RaidController_t::BatteryCfgMutex,
    &RaidController_t::PoolCfgMutex, &RaidController_t::ChassisCfgMutex};

class DevicesProcess : public DevicesTest {
protected:
    /// An item as the walk makes it.
    Thread_Args_t* itemFor(uintptr_t code, const Path& path) {
        auto* item = zeroed<Thread_Args_t>();
        item->Func = ProcessBuildLogicalDeviceInfo;
        item->Arg0 = reinterpret_cast<uintptr_t>(ctrl);
        item->Arg1 = reinterpret_cast<uintptr_t>(&mi);
        item->Arg3 = reinterpret_cast<uintptr_t>(clonedPath(path));
        item->Arg4 = reinterpret_cast<uintptr_t>(clonedInstance(repository.get(path).value()));
        item->Arg5 = code;
        return item;
    }
    void process(Thread_Args_t* item) {
        startOver();
        ProcessBuildLogicalDeviceInfo(ctx(), item);
    }
    std::size_t records() const {
        return ctrl->VolumeList->Size + ctrl->PortList->Size + ctrl->DiskList->Size +
               ctrl->BatteryList->Size;
    }
    void expectAllMutexesFree() {
        for (auto mutex : kClassMutexes) EXPECT_TRUE(isFree(ctrl->*mutex));
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
    }
};

TEST_F(DevicesProcess, AnItemCarriesAllThatTheWalkHasPutIn) {
    Thread_Args_t* const item = itemFor(2, vendor.port(card, "P0"));
    const auto op = reinterpret_cast<CMPIObjectPath*>(item->Arg3);
    const auto inst = reinterpret_cast<CMPIInstance*>(item->Arg4);
    const auto work = TakeWork<DeviceWork>(item);
    EXPECT_EQ(work.ctrl, ctrl);
    EXPECT_EQ(work.mi, &mi);
    EXPECT_EQ(work.op, op);
    EXPECT_EQ(work.inst, inst);
    EXPECT_EQ(work.deviceCode, 2);
    op->ft->release(op);
    inst->ft->release(inst);
}

class DevicesProcessKind : public DevicesProcess,
                           public testing::WithParamInterface<ProcessedKind> {};

INSTANTIATE_TEST_SUITE_P(Every, DevicesProcessKind, testing::ValuesIn(kProcessedKinds),
                         [](const auto& param) { return param.param.name; });

TEST_P(DevicesProcessKind, IsBuiltIntoItsList) {
    const ProcessedKind& kind = GetParam();
    const Path path = kind.add(vendor, card);
    VirtualClock::set(kStart + 4);
    process(itemFor(kind.code, path));
    EXPECT_EQ(records(), 1u);
    ASSERT_EQ((ctrl->*kind.list)->Size, 1u);
    EXPECT_EQ(testbed::Broker::toPath(GetDiskOp((ctrl->*kind.list)->Head->Data)), path);
    EXPECT_EQ(ctrl->*kind.updateTime, kStart + 4);
    // Of the clones only the record's own are left, and the controller's.
    EXPECT_EQ(books().liveClones(), 1 + kind.paths);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    EXPECT_TRUE(logged(LOG_DEBUG, std::string(kind.builder) + ", ENTER...\n"));
    expectAllMutexesFree();
}

TEST_P(DevicesProcessKind, IsBuiltUnderItsClassMutexAlone) {
    const ProcessedKind& kind = GetParam();
    const Path path = kind.add(vendor, card);
    Thread_Args_t* item = itemFor(kind.code, path);
    int watched = 0;
    auto rule = watch(Entry::InstanceGetProperty, [&] {
        watched++;
        for (auto mutex : kClassMutexes) {
            EXPECT_EQ(isFree(ctrl->*mutex), mutex != kind.classMutex);
        }
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
    });
    rule.name = "DeviceID";
    failOnly(rule);
    process(item);
    EXPECT_GE(watched, 1);
    expectAllMutexesFree();
}

TEST_P(DevicesProcessKind, WaitsForItsClassMutex) {
    const ProcessedKind& kind = GetParam();
    Thread_Args_t* item = itemFor(kind.code, kind.add(vendor, card));
    CMPIContext* prepared = ::Broker->bft->prepareAttachThread(::Broker, ctx());
    pthread_mutex_lock(&(ctrl->*kind.classMutex));
    std::atomic<bool> begun = false;
    std::thread worker([&] {
        ::Broker->bft->attachThread(::Broker, prepared);
        begun = true;
        ProcessBuildLogicalDeviceInfo(prepared, item);
        ::Broker->bft->detachThread(::Broker, prepared);
    });
    EXPECT_TRUE(eventually([&] { return begun.load(); }));
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
    EXPECT_EQ(CapturedSyslog::count(std::string(kind.builder) + ", ENTER...\n"), 0u);
    pthread_mutex_unlock(&(ctrl->*kind.classMutex));
    worker.join();
    EXPECT_EQ((ctrl->*kind.list)->Size, 1u);
}

TEST_P(DevicesProcessKind, ThePathGoesBeforeTheInstance) {
    const ProcessedKind& kind = GetParam();
    Thread_Args_t* item = itemFor(kind.code, kind.add(vendor, card));
    const auto* path = reinterpret_cast<const void*>(item->Arg3);
    const auto* instance = reinterpret_cast<const void*>(item->Arg4);
    std::vector<std::pair<bool, bool>> alive;  // path and instance, at each release
    failOnly(watch(Entry::Release, [&] {
        alive.push_back({books().kindOf(path).has_value(), books().kindOf(instance).has_value()});
    }));
    process(item);
    const std::vector<std::pair<bool, bool>> expected = {{true, true}, {false, true}};
    EXPECT_EQ(alive, expected);
}

TEST_P(DevicesProcessKind, RejectedDeviceLeavesNothing) {
    const ProcessedKind& kind = GetParam();
    const Path path = kind.add(vendor, card);
    unset(path, "DeviceID");
    process(itemFor(kind.code, path));
    EXPECT_EQ(records(), 0u);
    EXPECT_EQ(books().liveClones(), 1u);
    EXPECT_TRUE(logged(LOG_DEBUG, std::string(kind.builder) + ", EXIT(-1).\n"));
    expectAllMutexesFree();
}

TEST_P(DevicesProcessKind, NoMemoryForItsRecord) {
    const ProcessedKind& kind = GetParam();
    Thread_Args_t* item = itemFor(kind.code, kind.add(vendor, card));
    const auto fault = FailAllocation::from(1);
    process(item);
    EXPECT_EQ(records(), 0u);
    EXPECT_EQ(books().liveClones(), 1u);
    expectAllMutexesFree();
}

class DevicesProcessCode : public DevicesProcess, public testing::WithParamInterface<int> {};

INSTANTIATE_TEST_SUITE_P(Unknown, DevicesProcessCode, testing::Values(0, 5, 6, 98, 99, 100, -1),
                         [](const auto& param) {
                             return "Number" + std::to_string(param.param & 0xff);
                         });

TEST_P(DevicesProcessCode, IsLoggedAndTheClonesAreReleased) {
    const Path path = vendor.battery(card, "b1");
    process(itemFor(static_cast<uintptr_t>(GetParam()), path));
    EXPECT_EQ(inventoryLog(),
              std::vector<LogLine>{errorLine(
                  formatted("ProcessBuildLogicalDeviceInfo: invalid type %d\n", GetParam()))});
    EXPECT_EQ(records(), 0u);
    EXPECT_EQ(books().liveClones(), 1u);
    EXPECT_THAT(books().calls(), IsEmpty());
    expectAllMutexesFree();
}

TEST_F(DevicesProcess, ItemWithoutClones) {
    for (uintptr_t code = 0; code <= 5; code++) {
        auto* item = zeroed<Thread_Args_t>();
        item->Arg0 = reinterpret_cast<uintptr_t>(ctrl);
        item->Arg5 = code;
        process(item);
        EXPECT_EQ(records(), 0u) << code;
        EXPECT_EQ(books().liveClones(), 1u) << code;
        expectAllMutexesFree();
    }
}

TEST_F(DevicesProcess, ClonesOutliveTheBuilder) {
    // The record's path is a clone of its own: the item's may go.
    process(itemFor(4, vendor.battery(card, "b1")));
    broker.flushThread();
    const auto* battery = recordsOf<Battery_t>(ctrl->BatteryList).at(0);
    EXPECT_STREQ(battery->DeviceID, "b1");
    EXPECT_EQ(testbed::Broker::toPath(battery->BatteryOp).findKey("DeviceID")->asString(), "b1");
}

}  // namespace
}  // namespace plexortest
