// The walk on a real worker, with the other one building the devices meanwhile.
#include <set>

#include "devices_fixture.h"
#include "sanitizers.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

class DevicesWorkers : public DevicesTest {
protected:
    void SetUp() override {
        DevicesTest::SetUp();
        setActiveThreads(0);
        VirtualClock::onSleep(nullptr);
    }
    void TearDown() override {
        gate.open();
        stopWorkers();
        DevicesTest::TearDown();
    }
    /// Has a worker walk the controller.
    void queueWalk() {
        auto* item = zeroed<Thread_Args_t>();
        item->Func = runWalk;
        item->Arg0 = reinterpret_cast<uintptr_t>(this);
        ASSERT_EQ(PutItem(&__FIFO, item), 0);
        pthread_cond_signal(&PlexorThreadCond);
    }
    void startWalk() {
        queueWalk();
        startWorkers();
    }
    bool walkEnds() {
        return eventually([this] { return ended.load(); });
    }
    static void runWalk(CMPIContext* context, void* args) {
        auto* item = static_cast<Thread_Args_t*>(args);
        auto* test = reinterpret_cast<DevicesWorkers*>(item->Arg0);
        free(item);
        BuildLogicalDeviceInfo(&test->mi, context, test->ctrl);
        test->queueAtEnd = IsFifoEmpty(&__FIFO) != 0;
        pthread_mutex_lock(&PlexorThreadMutex);
        test->activeAtEnd = ActiveThreads;
        pthread_mutex_unlock(&PlexorThreadMutex);
        test->ended = true;
    }
    template <class Record>
    static std::set<std::string> ids(const List_t* list) {
        std::set<std::string> found;
        for (const Record* record : recordsOf<Record>(list)) found.insert(record->DeviceID);
        EXPECT_EQ(found.size(), list->Size) << "a device was built twice";
        return found;
    }

    Gate gate;
    std::atomic<bool> ended = false;
    std::atomic<bool> queueAtEnd = false;
    std::atomic<unsigned int> activeAtEnd = 77;
};

TEST_F(DevicesWorkers, MoreDevicesThanTheQueueHolds) {
    addPorts(60);
    // A slow vendor: the builder is behind the producer.
    auto rule = watch(Entry::InstanceGetProperty, {});
    rule.name = "UsageRestriction";
    rule.delay = std::chrono::milliseconds(1);
    failOnly(rule);
    startWalk();
    ASSERT_TRUE(walkEnds());
    EXPECT_EQ(ids<SASSATAPort_t>(ctrl->PortList).size(), 60u);
    EXPECT_TRUE(queueAtEnd);
    EXPECT_EQ(activeAtEnd, 1u);
    EXPECT_GE(CapturedSyslog::count("BuildLogicalDeviceInfo: FIFO full, waiting...\n"), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining("Added to FIFO: "), 60u);
    EXPECT_EQ(books().liveClones(), 1u + 60u);
    for (const Sleep& sleep : VirtualClock::sleeps()) EXPECT_EQ(sleep.seconds, 1u);
}

// The other worker could not be started: nobody but the walk itself builds.
TEST_F(DevicesWorkers, AWorkerThatIsAloneBuildsThemAll) {
    addPorts(60);
    testbed::FaultRule rule;
    rule.entry = Entry::PrepareAttachThread;
    rule.nullResult = true;
    rule.times = 1;
    faults().add(rule);
    startWalk();
    ASSERT_TRUE(walkEnds());
    EXPECT_EQ(ids<SASSATAPort_t>(ctrl->PortList).size(), 60u);
    EXPECT_TRUE(queueAtEnd);
    EXPECT_EQ(CapturedSyslog::countContaining("waiting...\n"), 0u);
}

// An address sanitizer does not follow a thread out of the frames that it leaves.
#ifndef PLEXOR_ADDRESS_SANITIZER
TEST_F(DevicesWorkers, AWorkerWhoseOtherHasEndedBuildsThemAll) {
    static std::atomic<bool> left;
    left = false;
    startWorkers();
    auto* item = zeroed<Thread_Args_t>();
    item->Func = [](CMPIContext*, void* args) {
        free(args);
        // Destroyed after everything that stands in the thread's frames.
        static thread_local const struct Leaving {
            ~Leaving() { left = true; }
        } leaving;
        pthread_exit(const_cast<Leaving*>(&leaving));
    };
    ASSERT_EQ(PutItem(&__FIFO, item), 0);
    pthread_cond_signal(&PlexorThreadCond);
    ASSERT_TRUE(eventually([] { return left.load(); }));
    addPorts(60);
    queueWalk();
    ASSERT_TRUE(walkEnds());
    EXPECT_EQ(ids<SASSATAPort_t>(ctrl->PortList).size(), 60u);
    EXPECT_TRUE(queueAtEnd);
    EXPECT_EQ(CapturedSyslog::countContaining("waiting...\n"), 0u);
}
#endif

TEST_F(DevicesWorkers, DevicesOfAllKinds) {
    const Path pool = vendor.pool(card, "P1");
    attach(ctrl, newPool("P1"));
    for (int i = 0; i < 8; i++) {
        const std::string id = std::to_string(i);
        vendor.drive(card, "d" + id, pool);
        vendor.volume(card, "v" + id, pool);
        vendor.port(card, "p" + id);
        vendor.fan(card, "f" + id);
        vendor.battery(card, "b" + id);
    }
    startWalk();
    ASSERT_TRUE(walkEnds());
    EXPECT_EQ(ids<DiskDrive_t>(ctrl->DiskList).size(), 8u);
    EXPECT_EQ(ids<StorageVolume_t>(ctrl->VolumeList).size(), 8u);
    EXPECT_EQ(ids<SASSATAPort_t>(ctrl->PortList).size(), 8u);
    EXPECT_EQ(ids<Battery_t>(ctrl->BatteryList).size(), 8u);
    EXPECT_EQ(CapturedSyslog::countContaining("BuildLogicalDeviceInfo: (99)"), 8u);
    for (const std::string& text : CapturedSyslog::linesAt(LOG_ERR)) {
        EXPECT_THAT(text, testing::AnyOf("BuildLogicalDeviceInfo: FIFO full, waiting...\n",
                                         testing::StartsWith("GetSampelInterval: "),
                                         testing::StartsWith("InitPlexorThreads: ")));
    }
}

TEST_F(DevicesWorkers, ReturnsOnlyWhenTheOtherWorkerRests) {
    addPorts(1);
    auto rule = watch(Entry::InstanceGetProperty, [this] { gate.pass(); });
    rule.name = "DeviceID";
    failOnly(rule);
    startWalk();
    ASSERT_TRUE(gate.awaitArrivals(1));
    const auto waits = [] {
        return CapturedSyslog::count("BuildLogicalDeviceInfo: FIFO not empty, waiting...\n");
    };
    // The queue is empty, yet the producer goes on waiting.
    EXPECT_TRUE(IsFifoEmpty(&__FIFO));
    const std::size_t before = waits();
    EXPECT_TRUE(eventually([&] { return waits() >= before + 3; }));
    EXPECT_FALSE(ended);
    gate.open();
    ASSERT_TRUE(walkEnds());
    EXPECT_EQ(activeAtEnd, 1u);
    EXPECT_EQ(ctrl->PortList->Size, 1u);
}

}  // namespace
}  // namespace plexortest
