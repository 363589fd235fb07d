// How long many clients wait: with a vendor that answers at once, in ten seconds, and never.
//
//   crowd-latency [--clients N] [--rounds N] [--seconds N] [--pause MS] [--json FILE]
//
// Each round has a window for each vendor, so that a change of the machine meets all alike, and
// lets the refreshes that have waited come to an end in between; each client pauses between two of
// its requests. With the slow vendors a refresh is under way all the time. Names of the
// measurements: crowd/at-once/p99, and so on; the ratios are to the same round's window with the
// vendor that answers at once, and the one in the middle of all rounds'.
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <map>
#include <thread>

#include "bench_clients.h"
#include "bench_program.h"
#include "held_vendor.h"
#include "measurements.h"
#include "polling_interval.h"
#include "provider_session.h"
#include "scenario_parser.h"

namespace bench {
namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using Clock = std::chrono::steady_clock;

constexpr seconds kInventoryLimit{60};
constexpr seconds kGrace{4};  // what the provider lets pass before its first refresh, and more
constexpr seconds kQueryLimit{20};
constexpr seconds kSettle{2};  // for the refreshes that have waited, before the next window

struct Mood {
    const char* name;
    milliseconds answerTime;
};
constexpr Mood kMoods[] = {
    {"at-once", milliseconds(0)},
    {"ten-seconds", seconds(10)},
    {"never", std::chrono::hours(1)},
};

struct Crowd {
    int clients = 64;
    int rounds = 9;
    int seconds = 4;
    int pause = 50;
};

double middle(std::vector<double> values, double part = 0.5) {
    std::sort(values.begin(), values.end());
    const auto last = static_cast<double>(values.size() - 1);
    return values[static_cast<std::size_t>(last * part)];
}

/// The times of all requests in one window, milliseconds.
std::vector<double> window(testbed::InstanceClient client, const Crowd& crowd) {
    const auto end = Clock::now() + seconds(crowd.seconds);
    std::vector<std::vector<double>> times(static_cast<std::size_t>(crowd.clients));
    std::vector<std::thread> threads;
    for (auto& own : times)
        threads.emplace_back([&own, &crowd, client, end] {
            MixedRequests requests(client);
            while (Clock::now() < end) {
                own.push_back(std::chrono::duration<double, std::milli>(requests.next()).count());
                std::this_thread::sleep_for(milliseconds(crowd.pause));
            }
        });
    for (std::thread& thread : threads) thread.join();
    std::vector<double> all;
    for (const auto& own : times) all.insert(all.end(), own.begin(), own.end());
    return all;
}

/// Makes requests until a refresh waits for the vendor.
void provokeQuery(testbed::InstanceClient client, HeldVendor& vendor) {
    MixedRequests requests(client);
    const auto limit = Clock::now() + kQueryLimit;
    while (!vendor.waitForQuery(milliseconds(10))) {
        if (Clock::now() > limit) throw BenchError("no refresh asks the vendor");
        requests.next();
    }
}

/// The times of a window with a vendor of that mood.
std::vector<double> windowOf(testbed::ProviderSession& session, HeldVendor& vendor,
                             const Mood& mood, const Crowd& crowd) {
    vendor.answerIn(mood.answerTime);
    if (mood.answerTime.count() != 0) provokeQuery(session.client(), vendor);
    std::vector<double> times = window(session.client(), crowd);
    vendor.release();
    std::this_thread::sleep_for(kSettle);
    return times;
}

/// Windows in turn, another one first in each round.
void measure(Measurements& found, testbed::ProviderSession& session, HeldVendor& vendor,
             const Crowd& crowd) {
    std::map<std::string, std::vector<double>> medians, rare, ratios;
    std::size_t requests = 0;
    for (int round = 0; round < crowd.rounds; round++) {
        for (std::size_t i = 0; i < std::size(kMoods); i++) {
            const Mood& mood = kMoods[(static_cast<std::size_t>(round) + i) % std::size(kMoods)];
            const std::vector<double> times = windowOf(session, vendor, mood, crowd);
            requests += times.size();
            medians[mood.name].push_back(middle(times));
            rare[mood.name].push_back(middle(times, 0.99));
        }
        for (const Mood& mood : kMoods)
            ratios[mood.name].push_back(rare[mood.name].back() / rare["at-once"].back());
    }
    for (const Mood& mood : kMoods) {
        const std::string name = std::string("crowd/") + mood.name;
        found.add(name + "/median", middle(medians[mood.name]), "ms");
        found.add(name + "/p99", middle(rare[mood.name]), "ms");
        found.add(name + "/p99-ratio", middle(ratios[mood.name]), "");
    }
    found.add("crowd/requests", static_cast<double>(requests), "requests");
}

void run(Measurements& found, const testbed::Scenario& scenario, const std::string& library,
         const Crowd& crowd) {
    std::optional<HeldVendor> vendor;  // outlives the session: its workers may be waiting in it
    testbed::ProviderSession session(scenario, library, "PlexorProvider");
    if (!session.waitForInventory(kInventoryLimit, "root/cimv2"))
        throw BenchError("the inventory does not arrive");
    session.broker().books().keepCalls(false);
    std::this_thread::sleep_for(kGrace);
    vendor.emplace(session.broker(), milliseconds(0));
    try {
        measure(found, session, *vendor, crowd);
    } catch (...) {
        vendor->release();
        throw;
    }
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    bench::Crowd crowd;
    std::string library = PROVIDER, scenario = SCENARIO, json;
    CLI::App app("Measures how long many clients wait for the provider");
    app.add_option("--clients", crowd.clients, "Number of clients")->check(CLI::Range(1, 1000));
    app.add_option("--rounds", crowd.rounds, "Number of windows for each vendor")
        ->check(CLI::Range(1, 1000));
    app.add_option("--seconds", crowd.seconds, "Length of a window")->check(CLI::Range(1, 3600));
    app.add_option("--pause", crowd.pause, "Between two requests of a client, ms")
        ->check(CLI::Range(0, 60000));
    app.add_option("--json", json, "File for what was found");
    app.add_option("--library", library, "The provider's library");
    app.add_option("--scenario", scenario, "The vendor's array");
    return bench::runProgram(app, argc, argv, LOG_EMERG, [&] {
        const testbed::PollingInterval interval(1);
        bench::Measurements found;
        bench::run(found, testbed::readScenario(scenario), library, crowd);
        found.write(json);
    });
}
