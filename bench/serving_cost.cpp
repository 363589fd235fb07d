// What a request for drives costs the provider, beside a provider that answers with constants
// through the same broker; and a line that the log's mask holds back. One client, no refresh beside
// it.
//
//   serving-cost [--drives N] [--open] [--library FILE] [--benchmark_...]
//
// With --open all lines of the log pass, in serving-cost-open, whose log takes them. The other
// options are google-benchmark's; scripts/costs has it make the repetitions of all measurements in
// turn, drawn at random, so that a change of the machine meets all alike.
#include <benchmark/benchmark.h>
#include <syslog.h>
#include <time.h>

#include <CLI/CLI.hpp>

#include "bare_provider.h"
#include "bench_clients.h"
#include "bench_program.h"
#include "operations.h"
#include "shelf.h"

namespace bench {
namespace {

using benchmark::State;
using Paths = std::vector<testbed::ObjectPath>;

using Client = testbed::InstanceClient;

/// The processor's time that the calling thread has had, nanoseconds.
double ownTime() {
    timespec now = {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) * 1e9 + static_cast<double>(now.tv_nsec);
}

double timeOf(State& state, const Operation& operation, Client client,
              const testbed::ObjectPath& path) {
    const double begin = ownTime();
    const testbed::Response response = operation.ask(client, path);
    const double time = ownTime() - begin;
    if (response.rc != CMPI_RC_OK) state.SkipWithError("the request fails");
    return time;
}

/// Asks both for one drive after the other, in turn, so that a machine that becomes slower does so
/// for both. Each is first every other time: the second one finds what the first has left in the
/// caches. The first answers are not looked at: what was measured before may have left a heap that
/// is given back just then.
void compare(State& state, const Operation& operation, Client provider, Client bare,
             const Paths& paths) {
    for (Client client : {provider, bare}) operation.ask(client, paths.front());
    std::size_t next = 0;
    double providers = 0, bares = 0;
    bool isProvidersTurn = false;
    for (auto _ : state) {
        const auto ask = [&](Client client) {
            return timeOf(state, operation, client, paths[next]);
        };
        isProvidersTurn = !isProvidersTurn;
        if (isProvidersTurn) providers += ask(provider);
        bares += ask(bare);
        if (!isProvidersTurn) providers += ask(provider);
        next = (next + 1) % paths.size();
    }
    state.counters["ratio"] = providers / bares;
    state.counters["provider"] = providers / static_cast<double>(state.iterations());
    state.counters["bare"] = bares / static_cast<double>(state.iterations());
}

void requireSameAnswers(Shelf& shelf, BareProvider& bare) {
    const auto ask = [](testbed::InstanceClient client) {
        return client.enumerateInstances(kDriveClass).instances;
    };
    if (ask(shelf.client()) != ask(bare.client()))
        throw BenchError("the bare provider answers something else");
}

void addRequests(Shelf& shelf, BareProvider& bare, const Paths& paths) {
    const std::string drives = std::to_string(paths.size());
    for (const Operation& operation : kOperations) {
        benchmark::RegisterBenchmark(
            (operation.name + ("/" + drives)).c_str(),
            [&operation, provider = shelf.client(), client = bare.client(), &paths](State& state) {
                compare(state, operation, provider, client, paths);
            });
    }
}

/// What a line costs that nobody wants to see: the C library's call, as the provider makes it.
void maskedLine(State& state) {
    const char* caller = "FindDiskByDeviceID";
    for (auto _ : state) {
        benchmark::DoNotOptimize(caller);
        syslog(LOG_DEBUG, "%s: checking %s %p (%s: %s)\n", caller, "disk",
               static_cast<void*>(&state), "ID", "32_0");
    }
}

void run(int drives, const std::string& library) {
    Shelf shelf(drives, library);
    const auto instances = shelf.client().enumerateInstances(kDriveClass).instances;
    BareProvider bare(shelf.broker(), instances);
    requireSameAnswers(shelf, bare);
    Paths paths;
    for (const testbed::Instance& instance : instances) paths.push_back(instance.path);
    addRequests(shelf, bare, paths);
    benchmark::RegisterBenchmark("masked-line", maskedLine);
    benchmark::RunSpecifiedBenchmarks();
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    // Its own options, which begin with "--benchmark_", are taken out of the list.
    benchmark::Initialize(&argc, argv);
    int drives = 24;
    bool open = false;
    std::string library = PROVIDER;
    CLI::App app("Measures what requests cost the provider, beside constants");
    app.add_option("--drives", drives, "Number of drives")->check(CLI::Range(1, 100000));
    app.add_flag("--open", open, "Let all lines of the log through");
    app.add_option("--library", library, "The provider's library");
    return bench::runProgram(app, argc, argv, LOG_ERR, [&] {
        if (open) setlogmask(LOG_UPTO(LOG_DEBUG));
        bench::run(drives, library);
    });
}
