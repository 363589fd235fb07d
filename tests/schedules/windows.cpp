// What happens in each of them, and what has to hold.
#include "windows.h"

#include <exception>
#include <functional>
#include <string>
#include <vector>

#include "PlexorProviderIfc.h"

namespace schedules {
namespace {

constexpr unsigned kInterval = 20;  // seconds after which a class is due, when nobody chose another

constexpr std::size_t kMostRequestsBefore = 4;

/// Threads of a window. What one of them finds is what the window found.
class Threads {
public:
    explicit Threads(Scheduler& scheduler) : scheduler_(scheduler) {}

    void add(const std::function<void()>& body) {
        numbers_.push_back(scheduler_.spawn([this, body] {
            try {
                body();
            } catch (const Finding&) {
                if (!finding_) finding_ = std::current_exception();
            }
        }));
    }
    void join() {
        for (const std::size_t number : numbers_) scheduler_.join(number);
        numbers_.clear();
        if (finding_) std::rethrow_exception(finding_);
    }

private:
    Scheduler& scheduler_;
    std::vector<std::size_t> numbers_;
    std::exception_ptr finding_;
};

void stop(World& world) {
    require(world.cleanUp(true) == CMPI_RC_OK, "a stopping manager's cleanup is refused");
}

/// Lets the inventory, or what is due, come to its end.
void settle(Scheduler& scheduler) {
    scheduler.sleep(10 * kSecond);
}

void requireAll(World& world) {
    for (const char* name : {World::kControllers, World::kVolumes, World::kDrives}) {
        require(world.names(name) == world.all(name), std::string(name) + " is not complete");
    }
}

void load(World& world, Scheduler& scheduler) {
    world.callFactory();
    settle(scheduler);
    requireAll(world);
}

void becomeDue(Scheduler& scheduler) {
    scheduler.sleep((kInterval + 1) * kSecond);
}

void inventoryAgainstRequests(World& world, Scheduler& scheduler) {
    Threads threads(scheduler);
    threads.add([&] { world.callFactory(); });
    for (const char* name : {World::kDrives, World::kVolumes}) {
        threads.add([&world, &scheduler, name] {
            for (int i = 0; i < 4; i++) {
                world.instances(name);
                scheduler.sleep(kSecond);
            }
        });
    }
    threads.join();
    settle(scheduler);
    requireAll(world);
    stop(world);
}

void refreshAgainstDelete(World& world, Scheduler& scheduler) {
    load(world, scheduler);
    becomeDue(scheduler);
    world.pullDrive();
    Threads threads(scheduler);
    for (const char* name : {World::kDrives, World::kVolumes}) {
        threads.add([&world, name] {
            const auto allDrives = world.all(World::kDrives).size();
            for (int i = 0; i < 40; i++) {
                world.instances(name);
                if (world.names(World::kDrives).size() < allDrives) return;
            }
        });
    }
    threads.join();
    settle(scheduler);
    require(world.names(World::kDrives).size() == world.all(World::kDrives).size() - 1,
            "the pulled drive is still there, or another one is gone");
    world.returnDrive();
    becomeDue(scheduler);
    world.names(World::kDrives);
    settle(scheduler);
    requireAll(world);
    stop(world);
}

void cleanupAgainstEverything(World& world, Scheduler& scheduler) {
    load(world, scheduler);
    becomeDue(scheduler);
    Threads threads(scheduler);
    threads.add([&] { world.instances(World::kDrives); });
    threads.add([&] { world.names(World::kVolumes); });
    threads.add([&] { world.callFactory(); });
    threads.add([&] { stop(world); });
    threads.add([&] { world.cleanUp(false); });
    threads.join();
    stop(world);
}

void factoryAgainstFactory(World& world, Scheduler& scheduler) {
    Threads threads(scheduler);
    for (int i = 0; i < 3; i++) threads.add([&] { world.callFactory(); });
    threads.join();
    settle(scheduler);
    requireAll(world);
    stop(world);
}

void cleanupAgainstCleanup(World& world, Scheduler& scheduler) {
    load(world, scheduler);
    becomeDue(scheduler);
    Threads threads(scheduler);
    threads.add([&] { world.instances(World::kDrives); });
    for (int i = 0; i < 3; i++) {
        threads.add([&] {
            stop(world);
            require(IsListEmpty(RaidControllerList), "a cleanup ends before the controllers do");
        });
    }
    threads.join();
}

/// A manager that is stopped while it starts. Afterwards there is all or nothing.
void startAgainstStop(World& world, Scheduler& scheduler) {
    Threads threads(scheduler);
    threads.add([&] { world.callFactory(); });
    threads.add([&] { world.names(World::kDrives); });
    threads.add([&] { stop(world); });
    threads.join();
    settle(scheduler);
    if (IsInitialized()) requireAll(world);
    stop(world);
}

void lostSignal(World& world, Scheduler& scheduler) {
    load(world, scheduler);
    for (int i = 0; i < 4; i++) {
        becomeDue(scheduler);
        Threads threads(scheduler);
        for (const char* name : World::kDevices) {
            threads.add([&world, name, before = scheduler.draw(kMostRequestsBefore)] {
                // So that it may come just as the workers find nothing more to do.
                for (std::size_t j = 0; j < before; j++) world.names(World::kControllers);
                world.names(name);
            });
        }
        threads.join();
        scheduler.sleep(5 * kSecond);
        require(IsFifoEmpty(&__FIFO) != 0, "work waits in the queue while the workers sleep");
    }
    stop(world);
}

/// A thread that is held up for longer than anybody waits: one life may be given up, not the next.
void lifeAfterAStall(World& world, Scheduler& scheduler) {
    Threads threads(scheduler);
    threads.add([&] {
        scheduler.stallOnce();
        world.callFactory();
    });
    threads.add([&] {
        stop(world);
        world.callFactory();
    });
    threads.join();
    scheduler.sleep(2 * Scheduler::kStall);
    if (IsInitialized()) requireAll(world);
    stop(world);
    scheduler.sleep(2 * Scheduler::kStall);
}

constexpr Window kWindows[] = {
    {"inventory", "the inventory against requests", inventoryAgainstRequests},
    {"refresh", "a refresh that deletes a drive against requests", refreshAgainstDelete},
    {"cleanup", "two cleanups against requests, a refresh and a factory call",
     cleanupAgainstEverything},
    {"cleanups", "three cleanups against each other", cleanupAgainstCleanup},
    {"start", "a cleanup against a factory call", startAgainstStop},
    {"factory", "three factory calls against each other", factoryAgainstFactory},
    {"signal", "work that is queued while the workers go to wait", lostSignal},
    {"stall", "a factory call that is held up for long", lifeAfterAStall, true},
};

}  // namespace

std::span<const Window> windows() {
    return kWindows;
}

}  // namespace schedules
