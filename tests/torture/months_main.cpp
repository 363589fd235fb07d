// Months in somebody else's process: refreshes of an array, one after the other, the results in
// another order each time, and what the process then has in memory.
//
//   months-test [--refreshes N] [--manager KIND] [--library FILE] [--scenario FILE]
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <atomic>
#include <chrono>
#include <iostream>
#include <stdexcept>
#include <thread>

#include "idle_workers.h"
#include "manager_option.h"
#include "process_view.h"
#include "provider_session.h"
#include "scenario_parser.h"

namespace torture {
namespace {

constexpr std::time_t kInterval = 20;
constexpr std::size_t kGrowthLimitKilobytes = 1024;
constexpr int kWarmUp = 100;

std::atomic<std::time_t> now = 1'700'000'000;

void refresh(testbed::ProviderSession& session, const IdleWorkers& workers) {
    now += kInterval;
    session.client().enumerateInstanceNames("Tovexa_PlexorStorageExtent");
    while (!workers.areIdle()) std::this_thread::sleep_for(std::chrono::microseconds(200));
}

/// Prints what has become of the memory; whether it is flat.
bool run(int refreshes, const std::string& file, const std::string& library,
         const std::string& manager) {
    testbed::Scenario scenario = testbed::readScenario(file);
    scenario.manager = testbed::chosenManager(scenario, manager);
    testbed::ProviderSession session(scenario, library, "PlexorProvider");
    testbed::Books& books = session.broker().books();
    books.keepCalls(false);
    if (!session.waitForInventory(std::chrono::minutes(5), "root/cimv2"))
        throw std::runtime_error("the inventory does not arrive");
    now += 10;
    const IdleWorkers workers(library);
    std::size_t settled = 0;
    for (int i = 1; i <= refreshes; i++) {
        refresh(session, workers);
        if (i == std::min(kWarmUp, refreshes)) settled = residentKilobytes();
    }
    const std::size_t resident = residentKilobytes();
    const std::size_t drives =
        session.client().enumerateInstanceNames("Tovexa_PlexorStorageExtent").paths.size();
    std::cout << refreshes << " refreshes of " << drives << " drives, manager " << manager << ": "
              << settled << " KiB resident after the first " << kWarmUp << ", " << resident
              << " at the end, " << books.live() - books.liveClones() << " objects and "
              << books.liveClones() << " clones kept" << std::endl;
    return resident <= settled + kGrowthLimitKilobytes;
}

}  // namespace
}  // namespace torture

// In front of the C library's for the provider: its days pass as this program says.
extern "C" std::time_t time(std::time_t* out) noexcept {
    const std::time_t value = torture::now;
    if (out != nullptr) *out = value;
    return value;
}

extern "C" unsigned int sleep(unsigned int) {
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
    return 0;
}

int main(int argc, char** argv) {
    int refreshes = getenv("PLEXOR_LONG") != nullptr ? 100000 : 120;
    std::string library = PROVIDER, manager = "host,random-order", scenario = SCENARIO;
    CLI::App app("Refreshes an array for months");
    app.add_option("--refreshes", refreshes, "Number of refreshes")->check(CLI::Range(1, 10000000));
    app.add_option("--library", library, "The provider's library");
    app.add_option("--scenario", scenario, "The array");
    testbed::addManagerOption(app, manager);
    CLI11_PARSE(app, argc, argv);

    setlogmask(LOG_UPTO(LOG_EMERG));
    try {
        if (torture::run(refreshes, scenario, library, manager)) return EXIT_SUCCESS;
        std::cerr << "memory grows" << std::endl;
    } catch (const std::exception& error) {
        std::cerr << error.what() << std::endl;
    }
    return EXIT_FAILURE;
}
