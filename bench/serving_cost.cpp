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

#include <CLI/CLI.hpp>
#include <cstdlib>
#include <iostream>

#include "bare_provider.h"
#include "bench_clients.h"
#include "operations.h"
#include "shelf.h"

namespace bench {
namespace {

using benchmark::State;
using Paths = std::vector<testbed::ObjectPath>;

/// Asks for one drive after the other. The first answer is not looked at: what was measured before
/// may have left a heap that is given back just then.
void serve(State& state, const Operation& operation, testbed::InstanceClient client,
           const Paths& paths) {
    operation.ask(client, paths.front());
    std::size_t next = 0;
    for (auto _ : state) {
        const testbed::Response response = operation.ask(client, paths[next]);
        if (response.rc != CMPI_RC_OK) state.SkipWithError("the request fails");
        next = (next + 1) % paths.size();
    }
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
        const auto add = [&](const char* who, testbed::InstanceClient client) {
            benchmark::RegisterBenchmark((operation.name + ("/" + drives + "/") + who).c_str(),
                                         [&operation, client, &paths](State& state) {
                                             serve(state, operation, client, paths);
                                         });
        };
        add("provider", shelf.client());
        add("bare", bare.client());
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
    CLI11_PARSE(app, argc, argv);

    setlogmask(open ? LOG_UPTO(LOG_DEBUG) : LOG_UPTO(LOG_ERR));
    try {
        bench::run(drives, library);
        return EXIT_SUCCESS;
    } catch (const std::exception& error) {
        std::cerr << error.what() << std::endl;
        return EXIT_FAILURE;
    }
}
