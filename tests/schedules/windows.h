// The moments in which threads of the manager and of the provider meet.
#pragma once

#include <span>

#include "scheduler.h"
#include "world.h"

namespace schedules {

/// One life of the provider or more, from loading to the end of the last cleanup.
struct Window {
    const char* name;
    const char* summary;
    void (*run)(World& world, Scheduler& scheduler);
    bool mayGiveUp = false;  ///< a life may be left behind, with what it has in memory
};

std::span<const Window> windows();

}  // namespace schedules
