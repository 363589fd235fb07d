// Allocations of the provider that fail on demand: calloc, malloc, realloc and strdup as called
// from the executable's own objects. The test bed allocates with operator new and is not touched.
#pragma once

#include <cstddef>
#include <functional>
#include <string>

namespace plexortest {

enum class Allocator : unsigned {
    Calloc = 1,
    Malloc = 2,
    Realloc = 4,
    Strdup = 8,
    Any = 15,
};

/// Armed as long as it lives; one at a time. Counting starts at 1 with the first matching call, on
/// whatever thread. Thread-safe.
class [[nodiscard]] FailAllocation {
public:
    /// The n-th call fails, the others work.
    static FailAllocation nth(std::size_t n, Allocator which = Allocator::Any);
    /// The n-th call and all after it fail.
    static FailAllocation from(std::size_t n, Allocator which = Allocator::Any);
    /// Every strdup of exactly that text fails.
    static FailAllocation strdupOf(std::string text);
    /// Nothing fails; calls are counted.
    static FailAllocation none(Allocator which = Allocator::Any);

    ~FailAllocation();
    FailAllocation(const FailAllocation&) = delete;
    FailAllocation& operator=(const FailAllocation&) = delete;

    /// Matching calls since it was armed.
    std::size_t calls() const;
    /// Those that failed.
    std::size_t failures() const;

private:
    FailAllocation() = default;
};

/// Runs `act` with its first allocation failing, then the second, and so on, until a run needs no
/// more allocations; each run with that one failing, and again with all from it on failing. `act`
/// gets the number of the failing allocation and builds its own world. Returns the number of
/// allocations.
std::size_t forEachFailingAllocation(const std::function<void(std::size_t n)>& act);

}  // namespace plexortest
