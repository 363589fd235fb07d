// Starting the workers: the refresh interval, their contexts, what cannot be started.
#include "stop_at_line.h"
#include "workers_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

class WorkersStart : public WorkersTest {
protected:
    /// There is no context for the other one.
    void startTheOnlyWorker() {
        FaultRule none;
        none.entry = Entry::PrepareAttachThread;
        none.nullResult = true;
        none.times = 1;
        faults().add(none);
        startWorkers(1);
    }
    /// Expects that the start, of which nothing was said, has left nothing.
    void expectNoneStarted() {
        EXPECT_EQ(books().count(Entry::AttachThread), books().count(Entry::DetachThread));
        EXPECT_EQ(threadsOf(Entry::AttachThread).count(std::this_thread::get_id()),
                  threadsOf(Entry::AttachThread).size())
            << "only here, to end the contexts that nobody uses";
        EXPECT_EQ(idleLines(), 0u);
        expectNobodyLeft();
    }
    /// What is queued is for the next workers.
    void expectNobodyWorks() {
        auto* idle = zeroed<Thread_Args_t>();
        ASSERT_EQ(PutItem(&__FIFO, idle), 0);
        EXPECT_FALSE(RunQueuedItemAlone(ctx()));
        EXPECT_EQ(GetItem(&__FIFO), idle);
        free(idle);
    }
    /// A stop at that line of the log is the end of the start.
    void expectTheEndAt(const char* line) {
        const LifeMember member;
        {
            const StopAtLine stop(line);
            InitPlexorThreads(ctx());
        }
        EXPECT_EQ(books().count(Entry::PrepareAttachThread), 0u);
        expectNoneStarted();
    }
};

/// As the library has it when it is loaded: read before anything runs.
const unsigned int terminateThreadAtFirst = TerminateThread;

TEST_F(WorkersStart, AWorkersStackHasAGuard) {
    // As it is when the library is loaded, whatever earlier tests have left.
    PlexorThreadAttr = {};
    InitPlexorThreads(ctx());
    std::size_t guard = 0;
    EXPECT_EQ(pthread_attr_getguardsize(&PlexorThreadAttr, &guard), 0);
    EXPECT_GT(guard, 0u);
}

TEST_F(WorkersStart, NobodyIsToldToStopBeforehand) {
    EXPECT_EQ(terminateThreadAtFirst, 0u);
}

/// While one lives, a thread that does not ask for a stack of its own gets one that is larger than
/// the address space: it cannot be created.
class NoNewThreads {
public:
    NoNewThreads() {
        pthread_getattr_default_np(&before_);
        pthread_attr_t huge;
        pthread_attr_init(&huge);
        EXPECT_EQ(pthread_attr_setstacksize(&huge, std::size_t{1} << 47), 0);
        EXPECT_EQ(pthread_setattr_default_np(&huge), 0);
        pthread_attr_destroy(&huge);
    }
    ~NoNewThreads() {
        EXPECT_EQ(pthread_setattr_default_np(&before_), 0);
        pthread_attr_destroy(&before_);
    }
    NoNewThreads(const NoNewThreads&) = delete;
    NoNewThreads& operator=(const NoNewThreads&) = delete;

private:
    pthread_attr_t before_;
};

TEST_F(WorkersStart, TwoWorkersAreStartedAndSaidSo) {
    startWorkers();
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "InitPlexorThreads: thread 0 created\n"));
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "InitPlexorThreads: thread 1 created\n"));
    EXPECT_EQ(CapturedSyslog::countContaining("created\n"), 2u);
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "PlexorThread(0): no item to process, wait...\n"));
    EXPECT_TRUE(loggedOnce(LOG_DEBUG, "PlexorThread(1): no item to process, wait...\n"));
}

TEST_F(WorkersStart, EachWorkerAttachesWithAContextPreparedHere) {
    startWorkers();
    const auto here = std::this_thread::get_id();
    EXPECT_EQ(books().count(Entry::PrepareAttachThread), 2u);
    EXPECT_EQ(threadsOf(Entry::PrepareAttachThread), std::set{here});
    const auto attached = threadsOf(Entry::AttachThread);
    EXPECT_EQ(attached.size(), 2u);
    EXPECT_EQ(attached.count(here), 0u);
    for (const auto& call : books().calls()) EXPECT_EQ(call.rc, CMPI_RC_OK);
}

