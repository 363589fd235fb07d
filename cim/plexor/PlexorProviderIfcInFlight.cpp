// Calls of the manager that are under way.
#include "PlexorProviderIfcInFlight.h"

bool CallsInFlight::LeaveOpen(unsigned int generation) {
    std::uint64_t word = word_;
    while (GenerationOf(word) == generation) {
        if (word_.compare_exchange_weak(word, word - 1)) return true;
    }
    return false;
}

void CallsInFlight::Close(bool keepEarlier) {
    // Only closing changes the generation, so it stays while the calls in it are counted.
    const unsigned int generation = GenerationOf(word_);
    const std::uint64_t closed =
        word_.exchange(static_cast<std::uint64_t>(generation + 1) << kCountBits);
    if (!keepEarlier) {
        awaitedFrom_ = generation;
        awaited_ = 0;
    }
    awaited_ += CountOf(closed);
}
