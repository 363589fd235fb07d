// The worker's body: taking items, running them, waiting, leaving.
#include "real_waits.h"
#include "refresh_fixture.h"
#include "worker_harness.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

class WorkersLoop : public RefreshTest {
protected:
    static std::size_t idleLines() {
        return timesLogged(LOG_DEBUG, "PlexorThread(7): no item to process, wait...\n");
    }
    static bool mutexIsFree() {
        if (pthread_mutex_trylock(&PlexorThreadMutex) != 0) return false;
        pthread_mutex_unlock(&PlexorThreadMutex);
        return true;
    }
    FaultRule hookOn(Entry entry, std::function<void()> hook) {
        FaultRule rule;
        rule.entry = entry;
        rule.hook = std::move(hook);
        return rule;
    }

    Tasks tasks_;
};

TEST_F(WorkersLoop, ItemsRunInOrder) {
    std::vector<int> order;
    for (int i = 0; i < 5; i++) {
        ASSERT_EQ(tasks_.put([&order, i](CMPIContext*, void*) { order.push_back(i); }), 0);
    }
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    worker.stop();
    EXPECT_EQ(order, (std::vector<int>{0, 1, 2, 3, 4}));
    EXPECT_EQ(timesLogged(LOG_DEBUG, "PlexorThread(7): running...\n"), 5u);
}

TEST_F(WorkersLoop, AnItemGetsItselfAndTheWorkersContext) {
    Thread_Args_t* item = nullptr;
    void* seen = nullptr;
    CMPIContext* seenContext = nullptr;
    item = tasks_.make([&](CMPIContext* ctx, void* args) {
        seen = args;
        seenContext = ctx;
        const CMPIObjectPath* path =
            ::Broker->eft->newObjectPath(::Broker, "root/cimv2", "CIM_Any", nullptr);
        ::Broker->bft->enumerateInstances(::Broker, ctx, path, nullptr, nullptr);
    });
    ASSERT_EQ(PutItem(&__FIFO, item), 0);
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    worker.stop();
    EXPECT_EQ(seen, item);
    EXPECT_NE(seenContext, nullptr);
    EXPECT_NE(seenContext, ctx());
    EXPECT_EQ(books().count(Entry::EnumerateInstances), 1u);
}

TEST_F(WorkersLoop, AnItemRunsWithoutTheMutexAndCounted) {
    bool free = false;
    unsigned int active = 0;
    tasks_.put([&](CMPIContext*, void*) {
        free = mutexIsFree();
        active = activeThreads();
    });
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    worker.stop();
    EXPECT_TRUE(free);
    EXPECT_EQ(active, 1u);
    EXPECT_EQ(ActiveThreads, 0u);
}

TEST_F(WorkersLoop, RunningIsTracedBeforeTheItemAndTheFlushComesAfterIt) {
    if (!kContextHasFlush) GTEST_SKIP() << "no context entry to watch";
    std::vector<std::string> events;
    tasks_.put([&](CMPIContext*, void*) {
        const bool traced = timesLogged(LOG_DEBUG, "PlexorThread(7): running...\n") == 1;
        events.push_back(traced ? "item after its line" : "item");
    });
    faults().add(hookOn(Entry::ContextFlush, [&] {
        events.push_back(mutexIsFree() ? "flush without the mutex" : "flush");
    }));
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    worker.stop();
    EXPECT_EQ(events, (std::vector<std::string>{"item after its line", "flush without the mutex"}));
}

TEST_F(WorkersLoop, EveryItemIsFollowedByOneFlush) {
    for (int i = 0; i < 4; i++) tasks_.put([](CMPIContext*, void*) {});
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    worker.stop();
    EXPECT_EQ(books().count(Entry::ContextFlush), 4u);
}

TEST_F(WorkersLoop, WhatAnItemObtainedIsGoneAfterIt) {
    std::thread::id thread;
    std::size_t during = 0;
    tasks_.put([&](CMPIContext*, void*) {
        thread = std::this_thread::get_id();
        for (int i = 0; i < 10; i++) {
            ::Broker->eft->newObjectPath(::Broker, "root/cimv2", "CIM_Any", nullptr);
        }
        during = books().liveOnThread(thread);
    });
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(during, 10u);
    EXPECT_EQ(books().liveOnThread(thread), 0u);
    worker.stop();
}

TEST_F(WorkersLoop, AnItemWithoutFunctionIsFlushedAndNotFreed) {
    auto* item = static_cast<Thread_Args_t*>(calloc(1, sizeof(Thread_Args_t)));
    item->Arg5 = 4711;
    ASSERT_EQ(PutItem(&__FIFO, item), 0);
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    worker.stop();
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "PlexorThread(7): running...\n"));
    EXPECT_EQ(books().count(Entry::ContextFlush), 1u);
    EXPECT_EQ(item->Arg5, 4711u);
    free(item);
}

