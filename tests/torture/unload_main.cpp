// Loads the provider's library, uses it, unloads it, and looks whether it has gone; many times.
//
//   unload-test [--cycles N] [--library FILE] [--manager KIND] [--stuck]
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <cstdlib>
#include <iostream>

#include "fast_clock.h"
#include "load_cycle.h"
#include "manager_option.h"
#include "polling_interval.h"
#include "process_view.h"
#include "sanitizers.h"
#include "scenario_parser.h"

namespace torture {
namespace {

constexpr int kSpeed = 100;
constexpr int kWarmUpCycles = 100;
constexpr std::size_t kGrowthLimitKilobytes = 16 * 1024;
constexpr int kSkipped = 77;  // what ctest takes for a skipped test

#if defined(PLEXOR_ADDRESS_SANITIZER)
constexpr bool kMemoryIsWatched = false;  // freed memory is kept back
#else
constexpr bool kMemoryIsWatched = true;
#endif

void runCycles(LoadCycles& cycles, int count) {
    std::size_t settledMemory = 0;
    for (int i = 0; i < count; i++) {
        const Moment moment = kMoments[i % std::size(kMoments)];
        try {
            cycles.run(moment);
        } catch (const CycleError& error) {
            throw CycleError("cycle " + std::to_string(i + 1) + ", unloading " +
                             momentName(moment) + ": " + error.what());
        }
        if (i + 1 == kWarmUpCycles) settledMemory = residentKilobytes();
    }
    std::cout << count << " cycles, " << residentKilobytes() << " KB resident";
    if (count > kWarmUpCycles) std::cout << ", " << settledMemory << " KB after the warm-up";
    std::cout << std::endl;
    if (count <= kWarmUpCycles || !kMemoryIsWatched) return;
    if (residentKilobytes() > settledMemory + kGrowthLimitKilobytes)
        throw CycleError("memory grows from cycle to cycle");
}

}  // namespace
}  // namespace torture

int main(int argc, char** argv) {
    const bool longForm = getenv("PLEXOR_LONG") != nullptr;
    int count = longForm ? 1000 : 5;
    bool stuck = false;
    std::string library = PROVIDER, scenarioFile = SCENARIO, manager;
    CLI::App app("Loads and unloads the provider's library");
    app.add_option("--cycles", count, "Number of cycles");
    app.add_option("--library", library, "The provider's library");
    app.add_option("--scenario", scenarioFile, "The vendor's array");
    app.add_flag("--stuck", stuck, "Unload while a worker is stuck in the vendor's provider");
    testbed::addManagerOption(app, manager);
    CLI11_PARSE(app, argc, argv);

    if (stuck && !longForm) {
        std::cout << "takes half a minute; set PLEXOR_LONG to run it" << std::endl;
        return torture::kSkipped;
    }
    setlogmask(LOG_UPTO(LOG_EMERG));
    const testbed::PollingInterval interval(1);
    torture::FastClock::setSpeed(torture::kSpeed);
    try {
        testbed::Scenario scenario = testbed::readScenario(scenarioFile);
        scenario.manager = testbed::chosenManager(scenario, manager);
        torture::LoadCycles cycles(scenario, library);
        if (stuck)
            cycles.runStuck();
        else
            torture::runCycles(cycles, count);
    } catch (const std::exception& error) {
        std::cerr << error.what() << std::endl;
        return EXIT_FAILURE;
    }
    std::cout << "no failure" << std::endl;
    return EXIT_SUCCESS;
}
