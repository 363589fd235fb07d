// Points in time on the monotonic clock.
#include "PlexorProviderDeadline.h"

#include <gtest/gtest.h>

namespace {

long long nanoseconds(const timespec& moment) {
    return moment.tv_sec * 1'000'000'000LL + moment.tv_nsec;
}

long long clockNow() {
    timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    return nanoseconds(now);
}

TEST(DeadlineTest, NowIsWhatTheClockSays) {
    const long long before = clockNow();
    const Deadline now = Deadline::Now();
    const long long after = clockNow();
    EXPECT_GE(nanoseconds(now.Moment()), before);
    EXPECT_LE(nanoseconds(now.Moment()), after);
    EXPECT_TRUE(now.Passed());
    EXPECT_EQ(nanoseconds(now.Plus(7).Moment()), nanoseconds(now.Moment()) + 7'000'000'000);
}

TEST(DeadlineTest, WhatIsToComeHasNotPassed) {
    const Deadline later = Deadline::In(3600);
    EXPECT_FALSE(later.Passed());
    EXPECT_LT(later.SecondsAgo(), 0);
    EXPECT_FALSE(later.IsBefore(Deadline::Now()));
    EXPECT_TRUE(Deadline::Now().IsBefore(later));
}

}  // namespace
