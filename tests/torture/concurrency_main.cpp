// Many clients, an array that never stands still and a slow vendor, with the provider's own
// workers.
//
//   concurrency-test [--seconds N] [--seed N] [--threads N] [--manager KIND]
#include <CLI/CLI.hpp>
#include <atomic>
#include <cstdlib>
#include <iostream>
#include <random>
#include <thread>

#include "PlexorProviderCfg.h"
#include "array_changer.h"
#include "clients.h"
#include "fast_clock.h"
#include "formatted_log.h"
#include "manager_kinds.h"
#include "manager_stop.h"
#include "polling_interval.h"
#include "process_view.h"
#include "sanitizers.h"
#include "settlement.h"
#include "vendor.h"
#include "vendor_comparison.h"
#include "watch.h"

#if defined(PLEXOR_ADDRESS_SANITIZER)
// A volume that is turned away for want of a pool leaves its texts behind, on purpose.
extern "C" const char* __lsan_default_suppressions() {
    return "leak:BuildVolumeInfo\n";
}
#endif

#if defined(PLEXOR_THREAD_SANITIZER)
// The sanitizer does not know the join with a deadline and takes joined workers for leaked ones;
// the test counts the threads itself.
extern "C" const char* __tsan_default_options() {
    return "report_thread_leaks=0";
}
#endif

namespace torture {
namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using Clock = std::chrono::steady_clock;

constexpr seconds kInventoryLimit{60};

struct Settings {
    int runSeconds = 10;
    unsigned seed = 0;
    int threads = 16;
    int speed = 4;
    int latency = 50;
    testbed::BrokerOptions manager;
};

/// Nobody keeps account of the faults: they only have to do no lasting harm.
struct Indifferent : modeltest::FaultListener {
    void failNextWalk(modeltest::Kind) override {}
    void failNextExtent() override {}
};

/// Two controllers that change, and a last one that stays as it is.
testbed::Scenario arrayWithSteadyController() {
    testbed::Scenario scenario = modeltest::ArrayChanger::startingScenario();
    testbed::ControllerDescription steady = scenario.controllers[0];
    steady.id = "C9";
    steady.model = "Model C9";
    steady.enclosures[0].tag = "C9_32";
    scenario.controllers.push_back(steady);
    return scenario;
}

class ConcurrencyTest {
public:
    explicit ConcurrencyTest(const Settings& settings)
        : settings_(settings),
          scenario_(arrayWithSteadyController()),
          naming_(scenario_.vendor, scenario_.host),
          broker_(repository_, settings.manager),
          changer_(broker_, scenario_, naming_, listener_, settings.seed),
          check_(failures_, scenario_) {
        testbed::buildVendor(repository_, scenario_);
        broker_.books().keepCalls(false);
        broker_.faults().setLatency(milliseconds(0), milliseconds(settings.latency));
    }

    /// Loads, tortures, compares, unloads. The number of failures.
    std::size_t run() {
        const std::size_t threadsBefore = threadCountAtRest();
        startChanging();
        testbed::InstanceClient client(broker_, callFactories());
        torment(client);
        if (settle(client)) {
            compareAnswers(client, scenario_, failures_);
            compareCache(scenario_, settings_.manager.randomOrder, failures_);
        } else {
            failures_.add("the refreshes do not come to an end");
        }
        unload(client, threadsBefore);
        failures_.print(std::cerr);
        return failures_.count();
    }

private:
    CMPIInstanceMI* callFactory() {
        const testbed::Broker::CallScope scope(broker_);
        CMPIStatus status = {CMPI_RC_OK, nullptr};
        return PlexorProvider_Create_InstanceMI(broker_.handle(), scope.context(), &status);
    }

    /// As often as the manager does; all calls give the same.
    CMPIInstanceMI* callFactories() {
        std::vector<std::thread> further;
        CMPIInstanceMI* const mi = callFactory();
        for (int i = 1; i < settings_.manager.factoryCalls; i++)
            further.emplace_back([&] {
                if (callFactory() != mi) failures_.add("another interface for another class");
            });
        for (std::thread& thread : further) thread.join();
        return mi;
    }

    void startChanging() {
        changing_ = std::thread([this] {
            while (!stop_) {
                changer_.change();
                changes_++;
                std::this_thread::sleep_for(milliseconds(changer_.draw(5)));
            }
        });
    }

