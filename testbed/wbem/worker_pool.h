// A fixed number of threads that carry out jobs in the order in which they came.
#pragma once

#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

namespace testbed {

class WorkerPool {
public:
    explicit WorkerPool(unsigned threads);
    /// Drops the jobs that have not begun and waits for those that have.
    ~WorkerPool();
    WorkerPool(const WorkerPool&) = delete;
    WorkerPool& operator=(const WorkerPool&) = delete;

    /// `job` must not throw.
    void add(std::function<void()> job);

private:
    void work();

    std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<std::function<void()>> jobs_;  // guarded by mutex_
    bool stopping_ = false;                   // guarded by mutex_
    std::vector<std::thread> threads_;
};

}  // namespace testbed
