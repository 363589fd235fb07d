// The provider's sleeps, made short: the executable exports `sleep` in front of the C library's.
#pragma once

namespace loadtest {

/// While one lives, a second of sleep lasts 10 ms. Not to be nested.
class QuickSleep {
public:
    QuickSleep();
    ~QuickSleep();
    QuickSleep(const QuickSleep&) = delete;
    QuickSleep& operator=(const QuickSleep&) = delete;
    /// How often sleep was called.
    int calls() const;
};

}  // namespace loadtest
