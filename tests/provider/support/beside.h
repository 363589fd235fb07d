// Another thread that is at it all the time, for the thread sanitizer.
#pragma once

#include <atomic>
#include <functional>
#include <thread>

namespace plexortest {

/// Does something over and over on a thread of its own, for a scope: at least once before what is
/// in it, and once after that.
class Beside {
public:
    explicit Beside(std::function<void()> act)
        : thread_([this, act = std::move(act)] {
              while (!done_.load(std::memory_order_relaxed)) {
                  act();
                  rounds_.fetch_add(1, std::memory_order_relaxed);
              }
          }) {
        awaitRound();
    }
    ~Beside() {
        awaitRound();
        done_.store(true, std::memory_order_relaxed);
        thread_.join();
    }
    Beside(const Beside&) = delete;
    Beside& operator=(const Beside&) = delete;

    /// Waits until it has been done once more, and orders nothing by that.
    void awaitRound() const {
        const unsigned int now = rounds_.load(std::memory_order_relaxed);
        while (rounds_.load(std::memory_order_relaxed) - now < 2) std::this_thread::yield();
    }

private:
    std::atomic<bool> done_ = false;
    std::atomic<unsigned int> rounds_ = 0;
    std::thread thread_;
};

/// Writes and reads a word without changing it, and without ordering anything.
template <typename Word>
void touch(Word& word) {
    __atomic_fetch_add(&word, 0, __ATOMIC_RELAXED);
}

}  // namespace plexortest
