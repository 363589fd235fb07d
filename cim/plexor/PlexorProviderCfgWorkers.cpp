// The two workers: start, body, stop.
#include <errno.h>
#include <stdlib.h>
#include <unistd.h>

#include <atomic>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgItems.h"
#include "PlexorProviderLock.h"
#include "PlexorProviderUtilManager.h"

// Two, not fewer: one may wait for the queue to drain while the other drains it.
pthread_t PlexorThreads[2];
pthread_attr_t PlexorThreadAttr;
pthread_mutex_t PlexorThreadMutex = PTHREAD_MUTEX_INITIALIZER;
pthread_cond_t PlexorThreadCond = PTHREAD_COND_INITIALIZER;
unsigned int ActiveThreads = 0;
unsigned int TerminateThread = 0;
time_t StateUpdateInterval = kDefaultIntervalSeconds;

namespace {

constexpr int kThreadCount = sizeof PlexorThreads / sizeof PlexorThreads[0];
constexpr unsigned int kExitSeconds = 3;  // what the workers get to leave
constexpr time_t kJoinLimitSeconds = 1;
constexpr time_t kMissedSignalSeconds = 1;

bool __Started[kThreadCount];                           // workers to join; factory and cleanup only
std::atomic<unsigned int> __LivingWorkers;              // of the present life
pthread_cond_t __ItemEnded = PTHREAD_COND_INITIALIZER;  // with PlexorThreadMutex

/// A worker between two waits. They are linked, so that the present life's can be told from one
/// that an earlier life left behind.
class ActiveWorker {
public:
    ActiveWorker() PLEXOR_HOLDS(PlexorThreadMutex) : next_(first_) {
        ExpectHeld(PlexorThreadMutex, __func__);
        first_ = this;
        ActiveThreads++;
    }
    ~ActiveWorker() PLEXOR_HOLDS(PlexorThreadMutex) {
        ActiveWorker** link = &first_;
        while (*link != this) link = &(*link)->next_;
        *link = next_;
        ActiveThreads--;
    }
    ActiveWorker(const ActiveWorker&) = delete;
    ActiveWorker& operator=(const ActiveWorker&) = delete;

    /// How many of the present life run an item.
    static unsigned int CountRunning() PLEXOR_HOLDS(PlexorThreadMutex) {
        return Count([](const ActiveWorker& worker) { return worker.life_ == PresentLife(); });
    }
    /// How many belong to earlier lives.
    static unsigned int CountOld() PLEXOR_HOLDS(PlexorThreadMutex) {
        return Count([](const ActiveWorker& worker) { return worker.life_ != PresentLife(); });
    }

private:
    template <typename Condition>
    static unsigned int Count(Condition condition) PLEXOR_HOLDS(PlexorThreadMutex) {
        unsigned int count = 0;
        for (const ActiveWorker* worker = first_; worker != nullptr; worker = worker->next_) {
            if (condition(*worker)) count++;
        }
        return count;
    }

