// How long clients wait, with a vendor that answers at once and with one that takes ten seconds.
//
//   client-latency [--requests N] [--limit MS] [--library FILE] [--scenario FILE]
//
// With the slow vendor a refresh is under way all the time. The requests are made in portions; in
// between, the queries that are waiting get their answers, so that the requests meet the workers
// at all their queries. Exit status 1 when a request is held up.
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>

#include "bench_clients.h"
#include "bench_program.h"
#include "held_vendor.h"
#include "polling_interval.h"
#include "provider_session.h"
#include "scenario_parser.h"
#include "vendor_graphs.h"

namespace bench {
namespace {

using std::chrono::milliseconds;
using std::chrono::nanoseconds;
using std::chrono::seconds;
using Times = std::vector<nanoseconds>;

constexpr seconds kAnswerTime{10};
constexpr seconds kInventoryLimit{60};
constexpr seconds kQueryLimit{20};
constexpr std::size_t kPortions = 100;

double milli(nanoseconds time) {
    return std::chrono::duration<double, std::milli>(time).count();
}

/// Sorts `times`.
void print(const char* vendor, Times& times) {
    std::sort(times.begin(), times.end());
    const std::size_t rare = std::min(times.size() - 1, times.size() * 999 / 1000);
    std::printf("%-28s %8zu %11.3f %11.3f %11.3f\n", vendor, times.size(),
                milli(times[times.size() / 2]), milli(times[rare]), milli(times.back()));
    std::fflush(stdout);
}

Times measureIdle(testbed::InstanceClient client, std::size_t count) {
    MixedRequests requests(client);
    Times times;
    while (times.size() < count) times.push_back(requests.next());
    return times;
}

/// A drive and a volume that the provider does not know yet, so that a refresh builds them.
void addDevices(testbed::Repository& repository, const testbed::Scenario& scenario) {
    const testbed::Naming naming(scenario.vendor, scenario.host);
    for (const testbed::ControllerDescription& controller : scenario.controllers) {
        if (controller.drives.empty() || controller.volumes.empty()) continue;
        testbed::DriveDescription drive = controller.drives.front();
        drive.id = "new_drive";
        testbed::driveGraph(naming, controller, drive).place(repository);
        testbed::VolumeDescription volume = controller.volumes.front();
        volume.id = "new_volume";
        testbed::volumeGraph(naming, controller, volume).place(repository);
    }
}

/// Makes requests that nobody measures until a refresh asks the vendor something.
void provokeQuery(MixedRequests& requests, HeldVendor& vendor) {
    const auto deadline = std::chrono::steady_clock::now() + kQueryLimit;
    while (!vendor.waitForQuery(milliseconds(10))) {
        if (std::chrono::steady_clock::now() >= deadline)
            throw BenchError("no refresh asks the vendor");
        requests.next();
    }
}

/// Ends early after a request that took longer than `longest`: that is the finding.
Times measureHeld(testbed::InstanceClient client, HeldVendor& vendor, std::size_t count,
                  nanoseconds longest) {
    MixedRequests requests(client);
    Times times;
    int queries = 0;
    for (std::size_t portion = 1; portion <= kPortions; portion++) {
        provokeQuery(requests, vendor);
        while (times.size() < count * portion / kPortions) {
            times.push_back(requests.next());
            if (times.back() > longest) return times;
        }
        queries += vendor.letThrough();
    }
    std::printf("the requests met the workers at %d queries of 10 seconds\n", queries);
    return times;
}

/// True when no request was held up.
bool run(const testbed::Scenario& scenario, const std::string& library, std::size_t count,
         int limit) {
    std::optional<HeldVendor> vendor;  // outlives the session: its workers may be waiting in it
    testbed::ProviderSession session(scenario, library, "PlexorProvider");
    if (!session.waitForInventory(kInventoryLimit, "root/cimv2"))
        throw BenchError("the inventory does not arrive");
    session.broker().books().keepCalls(false);

    Times idle = measureIdle(session.client(), count);
    addDevices(session.repository(), scenario);
    vendor.emplace(session.broker(), kAnswerTime);
    const nanoseconds longest = *std::max_element(idle.begin(), idle.end()) + milliseconds(limit);
    Times held;
    try {
        held = measureHeld(session.client(), *vendor, count, longest);
    } catch (...) {
        vendor->release();
        throw;
    }
    vendor->release();

    std::printf("%-28s %8s %11s %11s %11s\n", "request times", "number", "median ms", "99.9 % ms",
                "slowest ms");
    print("vendor answers at once", idle);
    print("vendor takes 10 seconds", held);
    return held.back() <= longest;
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    std::size_t count = 10000;
    int limit = 50;
    std::string library = PROVIDER, scenarioFile = SCENARIO;
    CLI::App app("Measures how long clients wait for the provider");
    app.add_option("--requests", count, "Number of requests for each vendor")
        ->check(CLI::Range(100, 10000000));
    app.add_option("--limit", limit, "How much slower the slowest request may become, ms");
    app.add_option("--library", library, "The provider's library");
    app.add_option("--scenario", scenarioFile, "The vendor's array");
    return bench::runProgram(app, argc, argv, LOG_EMERG, [&] {
        const testbed::PollingInterval interval(1);
        if (!bench::run(testbed::readScenario(scenarioFile), library, count, limit))
            throw bench::BenchError("a request was held up for more than " + std::to_string(limit) +
                                    " ms");
    });
}
