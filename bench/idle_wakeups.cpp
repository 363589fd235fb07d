// How often the provider's threads wake up while nobody asks anything.
//
//   idle-wakeups [--seconds N] [--json FILE] [--library FILE] [--scenario FILE]
#include <syslog.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <filesystem>
#include <fstream>
#include <thread>

#include "bench_clients.h"
#include "bench_program.h"
#include "measurements.h"
#include "provider_session.h"
#include "scenario_parser.h"

namespace bench {
namespace {

constexpr std::chrono::seconds kInventoryLimit{60};

/// How often all threads but this one have given up the processor of their own accord: as often as
/// they woke up, give or take one.
std::size_t wakeups() {
    std::size_t sum = 0;
    for (const auto& task : std::filesystem::directory_iterator("/proc/self/task")) {
        if (task.path().filename() == std::to_string(gettid())) continue;
        std::ifstream status(task.path() / "status");
        for (std::string word; status >> word;) {
            std::size_t count = 0;
            if (word == "voluntary_ctxt_switches:" && status >> count) sum += count;
        }
    }
    return sum;
}

void run(Measurements& found, const testbed::Scenario& scenario, const std::string& library,
         int seconds) {
    testbed::ProviderSession session(scenario, library, "PlexorProvider");
    if (!session.waitForInventory(kInventoryLimit, "root/cimv2"))
        throw BenchError("the inventory does not arrive");
    std::this_thread::sleep_for(std::chrono::seconds(2));  // the last requests' refreshes
    const std::size_t before = wakeups();
    std::this_thread::sleep_for(std::chrono::seconds(seconds));
    found.add("idle/wakeups", static_cast<double>(wakeups() - before) / seconds, "per second");
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    int seconds = 30;
    std::string library = PROVIDER, scenario = SCENARIO, json;
    CLI::App app("Counts how often an idle provider wakes up");
    app.add_option("--seconds", seconds, "How long to watch it")->check(CLI::Range(1, 3600));
    app.add_option("--json", json, "File for what was found");
    app.add_option("--library", library, "The provider's library");
    app.add_option("--scenario", scenario, "The vendor's array");
    return bench::runProgram(app, argc, argv, LOG_EMERG, [&] {
        bench::Measurements found;
        bench::run(found, testbed::readScenario(scenario), library, seconds);
        found.write(json);
    });
}
