// Schedules of the provider's threads, drawn from seeds: the same seed, the same order.
//
//   schedules-test [--schedules N] [--seed S] [--window NAME]
#include <malloc.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <string>
#include <string_view>

#include "error_lines.h"
#include "windows.h"

namespace schedules {
namespace {

// The one under way, for a crash, in which nothing can be allocated any more.
char schedule[64];

void tellSchedule(int signal) {
    constexpr std::string_view kCrash = "a crash in schedule ";
    [[maybe_unused]] ssize_t rest = write(STDERR_FILENO, kCrash.data(), kCrash.size());
    rest = write(STDERR_FILENO, schedule, strlen(schedule));
    rest = write(STDERR_FILENO, "\n", 1);
    std::signal(signal, SIG_DFL);
    std::raise(signal);
}

/// Nobody who was given up may still be inside.
bool somebodyWasGivenUp() {
    for (const std::string& line : takeErrorLines()) {
        if (line.find("is still busy") != std::string::npos) return true;
    }
    return false;
}

/// The provider's threads of this schedule are still inside, so the process ends with it.
[[noreturn]] void fail(const Finding& found) {
    std::cerr << "schedule " << schedule << ": " << found.what() << std::endl;
    std::_Exit(EXIT_FAILURE);
}

/// The number of switches.
std::size_t run(World& world, const Window& window, unsigned seed) {
    snprintf(schedule, sizeof schedule, "%s, seed %u", window.name, seed);
    Scheduler scheduler(seed);
    try {
        scheduler.run([&] {
            try {
                window.run(world, scheduler);
            } catch (const Finding& found) {
                fail(found);
            }
        });
        const bool givenUp = somebodyWasGivenUp();
        require(!givenUp || window.mayGiveUp, "a cleanup gave somebody up who went on");
        if (givenUp) world.acceptWhatIsLeft();
        world.requireNothingLeft();
    } catch (const Finding& found) {
        fail(found);
    }
    return scheduler.switches();
}

/// The number of schedules.
std::size_t runAll(World& world, const std::string& only, unsigned seed, unsigned count) {
    std::size_t switches = 0, schedules = 0;
    for (unsigned i = 0; i < count; i++) {
        for (const Window& window : windows()) {
            if (!only.empty() && only != window.name) continue;
            switches += run(world, window, seed + i);
            schedules++;
        }
    }
    std::cout << schedules << " schedules, " << switches << " switches: nothing found" << std::endl;
    return schedules;
}

}  // namespace
}  // namespace schedules

int main(int argc, char** argv) {
    unsigned seed = 1, count = getenv("PLEXOR_LONG") != nullptr ? 62'500 : 125;
    std::string window;
    CLI::App app("Runs the provider's threads in orders drawn from seeds");
    app.add_option("--schedules", count, "Number of schedules of each window");
    app.add_option("--seed", seed, "The first one's seed");
    app.add_option("--window", window, "One window only");
    CLI11_PARSE(app, argc, argv);

    for (const int signal : {SIGSEGV, SIGABRT, SIGBUS, SIGFPE}) {
        std::signal(signal, schedules::tellSchedule);
    }
    mallopt(M_PERTURB, 0xa5);  // what is used after its end must not look as if it still lived
    schedules::World world;
    return schedules::runAll(world, window, seed, count) > 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}
