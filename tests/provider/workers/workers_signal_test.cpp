// Work whose wake-up got lost between a worker's look into the queue and its wait.
#include "real_waits.h"
#include "workers_fixture.h"

namespace plexortest {
namespace {

using WorkersSignal = WorkersCardTest;

TEST_F(WorkersSignal, AnItemThatNobodyWasWokenForIsFound) {
    const HurriedWaits hurry(HurriedWaits::Conditions);
    startWorkers();
    ASSERT_EQ(tasks_.put([](CMPIContext*, void*) {}), 0);
    EXPECT_TRUE(eventually([this] { return tasks_.ended() == 1; }));
}

TEST_F(WorkersSignal, ARequestWithALostSignalIsServed) {
    const HurriedWaits hurry(HurriedWaits::Conditions);
    startWorkers();
    setThreadActivityDone(1);
    const LostWakeUps lost(LostWakeUps::Signals);
    ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
    EXPECT_EQ(LostWakeUps::count(), 1);
    EXPECT_TRUE(eventually([this] { return associatorQueries().size() == 1; }));
}

TEST_F(WorkersSignal, AnInventoryWithALostSignalIsBuilt) {
    const HurriedWaits hurry(HurriedWaits::Conditions);
    startWorkers();
    const LostWakeUps lost(LostWakeUps::Signals);
    ASSERT_EQ(BuildDeviceInfoAsync(&mi, ctx()), 0);
    EXPECT_EQ(LostWakeUps::count(), 1);
    EXPECT_TRUE(eventually([] { return threadActivityDone() == 1; }));
}

TEST_F(WorkersSignal, AStopWhoseBroadcastCameBetweenTwoLooksIsSeen) {
    startWorkers();
    ASSERT_TRUE(workersComeToRest());
    const HurriedWaits hurry(HurriedWaits::Conditions);
    const LostWakeUps lost(LostWakeUps::Broadcasts);
    // Idle workers, waiting before the stop was asked for; from now on in a hurry.
    pthread_cond_signal(&PlexorThreadCond);
    pthread_cond_signal(&PlexorThreadCond);
    ASSERT_TRUE(eventually([] { return HurriedWaits::workWaits().size() >= 4; }));
    CleanupPlexorThreads();
    EXPECT_EQ(LostWakeUps::count(), 1);
    EXPECT_TRUE(eventually([] { return exitLines() == 2; }));
}

TEST_F(WorkersSignal, AWorkerThatIsIdleForTheFirstTimeAfterTheStopLeavesToo) {
    const HurriedWaits hurry(HurriedWaits::Conditions);
    TerminateThread = 1;
    Worker worker(ctx());
    EXPECT_TRUE(eventually([&] { return worker.ended(); }));
}

TEST_F(WorkersSignal, TheNextLookIsWithinASecond) {
    const HurriedWaits hurry(HurriedWaits::Conditions);
    startWorkers();
    ASSERT_TRUE(eventually([] { return HurriedWaits::workWaits().size() >= 10; }));
    for (const auto wait : HurriedWaits::workWaits()) {
        EXPECT_LE(wait, std::chrono::milliseconds(1000));
        EXPECT_GE(wait, std::chrono::milliseconds(500)) << "a worker that spins";
    }
}

TEST_F(WorkersSignal, LooksWithoutResultAreNotLogged) {
    const HurriedWaits hurry(HurriedWaits::Conditions);
    startWorkers();
    const std::size_t lines = CapturedSyslog::lines().size();
    const std::size_t looks = HurriedWaits::workWaits().size();
    ASSERT_TRUE(eventually([&] { return HurriedWaits::workWaits().size() >= looks + 10; }));
    EXPECT_EQ(CapturedSyslog::lines().size(), lines);
}

}  // namespace
}  // namespace plexortest
