// Counts the calls that keep the library mapped, in front of the C library's function.
#include "library_pins.h"

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <atomic>

#include "PlexorProviderUtilLife.h"

namespace {

std::atomic<int> pins = 0;

}  // namespace

extern "C" {
void* __real_dlopen(const char* file, int flags);
void* __wrap_dlopen(const char* file, int flags) {
    if ((flags & RTLD_NODELETE) != 0) ++pins;
    return __real_dlopen(file, flags);
}
}

namespace plexortest {

int libraryPins() {
    return pins;
}

namespace {

TEST(LibraryPins, AreCounted) {
    const int before = libraryPins();
    KeepLibraryMapped();
    EXPECT_EQ(libraryPins(), before + 1);
}

}  // namespace
}  // namespace plexortest
