// What the provider does for a request and for a refresh of its drives, in numbers that do not
// depend on the machine: calls of the broker and of its objects, lines of the log with all of them
// masked, allocations; the bytes of the heap that a record takes, and those that refreshes leave
// behind.
//
//   counts [--drives N...] [--json FILE] [--library FILE]
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <functional>

#include "bench_clients.h"
#include "bench_program.h"
#include "counted_log.h"
#include "counted_memory.h"
#include "measurements.h"
#include "operations.h"
#include "shelf.h"

namespace bench {
namespace {

constexpr int kRefreshes = 20;

std::size_t brokerCalls(const testbed::Books& books) {
    std::size_t calls = 0;
    for (int entry = 0; entry <= static_cast<int>(testbed::Entry::OtherObjectCall); entry++)
        calls += books.count(static_cast<testbed::Entry>(entry));
    return calls;
}

struct Counts {
    std::size_t calls, lines, allocations;
};

Counts countsNow(const testbed::Books& books) {
    return {brokerCalls(books), loggedLines(), allocations()};
}

/// Counts what `act` has the provider do.
void count(Measurements& found, Shelf& shelf, const std::string& name,
           const std::function<void()>& act) {
    const testbed::Books& books = shelf.broker().books();
    const Counts before = countsNow(books);
    act();
    const Counts after = countsNow(books);
    const auto add = [&](const char* what, std::size_t number) {
        found.add(name + "/" + what, static_cast<double>(number), what);
    };
    add("calls", after.calls - before.calls);
    add("lines", after.lines - before.lines);
    add("allocations", after.allocations - before.allocations);
}

/// What many refreshes of the same drives, each in another order, leave behind.
double growth(Shelf& shelf) {
    const std::size_t before = allocatedBytes();
    for (int i = 0; i < kRefreshes; i++) {
        shelf.arrange(Results::Random);
        shelf.refresh();
    }
    return static_cast<double>(allocatedBytes()) - static_cast<double>(before);
}

void measure(Measurements& found, int drives, const std::string& library) {
    const std::size_t bytesBefore = allocatedBytes();
    Shelf shelf(drives, library);
    const std::string size = "/" + std::to_string(drives);
    found.add("record" + size, static_cast<double>(allocatedBytes() - bytesBefore) / drives,
              "bytes");
    shelf.broker().books().recordObjectCalls(true);
    const auto paths = shelf.client().enumerateInstanceNames(kDriveClass).paths;
    // The first get after drives have come or gone makes the index of a long list.
    shelf.client().getInstance(paths.front());
    for (const Operation& operation : kOperations)
        count(found, shelf, operation.name + size,
              [&] { operation.ask(shelf.client(), paths.back()); });
    for (const auto& [order, results] : kAllResults) {
        shelf.arrange(results);
        count(found, shelf, std::string("refresh-") + order + size, [&] { shelf.refresh(); });
    }
    found.add("growth" + size, growth(shelf), "bytes");
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    std::vector<int> drives = {24, 240};
    std::string library = PROVIDER, json;
    CLI::App app("Counts what the provider does for requests and refreshes");
    app.add_option("--drives", drives, "Numbers of drives")->check(CLI::Range(1, 100000));
    app.add_option("--json", json, "File for what was found");
    app.add_option("--library", library, "The provider's library");
    return bench::runProgram(app, argc, argv, LOG_EMERG, [&] {
        bench::countAllocationsOf(library);
        bench::Measurements found;
        for (const int number : drives) bench::measure(found, number, library);
        found.write(json);
    });
}