    void stopChanging() {
        stop_ = true;
        changing_.join();
        broker_.faults().clear();
        broker_.faults().setLatency(milliseconds(0), milliseconds(0));
    }

    void torment(const testbed::InstanceClient& client) {
        Clients clients(client, check_, settings_.seed);
        Watch watch(failures_, [&] { return clients.completed(); });
        clients.start(settings_.threads);
        const auto start = Clock::now();
        while (!inventoryDone() && Clock::now() < start + kInventoryLimit)
            std::this_thread::sleep_for(milliseconds(10));
        if (!inventoryDone()) failures_.add("the initial inventory does not come to an end");
        std::this_thread::sleep_until(start + seconds(settings_.runSeconds));
        clients.stop();
        stopChanging();
        std::cout << clients.completed() << " requests, " << changes_ << " changes, "
                  << broker_.books().count(testbed::Entry::Associators) << " walks, "
                  << FormattedLog::lines() << " log lines, longest queue " << watch.longestQueue()
                  << std::endl;
    }

    void unload(testbed::InstanceClient& client, std::size_t threadsBefore) {
        const CMPIrc rc = testbed::stopProvider(broker_, client, [&] {
            for (const auto& served : testbed::servedClasses())
                client.enumerateInstances(served.name);
        });
        if (rc != CMPI_RC_OK) failures_.add("cleanup answers " + std::to_string(rc));
        if (!waitForThreadCount(threadsBefore, seconds(2)))
            failures_.add("workers are left: " + std::to_string(threadCount()) + " threads, " +
                          std::to_string(threadsBefore) + " at the start");
        if (!IsListEmpty(RaidControllerList)) failures_.add("controllers are left");
        if (!IsFifoEmpty(&__FIFO)) failures_.add("work items are left");
        // A volume that is turned away keeps the clone of its path, on purpose.
        const std::size_t clones = broker_.books().liveClones();
        if (clones != FormattedLog::volumesTurnedAway())
            failures_.add(std::to_string(clones) + " clones are left, " +
                          std::to_string(FormattedLog::volumesTurnedAway()) + " expected");
        for (const std::string& misuse : broker_.books().misuses())
            failures_.add("misuse: " + misuse);
    }

    const Settings settings_;
    Failures failures_;
    testbed::Scenario scenario_;
    testbed::Naming naming_;
    testbed::Repository repository_;
    testbed::Broker broker_;
    Indifferent listener_;
    modeltest::ArrayChanger changer_;
    ResponseCheck check_;
    std::atomic<bool> stop_ = false;
    std::atomic<int> changes_ = 0;
    std::thread changing_;
};

}  // namespace
}  // namespace torture

int main(int argc, char** argv) {
    torture::Settings settings;
    settings.seed = std::random_device()();
    std::string manager = "host";
    CLI::App app("Puts the provider under load while its array changes");
    app.add_option("--seconds", settings.runSeconds, "How long, real time");
    app.add_option("--seed", settings.seed, "Seed of requests and changes; drawn when not given");
    app.add_option("--threads", settings.threads, "Number of clients")->check(CLI::Range(1, 200));
    app.add_option("--speed", settings.speed, "Seconds of the provider's clock in a real second")
        ->check(CLI::Range(1, 1000));
    app.add_option("--latency", settings.latency, "Longest answer time of the vendor, ms")
        ->check(CLI::Range(0, 10000));
    app.add_option("--manager", manager, "Kind of manager and behaviours");
    CLI11_PARSE(app, argc, argv);
    if (app.count("--seconds") == 0) {
        const bool isLong = getenv("PLEXOR_LONG") != nullptr;
        settings.runSeconds = isLong ? 600 : manager == "host" ? 10 : 3;
    }
    // The answers are known by their keys, and the changes leave references to pools that have
    // gone.
    testbed::chooseManager(settings.manager,
                           manager + ",filter-drops-names=off,dangling-fails=off");

    std::cout << "seed " << settings.seed << ", " << settings.runSeconds << " s, "
              << settings.threads << " clients" << std::endl;
    const testbed::PollingInterval interval(1);
    torture::FastClock::setSpeed(settings.speed);
    const std::size_t failures = torture::ConcurrencyTest(settings).run();
    std::cout << failures << " failures" << std::endl;
    return failures == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}
