// Who gets a turn to initialise, or to clean up, and for whom it waits.
#include <dlfcn.h>
#include <pthread.h>

#include <future>
#include <thread>

#include "PlexorProviderIfcTurns.h"
#include "PlexorProviderUtilLife.h"
#include "meeting_fixture.h"

namespace {

std::atomic<int> waits = 0;  // without a limit, on whatever condition
thread_local int waitsHere = 0;

}  // namespace

// In front of the C library's.
extern "C" int pthread_cond_wait(pthread_cond_t* cond, pthread_mutex_t* mutex) {
    static const auto real = reinterpret_cast<int (*)(pthread_cond_t*, pthread_mutex_t*)>(
        dlsym(RTLD_NEXT, "pthread_cond_wait"));
    ++waits;
    ++waitsHere;
    return real(cond, mutex);
}

namespace {

using plexortest::HurriedWaits;

using FactoryTurnsTest = plexortest::EntryTest;
using CleanupTurnsTest = plexortest::EntryTest;

/// What a busy machine has taken of it before it began is not waited for.
void expectAWaitOf(HurriedWaits::Duration limit) {
    const auto waited = HurriedWaits::otherWaits();
    ASSERT_FALSE(waited.empty());
    EXPECT_LE(waited.front(), limit);
    EXPECT_GT(waited.front(), limit / 2);
}

TEST_F(CleanupTurnsTest, ACleanupLeavesAfterThoseThatWaitForIt) {
    std::optional<CleanupTurn> turn(std::in_place, 60, nullptr);
    ASSERT_TRUE(turn->Taken());
    const int before = waits;
    std::thread second([] {
        const CleanupTurn joined(60, nullptr);
        EXPECT_FALSE(joined.Taken());
        EXPECT_FALSE(joined.Refused());
    });
    EXPECT_TRUE(plexortest::eventually([before] { return waits > before; }));
    waitsHere = 0;
    turn.reset();
    EXPECT_GT(waitsHere, 0) << "the manager may unmap the library as soon as this one returns";
    second.join();
}

TEST_F(CleanupTurnsTest, ARequestThatLeavesIsNoticedAtOnce) {
    std::optional<RequestInFlight> request(std::in_place);
    CleanupTurn turn(3600, nullptr);
    auto waiting = std::async(std::launch::async, [&turn] { return turn.AwaitRequests(); });
    EXPECT_EQ(waiting.wait_for(std::chrono::milliseconds(30)), std::future_status::timeout);
    request.reset();
    EXPECT_TRUE(waiting.get());
}

TEST_F(CleanupTurnsTest, AFactoryCallThatWasGivenUpIsNotWaitedForAgain) {
    const FactoryCall hanging;
    {
        CleanupTurn turn(0, nullptr);
        EXPECT_FALSE(turn.AwaitFactoryCalls());
    }
    CleanupTurn turn(0, nullptr);
    EXPECT_TRUE(turn.AwaitFactoryCalls());
}

TEST_F(CleanupTurnsTest, NewcomersGetASecondToLeave) {
    CleanupTurn turn(60, nullptr);
    const RequestInFlight newcomer;
    const HurriedWaits hurry(HurriedWaits::Conditions);
    EXPECT_FALSE(turn.AwaitNewcomers());
    expectAWaitOf(std::chrono::seconds(1));
}

TEST_F(CleanupTurnsTest, ARequestThatWasGivenUpIsNoNewcomer) {
    const RequestInFlight hanging;
    CleanupTurn turn(0, nullptr);
    EXPECT_FALSE(turn.AwaitRequests());
    const HurriedWaits watched(HurriedWaits::Conditions);
    EXPECT_TRUE(turn.AwaitNewcomers());
    EXPECT_TRUE(HurriedWaits::otherWaits().empty());
}

void cleanUp() {
    const CleanupTurn turn(1, nullptr);
    EXPECT_TRUE(turn.Taken());
}

TEST_F(FactoryTurnsTest, ACallThatACleanupHasOvertakenBeginsNoLife) {
    const unsigned int before = PresentLife();
    FactoryCall late;
    cleanUp();
    EXPECT_FALSE(late.TakeTurn());
    EXPECT_EQ(PresentLife(), before);
    FactoryCall next;
    EXPECT_TRUE(next.TakeTurn());
    EXPECT_EQ(PresentLife(), before + 1);
}

TEST_F(FactoryTurnsTest, ACallWaitsHalfAMinuteForAnother) {
    FactoryCall first;
    ASSERT_TRUE(first.TakeTurn());
    const unsigned int life = PresentLife();
    const HurriedWaits hurry(HurriedWaits::Conditions);
    std::thread([] {
        FactoryCall second;
        EXPECT_FALSE(second.TakeTurn());
    }).join();
    expectAWaitOf(std::chrono::seconds(30));
    EXPECT_EQ(PresentLife(), life);
}

TEST_F(FactoryTurnsTest, ACallTakesTheTurnThatAnotherHasGivenBack) {
    for (int i = 0; i < 3; i++) {
        const unsigned int before = PresentLife();
        FactoryCall call;
        EXPECT_TRUE(call.TakeTurn());
        EXPECT_EQ(PresentLife(), before + 1);
        EXPECT_EQ(OwnLife(), before + 1);
    }
    RequestStop();
    EXPECT_FALSE(LifeGuard().MemberOfEnded()) << "the thread is nobody's member any more";
}

}  // namespace
