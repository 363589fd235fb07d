// Decides which of the threads under test runs, one at a time, and what time it is; from a seed.
//
// Threads change hands where they take or give back a lock, wait, signal, sleep, log, begin or end
// (interposed.cpp); a seed gives the same order again. Time stands still while a thread can run.
#pragma once

#include <pthread.h>
#include <semaphore.h>

#include <cstdint>
#include <ctime>
#include <deque>
#include <functional>
#include <map>
#include <optional>
#include <random>
#include <vector>

namespace schedules {

using Nanoseconds = std::int64_t;

constexpr Nanoseconds kSecond = 1'000'000'000;

/// What a thread waits for; the standard library's semaphore calls functions that are interposed.
class Turn {
public:
    Turn() { sem_init(&semaphore_, 0, 0); }
    ~Turn() { sem_destroy(&semaphore_); }
    Turn(const Turn&) = delete;
    Turn& operator=(const Turn&) = delete;
    void give() { sem_post(&semaphore_); }
    void await() {
        while (sem_wait(&semaphore_) != 0) {
        }
    }

private:
    sem_t semaphore_;
};

/// Only the thread that runs touches it, but for its own way in and out.
class Scheduler {
public:
    /// The one that the calling thread is under; NULL for a thread of nobody's.
    static Scheduler* current();

    explicit Scheduler(unsigned seed);
    ~Scheduler();
    Scheduler(const Scheduler&) = delete;
    Scheduler& operator=(const Scheduler&) = delete;

    /// Runs `first` on the calling thread, and then whatever it started, to the end. Ends the
    /// process with a message, also on standard error, when they come to no end: nobody can be made
    /// to leave the locks that it waits for.
    void run(const std::function<void()>& first);

    /// Another thread under this scheduler. `number` names it.
    std::size_t spawn(std::function<void()> body);
    /// Waits until it has ended.
    void join(std::size_t number);

    // What the interposed functions do, with their results.
    void pause();
    int lock(pthread_mutex_t* mutex);
    int unlock(pthread_mutex_t* mutex);
    /// No deadline: for ever.
    int wait(pthread_cond_t* condition, pthread_mutex_t* mutex,
             std::optional<Nanoseconds> deadline);
    int wake(pthread_cond_t* condition, bool all);
    void sleep(Nanoseconds time);
    int create(pthread_t* handle, const pthread_attr_t* attributes, void* (*body)(void*),
               void* argument);
    int join(pthread_t handle, void** result, std::optional<Nanoseconds> deadline);

    Nanoseconds now() const { return now_; }
    std::size_t switches() const { return switches_; }
    std::mt19937& random() { return random_; }
    /// Draws a number below `limit`.
    std::size_t draw(std::size_t limit);
    /// The calling thread will be held up for kStall, at a moment that the seed chooses.
    void stallOnce();
    static constexpr Nanoseconds kStall = 60 * kSecond;

private:
    enum class State { Ready, WantsLock, Waits, Sleeps, Joins, Ended };
    struct Thread {
        std::size_t number = 0;
        State state = State::Ready;
        const void* object = nullptr;         ///< the mutex, condition or thread waited for
        std::optional<Nanoseconds> deadline;  ///< of a wait
        bool timedOut = false;
        std::size_t untilStall =
            0;  ///< the pause that takes long is that many pauses away; 0: none
        pthread_t handle = {};
        bool isJoinedHere = false;  ///< by run(), once all have ended
        std::function<void()> body;
        Turn turn;
    };

    Thread& self();
    Thread& add();
    /// Lets another one run until this one's turn comes again.
    void giveWay();
    /// The next one to run: one of those that can, else the first whose time comes. NULL: all
    /// ended.
    Thread* choose();
    Thread* nextInTime();
    void passTo(Thread& next);
    int take(pthread_mutex_t* mutex);
    int giveBack(pthread_mutex_t* mutex);
    void block(State state, const void* object, std::optional<Nanoseconds> deadline);
    void makeReady(State state, const void* object);
    /// Gives the thread's turn away for ever.
    void end(Thread& thread);
    [[noreturn]] void giveUp(const char* what) const;
    static void* begin(void* thread);

    std::deque<Thread> threads_;  // stay where they are
    std::map<const pthread_mutex_t*, std::size_t> owners_;
    std::mt19937 random_;
    std::size_t rarity_;  // a thread is made to give way once in so many times
    Nanoseconds now_;
    std::size_t switches_ = 0;
    std::size_t pauses_ = 0;
    Turn allEnded_;
};

}  // namespace schedules
