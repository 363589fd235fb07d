// A promise that was not kept, as libFuzzer and ctest notice it.
#include "fuzz_target.h"

#include <cstdio>
#include <cstdlib>

namespace fuzz {

void require(bool kept, const char* promise) {
    if (kept) return;
    std::fprintf(stderr, "not kept: %s\n", promise);
    std::abort();
}

}  // namespace fuzz
