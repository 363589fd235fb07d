// That calls of the provider are seen while a test watches them.
#include "watched_calls.h"

#include "list_fixture.h"

namespace plexortest {
namespace {

using WatchedCalls = ListTest;

TEST_F(WatchedCalls, FreesOfTheProviderAreSeenWhileWatched) {
    std::vector<const void*> freed;
    char* const block = ownedCopy("block");
    {
        const FreeWatch watch([&](const void* freedBlock) { freed.push_back(freedBlock); });
        FreeBattery(nullptr);
        fill({block});
        FreeList(&list, nullptr);
    }
    FreeList(&list, nullptr);
    ASSERT_EQ(freed.size(), 2u) << "the list's entry and the block";
    EXPECT_EQ(freed[1], block);
}

TEST_F(WatchedCalls, EndsOfHoldsOfOneMutexAreSeen) {
    RaidController_t* const ctrl = attach(newController("C0"));
    int ends = 0;
    const HoldWatch watch(ctrl->CtrlMutex, [&] {
        ends++;
        EXPECT_NE(pthread_mutex_trylock(&ctrl->CtrlMutex), 0) << "still held";
    });
    EXPECT_EQ(DeletePort(ctrl, ctrl), -3);
    EXPECT_EQ(ends, 1);
    pthread_mutex_lock(&ctrl->PortCfgMutex);
    pthread_mutex_unlock(&ctrl->PortCfgMutex);
    EXPECT_EQ(ends, 1) << "another mutex";
}

TEST_F(WatchedCalls, NeedUpdateDeclinesWhileItIsToldTo) {
    {
        const UpdatesDeclined declined;
        EXPECT_EQ(NeedUpdate(17, 1), 0);
        EXPECT_EQ(UpdatesDeclined::questions(), (std::vector<UpdatesDeclined::Question>{{17, 1}}));
    }
    EXPECT_EQ(NeedUpdate(17, 1), 1);
}

}  // namespace
}  // namespace plexortest
