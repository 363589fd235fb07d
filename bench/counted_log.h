// The provider's log, counted instead of written: in front of the C library's, in a program that
// links this.
#pragma once

#include <atomic>
#include <chrono>
#include <cstddef>

namespace bench {

/// Lines so far, of whatever priority and whatever the mask says.
std::size_t loggedLines();

/// How often one line of the log came. For the whole program; all are made before the first line.
class CountedLine {
public:
    explicit CountedLine(const char* text);
    CountedLine(const CountedLine&) = delete;
    CountedLine& operator=(const CountedLine&) = delete;

    int count() const { return count_; }
    /// When it came last.
    std::chrono::steady_clock::time_point when() const { return when_; }
    void reset() { count_ = 0; }

private:
    friend void countLine(const char* text);
    const char* text_;
    std::atomic<std::chrono::steady_clock::time_point> when_{};
    std::atomic<int> count_ = 0;
    CountedLine* next_;
};

}  // namespace bench