TEST_F(WorkersStart, TheyAreJoinable) {
    startWorkers();
    int state = -1;
    ASSERT_EQ(pthread_attr_getdetachstate(&PlexorThreadAttr, &state), 0);
    EXPECT_EQ(state, PTHREAD_CREATE_JOINABLE);
    EXPECT_FALSE(pthread_equal(PlexorThreads[0], PlexorThreads[1]));
    for (const pthread_t thread : PlexorThreads) {
        pthread_attr_t own;
        ASSERT_EQ(pthread_getattr_np(thread, &own), 0);
        ASSERT_EQ(pthread_attr_getdetachstate(&own, &state), 0);
        EXPECT_EQ(state, PTHREAD_CREATE_JOINABLE);
        pthread_attr_destroy(&own);
    }
}

TEST_F(WorkersStart, BothWork) {
    startWorkers();
    Gate gate;
    {
        const GateOpener opener(gate);
        occupyWorkers(2, gate);
    }
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(tasks_.ended(), 2);
}

TEST_F(WorkersStart, NothingIsDoneYet) {
    startWorkers();
    EXPECT_EQ(threadActivityDone(), 0u);
    EXPECT_EQ(activeThreads(), 0u);
    EXPECT_EQ(TerminateThread, 0u);
}

TEST_F(WorkersStart, WithoutAContextThereIsNoWorker) {
    startTheOnlyWorker();
    tasks_.queue([](CMPIContext*, void*) {});
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(tasks_.ended(), 1);
    EXPECT_EQ(books().count(Entry::AttachThread), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining("PlexorThread(0)"), 0u);
}

TEST_F(WorkersStart, WithoutMemoryThereIsNoWorker) {
    {
        const auto fault = FailAllocation::nth(1);
        startWorkers(1);
        EXPECT_EQ(fault.failures(), 1u);
    }
    tasks_.queue([](CMPIContext*, void*) {});
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(tasks_.ended(), 1);
    EXPECT_EQ(books().count(Entry::PrepareAttachThread), 2u);
    EXPECT_EQ(books().count(Entry::DetachThread), 1u) << "the context that nobody uses is ended";
}

TEST_F(WorkersStart, AThreadThatCannotBeCreatedIsNoWorker) {
    {
        const NoNewThreads none;
        InitPlexorThreads(ctx());
    }
    EXPECT_EQ(books().count(Entry::PrepareAttachThread), 2u);
    EXPECT_EQ(books().count(Entry::DetachThread), 2u) << "the contexts that nobody uses are ended";
    expectNoneStarted();
}

TEST_F(WorkersStart, AfterAStopNoneIsStarted) {
    RequestStop();
    InitPlexorThreads(ctx());
    EXPECT_EQ(books().count(Entry::PrepareAttachThread), 2u);
    EXPECT_EQ(books().count(Entry::DetachThread), 2u);
    expectNoneStarted();
}

TEST_F(WorkersStart, AStopDuringTheSearchForTheIntervalIsTheEndOfIt) {
    expectTheEndAt("GetSampelInterval: ");
    EXPECT_EQ(CapturedSyslog::countContaining("Sample interval was set"), 0u);
}

TEST_F(WorkersStart, AStopBehindTheIntervalPreparesNoThread) {
    expectTheEndAt("InitPlexorThreads: Sample interval was set to 20 secs\n");
}

TEST_F(WorkersStart, ItsOnlyWorkersQueueIsEmptiedByWhoeverWaits) {
    startTheOnlyWorker();
    EXPECT_FALSE(RunQueuedItemAlone(ctx())) << "nothing is queued";
    Gate gate;
    const GateOpener opener(gate);
    occupyWorkers(1, gate);
    auto* idle = zeroed<Thread_Args_t>();
    idle->Arg5 = 4711;
    ASSERT_EQ(PutItem(&__FIFO, idle), 0);
    EXPECT_TRUE(RunQueuedItemAlone(ctx())) << "one without a function is done at once";
    EXPECT_EQ(idle->Arg5, 4711u) << "and not freed";
    free(idle);
    tasks_.put([](CMPIContext*, void*) {
        EXPECT_EQ(pthread_mutex_trylock(&PlexorThreadMutex), 0) << "it may queue, and wait";
        pthread_mutex_unlock(&PlexorThreadMutex);
    });
    EXPECT_TRUE(RunQueuedItemAlone(ctx()));
    EXPECT_EQ(tasks_.ended(), 1);
    gate.open();
    EXPECT_TRUE(eventually([this] { return tasks_.ended() == 2; }));
}

