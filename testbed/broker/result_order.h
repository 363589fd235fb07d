// The order in which a manager hands out what it found.
#pragma once

#include <algorithm>
#include <cstdint>
#include <mutex>
#include <random>
#include <vector>

namespace testbed {

/// Draws another order each time, the same ones for the same seed. Thread-safe.
class ResultOrder {
public:
    explicit ResultOrder(std::uint32_t seed) : random_(seed) {}

    template <class Item>
    void shuffle(std::vector<Item>& items) {
        const std::lock_guard lock(mutex_);
        std::shuffle(items.begin(), items.end(), random_);
    }

private:
    std::mutex mutex_;
    std::mt19937 random_;  // guarded by mutex_
};

}  // namespace testbed
