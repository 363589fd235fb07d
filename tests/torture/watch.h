// Watches a running provider from outside: the queue's limit, and that requests keep coming back.
#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <functional>
#include <thread>

#include "failures.h"

namespace torture {

/// Aborts the process when no request completes for 30 seconds. Samples the queue meanwhile.
class Watch {
public:
    /// `completed` gives the number of requests that have come back.
    Watch(Failures& failures, std::function<std::uint64_t()> completed);
    ~Watch();
    Watch(const Watch&) = delete;
    Watch& operator=(const Watch&) = delete;

    unsigned longestQueue() const { return longestQueue_; }

private:
    void run();
    void sampleQueue();

    Failures& failures_;
    std::function<std::uint64_t()> completed_;
    std::atomic<bool> stop_ = false;
    std::atomic<unsigned> longestQueue_ = 0;
    std::thread thread_;
};

}  // namespace torture
