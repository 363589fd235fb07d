// A scope in which a thread cannot be cancelled.
#include <gtest/gtest.h>

#include "PlexorProviderLock.h"

namespace {

/// Whether the calling thread may be cancelled; stays as it is.
bool isCancellable() {
    int state = -1;
    pthread_setcancelstate(PTHREAD_CANCEL_DISABLE, &state);
    pthread_setcancelstate(state, nullptr);
    return state == PTHREAD_CANCEL_ENABLE;
}

TEST(NoCancellationTest, EndsWithItsScope) {
    ASSERT_TRUE(isCancellable());
    {
        const NoCancellation outer;
        EXPECT_FALSE(isCancellable());
        { const NoCancellation inner; }
        EXPECT_FALSE(isCancellable()) << "the outer one's goes on";
    }
    EXPECT_TRUE(isCancellable());
}

}  // namespace
