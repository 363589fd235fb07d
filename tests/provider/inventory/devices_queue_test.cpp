// The producer's two waits: for room in the queue, and for the end of the work.
#include <thread>

#include "devices_fixture.h"

namespace plexortest {
namespace {

using testing::Each;
using testing::ElementsAre;
using testing::Field;
using testing::IsEmpty;
using testing::SizeIs;

constexpr char kFull[] = "BuildLogicalDeviceInfo: FIFO full, waiting...\n";

class DevicesQueue : public DevicesTest {
protected:
    static std::size_t fullLines() { return CapturedSyslog::count(kFull); }
    static std::size_t waitLines() { return CapturedSyslog::count(kWaiting.text); }
    /// Every wait so far was one second of this thread's.
    void expectOneSecondWaits(std::size_t count) {
        EXPECT_THAT(VirtualClock::sleeps(), SizeIs(count));
        EXPECT_THAT(VirtualClock::sleeps(), Each(Field(&Sleep::seconds, 1u)));
        EXPECT_THAT(VirtualClock::sleeps(),
                    Each(Field(&Sleep::thread, std::this_thread::get_id())));
        EXPECT_EQ(VirtualClock::now(), kStart + static_cast<time_t>(count));
    }
    static Thread_Args_t* emptyItem() { return zeroed<Thread_Args_t>(); }
};

TEST_F(DevicesQueue, TwentyDevicesFit) {
    const Texts all = addPorts(20);
    std::size_t queued = 0;
    VirtualClock::onSleep([&](unsigned int) {
        queued = __FIFO.List.Size;
        take(1000);
    });
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(queued, 20u);
    EXPECT_EQ(taken(), all);
    EXPECT_EQ(fullLines(), 0u);
    EXPECT_EQ(waitLines(), 1u);
    expectOneSecondWaits(1);
}

TEST_F(DevicesQueue, TheTwentyFirstWaitsForRoom) {
    const Texts all = addPorts(21);
    takeInEachSleep(1);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(taken(), all);
    EXPECT_EQ(fullLines(), 1u);
    // The twenty that are queued then leave one by one.
    EXPECT_EQ(waitLines(), 20u);
    expectOneSecondWaits(21);
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR), Texts{kFull});
}

TEST_F(DevicesQueue, NothingIsLostHoweverLongItTakes) {
    const Texts all = addPorts(40);
    int sleeps = 0;
    VirtualClock::onSleep([&](unsigned int) {
        EXPECT_LE(__FIFO.List.Size, 20u);
        if (++sleeps % 3 == 0) take(1);
    });
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(taken(), all);
    EXPECT_EQ(fullLines(), 3u * 20u);
    EXPECT_EQ(waitLines(), 3u * 20u);
    expectOneSecondWaits(3 * 40);
    EXPECT_EQ(books().liveClones(), 1u + 2u * 40u);
}

TEST_F(DevicesQueue, EachWaitForRoomIsLoggedAndTheOfferRepeated) {
    addPorts(21);
    int sleeps = 0;
    VirtualClock::onSleep([&](unsigned int) {
        if (++sleeps >= 4) take(1000);
    });
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(fullLines(), 4u);
    EXPECT_EQ(CapturedSyslog::count(
                  formatted("PutItem: Fifo(%p) is full, limit 20\n", static_cast<void*>(&__FIFO))),
              4u);
    const std::string last = VendorObjects::devicePath("CIM_SASSATAPort", "20").text();
    const LogLine full = errorLine(kFull);
    EXPECT_TRUE(loggedInOrder({debugLine("BuildLogicalDeviceInfo: (2)" + last + "\n"), full, full,
                               full, full, debugLine("Added to FIFO: " + last + "\n")}));
}

TEST_F(DevicesQueue, OthersItemsTakeRoomToo) {
    addPorts(1);
    for (int i = 0; i < 20; i++) ASSERT_EQ(PutItem(&__FIFO, emptyItem()), 0);
    takeInEachSleep(1);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(fullLines(), 1u);
    EXPECT_EQ(taken_.size(), 21u);
    EXPECT_EQ(taken_.back()->Func, ProcessBuildLogicalDeviceInfo);
}

TEST_F(DevicesQueue, WaitsUntilItIsTheOnlyActiveThread) {
    setActiveThreads(4);
    VirtualClock::onSleep([](unsigned int) {
        EXPECT_TRUE(isFree(PlexorThreadMutex));
        setActiveThreads(ActiveThreads - 1);
    });
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(ActiveThreads, 1u);
    EXPECT_EQ(waitLines(), 3u);
    expectOneSecondWaits(3);
}

