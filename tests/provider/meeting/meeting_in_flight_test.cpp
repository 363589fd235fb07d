// Who is waited for: the calls of what was closed last, not later ones, not those given up.
#include <gtest/gtest.h>

#include <thread>

#include "PlexorProviderIfcInFlight.h"

namespace {

TEST(CallsInFlightTest, OnlyWhatWasThereIsWaitedFor) {
    CallsInFlight calls;
    const unsigned int before = calls.Enter();
    calls.Close(false);
    EXPECT_FALSE(calls.ClosedAreGone());
    EXPECT_TRUE(calls.IsClosed(before));
    EXPECT_FALSE(calls.HasOpen());

    const unsigned int after = calls.Enter();
    EXPECT_FALSE(calls.IsClosed(after));
    EXPECT_TRUE(calls.HasOpen());
    EXPECT_FALSE(calls.LeaveOpen(before));
    calls.LeaveClosed(before);
    EXPECT_TRUE(calls.ClosedAreGone());
    EXPECT_TRUE(calls.LeaveOpen(after));
    EXPECT_FALSE(calls.HasOpen());
}

TEST(CallsInFlightTest, EveryoneWhoLeavesIsCountedOff) {
    CallsInFlight calls;
    const auto comeAndGo = [&calls] {
        for (int i = 0; i < 1000000; i++) EXPECT_TRUE(calls.LeaveOpen(calls.Enter()));
    };
    std::thread other(comeAndGo);
    comeAndGo();
    other.join();
    EXPECT_FALSE(calls.HasOpen());
    const unsigned int next = calls.Enter();
    EXPECT_TRUE(calls.HasOpen());
    EXPECT_TRUE(calls.LeaveOpen(next));
    EXPECT_FALSE(calls.HasOpen());
}

TEST(CallsInFlightTest, WhatWasGivenUpDoesNotCountInTheNextClose) {
    CallsInFlight calls;
    const unsigned int hanging = calls.Enter();
    calls.Close(false);
    const unsigned int next = calls.Enter();
    calls.Close(false);
    calls.LeaveClosed(hanging);
    EXPECT_FALSE(calls.ClosedAreGone()) << "it is the other one that is waited for";
    calls.LeaveClosed(next);
    EXPECT_TRUE(calls.ClosedAreGone());
}

TEST(CallsInFlightTest, WhatIsKeptCountsInTheNextClose) {
    CallsInFlight calls;
    const unsigned int first = calls.Enter();
    calls.Close(false);
    const unsigned int second = calls.Enter();
    calls.Close(true);
    calls.LeaveClosed(second);
    EXPECT_FALSE(calls.ClosedAreGone());
    calls.LeaveClosed(first);
    EXPECT_TRUE(calls.ClosedAreGone());
}

}  // namespace
