// How long one refresh of the drives takes, for whatever order the vendor tells them in. Names of
// the measurements: refresh/N/unchanged, refresh/N/reversed, and so on.
//
//   refresh-cost [--drives N] [--library FILE] [--benchmark_...]
//
// On one thread, the processor's time of it: what the vendor in the test bed takes is part of it.
// The other options are google-benchmark's.
#include <benchmark/benchmark.h>
#include <syslog.h>

#include <CLI/CLI.hpp>

#include "bench_clients.h"
#include "bench_program.h"
#include "shelf.h"

namespace bench {
namespace {

/// Every refresh finds other drives when they are to be new, and the same ones otherwise.
void refresh(benchmark::State& state, Shelf& shelf, Results results) {
    shelf.arrange(results);
    shelf.refresh();
    for (auto _ : state) {
        if (results == Results::AllNew) {
            state.PauseTiming();
            shelf.arrange(results);
            state.ResumeTiming();
        }
        shelf.refresh();
    }
}

void run(int drives, const std::string& library) {
    Shelf shelf(drives, library);
    for (const auto& [name, results] : kAllResults)
        benchmark::RegisterBenchmark(
            ("refresh/" + std::to_string(drives) + "/" + name).c_str(),
            [&shelf, wanted = results](benchmark::State& state) { refresh(state, shelf, wanted); })
            ->Unit(benchmark::kMillisecond);
    benchmark::RegisterBenchmark(("refresh/" + std::to_string(drives) + "/members").c_str(),
                                 [&shelf](benchmark::State& state) {
                                     for (auto _ : state) shelf.lookUpMembers();
                                 })
        ->Unit(benchmark::kMillisecond);
    benchmark::RunSpecifiedBenchmarks();
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    // Its own options, which begin with "--benchmark_", are taken out of the list.
    benchmark::Initialize(&argc, argv);
    int drives = 24;
    std::string library = PROVIDER;
    CLI::App app("Measures a refresh of the drives");
    app.add_option("--drives", drives, "Number of drives")->check(CLI::Range(1, 100000));
    app.add_option("--library", library, "The provider's library");
    return bench::runProgram(app, argc, argv, LOG_ERR, [&] { bench::run(drives, library); });
}