TEST_F(DevicesQueue, WaitsUntilTheQueueIsEmpty) {
    for (int i = 0; i < 3; i++) ASSERT_EQ(PutItem(&__FIFO, emptyItem()), 0);
    takeInEachSleep(1);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(waitLines(), 3u);
    EXPECT_EQ(taken_.size(), 3u);
}

TEST_F(DevicesQueue, WaitsForBoth) {
    addPorts(1);
    setActiveThreads(2);
    int sleeps = 0;
    VirtualClock::onSleep([&](unsigned int) {
        if (++sleeps >= 2) take(1);
        if (sleeps >= 5) setActiveThreads(1);
    });
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(waitLines(), 5u);
}

TEST_F(DevicesQueue, NobodyActiveIsFewEnough) {
    setActiveThreads(0);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(VirtualClock::sleeps(), IsEmpty());
}

TEST_F(DevicesQueue, WaitsAfterAFailedQueryToo) {
    failOnly(refusal(Entry::Associators));
    setActiveThreads(2);
    VirtualClock::onSleep([](unsigned int) { setActiveThreads(1); });
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(waitLines(), 1u);
    EXPECT_TRUE(loggedInOrder({kWaiting, debugLine("BuildLogicalDeviceInfo, DONE...\n"),
                               debugLine("BuildLogicalDeviceInfo, exit...\n")}));
}

TEST_F(DevicesQueue, ThereIsNoTimeLimit) {
    setActiveThreads(2);
    int sleeps = 0;
    VirtualClock::onSleep([&](unsigned int) {
        VirtualClock::advance(100'000);
        if (++sleeps >= 50) setActiveThreads(1);
    });
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(waitLines(), 50u);
}

/// Waits on the workers' condition on a thread of its own.
class Waiter {
public:
    Waiter() : thread_([this] { wait(); }) {
        while (!waiting_) std::this_thread::yield();
        // It has let go of the mutex, so it waits.
        pthread_mutex_lock(&PlexorThreadMutex);
        pthread_mutex_unlock(&PlexorThreadMutex);
    }
    ~Waiter() {
        if (thread_.joinable()) thread_.join();
    }
    /// Whether it was woken, and not by its limit of five seconds.
    bool isWoken() {
        thread_.join();
        return woken_;
    }

private:
    void wait() {
        timespec limit;
        clock_gettime(CLOCK_REALTIME, &limit);
        limit.tv_sec += 5;
        pthread_mutex_lock(&PlexorThreadMutex);
        waiting_ = true;
        woken_ = pthread_cond_timedwait(&PlexorThreadCond, &PlexorThreadMutex, &limit) == 0;
        pthread_mutex_unlock(&PlexorThreadMutex);
    }

    std::atomic<bool> waiting_ = false;
    bool woken_ = false;
    std::thread thread_;
};

TEST_F(DevicesQueue, OneDeviceWakesAllWorkers) {
    addPorts(1);
    Waiter first, second, third;
    EXPECT_EQ(walk(), 0);
    EXPECT_TRUE(first.isWoken());
    EXPECT_TRUE(second.isWoken());
    EXPECT_TRUE(third.isWoken());
}

TEST_F(DevicesQueue, WorkersAreWokenEvenWhenTheItemWasNotTaken) {
    addPorts(1);
    Waiter waiter;
    const auto fault = FailAllocation::nth(2);
    EXPECT_EQ(walk(), 0);
    EXPECT_TRUE(waiter.isWoken());
}

TEST_F(DevicesQueue, WakesWithoutTheWorkersMutexAndLooksWithIt) {
    addPorts(3);
    pthread_mutex_lock(&PlexorThreadMutex);
    CMPIContext* prepared = ::Broker->bft->prepareAttachThread(::Broker, ctx());
    std::thread producer([&] {
        ::Broker->bft->attachThread(::Broker, prepared);
        EXPECT_EQ(BuildLogicalDeviceInfo(&mi, prepared, ctrl), 0);
        ::Broker->bft->detachThread(::Broker, prepared);
    });
    const std::string last = VendorObjects::devicePath("CIM_SASSATAPort", "2").text();
    EXPECT_TRUE(
        eventually([&] { return CapturedSyslog::count("Added to FIFO: " + last + "\n") == 1; }));
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
    EXPECT_EQ(waitLines(), 0u);
    EXPECT_EQ(CapturedSyslog::count("BuildLogicalDeviceInfo, DONE...\n"), 0u);
    pthread_mutex_unlock(&PlexorThreadMutex);
    producer.join();
    EXPECT_THAT(taken(), ElementsAre("2 0", "2 1", "2 2"));
}

}  // namespace
}  // namespace plexortest
