// How often the provider asks the vendor, with one client and with many, all polling continuously.
//
//   vendor-load [--seconds N] [--clients N] [--library FILE] [--scenario FILE]
//
// The polling interval is one second. Exit status 1 when the number of clients makes a difference.
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <atomic>
#include <cmath>
#include <cstdio>
#include <thread>

#include "bench_clients.h"
#include "bench_program.h"
#include "polling_interval.h"
#include "provider_session.h"
#include "scenario_parser.h"

namespace bench {
namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;

constexpr int kAttempts = 3;
constexpr seconds kInventoryLimit{60};
constexpr seconds kGrace{3};       // what the provider lets pass before its first refresh
constexpr milliseconds kPause{5};  // leaves the workers a share of a small machine

std::size_t queryCount(const testbed::Books& books) {
    using testbed::Entry;
    std::size_t count = 0;
    for (Entry entry :
         {Entry::EnumerateInstanceNames, Entry::EnumerateInstances, Entry::GetInstance,
          Entry::Associators, Entry::AssociatorNames, Entry::References, Entry::ReferenceNames})
        count += books.count(entry);
    return count;
}

/// Refreshes become due when the clock's second changes: halfway between, none is under way, and
/// every window of whole seconds holds the same number of them.
void waitForHalfSecond() {
    using std::chrono::system_clock;
    const auto now = system_clock::now();
    auto half = std::chrono::floor<seconds>(now) + milliseconds(500);
    if (half <= now) half += seconds(1);
    std::this_thread::sleep_until(half);
}

/// Clients that ask all the time while one lives.
class Pollers {
public:
    Pollers(testbed::InstanceClient client, int count) {
        for (int i = 0; i < count; i++) threads_.emplace_back([this, client] { poll(client); });
    }
    ~Pollers() {
        stop_ = true;
        for (std::thread& thread : threads_) thread.join();
    }
    Pollers(const Pollers&) = delete;
    Pollers& operator=(const Pollers&) = delete;

    std::size_t requests() const { return requests_; }

private:
    void poll(testbed::InstanceClient client) {
        while (!stop_)
            for (const auto& served : testbed::servedClasses()) {
                client.enumerateInstances(served.name);
                requests_++;
                std::this_thread::sleep_for(kPause);
            }
    }

    std::atomic<bool> stop_ = false;
    std::atomic<std::size_t> requests_ = 0;
    std::vector<std::thread> threads_;
};

/// Vendor calls a minute.
double measure(testbed::ProviderSession& session, int clients, seconds window) {
    const testbed::Books& books = session.broker().books();
    const Pollers pollers(session.client(), clients);
    waitForHalfSecond();
    std::this_thread::sleep_for(seconds(1));  // the first refreshes may have been overdue
    const std::size_t callsBefore = queryCount(books);
    const std::size_t requestsBefore = pollers.requests();
    std::this_thread::sleep_for(window);
    const std::size_t calls = queryCount(books) - callsBefore;
    const std::size_t requests = pollers.requests() - requestsBefore;
    const double perMinute = 60.0 / static_cast<double>(window.count());
    std::printf("%4d client%s %10.0f requests a minute, %8.0f vendor calls a minute\n", clients,
                clients == 1 ? ": " : "s:", static_cast<double>(requests) * perMinute,
                static_cast<double>(calls) * perMinute);
    std::fflush(stdout);
    return static_cast<double>(calls) * perMinute;
}

/// Measures with one client and with many. How many more calls there are with many, percent.
double compare(testbed::ProviderSession& session, seconds window, int clients) {
    const double one = measure(session, 1, window);
    const double many = measure(session, clients, window);
    if (one == 0) throw BenchError("the vendor is never asked");
    const double difference = (many - one) / one * 100;
    std::printf("difference %.1f %%\n", difference);
    std::fflush(stdout);
    return difference;
}

/// True when many clients cost the vendor what one does. On a machine that is busy with other
/// things refreshes come late and fewer of them fit into a window, so there are several attempts.
bool run(const testbed::Scenario& scenario, const std::string& library, seconds window, int clients,
         double tolerance) {
    testbed::ProviderSession session(scenario, library, "PlexorProvider");
    if (!session.waitForInventory(kInventoryLimit, "root/cimv2"))
        throw BenchError("the inventory does not arrive");
    std::this_thread::sleep_for(kGrace);
    session.broker().books().keepCalls(false);

    for (int attempt = 0; attempt < kAttempts; attempt++)
        if (std::abs(compare(session, window, clients)) <= tolerance) return true;
    return false;
}

}  // namespace
}  // namespace bench

int main(int argc, char** argv) {
    int window = 20;
    int clients = 100;
    double tolerance = 5;
    std::string library = PROVIDER, scenarioFile = SCENARIO;
    CLI::App app("Measures how often the provider asks the vendor");
    app.add_option("--seconds", window, "Length of each measurement")->check(CLI::Range(1, 3600));
    app.add_option("--clients", clients, "Number of clients in the second measurement")
        ->check(CLI::Range(2, 1000));
    app.add_option("--tolerance", tolerance, "Largest difference, percent");
    app.add_option("--library", library, "The provider's library");
    app.add_option("--scenario", scenarioFile, "The vendor's array");
    return bench::runProgram(app, argc, argv, LOG_EMERG, [&] {
        const testbed::PollingInterval interval(1);
        const auto scenario = testbed::readScenario(scenarioFile);
        if (!bench::run(scenario, library, std::chrono::seconds(window), clients, tolerance))
            throw bench::BenchError("the number of clients makes a difference to the vendor");
    });
}
