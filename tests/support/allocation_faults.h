// Allocations of the provider that fail on demand.
//
// The test program is linked with --wrap for calloc, malloc, realloc and strdup. Only what is linked
// into it is caught: the provider's objects. The test bed allocates with new and is not touched.
#pragma once

#include <string>

namespace plexortest {

/// While it lives, allocations fail as it says. One at a time. Counting is thread-safe.
class FailAllocation {
public:
    /// The n-th allocation from now (1 is the next) fails, once.
    static FailAllocation nth(int n) { return FailAllocation(n, true, ""); }
    /// The n-th and every later one fail.
    static FailAllocation from(int n) { return FailAllocation(n, false, ""); }
    /// Every strdup of exactly this text fails.
    static FailAllocation strdupOf(const std::string& text) {
        return FailAllocation(0, false, text);
    }
    ~FailAllocation();
    FailAllocation(const FailAllocation&) = delete;
    FailAllocation& operator=(const FailAllocation&) = delete;

    /// How many allocations were refused so far.
    static int refused();
    /// How many allocations were asked for since it was made.
    static int counted();

private:
    FailAllocation(int n, bool once, const std::string& text);
};

}  // namespace plexortest
