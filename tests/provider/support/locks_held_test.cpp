// In builds that check locks a test fails during which the provider was called without one that the
// call needs.
#include <gtest/gtest.h>

#include "PlexorProviderLock.h"

#if defined(PLEXOR_CHECK_LOCKS)

namespace {

unsigned int expected = 0;  // what a test has provoked itself

class LocksHeld : public testing::EmptyTestEventListener {
    void OnTestStart(const testing::TestInfo&) override {
        before_ = LocksMissed();
        expected = 0;
    }
    void OnTestEnd(const testing::TestInfo&) override {
        EXPECT_EQ(LocksMissed(), before_ + expected) << "calls without a lock that they need";
    }

    unsigned int before_ = 0;
};

[[maybe_unused]] const bool added = [] {
    testing::UnitTest::GetInstance()->listeners().Append(new LocksHeld);
    return true;
}();

TEST(LocksHeldTest, ACallWithoutItsLockIsTold) {
    pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
    const unsigned int before = LocksMissed();
    {
        const MutexGuard lock(mutex);
        ExpectHeld(mutex, "held");
    }
    EXPECT_EQ(LocksMissed(), before);
    testing::internal::CaptureStderr();
    ExpectHeld(mutex, "ACall");
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "ACall was called without its lock\n");
    EXPECT_EQ(LocksMissed(), before + 1);
    expected = 1;
}

}  // namespace

#endif
