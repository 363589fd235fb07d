// Factory calls that get no turn to initialise.
#include <thread>

#include "PlexorProviderIfcTurns.h"
#include "PlexorProviderUtilLife.h"
#include "meeting_fixture.h"

namespace {

using plexortest::HurriedWaits;

using FactoryTurnsTest = plexortest::EntryTest;

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
    EXPECT_EQ(HurriedWaits::otherWaits(),
              std::vector<HurriedWaits::Duration>{std::chrono::seconds(30)});
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
