// A scoped lock that could not take its mutex, and one that has given it back.
#include <errno.h>
#include <gtest/gtest.h>

#include "PlexorProviderLock.h"

namespace {

TEST(MutexGuardTest, OneThatCouldNotTakeItsMutexSaysSoAndGivesNothingBack) {
    pthread_mutexattr_t checking;
    pthread_mutexattr_init(&checking);
    pthread_mutexattr_settype(&checking, PTHREAD_MUTEX_ERRORCHECK);
    pthread_mutex_t mutex;
    pthread_mutex_init(&mutex, &checking);
    {
        const MutexGuard first(mutex);
        EXPECT_TRUE(first.Locked());
        {
            const MutexGuard second(mutex);
            EXPECT_FALSE(second.Locked());
        }
        EXPECT_EQ(pthread_mutex_lock(&mutex), EDEADLK) << "the first still has it";
    }
    EXPECT_EQ(pthread_mutex_unlock(&mutex), EPERM) << "nobody has it";
    pthread_mutex_destroy(&mutex);
    pthread_mutexattr_destroy(&checking);
}

TEST(MutexGuardTest, OneThatHasGivenItsMutexBackLeavesItToTheNext) {
    pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
    {
        MutexGuard first(mutex);
        first.Unlock();
        EXPECT_FALSE(first.Locked());
        EXPECT_EQ(pthread_mutex_lock(&mutex), 0);
        first.Unlock();
        EXPECT_EQ(pthread_mutex_trylock(&mutex), EBUSY);
    }
    EXPECT_EQ(pthread_mutex_trylock(&mutex), EBUSY) << "it is the next one's";
    pthread_mutex_unlock(&mutex);
    pthread_mutex_destroy(&mutex);
}

}  // namespace
