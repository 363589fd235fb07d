// The provider's workers without threads of their own, for lives that come by the thousand.
//
// The linker puts functions in front of those with which the provider starts, joins and waits for
// threads (played_workers.cpp). While a PlayedWorkers lives, the calling thread does their work:
// when it is told to, and whenever the provider sleeps.
#pragma once

#include "broker.h"

namespace fuzz {

/// One at a time, for a provider that is used by the calling thread only.
class PlayedWorkers {
public:
    /// Of the threads that the provider starts, `possible` are there (0 to 2); for the others there
    /// is no room. With one, the walk over devices does the other's work itself.
    PlayedWorkers(testbed::Broker& broker, unsigned possible);
    ~PlayedWorkers();
    PlayedWorkers(const PlayedWorkers&) = delete;
    PlayedWorkers& operator=(const PlayedWorkers&) = delete;

    /// Works until nothing is queued; nothing happens without a worker.
    void work();

    // What the functions do that the linker puts in front.
    bool start(CMPIContext* prepared);
    void sleep(unsigned seconds);
    /// NULL outside of such lives.
    static PlayedWorkers* current();

private:
    testbed::Broker& broker_;
    unsigned possible_;
    unsigned started_ = 0;
    bool atWork_ = false;
};

}  // namespace fuzz
