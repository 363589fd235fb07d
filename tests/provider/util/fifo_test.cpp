// The bounded queue.
#include <errno.h>

#include <atomic>
#include <memory>
#include <thread>

#include "list_fixture.h"

namespace plexortest {
namespace {

class FifoTest : public ProviderTest {
protected:
    void TearDown() override {
        CapturedSyslog::onLine(nullptr);
        while (GetItem(&fifo) != nullptr) {
        }
        ProviderTest::TearDown();
    }

    void put(unsigned int count) {
        for (unsigned int i = 0; i < count; i++) ASSERT_EQ(PutItem(&fifo, &items[i]), 0);
    }

    /// Whether somebody holds the queue's mutex.
    bool isLocked() {
        if (pthread_mutex_trylock(&fifo.Mutex) == EBUSY) return true;
        pthread_mutex_unlock(&fifo.Mutex);
        return false;
    }

    Fifo_t fifo = {PTHREAD_MUTEX_INITIALIZER, 20, {}};
    int items[64] = {};
};

TEST_F(FifoTest, TheProvidersQueueIsEmptyAndHoldsTwenty) {
    EXPECT_EQ(__FIFO.Size, 20u);
    EXPECT_EQ(__FIFO.List.Size, 0u);
    EXPECT_EQ(__FIFO.List.Head, nullptr);
    EXPECT_EQ(IsFifoEmpty(&__FIFO), 1);
    EXPECT_EQ(GetItem(&__FIFO), nullptr);
}

TEST_F(FifoTest, ItemsComeOutInTheOrderTheyWentIn) {
    put(3);
    EXPECT_EQ(GetItem(&fifo), &items[0]);
    EXPECT_EQ(PutItem(&fifo, &items[3]), 0);
    EXPECT_EQ(GetItem(&fifo), &items[1]);
    EXPECT_EQ(GetItem(&fifo), &items[2]);
    EXPECT_EQ(GetItem(&fifo), &items[3]);
    EXPECT_EQ(GetItem(&fifo), nullptr);
}

TEST_F(FifoTest, TwentyFirstItemIsRefused) {
    put(20);
    CapturedSyslog::clear();
    EXPECT_EQ(PutItem(&fifo, &items[20]), -6);
    EXPECT_EQ(fifo.List.Size, 20u);
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{{LOG_DEBUG, formatted("PutItem: Fifo(%p) is full, limit 20\n",
                                                          static_cast<void*>(&fifo))}}));
    for (int i = 0; i < 20; i++) EXPECT_EQ(GetItem(&fifo), &items[i]);
    EXPECT_EQ(GetItem(&fifo), nullptr);
}

TEST_F(FifoTest, ThereIsRoomAgainAfterAGet) {
    put(20);
    EXPECT_EQ(PutItem(&fifo, &items[20]), -6);
    EXPECT_EQ(GetItem(&fifo), &items[0]);
    EXPECT_EQ(PutItem(&fifo, &items[20]), 0);
    EXPECT_EQ(fifo.List.Size, 20u);
}

TEST_F(FifoTest, LimitIsTheQueuesOwn) {
    fifo.Size = 2;
    put(2);
    EXPECT_EQ(PutItem(&fifo, &items[2]), -6);
    EXPECT_TRUE(logged(
        LOG_DEBUG, formatted("PutItem: Fifo(%p) is full, limit 2\n", static_cast<void*>(&fifo))));
}

TEST_F(FifoTest, PutLogsLikeAnAppend) {
    put(1);
    const void* list = &fifo.List;
    const void* item = &items[0];
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  {LOG_DEBUG, formatted("Adding data %p to the list %p at the tail\n", item, list)},
                  {LOG_DEBUG, formatted("Data %p added to the list %p, size 1\n", item, list)}}));
}

TEST_F(FifoTest, NullItemIsAcceptedAndNotQueued) {
    EXPECT_EQ(PutItem(&fifo, nullptr), 0);
    EXPECT_EQ(IsFifoEmpty(&fifo), 1);
}

TEST_F(FifoTest, NullItemIsRefusedByAFullQueue) {
    put(20);
    EXPECT_EQ(PutItem(&fifo, nullptr), -6);
}

