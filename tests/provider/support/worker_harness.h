// Workers, work items and gates for tests that run the provider's worker body.
#pragma once

#include <pthread.h>
#include <stdlib.h>

#include <atomic>
#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>

#include "PlexorProviderCfg.h"
#include "eventually.h"

namespace plexortest {

/// The quiet stop with the limit of a cleanup that does not terminate.
inline bool quiesceWorkers() {
    return QuiesceWorkers([] { return Deadline::In(30); });
}

/// What a cleanup will give up because somebody still uses it. Made before that cleanup; releases
/// it at the end of the scope, when that somebody has left.
class GivenUpInventory {
public:
    GivenUpInventory() = default;
    ~GivenUpInventory() {
        FreeList(&controllers_, FreeController);
        for (char* name : names_) free(name);
    }
    GivenUpInventory(const GivenUpInventory&) = delete;
    GivenUpInventory& operator=(const GivenUpInventory&) = delete;

private:
    List_t controllers_ = *RaidControllerList;
    char* names_[3] = {__SystemClassName, __HostName, __SystemName};
};

/// Holds whoever passes until it is opened.
class Gate {
public:
    void pass() {
        std::unique_lock lock(mutex_);
        arrived_++;
        changed_.notify_all();
        changed_.wait(lock, [this] { return open_; });
    }
    void open() {
        const std::lock_guard lock(mutex_);
        open_ = true;
        changed_.notify_all();
    }
    /// Waits until that many have arrived; false when they have not within the limit.
    bool awaitArrivals(int wanted) {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, kGenerousLimit, [&] { return arrived_ >= wanted; });
    }

private:
    std::mutex mutex_;
    std::condition_variable changed_;
    int arrived_ = 0;    // guarded by mutex_
    bool open_ = false;  // guarded by mutex_
};

/// Opens a gate on every way out of a scope, so that a failed assertion leaves nobody behind it.
class GateOpener {
public:
    explicit GateOpener(Gate& gate) : gate_(gate) {}
    ~GateOpener() { gate_.open(); }
    GateOpener(const GateOpener&) = delete;
    GateOpener& operator=(const GateOpener&) = delete;

private:
    Gate& gate_;
};

/// Work items that run the test's own code. Must outlive the workers that may run them.
class Tasks {
public:
    using Work = std::function<void(CMPIContext* ctx, void* item)>;

    /// A new item, allocated as the provider does it and freed by its work function.
    Thread_Args_t* make(Work work) {
        const std::lock_guard lock(mutex_);
        works_.push_back({this, std::move(work)});
        auto* item = static_cast<Thread_Args_t*>(calloc(1, sizeof(Thread_Args_t)));
        item->Func = run;
        item->Arg0 = reinterpret_cast<uintptr_t>(&works_.back());
        return item;
    }
    /// Puts an item into the queue without waking anybody. The queue's code.
    int put(Work work) {
        Thread_Args_t* item = make(std::move(work));
        const int rc = PutItem(&__FIFO, item);
        if (rc != RESULT_OK) free(item);
        return rc;
    }
    /// The same, and wakes one worker.
    int queue(Work work) {
        const int rc = put(std::move(work));
        pthread_cond_signal(&PlexorThreadCond);
        return rc;
    }
    int ended() const { return ended_; }

private:
    struct Entry {
        Tasks* owner;
        Work work;
    };

    static void run(CMPIContext* ctx, void* args) {
        auto* entry = reinterpret_cast<Entry*>(static_cast<Thread_Args_t*>(args)->Arg0);
        entry->work(ctx, args);
        free(args);
        ++entry->owner->ended_;
    }

    std::mutex mutex_;
    std::deque<Entry> works_;  // guarded by mutex_; entries stay where they are
    std::atomic<int> ended_ = 0;
};

/// One worker of the provider on a thread that the test joins.
class Worker {
public:
    /// Prepares its context from `creator`, the calling thread's.
    explicit Worker(const CMPIContext* creator, long index = 0) {
        auto* start = static_cast<Thread_Args_t*>(calloc(1, sizeof(Thread_Args_t)));
        start->Arg0 = static_cast<uintptr_t>(index);
        start->Arg1 =
            reinterpret_cast<uintptr_t>(::Broker->bft->prepareAttachThread(::Broker, creator));
        started_ = pthread_create(&thread_, nullptr, PlexorThread, start) == 0;
    }
    ~Worker() { stop(); }
    Worker(const Worker&) = delete;
    Worker& operator=(const Worker&) = delete;

    /// Wakes it to terminate, again and again until it has ended.
    void stop() {
        pthread_mutex_lock(&PlexorThreadMutex);
        TerminateThread = 1;
        pthread_mutex_unlock(&PlexorThreadMutex);
        eventually([this] {
            pthread_cond_broadcast(&PlexorThreadCond);
            return ended();
        });
    }
    /// Whether it has ended; takes its exit value then.
    bool ended() {
        if (started_ && pthread_tryjoin_np(thread_, &exitValue_) == 0) started_ = false;
        return !started_;
    }
    void* exitValue() const { return exitValue_; }

private:
    pthread_t thread_ = {};
    bool started_ = false;
    void* exitValue_ = &thread_;  // something that no worker returns
};

/// Number of workers that are not waiting, as they count themselves.
inline unsigned int activeThreads() {
    pthread_mutex_lock(&PlexorThreadMutex);
    const unsigned int active = ActiveThreads;
    pthread_mutex_unlock(&PlexorThreadMutex);
    return active;
}

inline unsigned int threadActivityDone() {
    pthread_mutex_lock(&PlexorThreadMutex);
    const unsigned int done = ThreadActivityDone;
    pthread_mutex_unlock(&PlexorThreadMutex);
    return done;
}

inline void setThreadActivityDone(unsigned int done) {
    pthread_mutex_lock(&PlexorThreadMutex);
    ThreadActivityDone = done;
    pthread_mutex_unlock(&PlexorThreadMutex);
}

inline unsigned int queuedItems() {
    pthread_mutex_lock(&__FIFO.Mutex);
    const unsigned int size = __FIFO.List.Size;
    pthread_mutex_unlock(&__FIFO.Mutex);
    return size;
}

/// True once the queue is empty and every worker waits.
inline bool workersComeToRest() {
    return eventually([] { return queuedItems() == 0 && activeThreads() == 0; });
}

}  // namespace plexortest
