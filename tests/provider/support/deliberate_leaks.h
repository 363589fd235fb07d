// Leaks that the provider makes on purpose, hidden from LeakSanitizer and from nothing else.
#pragma once

extern "C" {
// Of the checker that the program is linked with, be it without a sanitizer's code; null without.
void __lsan_disable() __attribute__((weak));
void __lsan_enable() __attribute__((weak));
}

namespace plexortest {

/// What this thread allocates while one lives may stay behind. Put it around the one call that
/// leaves something behind, so that every other leak is still found.
class DeliberateLeaks {
public:
    DeliberateLeaks() {
        if (__lsan_disable != nullptr) __lsan_disable();
    }
    ~DeliberateLeaks() {
        if (__lsan_enable != nullptr) __lsan_enable();
    }
    DeliberateLeaks(const DeliberateLeaks&) = delete;
    DeliberateLeaks& operator=(const DeliberateLeaks&) = delete;
};

}  // namespace plexortest
