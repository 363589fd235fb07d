// How long the first inventory takes, and how much of it the provider spends waiting: for room in
// its queue, and for the last device, a second at a time; and how many of the vendor's answers the
// thread that asks most of them waits for. From the walk over the devices on.
//
//   inventory-cost [--drives N...] [--answer-time MS] [--json FILE] [--library FILE]
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <map>
#include <thread>

#include "bench_clients.h"
#include "bench_program.h"
#include "counted_log.h"
#include "drive_shelf.h"
#include "measurements.h"
#include "provider_session.h"

namespace bench {
namespace {

using std::chrono::milliseconds;
using Clock = std::chrono::steady_clock;

constexpr std::chrono::minutes kLimit{10};
constexpr milliseconds kLook{5};

CountedLine walkBegun{"BuildLogicalDeviceInfo, enter...\n"};
CountedLine queueFull{"BuildLogicalDeviceInfo: FIFO full, waiting...\n"};
CountedLine notEmpty{"BuildLogicalDeviceInfo: FIFO not empty, waiting...\n"};
CountedLine walkDone{"BuildLogicalDeviceInfo, DONE...\n"};

void waitFor(const std::function<bool()>& condition) {
    const auto limit = Clock::now() + kLimit;
    while (!condition()) {
        if (Clock::now() > limit) throw BenchError("the inventory does not arrive");
        std::this_thread::sleep_for(kLook);
    }
}

double secondsFromBegin(Clock::time_point end) {
    return std::chrono::duration<double>(end - walkBegun.when()).count();
}

/// How many of the vendor's answers one thread alone has waited for, at most.
std::size_t longestWait(const testbed::Books& books) {
    std::map<std::thread::id, std::size_t> answers;
    std::size_t most = 0;
    for (const testbed::CallRecord& call : books.queries())
        most = std::max(most, ++answers[call.thread]);
    return most;
}

void measure(Measurements& found, int drives, milliseconds answerTime, const std::string& library) {
    for (CountedLine* line : {&walkBegun, &queueFull, &notEmpty, &walkDone}) line->reset();
    testbed::ProviderSession session(driveShelf(drives, answerTime), library, "PlexorProvider");
    testbed::InstanceClient client = session.client();
    waitFor([&] {
        return client.enumerateInstanceNames("Tovexa_PlexorStorageExtent").paths.size() ==
               static_cast<std::size_t>(drives);
    });
    const double complete = secondsFromBegin(Clock::now());
    waitFor([] { return walkDone.count() > 0; });
    const std::string name =
        "inventory/" + std::to_string(drives) + "/" + std::to_string(answerTime.count()) + "ms/";
    found.add(name + "all-there", complete, "s");
    found.add(name + "walk", secondsFromBegin(walkDone.when()), "s");
    found.add(name + "waits-for-room", queueFull.count(), "waits");
    found.add(name + "waits-for-end", notEmpty.count(), "waits");
    found.add(name + "answers", static_cast<double>(longestWait(session.broker().books())),
              "answers");
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    std::vector<int> drives = {10, 20, 40, 100, 240, 1000};
    int answerTime = 0;
    std::string library = PROVIDER, json;
    CLI::App app("Measures the provider's first inventory");
    app.add_option("--drives", drives, "Numbers of drives")->check(CLI::Range(1, 100000));
    app.add_option("--answer-time", answerTime,
                   "Milliseconds that each of the vendor's answers takes")
        ->check(CLI::Range(0, 10000));
    app.add_option("--json", json, "File for what was found");
    app.add_option("--library", library, "The provider's library");
    return bench::runProgram(app, argc, argv, LOG_ERR, [&] {
        bench::Measurements found;
        for (const int count : drives)
            bench::measure(found, count, std::chrono::milliseconds(answerTime), library);
        found.write(json);
    });
}
