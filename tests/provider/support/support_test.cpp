// That the ground the other tests stand on is firm: what they replace is really replaced.
#include <stdlib.h>
#include <unistd.h>

#include <thread>

#include "provider_fixture.h"
#include "vendor_objects.h"

namespace plexortest {
namespace {

using SupportTest = ProviderTest;

TEST_F(SupportTest, TimeAndSleepAreVirtual) {
    EXPECT_EQ(time(nullptr), kStart);
    EXPECT_EQ(sleep(3), 0u);
    time_t stored = 0;
    EXPECT_EQ(time(&stored), kStart + 3);
    EXPECT_EQ(stored, kStart + 3);
    ASSERT_EQ(VirtualClock::sleeps().size(), 1u);
    EXPECT_EQ(VirtualClock::sleeps()[0].seconds, 3u);
    EXPECT_EQ(VirtualClock::sleeps()[0].thread, std::this_thread::get_id());
}

TEST_F(SupportTest, SleepHookRunsBeforeTheClockMoves) {
    time_t seen = 0;
    VirtualClock::onSleep([&](unsigned int) { seen = time(nullptr); });
    sleep(1);
    EXPECT_EQ(seen, kStart);
}

TEST_F(SupportTest, LogLinesAreCapturedInOrderWithTheirPriority) {
    syslog(LOG_ERR, "%s: rc %d\n", "Caller", 5);
    syslog(LOG_DEBUG, "done");
    const std::vector<LogLine> expected = {{LOG_ERR, "Caller: rc 5\n"}, {LOG_DEBUG, "done"}};
    EXPECT_EQ(CapturedSyslog::lines(), expected);
    EXPECT_TRUE(loggedInOrder(expected));
    EXPECT_FALSE(loggedInOrder({expected[1], expected[0]}));
    EXPECT_TRUE(logged(LOG_DEBUG, "done"));
    EXPECT_FALSE(logged(LOG_INFO, "done"));
}

TEST_F(SupportTest, MaskedLinesAreLeftOutOnRequest) {
    setlogmask(LOG_UPTO(LOG_ERR));
    syslog(LOG_DEBUG, "kept");
    CapturedSyslog::honourMask(true);
    syslog(LOG_DEBUG, "masked");
    syslog(LOG_ERR, "kept too");
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{{LOG_DEBUG, "kept"}, {LOG_ERR, "kept too"}}));
}

TEST_F(SupportTest, AllocationsFailOnDemand) {
    List_t list = {};
    int item = 0;
    {
        const auto fault = FailAllocation::nth(2);
        EXPECT_EQ(AddEntryAtListTail(&list, &item), 0);
        EXPECT_EQ(AddEntryAtListTail(&list, &item), -2);
        EXPECT_EQ(AddEntryAtListTail(&list, &item), 0);
        EXPECT_EQ(fault.calls(), 3u);
        EXPECT_EQ(fault.failures(), 1u);
    }
    {
        const auto fault = FailAllocation::strdupOf("no");
        EXPECT_EQ(StringClone("no"), nullptr);
        char* copy = StringClone("yes");
        EXPECT_STREQ(copy, "yes");
        free(copy);
    }
    FreeList(&list, [](void*) {});
}

TEST_F(SupportTest, LoopOverFailingAllocationsCountsThem) {
    std::vector<std::size_t> tried;
    const std::size_t allocations = forEachFailingAllocation([&](std::size_t n) {
        tried.push_back(n);
        free(StringClone("one"));
        free(StringClone("two"));
    });
    EXPECT_EQ(allocations, 2u);
    EXPECT_EQ(tried, (std::vector<std::size_t>{1, 1, 2, 2, 3}));
}

TEST_F(SupportTest, VendorObjectsAreFoundThroughTheBroker) {
    VendorObjects vendor(repository);
    const auto profile = vendor.profile();
    const VendorController controller = vendor.controller("C0", profile);
    const auto pool = vendor.pool(controller, "P0");
    const auto chassis = vendor.chassis(controller, "C0_1");
    const VendorDrive drive = vendor.drive(controller, "D0", pool, chassis, 4);
    const VendorVolume volume = vendor.volume(controller, "V0", pool);

    const auto found = [&](const testbed::ObjectPath& source, const char* association,
                           const char* resultClass) {
        CMPIStatus status = {CMPI_RC_OK, nullptr};
        const CMPIBroker* handle = broker.handle();
        CMPIEnumeration* result =
            handle->bft->associators(handle, ctx(), broker.makePath(source), association,
                                     resultClass, nullptr, nullptr, nullptr, &status);
        std::vector<testbed::ObjectPath> paths;
        while (result != nullptr && result->ft->hasNext(result, nullptr)) {
            const CMPIData data = result->ft->getNext(result, nullptr);
            paths.push_back(testbed::Broker::toInstance(data.value.inst).path);
        }
        return paths;
    };
    using Paths = std::vector<testbed::ObjectPath>;
    EXPECT_EQ(found(profile, "CIM_ElementConformsToProfile", "CIM_PortController"),
              Paths{controller.port});
    EXPECT_EQ(found(controller.port, "CIM_LogicalIdentity", "CIM_ComputerSystem"),
              Paths{controller.system});
    EXPECT_EQ(found(controller.port, "CIM_Realizes", "CIM_PhysicalPackage"),
              Paths{controller.package});
    EXPECT_EQ(found(controller.system, "CIM_HostedStoragePool", "CIM_StoragePool"), Paths{pool});
    EXPECT_EQ(found(controller.system, "CIM_SystemPackaging", "CIM_Chassis"), Paths{chassis});
    EXPECT_EQ(found(controller.system, "CIM_SystemDevice", nullptr),
              (Paths{drive.drive, volume.volume}));
    EXPECT_EQ(found(drive.drive, "CIM_MediaPresent", nullptr), Paths{drive.extent});
    EXPECT_EQ(found(drive.drive, "CIM_Realizes", "CIM_PhysicalPackage"), Paths{drive.package});
    EXPECT_EQ(found(drive.package, "CIM_PackageInConnector", "CIM_Slot"), Paths{drive.slot});
    EXPECT_EQ(found(drive.slot, "CIM_Container", "CIM_Chassis"), Paths{chassis});
    EXPECT_EQ(found(drive.extent, "CIM_ConcreteComponent", "CIM_StoragePool"), Paths{pool});
    EXPECT_EQ(found(volume.volume, "CIM_ElementSettingData", "CIM_StorageSetting"),
              Paths{volume.setting});
    EXPECT_EQ(found(volume.volume, "CIM_AllocatedFromStoragePool", "CIM_StoragePool"), Paths{pool});
}

TEST_F(SupportTest, WorkersRunAnItemAndStop) {
    startWorkers();
    EXPECT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    EXPECT_TRUE(
        eventually([] { return CapturedSyslog::count("DoBuildDeviceInfoAsync done.") == 1; }));
    stopWorkers();
    EXPECT_EQ(CapturedSyslog::countContaining(" exiting...\n"), 2u);
}

}  // namespace
}  // namespace plexortest
