// Broker objects of long-lived threads: after every item nothing but the records' clones is left.
#include <map>

#include "workers_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;

class WorkersObjects : public WorkersCardTest {
protected:
    void SetUp() override {
        WorkersCardTest::SetUp();
        pool_ = vendor.pool(card, "pool0");
    }
    /// `count` devices of each of the four kinds.
    void addDevices(int count) {
        for (int i = 0; i < count; i++) {
            const std::string number = std::to_string(i);
            vendor.drive(card, "D" + number, pool_);
            vendor.volume(card, "V" + number, pool_);
            vendor.port(card, "P" + number);
            vendor.battery(card, "B" + number);
        }
    }
    void buildInventory() {
        ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
        // A slow sanitizer needs its time here.
        for (int i = 0; i < 20 && threadActivityDone() == 0; i++) {
            eventually([] { return threadActivityDone() == 1; });
        }
        ASSERT_TRUE(workersComeToRest());
    }
    std::size_t liveOnWorkers() {
        std::size_t live = 0;
        for (const std::thread::id thread : threadsOf(Entry::AttachThread)) {
            live += books().liveOnThread(thread);
        }
        return live;
    }
    std::size_t records() {
        return ctrl->DiskList->Size + ctrl->VolumeList->Size + ctrl->PortList->Size +
               ctrl->BatteryList->Size;
    }

    testbed::ObjectPath pool_;
};

TEST_F(WorkersObjects, AThousandDevicesLeaveTheirClonesOnly) {
    addDevices(250);
    startWorkers();
    CapturedSyslog::discard(true);
    buildInventory();

    ASSERT_EQ(records(), 1000u);
    // Two for a drive (itself and its extent), one for each other device and for the pool.
    EXPECT_EQ(liveOnWorkers(), 250u * 5 + 1);
    EXPECT_EQ(books().liveClones(), 250u * 5 + 1 + 1) << "with the controller's path";
    // The test's own context and those of two workers.
    EXPECT_EQ(books().live(testbed::ObjectKind::Context), 3u);
    CapturedSyslog::discard(false);
}

TEST_F(WorkersObjects, EachWorkerAsksOnTheContextThatItAttachedWith) {
    addDevices(3);
    startWorkers();
    buildInventory();
    VirtualClock::advance(20);
    for (const int action : {101, 102, 103, 105}) {
        ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, action), 0);
    }
    ASSERT_TRUE(workersComeToRest());
    std::map<std::thread::id, const void*> attached;
    std::size_t asked = 0;
    for (const testbed::CallRecord& call : books().calls()) {
        if (call.entry == Entry::AttachThread) attached[call.thread] = call.context;
        if (!testbed::isQuery(call.entry)) continue;
        asked++;
        EXPECT_NE(call.context, nullptr);
        EXPECT_EQ(call.context, attached[call.thread]) << testbed::entryName(call.entry);
    }
    EXPECT_EQ(attached.size(), 2u);
    EXPECT_GT(asked, 3u + 3 * 8 + 6) << "three walks, the builds' queries, six classes";
}

TEST_F(WorkersObjects, RefreshesDoNotPileUp) {
    addDevices(5);
    startWorkers();
    buildInventory();
    ASSERT_EQ(records(), 20u);
    const std::size_t live = books().live();
    for (int round = 0; round < 20; round++) {
        VirtualClock::advance(20);
        for (int action = 100; action <= 105; action++) {
            ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, action), 0);
        }
        ASSERT_TRUE(workersComeToRest());
        ASSERT_EQ(books().live(), live) << "round " << round;
    }
}

}  // namespace
}  // namespace plexortest
