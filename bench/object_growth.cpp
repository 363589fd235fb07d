// What the workers keep of the objects that they obtain from the object manager, after the first
// inventory and after each refresh of the drives. Nothing may pile up where the manager can be
// asked to flush a thread.
//
//   object-growth [--drives N] [--refreshes N] [--flat] [--library FILE] [--manager KIND]
//
// With --flat the exit status is 1 when anything piles up.
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <thread>

#include "bench_clients.h"
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

/// Prints how many objects are kept; gives the number of those that are no clones.
std::size_t print(const char* when, int round, testbed::Books& books) {
    const std::size_t clones = books.liveClones();
    const std::size_t others = books.live() - clones;
    std::printf("%-10s %4d %12zu %12zu\n", when, round, clones, others);
    std::fflush(stdout);
    return others;
}

std::size_t queries(const testbed::Books& books) {
    return books.count(Entry::Associators) + books.count(Entry::AssociatorNames);
}

/// Waits until the workers ask the vendor nothing any more.
void settle(const testbed::Books& books) {
    const auto limit = Clock::now() + kRefreshLimit;
    std::size_t last = queries(books);
    for (auto quietSince = Clock::now(); Clock::now() - quietSince < kQuiet;
         std::this_thread::sleep_for(kLook)) {
        if (Clock::now() > limit) throw BenchError("the workers do not come to rest");
        const std::size_t now = queries(books);
        if (now != last) quietSince = Clock::now();
        last = now;
    }
}

/// Asks for drives until that has the workers ask the vendor, and lets them end it.
void refresh(testbed::ProviderSession& session) {
    const testbed::Books& books = session.broker().books();
    const auto limit = Clock::now() + kRefreshLimit;
    const std::size_t before = queries(books);
    while (queries(books) == before) {
        if (Clock::now() > limit) throw BenchError("no refresh takes place");
        session.client().enumerateInstanceNames("Tovexa_PlexorStorageExtent");
        std::this_thread::sleep_for(kLook);
    }
    settle(books);
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
    if (!session.waitForInventory(kInventoryLimit, "root/cimv2"))
        throw BenchError("the inventory does not arrive");
    std::this_thread::sleep_for(kGrace);
    settle(books);
    const std::size_t first = print("inventory", 0, books);
    std::size_t last = first;
    for (int round = 1; round <= refreshes; round++) {
        refresh(session);
        last = print("refresh", round, books);
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
    CLI11_PARSE(app, argc, argv);

    setlogmask(LOG_UPTO(LOG_EMERG));
    std::printf("%-10s %4s %12s %12s\n", "after", "", "clones", "others");
    try {
        const std::size_t growth = bench::measure(drives, refreshes, library, manager);
        if (!flat || growth == 0) return EXIT_SUCCESS;
        std::cerr << growth << " objects have piled up" << std::endl;
    } catch (const std::exception& error) {
        std::cerr << error.what() << std::endl;
    }
    return EXIT_FAILURE;
}