TEST_F(WorkersLoop, WithoutAnItemItSaysSoAndWaits) {
    Worker worker(ctx(), 7);
    ASSERT_TRUE(eventually([] { return idleLines() == 1; }));
    EXPECT_EQ(activeThreads(), 0u);
    EXPECT_EQ(books().count(Entry::ContextFlush), 0u);
    EXPECT_FALSE(worker.ended());
    worker.stop();
}

TEST_F(WorkersLoop, AWakeUpForNothingIsALookIntoTheQueue) {
    Worker worker(ctx(), 7);
    ASSERT_TRUE(eventually([] { return idleLines() == 1; }));
    ASSERT_TRUE(workersComeToRest());
    pthread_cond_broadcast(&PlexorThreadCond);
    EXPECT_TRUE(eventually([] { return idleLines() == 2; }));
    EXPECT_FALSE(worker.ended());
    worker.stop();
}

TEST_F(WorkersLoop, ASignalFindsItsItem) {
    Worker worker(ctx(), 7);
    ASSERT_TRUE(eventually([] { return idleLines() == 1; }));
    ASSERT_TRUE(workersComeToRest());
    tasks_.queue([](CMPIContext*, void*) {});
    EXPECT_TRUE(eventually([this] { return tasks_.ended() == 1; }));
    worker.stop();
}

TEST_F(WorkersLoop, ATerminatedWorkerDrainsTheQueueAndWaits) {
    const HurriedWaits hurry;
    TerminateThread = 1;
    for (int i = 0; i < 20; i++) ASSERT_EQ(tasks_.put([](CMPIContext*, void*) {}), 0);
    Worker worker(ctx(), 7);

    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(tasks_.ended(), 20);
    ASSERT_TRUE(eventually([] { return idleLines() == 1; }));
    // Nobody has woken it: it waits, however often it looks into the queue.
    ASSERT_TRUE(eventually([] { return HurriedWaits::workWaits().size() >= 5; }));
    EXPECT_FALSE(worker.ended());
    EXPECT_EQ(books().count(Entry::DetachThread), 0u);

    // More than once: a wake-up between two of its hurried waits finds nobody.
    EXPECT_TRUE(eventually([&] {
        pthread_cond_broadcast(&PlexorThreadCond);
        return worker.ended();
    }));
}

TEST_F(WorkersLoop, AWorkerThatIsWokenToTerminateLeavesWorkBehind) {
    Worker worker(ctx(), 7);
    ASSERT_TRUE(eventually([] { return idleLines() == 1; }));
    pthread_mutex_lock(&PlexorThreadMutex);
    TerminateThread = 1;
    tasks_.put([](CMPIContext*, void*) {});
    pthread_cond_broadcast(&PlexorThreadCond);
    pthread_mutex_unlock(&PlexorThreadMutex);
    ASSERT_TRUE(eventually([&] { return worker.ended(); }));
    EXPECT_EQ(tasks_.ended(), 0);
    EXPECT_EQ(queuedItems(), 1u);
}

TEST_F(WorkersLoop, LeavingItDetachesThenSaysSoThenEnds) {
    bool free = false, said = true;
    faults().add(hookOn(Entry::DetachThread, [&] {
        free = mutexIsFree();
        said = timesLogged(LOG_DEBUG, "Thread 7 exiting...\n") != 0;
    }));
    Worker worker(ctx(), 7);
    ASSERT_TRUE(eventually([] { return idleLines() == 1; }));
    worker.stop();

    EXPECT_TRUE(worker.ended());
    EXPECT_EQ(worker.exitValue(), nullptr);
    EXPECT_EQ(books().count(Entry::DetachThread), 1u);
    EXPECT_TRUE(free);
    EXPECT_FALSE(said);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "Thread 7 exiting...\n"));
    EXPECT_EQ(CapturedSyslog::lines().back().text, "Thread 7 exiting...\n");
    EXPECT_EQ(books().live(testbed::ObjectKind::Context), 1u) << "the test's own";
}

TEST_F(WorkersLoop, TheStartRecordIsFreedAndAttachingComesFirst) {
    tasks_.put([](CMPIContext*, void*) {});
    Worker worker(ctx(), 7);
    ASSERT_TRUE(workersComeToRest());
    worker.stop();
    std::vector<Entry> entries;
    for (const auto& call : books().calls()) entries.push_back(call.entry);
    EXPECT_EQ(entries, (std::vector<Entry>{Entry::PrepareAttachThread, Entry::AttachThread,
                                           Entry::ContextFlush, Entry::DetachThread}));
}

}  // namespace
}  // namespace plexortest
