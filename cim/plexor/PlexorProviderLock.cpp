// Checks of what callers hold, in the builds that make them.
#include "PlexorProviderLock.h"

#if defined(PLEXOR_CHECK_LOCKS)

#include <stdio.h>
#include <unistd.h>

#include <atomic>

namespace {

std::atomic<unsigned int> __LocksMissed = 0;

}  // namespace

void ExpectHeld(const pthread_mutex_t& mutex, const char* function) {
    // The C library notes the holder; nobody else writes that word to this thread's number.
    if (mutex.__data.__owner == gettid()) return;
    __LocksMissed++;
    fprintf(stderr, "%s was called without its lock\n", function);
}

unsigned int LocksMissed() {
    return __LocksMissed;
}

#endif
