// Leaks that the provider makes on purpose, hidden from LeakSanitizer and from nothing else.
#pragma once

#include "sanitizers.h"

#if defined(PLEXOR_ADDRESS_SANITIZER)
#include <sanitizer/lsan_interface.h>
#endif

namespace plexortest {

/// What this thread allocates while one lives may stay behind. Put it around the one call that
/// leaves something behind, so that every other leak is still found.
class DeliberateLeaks {
public:
#if defined(PLEXOR_ADDRESS_SANITIZER)
    DeliberateLeaks() {
        __lsan_disable();
    }
    ~DeliberateLeaks() {
        __lsan_enable();
    }
#else
    DeliberateLeaks() {}
    ~DeliberateLeaks() {}
#endif
    DeliberateLeaks(const DeliberateLeaks&) = delete;
    DeliberateLeaks& operator=(const DeliberateLeaks&) = delete;
};

}  // namespace plexortest
