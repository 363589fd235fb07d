// The two workers: start, body, initial inventory, stop.
#include <dlfcn.h>
#include <errno.h>
#include <stdlib.h>
#include <unistd.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderLock.h"

// Two, not fewer: one may wait for the queue to drain while the other drains it.
pthread_t PlexorThreads[2];
pthread_attr_t PlexorThreadAttr;
pthread_mutex_t PlexorThreadMutex = PTHREAD_MUTEX_INITIALIZER;
pthread_cond_t PlexorThreadCond = PTHREAD_COND_INITIALIZER;
unsigned int ActiveThreads = 0;
unsigned int TerminateThread = 0;
unsigned int ThreadActivityDone = 0;
time_t StateUpdateInterval = 20;

namespace {

constexpr int kThreadCount = sizeof PlexorThreads / sizeof PlexorThreads[0];
constexpr int kDefaultIntervalSeconds = 20;
constexpr unsigned int kExitSeconds = 3;     // what the workers get to leave
constexpr time_t kQuiesceLimitSeconds = 30;  // what a work function gets to end
constexpr time_t kJoinLimitSeconds = 1;
constexpr time_t kMissedSignalSeconds = 1;

bool __Started[kThreadCount];  // workers to join; factory and cleanup only
unsigned int __WorkerCount;    // workers that were started; relaxed atomic
unsigned int __RunningItems;   // work functions running; guarded by PlexorThreadMutex
unsigned int __StopRequested;  // written under PlexorThreadMutex, read as relaxed atomic
pthread_cond_t __ItemEnded = PTHREAD_COND_INITIALIZER;  // with PlexorThreadMutex

timespec DeadlineIn(time_t seconds) {
    timespec deadline;
    clock_gettime(CLOCK_MONOTONIC, &deadline);
    deadline.tv_sec += seconds;
    return deadline;
}

void SetStopRequested(unsigned int value) {
    __atomic_store_n(&__StopRequested, value, __ATOMIC_RELAXED);
}

void SetWorkerCount(unsigned int value) {
    __atomic_store_n(&__WorkerCount, value, __ATOMIC_RELAXED);
}

/// Runs one item with PlexorThreadMutex released; locked again on return.
void RunItem(Thread_Args_t* item, CMPIContext* ctx, long index) {
    __RunningItems++;
    pthread_mutex_unlock(&PlexorThreadMutex);
    syslog(LOG_DEBUG, "%s(%ld): running...\n", "PlexorThread", index);
    if (item->Func != nullptr) item->Func(ctx, item);
    FlushContext(ctx);
    pthread_mutex_lock(&PlexorThreadMutex);
    __RunningItems--;
    pthread_cond_broadcast(&__ItemEnded);
}

/// Waits until it is woken. The producers signal without PlexorThreadMutex, so a signal can fall
/// between an empty GetItem and the wait; work that is queued then is found at the next look, not
/// at the next signal, which might never come. So is a stop, unless the worker was busy when it was
/// asked for: then it waits for the next wake-up. The caller holds PlexorThreadMutex.
void WaitForWork(bool wasBusyAtStop) {
    while (!TerminateThread || wasBusyAtStop) {
        const timespec deadline = DeadlineIn(kMissedSignalSeconds);
        const int rc = pthread_cond_clockwait(&PlexorThreadCond, &PlexorThreadMutex,
                                              CLOCK_MONOTONIC, &deadline);
        if (rc != ETIMEDOUT) return;
        if (!StopRequested() && !IsFifoEmpty(&__FIFO)) return;
    }
}

/// Takes items until it is woken to terminate. The caller holds PlexorThreadMutex.
void WorkUntilTerminated(CMPIContext* ctx, long index) {
    bool ranItem = false;
    for (;;) {
        ActiveThreads++;
        auto* item = StopRequested() ? nullptr : static_cast<Thread_Args_t*>(GetItem(&__FIFO));
        if (item != nullptr) RunItem(item, ctx, index);
        ActiveThreads--;
        if (item != nullptr) {
            ranItem = true;
            continue;
        }
        syslog(LOG_DEBUG, "%s(%ld): no item to process, wait...\n", "PlexorThread", index);
        WaitForWork(ranItem && TerminateThread);
        if (TerminateThread) return;
        ranItem = false;
    }
}

void StartWorker(int i, const CMPIContext* ctx) {
    const CMPIBroker* broker = CurrentBroker();
    auto* args = NewRecord<Thread_Args_t>();
    CMPIContext* prepared = broker->bft->prepareAttachThread(broker, ctx);
    __Started[i] = false;
    if (args != nullptr && prepared != nullptr) {
        args->Arg0 = static_cast<uintptr_t>(i);
        args->Arg1 = reinterpret_cast<uintptr_t>(prepared);
        __Started[i] =
            pthread_create(&PlexorThreads[i], &PlexorThreadAttr, PlexorThread, args) == 0;
    }
    if (!__Started[i]) free(args);
    syslog(LOG_DEBUG, "%s: thread %d created\n", "InitPlexorThreads", i);
}

void StampAll(RaidController_t* ctrl) {
    const time_t now = time(nullptr);
    StoreTime(ctrl->BatteryUpdateTime, now);
    StoreTime(ctrl->PortUpdateTime, now);
    StoreTime(ctrl->DiskUpdateTime, now);
    StoreTime(ctrl->VolumeUpdateTime, now);
    StoreTime(ctrl->PoolUpdateTime, now);
    StoreTime(ctrl->ChassisUpdateTime, now);
    StoreTime(ctrl->ControllerUpdateTime, now);
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

/// Keeps the library mapped for the rest of the process: a thread that is still inside it would
/// otherwise return into unmapped memory.
void PinLibrary() {
    Dl_info info;
    if (dladdr(reinterpret_cast<void*>(&PlexorThread), &info) == 0) return;
    dlopen(info.dli_fname, RTLD_NOW | RTLD_NOLOAD | RTLD_NODELETE);
}

/// Joins the workers that have ended. False when one has not.
bool JoinWorkers() {
    bool allEnded = true;
    for (int i = 0; i < kThreadCount; i++) {
        if (!__Started[i]) continue;
        const timespec deadline = DeadlineIn(kJoinLimitSeconds);
        if (pthread_clockjoin_np(PlexorThreads[i], nullptr, CLOCK_MONOTONIC, &deadline) == 0) {
            __Started[i] = false;
        } else {
            allEnded = false;
        }
    }
    return allEnded;
}

}  // namespace

bool RunQueuedItemAlone(const CMPIContext* ctx) {
    if (__atomic_load_n(&__WorkerCount, __ATOMIC_RELAXED) != 1) return false;
    MutexGuard lock(PlexorThreadMutex);
    auto* item = StopRequested() ? nullptr : static_cast<Thread_Args_t*>(GetItem(&__FIFO));
    lock.Unlock();
    if (item == nullptr) return false;
    if (item->Func != nullptr) item->Func(const_cast<CMPIContext*>(ctx), item);
    return true;
}

bool StopRequested() {
    return __atomic_load_n(&__StopRequested, __ATOMIC_RELAXED) != 0;
}

void AdmitWork() {
    SetStopRequested(0);
}

bool QuiesceWorkers() {
    const timespec deadline = DeadlineIn(kQuiesceLimitSeconds);
    MutexGuard lock(PlexorThreadMutex);
    SetStopRequested(1);
    while (__RunningItems != 0) {
        if (pthread_cond_clockwait(&__ItemEnded, &PlexorThreadMutex, CLOCK_MONOTONIC, &deadline) !=
            0) {
            break;
        }
    }
    return __RunningItems == 0;
}

void InitPlexorThreads(const CMPIContext* ctx) {
    const int seconds = GetSampelInterval();
    StoreTime(StateUpdateInterval, seconds < 1 ? kDefaultIntervalSeconds : seconds);
    // At error level so that it reaches the log whatever the process masks.
    syslog(LOG_ERR, "%s: Sample interval was set to %lu secs\n", __func__,
           static_cast<unsigned long>(LoadTime(StateUpdateInterval)));
    pthread_attr_init(&PlexorThreadAttr);
    pthread_attr_setdetachstate(&PlexorThreadAttr, PTHREAD_CREATE_JOINABLE);
    for (int i = 0; i < kThreadCount; i++) StartWorker(i, ctx);
    SetWorkerCount(static_cast<unsigned int>(__Started[0]) + __Started[1]);
}

void* PlexorThread(void* args) {
    auto* start = static_cast<Thread_Args_t*>(args);
    const long index = static_cast<long>(start->Arg0);
    auto* ctx = reinterpret_cast<CMPIContext*>(start->Arg1);
    free(start);

    const CMPIBroker* broker = CurrentBroker();
    broker->bft->attachThread(broker, ctx);
    pthread_mutex_lock(&PlexorThreadMutex);
    WorkUntilTerminated(ctx, index);
    pthread_mutex_unlock(&PlexorThreadMutex);
    broker->bft->detachThread(broker, ctx);
    syslog(LOG_DEBUG, "Thread %ld exiting...\n", index);
    pthread_exit(nullptr);
}

int BuildDeviceInfoAsync(const CMPIInstanceMI* mi, const CMPIContext*) {
    auto* item = NewRecord<Thread_Args_t>();
    if (item == nullptr) {
        syslog(LOG_ERR, "%s, failed to allocate threadArgs\n", __func__);
        return RESULT_NO_MEMORY;
    }
    item->Func = DoBuildDeviceInfoAsync;
    item->Arg0 = reinterpret_cast<uintptr_t>(mi);
    const int rc = PutItem(&__FIFO, item);
    if (rc == RESULT_FIFO_FULL) {
        free(item);
        syslog(LOG_ERR, "%s, failed to put threadArgs in FIFO\n", __func__);
        return rc;
    }
    if (rc != RESULT_OK) free(item);
    pthread_cond_signal(&PlexorThreadCond);
    return rc;
}

void DoBuildDeviceInfoAsync(CMPIContext* ctx, void* args) {
    auto* item = static_cast<Thread_Args_t*>(args);
    auto* mi = reinterpret_cast<const CMPIInstanceMI*>(item->Arg0);
    free(item);

    const List_Entry_t* entry = RaidControllerList->Head;
    for (; entry != nullptr && !StopRequested(); entry = entry->Next) {
        auto* ctrl = static_cast<RaidController_t*>(entry->Data);
        if (ctrl == nullptr) continue;
        BuildPoolInfo(mi, ctx, ctrl);
        BuildChassisInfo(mi, ctx, ctrl);
        BuildLogicalDeviceInfo(mi, ctx, ctrl);
        StampAll(ctrl);
    }

    MutexGuard lock(PlexorThreadMutex);
    ThreadActivityDone = 1;
    pthread_cond_broadcast(&PlexorThreadCond);
    lock.Unlock();
    syslog(LOG_DEBUG, "%s done.", __func__);
}

void CleanupPlexorThreads() {
    MutexGuard lock(PlexorThreadMutex);
    TerminateThread = 1;
    lock.Unlock();
    pthread_cond_broadcast(&PlexorThreadCond);
    sleep(kExitSeconds);
    pthread_attr_destroy(&PlexorThreadAttr);
    SetWorkerCount(0);
    if (!JoinWorkers()) PinLibrary();
    DiscardQueuedWork();
}
