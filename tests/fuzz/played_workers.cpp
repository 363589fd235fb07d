// Starting, joining and sleeping, as the workers that are played do it.
#include "played_workers.h"

#include <cerrno>
#include <ctime>
#include <utility>

#include "PlexorProviderCfg.h"
#include "PlexorProviderCfgItems.h"
#include "PlexorProviderUtilManager.h"
#include "played_queue.h"
#include "virtual_clock.h"

namespace fuzz {
namespace {

PlayedWorkers* played = nullptr;

/// As a worker runs an item between two waits.
void runInSpan(CMPIContext* ctx, Thread_Args_t* item) {
    ItemSpan span(ctx);
    item->Func(span.Context(), item);
    span.End();
}

}  // namespace

PlayedWorkers::PlayedWorkers(testbed::Broker& broker, unsigned possible)
    : broker_(broker), possible_(possible) {
    played = this;
}
PlayedWorkers::~PlayedWorkers() {
    played = nullptr;
}

PlayedWorkers* PlayedWorkers::current() {
    return played;
}

void PlayedWorkers::work() {
    if (started_ == 0 || std::exchange(atWork_, true)) return;
    plexortest::playQueue(broker_, runInSpan);
    atWork_ = false;
}

/// The context is ended at once: what is played runs in calls of the manager's.
bool PlayedWorkers::start(CMPIContext* prepared) {
    if (started_ == possible_) return false;
    started_++;
    EndUnusedContext(prepared);
    return true;
}

/// The one who sleeps is a worker at its walk, and the other one takes what is queued. Without a
/// span: a manager may give back in it what the whole thread has obtained.
void PlayedWorkers::sleep(unsigned seconds) {
    plexortest::VirtualClock::advance(static_cast<time_t>(seconds));
    if (atWork_ && started_ > 1) plexortest::playQueue(broker_);
}

}  // namespace fuzz

using fuzz::PlayedWorkers;

extern "C" {

int __real_pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*body)(void*),
                          void* argument);
int __wrap_pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*body)(void*),
                          void* argument) {
    PlayedWorkers* workers = PlayedWorkers::current();
    if (workers == nullptr || body != PlexorThread) {
        return __real_pthread_create(thread, attributes, body, argument);
    }
    WorkerStart start = {};
    Unpack(static_cast<Thread_Args_t*>(argument), start);
    if (!workers->start(start.context)) return EAGAIN;
    free(argument);
    return 0;
}

int __real_pthread_clockjoin_np(pthread_t thread, void** value, clockid_t clock,
                                const timespec* deadline);
int __wrap_pthread_clockjoin_np(pthread_t thread, void** value, clockid_t clock,
                                const timespec* deadline) {
    if (PlayedWorkers::current() != nullptr) return 0;
    return __real_pthread_clockjoin_np(thread, value, clock, deadline);
}

unsigned __real_sleep(unsigned seconds);
unsigned __wrap_sleep(unsigned seconds) {
    PlayedWorkers* workers = PlayedWorkers::current();
    if (workers == nullptr) return __real_sleep(seconds);
    workers->sleep(seconds);
    return 0;
}

}  // extern "C"
