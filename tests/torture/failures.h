// What went wrong, from any thread.
#pragma once

#include <cstddef>
#include <mutex>
#include <ostream>
#include <string>
#include <vector>

namespace torture {

/// Keeps the first few texts and counts the others. Thread-safe.
class Failures {
public:
    void add(std::string text) {
        const std::lock_guard lock(mutex_);
        count_++;
        if (texts_.size() < kKept) texts_.push_back(std::move(text));
    }
    std::size_t count() const {
        const std::lock_guard lock(mutex_);
        return count_;
    }
    void print(std::ostream& out) const {
        const std::lock_guard lock(mutex_);
        for (const std::string& text : texts_) out << "failure: " << text << "\n";
        if (count_ > texts_.size()) out << "and " << count_ - texts_.size() << " more\n";
    }

private:
    static constexpr std::size_t kKept = 20;
    mutable std::mutex mutex_;
    std::size_t count_ = 0;           // guarded by mutex_
    std::vector<std::string> texts_;  // guarded by mutex_
};

}  // namespace torture
