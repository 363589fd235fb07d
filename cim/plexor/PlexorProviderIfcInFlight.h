// Calls of the manager that are under way, told apart by when they began.
#pragma once

#include <atomic>
#include <cstdint>

/// Counts calls of one kind. Who is about to change what they look at closes the present generation
/// and waits for the calls in it: neither for those that begin meanwhile, nor for those that an
/// earlier close has given up waiting for.
class CallsInFlight {
public:
    /// Counts a call; its generation. Without a lock.
    unsigned int Enter() { return GenerationOf(word_.fetch_add(1)); }
    /// Ends a call. False when its generation has been closed: then LeaveClosed has to. Without a
    /// lock.
    bool LeaveOpen(unsigned int generation);
    /// Ends a call of a closed generation. The caller holds the lock that closes.
    void LeaveClosed(unsigned int generation) {
        if (generation >= awaitedFrom_) awaited_--;
    }
    bool IsClosed(unsigned int generation) const { return GenerationOf(word_) != generation; }

    /// Closes the present generation. What an earlier close waits for is forgotten, unless
    /// `keepEarlier`. The caller holds the lock that closes.
    void Close(bool keepEarlier);
    /// Whether all calls of what was closed have ended. The caller holds that lock.
    bool ClosedAreGone() const { return awaited_ == 0; }
    /// Whether there are calls in the present generation.
    bool HasOpen() const { return CountOf(word_) != 0; }

private:
    static constexpr int kCountBits = 32;
    static unsigned int GenerationOf(std::uint64_t word) {
        return static_cast<unsigned int>(word >> kCountBits);
    }
    static unsigned int CountOf(std::uint64_t word) { return static_cast<unsigned int>(word); }

    std::atomic<std::uint64_t> word_ = 0;  // the present generation, and how many calls it has
    unsigned int awaitedFrom_ = 0;         // the oldest closed generation that is waited for
    unsigned int awaited_ = 0;             // calls of that one and of the closed ones after it
};