TEST_F(FifoTest, FailedAllocationQueuesNothing) {
    put(1);
    {
        const auto fault = FailAllocation::from(1);
        EXPECT_EQ(PutItem(&fifo, &items[1]), -2);
    }
    EXPECT_EQ(fifo.List.Size, 1u);
    EXPECT_FALSE(isLocked());
    EXPECT_EQ(PutItem(&fifo, &items[1]), 0);
    EXPECT_EQ(fifo.List.Size, 2u);
}

TEST_F(FifoTest, GetFromAnEmptyQueueGivesNull) {
    EXPECT_EQ(GetItem(&fifo), nullptr);
}

TEST_F(FifoTest, EmptyIsAskedOfTheList) {
    EXPECT_EQ(IsFifoEmpty(&fifo), 1);
    put(1);
    EXPECT_EQ(IsFifoEmpty(&fifo), 0);
    GetItem(&fifo);
    EXPECT_EQ(IsFifoEmpty(&fifo), 1);
}

TEST_F(FifoTest, EmptyWithoutAHeadWhateverTheTailSays) {
    put(1);
    ASSERT_EQ(RemoveEntryFromListByKey(&fifo.List, &items[0]), 0);
    EXPECT_EQ(IsFifoEmpty(&fifo), 1);
    EXPECT_EQ(PutItem(&fifo, &items[1]), 0);
    EXPECT_EQ(GetItem(&fifo), &items[1]);
}

TEST_F(FifoTest, MutexIsHeldForTheListOperationOnly) {
    int lines = 0;
    CapturedSyslog::onLine([&](const LogLine& line) {
        lines++;
        EXPECT_TRUE(isLocked()) << line.text;
    });
    put(20);
    EXPECT_FALSE(isLocked());
    PutItem(&fifo, &items[20]);
    EXPECT_FALSE(isLocked());
    GetItem(&fifo);
    EXPECT_FALSE(isLocked());
    IsFifoEmpty(&fifo);
    EXPECT_FALSE(isLocked());
    EXPECT_EQ(lines, 2 * 20 + 1 + 2);
}

TEST_F(FifoTest, EveryOperationWaitsForTheMutex) {
    const std::function<void()> operations[] = {
        [&] { PutItem(&fifo, &items[0]); }, [&] { GetItem(&fifo); }, [&] { IsFifoEmpty(&fifo); }};
    for (const auto& operation : operations) {
        std::atomic<bool> done = false;
        pthread_mutex_lock(&fifo.Mutex);
        std::thread thread([&] {
            operation();
            done = true;
        });
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        EXPECT_FALSE(done);
        pthread_mutex_unlock(&fifo.Mutex);
        thread.join();
        EXPECT_TRUE(done);
    }
}

TEST_F(FifoTest, EveryItemOfSeveralProducersComesOutOnce) {
    constexpr int kProducers = 3, kConsumers = 3, kEach = 2000;
    CapturedSyslog::discard(true);
    std::vector<int> taken(kProducers * kEach, 0);
    std::atomic<int> left = kProducers * kEach;
    std::atomic<bool> overfull = false;
    std::vector<std::thread> threads;
    for (int p = 0; p < kProducers; p++) {
        threads.emplace_back([&, p] {
            for (int i = 0; i < kEach; i++) {
                while (PutItem(&fifo, &taken[static_cast<std::size_t>(p * kEach + i)]) == -6) {
                    std::this_thread::yield();
                }
            }
        });
    }
    for (int c = 0; c < kConsumers; c++) {
        threads.emplace_back([&] {
            while (left > 0) {
                pthread_mutex_lock(&fifo.Mutex);
                if (fifo.List.Size > 20) overfull = true;
                pthread_mutex_unlock(&fifo.Mutex);
                if (auto* item = static_cast<int*>(GetItem(&fifo))) {
                    ++*item;
                    --left;
                }
            }
        });
    }
    for (auto& thread : threads) thread.join();
    EXPECT_EQ(taken, std::vector<int>(kProducers * kEach, 1));
    EXPECT_FALSE(overfull);
    EXPECT_EQ(IsFifoEmpty(&fifo), 1);
}

}  // namespace
}  // namespace plexortest