    static ActiveWorker* first_ PLEXOR_GUARDED_BY(PlexorThreadMutex);
    const unsigned int life_ = OwnLife();
    ActiveWorker* next_;
};

ActiveWorker* ActiveWorker::first_ = nullptr;

std::atomic<unsigned int> __TerminatedLife = 0;  // whose stop set TerminateThread; 0: unknown

/// Told to leave by the stop of this worker's life, not by an earlier one's.
bool ToldToLeave() PLEXOR_HOLDS(PlexorThreadMutex) {
    ExpectHeld(PlexorThreadMutex, __func__);
    if (LifeIsOver()) return true;
    return TerminateThread != 0 && (__TerminatedLife == 0 || __TerminatedLife == PresentLife());
}

/// A work function's run, with PlexorThreadMutex released.
class RunningItem {
public:
    explicit RunningItem(MutexGuard& lock) PLEXOR_LOCKS_UNCHECKED : lock_(lock) { lock_.Unlock(); }
    ~RunningItem() PLEXOR_LOCKS_UNCHECKED {
        lock_.Lock();
        pthread_cond_broadcast(&__ItemEnded);
    }
    RunningItem(const RunningItem&) = delete;
    RunningItem& operator=(const RunningItem&) = delete;

private:
    MutexGuard& lock_;
};

/// Counts a worker as living until its thread ends, be it cancelled.
class LivingWorker {
public:
    LivingWorker() = default;
    ~LivingWorker() {
        if (LifeIsOver()) return;
        // A thread that InitPlexorThreads has not started was never counted.
        unsigned int living = __LivingWorkers;
        while (living != 0 && !__LivingWorkers.compare_exchange_weak(living, living - 1)) {
        }
    }
    LivingWorker(const LivingWorker&) = delete;
    LivingWorker& operator=(const LivingWorker&) = delete;
};

Thread_Args_t* TakeItem() {
    return StopRequested() ? nullptr : static_cast<Thread_Args_t*>(GetItem(&__FIFO));
}

/// Runs the next item. False when there is none, or none may begin.
bool RunNextItem(CMPIContext* ctx, long index, MutexGuard& lock) PLEXOR_HOLDS(PlexorThreadMutex) {
    const ActiveWorker worker;
    Thread_Args_t* item = TakeItem();
    if (item == nullptr) return false;
    const RunningItem running(lock);
    syslog(LOG_DEBUG, "%s(%ld): running...\n", "PlexorThread", index);
    ItemSpan span(ctx);
    if (item->Func != nullptr) item->Func(span.Context(), item);
    span.End();
    return true;
}

/// Waits for the next reason to look around. The producers signal without PlexorThreadMutex, so a
/// signal can fall between an empty GetItem and the wait; hence a look each second. What ends the
/// wait of a worker that was
///                            idle when told to leave   busy when told to leave
///   a wake-up                yes                       yes
///   a look: told to leave    yes                       no, it waits for the next wake-up
///   a look: work is queued   yes, without a stop       yes, without a stop
///   a look: a later life     yes                       yes
void WaitForWork(bool wasBusyWhenTold) PLEXOR_HOLDS(PlexorThreadMutex) {
    for (;;) {
        if (LifeIsOver()) return;
        if (ToldToLeave() && !wasBusyWhenTold) return;
        if (WaitUntil(PlexorThreadCond, PlexorThreadMutex, Deadline::In(kMissedSignalSeconds))) {
            return;
        }
        if (!StopRequested() && !IsFifoEmpty(&__FIFO)) return;
    }
}

/// Runs items until there is none. Whether there was one.
bool RunItems(CMPIContext* ctx, long index, MutexGuard& lock) PLEXOR_HOLDS(PlexorThreadMutex) {
    bool anyRun = false;
    while (RunNextItem(ctx, index, lock)) anyRun = true;
    return anyRun;
}

/// Takes items until it is told to leave.
void WorkUntilTerminated(CMPIContext* ctx, long index, MutexGuard& lock)
    PLEXOR_HOLDS(PlexorThreadMutex) {
    for (;;) {
        const bool wasBusy = RunItems(ctx, index, lock);
        syslog(LOG_DEBUG, "%s(%ld): no item to process, wait...\n", "PlexorThread", index);
        WaitForWork(wasBusy && ToldToLeave());
        if (ToldToLeave()) return;
    }
}

/// Has worker `i` run, unless there is nothing to run it with or its life has been asked to end.
bool CreateThread(int i, Thread_Args_t* args) {
    const LifeGuard life;
    if (life.MemberOfEnded()) return false;
    // One that an earlier life could not join: nobody will any more.
    if (__Started[i] && PlexorThreads[i] != 0) pthread_detach(PlexorThreads[i]);
    __Started[i] = args != nullptr && life.Stands() &&
                   pthread_create(&PlexorThreads[i], &PlexorThreadAttr, PlexorThread, args) == 0;
    if (!__Started[i] && __LivingWorkers != 0) __LivingWorkers--;
    return __Started[i];
}

/// Starts worker `i`, if there is memory, a context and a thread for it and its life stands.
void StartWorker(int i, const CMPIContext* ctx) {
    const CMPIBroker* broker = CurrentBroker();
    auto* args = NewRecord<Thread_Args_t>();
    CMPIContext* prepared = broker->bft->prepareAttachThread(broker, ctx);
    if (args != nullptr) Pack(args, WorkerStart{i, prepared});
    if (CreateThread(i, prepared != nullptr ? args : nullptr)) return;
    free(args);
    if (prepared != nullptr) EndUnusedContext(prepared);
}

/// Frees what a stop left in the queue, clones included.
void DiscardQueuedWork() {
    while (!IsFifoEmpty(&__FIFO)) {
        auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
        if (item == nullptr) return;
        if (item->Func == ProcessBuildLogicalDeviceInfo) {
            ReleaseDeviceItem(item);
        } else {
            free(item);
        }
    }
}

/// Joins the workers that have ended. False when one has not: it is left to itself, or to the next
/// cleanup of the same life.
bool JoinWorkers() {
    bool allEnded = true;
    for (int i = 0; i < kThreadCount; i++) {
        if (!__Started[i]) continue;
        const Deadline deadline = Deadline::In(kJoinLimitSeconds);
        __Started[i] = pthread_clockjoin_np(PlexorThreads[i], nullptr, CLOCK_MONOTONIC,
                                            &deadline.Moment()) != 0;
        if (__Started[i]) allEnded = false;
    }
    return allEnded;
}

/// What earlier lives left behind in the workers' words.
void ForgetEarlierLives() PLEXOR_LOCKS_UNCHECKED {
    __LivingWorkers = 0;
    // A word that has been reset is nobody's any more.
    if (LoadShared(TerminateThread) == 0) __TerminatedLife = 0;
    CloseInventoryGate();
}

/// Before the workers run: one that looks at once must not take itself for the only one. False
/// when their life has ended.
bool PrepareThreads() {
    const LifeGuard life;
    if (life.MemberOfEnded()) return false;
    pthread_attr_init(&PlexorThreadAttr);
    pthread_attr_setdetachstate(&PlexorThreadAttr, PTHREAD_CREATE_JOINABLE);
    __LivingWorkers = kThreadCount;
    return true;
}

}  // namespace

