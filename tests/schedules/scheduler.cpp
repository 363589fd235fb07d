// Handing the turn from thread to thread.
#include "scheduler.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <iostream>
#include <memory>
#include <vector>

#include "real_functions.h"

namespace schedules {
namespace {

constexpr Nanoseconds kBegin = 1'700'000'000 * kSecond;
constexpr std::size_t kRarities[] = {2, 4, 12, 40};
/// A schedule that is longer does not come to an end.
constexpr std::size_t kMostPauses = 2'000'000;
/// About so many has a factory call that finds a controller.
constexpr std::size_t kPausesOfAFactoryCall = 260;

thread_local Scheduler* scheduler = nullptr;
thread_local void* ownThread = nullptr;

struct Start {
    Scheduler* scheduler;
    void* thread;
};

}  // namespace

Scheduler* Scheduler::current() {
    return scheduler;
}

Scheduler::Scheduler(unsigned seed) : random_(seed), now_(kBegin) {
    rarity_ = kRarities[draw(std::size(kRarities))];
}

Scheduler::~Scheduler() = default;

std::size_t Scheduler::draw(std::size_t limit) {
    return std::uniform_int_distribution<std::size_t>(0, limit - 1)(random_);
}

void Scheduler::stallOnce() {
    self().untilStall = 1 + draw(kPausesOfAFactoryCall);
}

Scheduler::Thread& Scheduler::self() {
    return *static_cast<Thread*>(ownThread);
}

Scheduler::Thread& Scheduler::add() {
    Thread& thread = threads_.emplace_back();
    thread.number = threads_.size() - 1;
    return thread;
}

void Scheduler::run(const std::function<void()>& first) {
    Thread& thread = add();
    thread.handle = pthread_self();
    scheduler = this;
    ownThread = &thread;
    first();
    scheduler = nullptr;
    end(thread);
    allEnded_.await();
    for (const Thread& other : threads_) {
        if (other.isJoinedHere) real::pthread_join(other.handle, nullptr);
    }
}

std::size_t Scheduler::spawn(std::function<void()> body) {
    Thread& thread = add();
    thread.body = std::move(body);
    auto* start = new Start{this, &thread};
    const int rc = real::pthread_create(&thread.handle, nullptr, &Scheduler::begin, start);
    if (rc != 0) giveUp("no thread can be made");
    thread.isJoinedHere = true;
    pause();
    return thread.number;
}

void* Scheduler::begin(void* argument) {
    const std::unique_ptr<Start> start(static_cast<Start*>(argument));
    Thread& thread = *static_cast<Thread*>(start->thread);
    // Also when the thread leaves by pthread_exit. What ends with the thread is nobody's any more.
    struct End {
        Scheduler& under;
        Thread& thread;
        ~End() {
            scheduler = nullptr;
            under.end(thread);
        }
    };
    thread.turn.await();
    scheduler = start->scheduler;
    ownThread = &thread;
    const End atTheEnd{*start->scheduler, thread};
    thread.body();
    return nullptr;
}

void Scheduler::end(Thread& thread) {
    thread.state = State::Ended;
    makeReady(State::Joins, &thread);
    Thread* next = choose();
    if (next == nullptr) {
        allEnded_.give();
    } else {
        switches_++;
        next->turn.give();
    }
}

void Scheduler::join(std::size_t number) {
    Thread& other = threads_[number];
    while (other.state != State::Ended) block(State::Joins, &other, std::nullopt);
}

void Scheduler::pause() {
    if (++pauses_ > kMostPauses) giveUp("the threads come to no end");
    Thread& own = self();
    if (own.untilStall != 0 && --own.untilStall == 0) return sleep(kStall);
    if (draw(rarity_) == 0) giveWay();
}

void Scheduler::giveWay() {
    Thread* next = choose();
    if (next == nullptr) giveUp("nobody can go on");
    passTo(*next);
}

void Scheduler::passTo(Thread& next) {
    Thread& own = self();
    if (&next == &own) return;
    switches_++;
    next.turn.give();
    own.turn.await();
}

Scheduler::Thread* Scheduler::choose() {
    std::vector<Thread*> ready;
    bool left = false;
    for (Thread& thread : threads_) {
        if (thread.state == State::Ready) ready.push_back(&thread);
        left = left || thread.state != State::Ended;
    }
    if (!ready.empty()) return ready[draw(ready.size())];
    if (!left) return nullptr;
    Thread* next = nextInTime();
    if (next == nullptr) giveUp("every thread waits for another one");
    return next;
}

Scheduler::Thread* Scheduler::nextInTime() {
    Thread* next = nullptr;
    for (Thread& thread : threads_) {
        if (thread.state == State::Ended || !thread.deadline) continue;
        if (next == nullptr || *thread.deadline < *next->deadline) next = &thread;
    }
    if (next == nullptr) return nullptr;
    now_ = std::max(now_, *next->deadline);
    next->timedOut = true;
    next->state = State::Ready;
    next->deadline.reset();
    return next;
}

void Scheduler::block(State state, const void* object, std::optional<Nanoseconds> deadline) {
    Thread& own = self();
    own.state = state;
    own.object = object;
    own.deadline = deadline;
    own.timedOut = false;
    giveWay();
}

void Scheduler::makeReady(State state, const void* object) {
    for (Thread& thread : threads_) {
        if (thread.state != state || thread.object != object) continue;
        thread.state = State::Ready;
        thread.deadline.reset();
    }
}

int Scheduler::take(pthread_mutex_t* mutex) {
    while (owners_.contains(mutex)) block(State::WantsLock, mutex, std::nullopt);
    owners_[mutex] = self().number;
    return real::pthread_mutex_lock(mutex);
}

int Scheduler::giveBack(pthread_mutex_t* mutex) {
    const int rc = real::pthread_mutex_unlock(mutex);
    owners_.erase(mutex);
    makeReady(State::WantsLock, mutex);
    return rc;
}

int Scheduler::lock(pthread_mutex_t* mutex) {
    pause();
    return take(mutex);
}

int Scheduler::unlock(pthread_mutex_t* mutex) {
    const int rc = giveBack(mutex);
    pause();
    return rc;
}

int Scheduler::wait(pthread_cond_t* condition, pthread_mutex_t* mutex,
                    std::optional<Nanoseconds> deadline) {
    giveBack(mutex);
    block(State::Waits, condition, deadline);
    const bool timedOut = self().timedOut;
    take(mutex);
    return timedOut ? ETIMEDOUT : 0;
}

int Scheduler::wake(pthread_cond_t* condition, bool all) {
    if (all) {
        makeReady(State::Waits, condition);
    } else {
        std::vector<Thread*> waiting;
        for (Thread& thread : threads_) {
            if (thread.state == State::Waits && thread.object == condition) {
                waiting.push_back(&thread);
            }
        }
        if (!waiting.empty()) {
            Thread& chosen = *waiting[draw(waiting.size())];
            chosen.state = State::Ready;
            chosen.deadline.reset();
        }
    }
    pause();
    return 0;
}

void Scheduler::sleep(Nanoseconds time) {
    block(State::Sleeps, nullptr, now_ + time);
}

int Scheduler::create(pthread_t* handle, const pthread_attr_t* attributes, void* (*body)(void*),
                      void* argument) {
    Thread& thread = add();
    thread.body = [body, argument] { body(argument); };
    auto* start = new Start{this, &thread};
    const int rc = real::pthread_create(&thread.handle, attributes, &Scheduler::begin, start);
    if (rc != 0) giveUp("no thread can be made");
    *handle = thread.handle;
    pause();
    return rc;
}

int Scheduler::join(pthread_t handle, void** result, std::optional<Nanoseconds> deadline) {
    for (Thread& thread : threads_) {
        if (thread.number == 0 || !pthread_equal(thread.handle, handle)) continue;
        if (thread.state != State::Ended) block(State::Joins, &thread, deadline);
        if (thread.state != State::Ended) return ETIMEDOUT;
        const int rc = real::pthread_join(handle, result);
        thread.handle = {};
        return rc;
    }
    return ESRCH;
}

void Scheduler::giveUp(const char* what) const {
    static constexpr const char* kStates[] = {"ready",  "wants a lock", "waits",
                                              "sleeps", "joins",        "ended"};
    std::cerr << what << ":";
    for (const Thread& thread : threads_) {
        std::cerr << " " << thread.number << " " << kStates[static_cast<int>(thread.state)] << ";";
    }
    std::cerr << std::endl;
    std::abort();
}

}  // namespace schedules