TEST_F(WorkersStart, TheOnlyWorkerThatIsCancelledIsNoneAnyMore) {
    startTheOnlyWorker();
    ASSERT_TRUE(workersComeToRest());
    EXPECT_EQ(pthread_cancel(PlexorThreads[1]), 0);
    Thread_Args_t idle = {};
    EXPECT_TRUE(eventually([&] {
        EXPECT_EQ(PutItem(&__FIFO, &idle), 0);
        const bool isAlone = RunQueuedItemAlone(ctx());
        if (!isAlone) GetItem(&__FIFO);
        return !isAlone;
    })) << "what is queued is for the next workers";
}

TEST_F(WorkersStart, WhereNoneCouldBeCreatedThereIsNoOnlyOne) {
    {
        const NoNewThreads none;
        InitPlexorThreads(ctx());
    }
    expectNobodyWorks();
}

TEST_F(WorkersStart, AfterItsCleanupTheOnlyWorkerIsNoneAnyMore) {
    startTheOnlyWorker();
    stopWorkers();
    __atomic_store_n(&TerminateThread, 0, __ATOMIC_SEQ_CST);
    expectNobodyWorks();
}

TEST_F(WorkersStart, StoppingNoWorkerIsHarmless) {
    FaultRule none;
    none.entry = Entry::PrepareAttachThread;
    none.nullResult = true;
    faults().add(none);
    startWorkers(0);
    stopWorkers();
    EXPECT_EQ(books().count(Entry::AttachThread), 0u);
    EXPECT_EQ(exitLines(), 0u);
}

TEST_F(WorkersStart, AtMostOneRefreshOfAClassPerInterval) {
    setPollingOption("45");
    RaidController_t* const ctrl = attach(newController("C0"));
    ctrl->ControllerOp = clonedPath(vendor.controller("C0").system);
    startWorkers();
    setThreadActivityDone(1);

    std::vector<time_t> refreshes;
    for (int second = 0; second < 100; second++) {
        ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
        ASSERT_TRUE(workersComeToRest());
        if (associatorQueries().size() > refreshes.size()) refreshes.push_back(second);
        VirtualClock::advance(1);
    }
    EXPECT_EQ(refreshes, (std::vector<time_t>{0, 45, 90}));
}

struct Interval {
    const char* name;
    const char* option;  ///< null: none is set
    time_t seconds;
};

class WorkersInterval : public WorkersTest, public ::testing::WithParamInterface<Interval> {};

TEST_P(WorkersInterval, IsTakenOverAndLogged) {
    if (GetParam().option != nullptr) {
        setPollingOption(GetParam().option);
    } else {
        setenv("PLEXOR_HOSTCONFIG_FILE", "/nonexistent/hostconfig", 1);
    }
    StateUpdateInterval = 99;
    startWorkers();
    EXPECT_EQ(StateUpdateInterval, GetParam().seconds);
    EXPECT_TRUE(loggedOnce(LOG_ERR, formatted("InitPlexorThreads: Sample interval was set to "
                                              "%ld secs\n",
                                              static_cast<long>(GetParam().seconds))));
}

INSTANTIATE_TEST_SUITE_P(
    Workers, WorkersInterval,
    ::testing::Values(Interval{"zero", "0", 20}, Interval{"negative", "-1", 20},
                      Interval{"lowest", "-2147483648", 20}, Interval{"one", "1", 1},
                      Interval{"nineteen", "19", 19}, Interval{"fortyfive", "45", 45},
                      Interval{"standard", "default", 20}, Interval{"text", "often", 20},
                      Interval{"missing", nullptr, 20}),
    [](const auto& test) { return std::string(test.param.name); });

}  // namespace
}  // namespace plexortest
