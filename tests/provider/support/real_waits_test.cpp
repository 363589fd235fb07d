// That waits are hurried, and wake-ups counted, when a test wants it.
#include "real_waits.h"

#include <errno.h>
#include <gtest/gtest.h>
#include <time.h>

#include "PlexorProvider.h"

namespace plexortest {
namespace {

using std::chrono::steady_clock;

TEST(RealWaits, HurriedWaitEndsEarlyAndIsNoted) {
    const HurriedWaits hurry;
    const auto start = steady_clock::now();
    timespec deadline;
    clock_gettime(CLOCK_MONOTONIC, &deadline);
    deadline.tv_sec += 20;

    pthread_mutex_lock(&PlexorThreadMutex);
    const int rc =
        pthread_cond_clockwait(&PlexorThreadCond, &PlexorThreadMutex, CLOCK_MONOTONIC, &deadline);
    pthread_mutex_unlock(&PlexorThreadMutex);

    EXPECT_EQ(rc, ETIMEDOUT);
    EXPECT_GE(steady_clock::now() - start, std::chrono::milliseconds(19));
    EXPECT_LT(steady_clock::now() - start, std::chrono::seconds(20));
    ASSERT_EQ(HurriedWaits::workWaits().size(), 1u);
    EXPECT_NEAR(static_cast<double>(HurriedWaits::workWaits()[0].count()), 20000, 500);
}

TEST(RealWaits, CountsWakeUpsAndWhetherTheMutexIsHeld) {
    const WakeUpCounter wakeUps;
    pthread_cond_signal(&PlexorThreadCond);
    pthread_mutex_lock(&PlexorThreadMutex);
    pthread_cond_broadcast(&PlexorThreadCond);
    pthread_mutex_unlock(&PlexorThreadMutex);

    EXPECT_EQ(WakeUpCounter::signals(), 1);
    EXPECT_EQ(WakeUpCounter::broadcasts(), 1);
    EXPECT_EQ(WakeUpCounter::underMutex(), 1);
}

}  // namespace
}  // namespace plexortest
