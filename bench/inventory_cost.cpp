// How long the first inventory takes, and how much of it the provider spends waiting: for room in
// its queue, and for the last device, a second at a time.
//
//   inventory-cost [--drives N...] [--answer-time MS] [--library FILE]
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <thread>

#include "bench_clients.h"
#include "drive_shelf.h"
#include "provider_session.h"

namespace bench {
namespace {

using std::chrono::milliseconds;
using Clock = std::chrono::steady_clock;

constexpr std::chrono::minutes kLimit{10};
constexpr milliseconds kLook{5};

/// A line of the provider's log, and how often it came.
struct CountedLine {
    const char* text;
    std::atomic<int> count = 0;
};
CountedLine queueFull{"BuildLogicalDeviceInfo: FIFO full, waiting...\n"};
CountedLine notEmpty{"BuildLogicalDeviceInfo: FIFO not empty, waiting...\n"};
CountedLine walkDone{"BuildLogicalDeviceInfo, DONE...\n"};

[[gnu::format(printf, 1, 0)]] void countLine(const char* format, va_list args) {
    char text[256];
    std::vsnprintf(text, sizeof text, format, args);
    for (CountedLine* line : {&queueFull, &notEmpty, &walkDone})
        if (std::strcmp(text, line->text) == 0) ++line->count;
}

void waitFor(const std::function<bool()>& condition) {
    const auto limit = Clock::now() + kLimit;
    while (!condition()) {
        if (Clock::now() > limit) throw BenchError("the inventory does not arrive");
        std::this_thread::sleep_for(kLook);
    }
}

double secondsSince(Clock::time_point start) {
    return std::chrono::duration<double>(Clock::now() - start).count();
}

void measure(int drives, milliseconds answerTime, const std::string& library) {
    for (CountedLine* line : {&queueFull, &notEmpty, &walkDone}) line->count = 0;
    const auto start = Clock::now();
    testbed::ProviderSession session(driveShelf(drives, answerTime), library, "PlexorProvider");
    session.broker().books().keepCalls(false);
    testbed::InstanceClient client = session.client();
    waitFor([&] {
        return client.enumerateInstanceNames("Tovexa_PlexorStorageExtent").paths.size() ==
               static_cast<std::size_t>(drives);
    });
    const double complete = secondsSince(start);
    waitFor([] { return walkDone.count > 0; });
    std::printf("%7d %12.2f %12.2f %15d %15d\n", drives, complete, secondsSince(start),
                queueFull.count.load(), notEmpty.count.load());
    std::fflush(stdout);
}

}  // namespace
}  // namespace bench

// The provider's log is counted, not written. Which name it calls depends on how it was compiled.
extern "C" void syslog(int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    bench::countLine(format, args);
    va_end(args);
}
extern "C" void __syslog_chk(int, int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    bench::countLine(format, args);
    va_end(args);
}

int main(int argc, char** argv) {
    std::vector<int> drives = {10, 20, 40, 100, 240, 1000};
    int answerTime = 0;
    std::string library = PROVIDER;
    CLI::App app("Measures the provider's first inventory");
    app.add_option("--drives", drives, "Numbers of drives")->check(CLI::Range(1, 100000));
    app.add_option("--answer-time", answerTime,
                   "Milliseconds that each of the vendor's answers takes")
        ->check(CLI::Range(0, 10000));
    app.add_option("--library", library, "The provider's library");
    CLI11_PARSE(app, argc, argv);

    setlogmask(LOG_UPTO(LOG_ERR));
    std::printf("%7s %12s %12s %15s %15s\n", "drives", "all there s", "walk ends s",
                "waits for room", "waits for end");
    try {
        for (const int count : drives)
            bench::measure(count, std::chrono::milliseconds(answerTime), library);
    } catch (const std::exception& error) {
        std::cerr << error.what() << std::endl;
        return EXIT_FAILURE;
    }
    return EXIT_SUCCESS;
}
