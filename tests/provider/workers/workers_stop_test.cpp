// Stopping the workers: who leaves, who stays, and what becomes of the queue.
#include "library_pins.h"
#include "real_waits.h"
#include "watched_calls.h"
#include "workers_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;

class WorkersStop : public WorkersTest {
protected:
    /// Puts an item with clones, as the initial inventory does it, into the queue.
    void putDeviceItem() {
        auto* item = static_cast<Thread_Args_t*>(calloc(1, sizeof(Thread_Args_t)));
        const testbed::ObjectPath path{"root/sample", "Sample_SASSATAPort", {}};
        CMPIInstance* instance = broker.makeInstance({path, {}});
        item->Func = ProcessBuildLogicalDeviceInfo;
        item->Arg3 = reinterpret_cast<uintptr_t>(clonedPath(path));
        item->Arg4 = reinterpret_cast<uintptr_t>(instance->ft->clone(instance, nullptr));
        item->Arg5 = 2;
        ASSERT_EQ(PutItem(&__FIFO, item), 0);
    }
    /// Stops the workers of which one is busy, without waiting for it.
    void stopWithoutWaiting() {
        const HurriedWaits hurry(HurriedWaits::Joins);
        CleanupPlexorThreads();
    }
    /// Ends a worker that has missed the broadcast.
    void stopTheRest() {
        running_ = false;
        EXPECT_TRUE(workersComeToRest());
        pthread_attr_init(&PlexorThreadAttr);
        CleanupPlexorThreads();
    }
};

TEST_F(WorkersStop, IdleWorkersLeave) {
    startWorkers();
    VirtualClock::reset(kStart);
    const time_t before = VirtualClock::now();
    const int pins = libraryPins();
    stopWorkers();
    EXPECT_EQ(libraryPins(), pins);

    EXPECT_EQ(TerminateThread, 1u);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "Thread 0 exiting...\n"));
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "Thread 1 exiting...\n"));
    EXPECT_EQ(books().count(Entry::DetachThread), 2u);
    EXPECT_EQ(threadsOf(Entry::DetachThread), threadsOf(Entry::AttachThread));
    ASSERT_EQ(VirtualClock::sleeps().size(), 1u);
    EXPECT_EQ(VirtualClock::sleeps()[0].seconds, 3u);
    EXPECT_EQ(VirtualClock::sleeps()[0].thread, std::this_thread::get_id());
    EXPECT_EQ(VirtualClock::now(), before + 3);
    EXPECT_EQ(activeThreads(), 0u);
}

TEST_F(WorkersStop, AllAreWokenAfterTheMutexWasReleased) {
    startWorkers();
    ASSERT_TRUE(workersComeToRest());
    const WakeUpCounter wakeUps;
    stopWorkers();
    EXPECT_EQ(WakeUpCounter::broadcasts(), 1);
    EXPECT_EQ(WakeUpCounter::signals(), 0);
    EXPECT_EQ(WakeUpCounter::underMutex(), 0);
}

TEST_F(WorkersStop, WorkersThatHaveLeftAreJoined) {
    startWorkers();
    stopWorkers();
    // Their identifiers are free for reuse: nobody can wait for them any more.
    const HurriedWaits hurry;
    CleanupPlexorThreads();
    EXPECT_TRUE(HurriedWaits::joins().empty());
}

TEST_F(WorkersStop, ABusyWorkerFinishesItsItemAndWaitsAgain) {
    startWorkers();
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(1, gate);
    const std::size_t idle = idleLines();

    stopWithoutWaiting();
    EXPECT_TRUE(eventually([] { return exitLines() == 1; })) << "the idle one";
    EXPECT_EQ(tasks_.ended(), 0);

    gate.open();
    ASSERT_TRUE(eventually([&] { return idleLines() == idle + 1; }));
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(tasks_.ended(), 1);
    EXPECT_EQ(exitLines(), 1u);
    EXPECT_EQ(books().count(Entry::DetachThread), 1u);

    stopTheRest();
    EXPECT_EQ(exitLines(), 2u);
    EXPECT_EQ(books().count(Entry::DetachThread), 2u);
}

TEST_F(WorkersStop, WaitingForAStuckWorkerIsBounded) {
    startWorkers();
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(2, gate);
    const int pins = libraryPins();
    {
        const HurriedWaits hurry(HurriedWaits::Joins);
        CleanupPlexorThreads();
        ASSERT_EQ(HurriedWaits::joins().size(), 2u);
        for (const auto join : HurriedWaits::joins()) EXPECT_LE(join, std::chrono::seconds(1));
    }
    EXPECT_GT(libraryPins(), pins) << "it will come back into the library's code";
    gate.open();
    stopTheRest();
}

TEST_F(WorkersStop, WhatIsLeftInTheQueueIsReleased) {
    startWorkers();
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(2, gate);
    putDeviceItem();
    tasks_.put([](CMPIContext*, void*) {});
    putDeviceItem();
    EXPECT_EQ(books().liveClones(), 4u);

    stopWithoutWaiting();

    EXPECT_EQ(queuedItems(), 0u);
    EXPECT_EQ(books().liveClones(), 0u);
    gate.open();
    stopTheRest();
    EXPECT_EQ(tasks_.ended(), 2);
}

TEST_F(WorkersStop, WithoutWorkersItOnlySleeps) {
    VirtualClock::reset(kStart);
    CleanupPlexorThreads();
    EXPECT_EQ(TerminateThread, 1u);
    ASSERT_EQ(VirtualClock::sleeps().size(), 1u);
    EXPECT_EQ(VirtualClock::sleeps()[0].seconds, 3u);
}

TEST_F(WorkersStop, TheAttributesAreDestroyedAfterTheSleep) {
    const DestroyWatch watch;
    int sleeps = 0;
    VirtualClock::onSleep([&](unsigned int) {
        sleeps++;
        EXPECT_EQ(DestroyWatch::destroyed(), std::vector<const void*>{});
    });
    CleanupPlexorThreads();
    EXPECT_EQ(sleeps, 1);
    EXPECT_EQ(DestroyWatch::destroyed(), std::vector<const void*>{&PlexorThreadAttr});
}

TEST_F(WorkersStop, BothMarksStaySet) {
    startWorkers();
    setThreadActivityDone(1);
    stopWorkers();
    EXPECT_EQ(ThreadActivityDone, 1u);
    EXPECT_EQ(TerminateThread, 1u);
}

TEST_F(WorkersStop, WhatAnotherTakesBetweenTheLookAndTheTakingIsNotMissed) {
    putDeviceItem();
    void* taken = nullptr;
    {
        const HoldWatch atTheLook(__FIFO.Mutex, [&taken] {
            if (taken == nullptr) RemoveEntryFromList(&__FIFO.List, &taken);
        });
        CleanupPlexorThreads();
    }
    EXPECT_EQ(queuedItems(), 0u);
    ASSERT_NE(taken, nullptr);
    EXPECT_EQ(books().liveClones(), 2u) << "they are whose item it is";
    ReleaseDeviceItem(static_cast<Thread_Args_t*>(taken));
}

}  // namespace
}  // namespace plexortest