void BeginWork() {
    BeginLife(ForgetEarlierLives);
}

int QueueItem(Thread_Args_t* item) {
    const LifeGuard life;
    return life.MemberOfEnded() ? RESULT_NOTHING : PutItem(&__FIFO, item);
}

bool OneWorkerActiveAtMost() {
    ExpectHeld(PlexorThreadMutex, __func__);
    return ActiveThreads <= ActiveWorker::CountOld() + 1;
}

bool RunQueuedItemAlone(const CMPIContext* ctx) {
    if (__LivingWorkers != 1) return false;
    Thread_Args_t* item = TakeItem();
    if (item == nullptr) return false;
    if (item->Func != nullptr) item->Func(const_cast<CMPIContext*>(ctx), item);
    return true;
}

bool QuiesceWorkers(Deadline (*limit)()) {
    RequestStop();
    MutexGuard lock(PlexorThreadMutex);
    while (ActiveWorker::CountRunning() != 0) {
        const Deadline deadline = limit();
        if (!WaitUntil(__ItemEnded, PlexorThreadMutex, deadline) && !limit().IsBefore(deadline)) {
            break;
        }
    }
    return ActiveWorker::CountRunning() == 0;
}

void WakeQuiesce() {
    MutexGuard lock(PlexorThreadMutex);
    pthread_cond_broadcast(&__ItemEnded);
}

void InitPlexorThreads(const CMPIContext* ctx) {
    const int seconds = GetSampelInterval();
    if (LifeGuard().MemberOfEnded()) return;
    StoreShared(StateUpdateInterval, seconds < 1 ? kDefaultIntervalSeconds : seconds);
    // At error level so that it reaches the log whatever the process masks.
    syslog(LOG_ERR, "%s: Sample interval was set to %lu secs\n", __func__,
           static_cast<unsigned long>(LoadShared(StateUpdateInterval)));
    if (!PrepareThreads()) return;
    for (int i = 0; i < kThreadCount; i++) {
        StartWorker(i, ctx);
        if (LifeGuard().MemberOfEnded()) return;
        syslog(LOG_DEBUG, "%s: thread %d created\n", __func__, i);
    }
}

void* PlexorThread(void* args) {
    const auto [index, ctx] = TakeWork<WorkerStart>(args);
    const CMPIBroker* broker = CurrentBroker();
    const LifeMember member;
    const LivingWorker living;
    broker->bft->attachThread(broker, ctx);
    MutexGuard lock(PlexorThreadMutex);
    WorkUntilTerminated(ctx, index, lock);
    lock.Unlock();
    broker->bft->detachThread(broker, ctx);
    syslog(LOG_DEBUG, "Thread %ld exiting...\n", index);
    pthread_exit(nullptr);
}

void CleanupPlexorThreads() {
    MutexGuard lock(PlexorThreadMutex);
    TerminateThread = 1;
    __TerminatedLife = PresentLife();
    lock.Unlock();
    pthread_cond_broadcast(&PlexorThreadCond);
    sleep(kExitSeconds);
    pthread_attr_destroy(&PlexorThreadAttr);
    __LivingWorkers = 0;
    if (!JoinWorkers()) KeepLibraryMapped();
    DiscardQueuedWork();
}
