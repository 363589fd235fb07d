// The walk over a controller's logical devices: what it asks, queues and logs.
#include "devices_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class DevicesWalk : public DevicesTest {
protected:
    LogLine query() const {
        return debugLine("BuildLogicalDeviceInfo, CIM Query - Associators: " + card.system.text() +
                         " (assocClass: CIM_SystemDevice, resultClass: NULL)");
    }
    LogLine source() const {
        return debugLine("BuildLogicalDeviceInfo: " + card.system.text() + "\n");
    }
    static LogLine classified(int code, const Path& path) {
        return debugLine(formatted("BuildLogicalDeviceInfo: (%d)%s\n", code, path.text().c_str()));
    }
    static LogLine added(const Path& path) {
        return debugLine("Added to FIFO: " + path.text() + "\n");
    }
};

const LogLine kWalkEnter = debugLine("BuildLogicalDeviceInfo, enter...\n");
const LogLine kDone = debugLine("BuildLogicalDeviceInfo, DONE...\n");
const LogLine kWalkExit = debugLine("BuildLogicalDeviceInfo, exit...\n");

TEST_F(DevicesWalk, NoDevices) {
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), IsEmpty());
    EXPECT_THAT(VirtualClock::sleeps(), IsEmpty());
    EXPECT_THAT(inventoryLog(), ElementsAre(kWalkEnter, source(), query(), kDone, kWalkExit));
}

TEST_F(DevicesWalk, OneQueryForDevicesOfAllKinds) {
    addPorts(3);
    vendor.battery(card, "B");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(queries(),
                ElementsAre("associators " + card.system.text() + " CIM_SystemDevice/NULL"));
}

TEST_F(DevicesWalk, OneItemForEachDeviceOfTheFourKinds) {
    vendor.drive(card, "d1");
    vendor.fan(card, "f1");
    vendor.volume(card, "v1");
    vendor.battery(card, "b1");
    vendor.drive(card, "d2");
    vendor.port(card, "p1");
    vendor.fan(card, "f2");
    vendor.volume(card, "v2");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), ElementsAre("3 d1", "1 v1", "4 b1", "3 d2", "2 p1", "1 v2"));
}

TEST_F(DevicesWalk, OtherControllersDevicesAreNotQueued) {
    vendor.battery(vendor.controller("C1"), "theirs");
    vendor.battery(card, "ours");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), ElementsAre("4 ours"));
}

TEST_F(DevicesWalk, ItemCarriesTheDevice) {
    const Path path = vendor.battery(card, "b1");
    set(path, "BatteryStatus", CimValue::uint16(7));
    EXPECT_EQ(walk(), 0);
    ASSERT_EQ(taken_.size(), 1u);
    const Thread_Args_t* item = taken_[0];
    EXPECT_EQ(item->Func, ProcessBuildLogicalDeviceInfo);
    EXPECT_EQ(item->Arg0, reinterpret_cast<uintptr_t>(ctrl));
    EXPECT_EQ(item->Arg1, reinterpret_cast<uintptr_t>(&mi));
    EXPECT_EQ(item->Arg2, 0u);
    EXPECT_EQ(pathIn(item), path);
    EXPECT_EQ(instanceIn(item), repository.get(path));
    EXPECT_EQ(item->Arg5, 4u);
}

TEST_F(DevicesWalk, ItemOwnsClones) {
    addPorts(2);
    EXPECT_EQ(walk(), 0);
    // The controller's path, and two for each device.
    EXPECT_EQ(books().liveClones(), 5u);
    broker.flushThread();
    EXPECT_THAT(taken(), ElementsAre("2 0", "2 1"));
    EXPECT_EQ(instanceIn(taken_[1]).find("ElementName")->asString(), "Port 1");
    releaseTaken();
    EXPECT_EQ(books().liveClones(), 1u);
}

TEST_F(DevicesWalk, Log) {
    const Path volume = vendor.volume(card, "v1").volume;
    const Path fan = vendor.fan(card, "f1");
    const Path drive = vendor.drive(card, "d1").drive;
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(inventoryLog(),
                ElementsAre(kWalkEnter, source(), query(), classified(1, volume), added(volume),
                            classified(99, fan), classified(3, drive), added(drive), kWaiting,
                            kDone, kWalkExit));
}

TEST_F(DevicesWalk, BuildsNothingItself) {
    vendor.battery(card, "b1");
    addPorts(2);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(ctrl->BatteryList->Size, 0u);
    EXPECT_EQ(ctrl->PortList->Size, 0u);
    EXPECT_EQ(ctrl->BatteryUpdateTime, 0);
}

TEST_F(DevicesWalk, FailedQueryQueuesNothing) {
    addPorts(2);
    for (const QueryFailure& failure : queryFailures()) {
        SCOPED_TRACE(failure.name);
        failOnly(along("CIM_SystemDevice", failure.answer));
        EXPECT_EQ(walk(), 0);
        EXPECT_THAT(taken(), IsEmpty());
        std::vector<LogLine> expected = {kWalkEnter, source(), query()};
        if (failure.logged) {
            expected.push_back(errorLine("Associators " + card.system.text() +
                                         " (assocClass: CIM_SystemDevice, resultClass: NULL) "
                                         "failed, " +
                                         *failure.logged));
        }
        expected.push_back(kDone);
        expected.push_back(kWalkExit);
        EXPECT_EQ(inventoryLog(), expected);
        EXPECT_EQ(books().calls().size(), 1u);
    }
}

TEST_F(DevicesWalk, ControllerWithoutPath) {
    addPorts(1);
    CMPIObjectPath* own = std::exchange(ctrl->ControllerOp, nullptr);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(books().calls(), IsEmpty());
    EXPECT_TRUE(logged(LOG_DEBUG, "BuildLogicalDeviceInfo: NULL\n"));
    EXPECT_TRUE(logged(LOG_DEBUG,
                       "BuildLogicalDeviceInfo, CIM Query - Associators: NULL "
                       "(assocClass: CIM_SystemDevice, resultClass: NULL)"));
    ctrl->ControllerOp = own;
}

TEST_F(DevicesWalk, VendorsTextsAreNoFormats) {
    const Path path = vendor.port(card, "%s%n%d");
    EXPECT_EQ(walk(), 0);
    EXPECT_TRUE(logged(LOG_DEBUG, classified(2, path).text));
    EXPECT_TRUE(logged(LOG_DEBUG, added(path).text));
}

TEST_F(DevicesWalk, MaskedLinesCostNoCallForTheirTexts) {
    addPorts(2);
    books().recordObjectCalls(true);
    setlogmask(LOG_UPTO(LOG_ERR));
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(books().count(Entry::PathToString), 0u);
}

}  // namespace
}  // namespace plexortest
