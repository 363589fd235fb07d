// What the workers keep of the objects that they obtain from the object manager, after the first
// inventory and after each refresh of the drives; how often a refresh calls these objects, and how
// long it takes (to within 20 ms). Nothing may pile up, and with --manager host,random-order the
// calls may only grow as the drives do.
//
//   object-growth [--drives N] [--refreshes N] [--flat] [--library FILE] [--manager KIND]
//
// With --flat the exit status is 1 when anything piles up.
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <thread>

#include "bench_clients.h"
#include "bench_program.h"
#include "drive_shelf.h"
#include "manager_option.h"
#include "polling_interval.h"
#include "provider_session.h"

namespace bench {
namespace {

using testbed::Entry;
using Clock = std::chrono::steady_clock;

constexpr std::chrono::minutes kInventoryLimit{10};
constexpr std::chrono::seconds kGrace{3};  // what the provider lets pass before its first refresh
constexpr std::chrono::seconds kRefreshLimit{120};
constexpr std::chrono::milliseconds kLook{20};
constexpr std::chrono::milliseconds kQuiet{1500};

struct Cost {
    std::size_t calls = 0;
    double seconds = 0;
};

/// Prints how many objects are kept; gives the number of those that are no clones.
std::size_t print(const char* when, int round, testbed::Books& books, const Cost& cost) {
    const std::size_t clones = books.liveClones();
    const std::size_t others = books.live() - clones;
    std::printf("%-10s %4d %12zu %12zu %12zu %9.2f\n", when, round, clones, others, cost.calls,
                cost.seconds);
    std::fflush(stdout);
    return others;
}

/// Calls of objects so far: what an identity that is read again costs.
std::size_t objectCalls(const testbed::Books& books) {
    std::size_t calls = 0;
    for (const Entry entry :
         {Entry::PathGetKey, Entry::PathGetClassName, Entry::PathGetNameSpace,
          Entry::StringGetCharPtr, Entry::InstanceGetProperty, Entry::InstanceGetObjectPath,
          Entry::EnumerationHasNext, Entry::EnumerationGetNext, Entry::Clone, Entry::Release})
        calls += books.count(entry);
    return calls;
}

std::size_t queries(const testbed::Books& books) {
    return books.count(Entry::Associators) + books.count(Entry::AssociatorNames);
}

/// Waits until the workers ask nobody anything any more; since when that is so.
Clock::time_point settle(const testbed::Books& books) {
    const auto limit = Clock::now() + kRefreshLimit;
    auto quietSince = Clock::now();
    std::size_t last = queries(books) + objectCalls(books);
    for (; Clock::now() - quietSince < kQuiet; std::this_thread::sleep_for(kLook)) {
        if (Clock::now() > limit) throw BenchError("the workers do not come to rest");
        const std::size_t now = queries(books) + objectCalls(books);
        if (now != last) quietSince = Clock::now();
        last = now;
    }
    return quietSince;
}

/// Asks for drives until that has the workers ask the vendor, and lets them end it.
Cost refresh(testbed::ProviderSession& session) {
    const testbed::Books& books = session.broker().books();
    const auto limit = Clock::now() + kRefreshLimit;
    const std::size_t before = queries(books);
    std::size_t calls = 0;
    while (queries(books) == before) {
        if (Clock::now() > limit) throw BenchError("no refresh takes place");
        std::this_thread::sleep_for(kLook);
        calls = objectCalls(books);
        session.client().enumerateInstanceNames("Tovexa_PlexorStorageExtent");
    }
    const auto begin = Clock::now();
    const auto end = settle(books);
    return {objectCalls(books) - calls, std::chrono::duration<double>(end - begin).count()};
}

/// How many objects more are kept after the last refresh than after the inventory.
std::size_t measure(int drives, int refreshes, const std::string& library,
                    const std::string& manager) {
    const testbed::PollingInterval interval(1);
    testbed::Scenario shelf = driveShelf(drives, std::chrono::milliseconds(0));
    shelf.manager = testbed::chosenManager(shelf, manager);
    testbed::ProviderSession session(shelf, library, "PlexorProvider");
    testbed::Books& books = session.broker().books();
    books.keepCalls(false);
    books.recordObjectCalls(true);
    if (!session.waitForInventory(kInventoryLimit, "root/cimv2"))
        throw BenchError("the inventory does not arrive");
    std::this_thread::sleep_for(kGrace);
    settle(books);
    const std::size_t first = print("inventory", 0, books, {});
    std::size_t last = first;
    for (int round = 1; round <= refreshes; round++) {
        const Cost cost = refresh(session);
        last = print("refresh", round, books, cost);
    }
    return last - std::min(first, last);
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    int drives = 1000;
    int refreshes = 5;
    bool flat = false;
    std::string library = PROVIDER, manager;
    CLI::App app("Measures what the provider's workers keep of the object manager's objects");
    app.add_option("--drives", drives, "Number of drives")->check(CLI::Range(1, 100000));
    app.add_option("--refreshes", refreshes, "Number of refreshes")->check(CLI::Range(0, 1000));
    app.add_flag("--flat", flat, "Fail when objects pile up");
    app.add_option("--library", library, "The provider's library");
    testbed::addManagerOption(app, manager);
    return bench::runProgram(app, argc, argv, LOG_EMERG, [&] {
        std::printf("%-10s %4s %12s %12s %12s %9s\n", "after", "", "clones", "others", "calls",
                    "seconds");
        const std::size_t growth = bench::measure(drives, refreshes, library, manager);
        if (flat && growth != 0)
            throw bench::BenchError(std::to_string(growth) + " objects have piled up");
    });
}
