// The model test: random changes of the vendor's array and random requests of clients, and after
// each request the cache and the log must be what a simple model says.
//
//   model-test [--seed N] [--steps N] [--manager KIND]
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <cstdlib>
#include <iostream>
#include <random>

#include "PlexorProviderCfg.h"
#include "array_changer.h"
#include "cache_model.h"
#include "fake_host.h"
#include "instance_client.h"
#include "manager_kinds.h"
#include "played_queue.h"
#include "sanitizers.h"
#include "vendor.h"

#if defined(PLEXOR_ADDRESS_SANITIZER)
// A volume that is turned away for want of a pool leaves its texts behind, on purpose.
extern "C" const char* __lsan_default_suppressions() {
    return "leak:BuildVolumeInfo\n";
}
#endif

namespace modeltest {
namespace {

constexpr std::time_t kInterval = 20;

/// The provider, its broker and the model, as one host.
class ModelTest {
public:
    ModelTest(unsigned seed, const testbed::BrokerOptions& manager)
        : scenario_(ArrayChanger::startingScenario()),
          naming_(scenario_.vendor, scenario_.host),
          broker_(repository_, manager),
          model_(repository_, naming_, scenario_, kInterval),
          changer_(broker_, scenario_, naming_, model_, seed) {
        testbed::buildVendor(repository_, scenario_);
        broker_.books().keepCalls(false);
        ::Broker = broker_.handle();
    }

    /// Discovery and first inventory, without the provider's own threads.
    bool start() {
        testbed::Broker::CallScope scope(broker_);
        // The walks' waits take no time: the model has all controllers stamped in one moment.
        FakeHost::whileSleeping = [this, begin = FakeHost::now] {
            FakeHost::now = begin;
            runQueue();
        };
        Array_t profiles = {};
        if (InitSystemInfo(&mi_, scope.context()) != 0) return false;
        if (GetHHRCProfiles(&mi_, scope.context(), &profiles) != 1) return false;
        if (BuildControllerInfo(&mi_, scope.context(), &profiles) != 0) return false;
        InitCompleteTime = FakeHost::now;
        BuildDeviceInfoAsync(&mi_, scope.context());
        runQueue();
        FakeHost::whileSleeping = [this] { runQueue(); };
        model_.buildInventory(FakeHost::now);
        FakeHost::takeChangeLines();
        FakeHost::now += 3;
        return same("after the first inventory");
    }

    bool step() {
        for (unsigned i = changer_.draw(4); i > 0; i--) changer_.change();
        FakeHost::now += changer_.draw(15);
        constexpr struct {
            Kind kind;
            const char* className;
        } kRequests[] = {{Kind::Volume, "Tovexa_PlexorStorageVolume"},
                         {Kind::Drive, "Tovexa_PlexorStorageExtent"},
                         {Kind::Port, "Tovexa_PlexorSASSATAPort"},
                         {Kind::Battery, "Tovexa_PlexorBattery"}};
        const auto& request = kRequests[changer_.draw(4)];
        testbed::InstanceClient client(broker_, &mi_);
        const auto response = changer_.draw(2) == 0
                                  ? client.enumerateInstances(request.className)
                                  : client.enumerateInstanceNames(request.className);
        if (response.rc != CMPI_RC_OK) return fail("a request failed");
        model_.request(request.kind, FakeHost::now);
        runQueue();
        return same(request.className);
    }

    void stop() {
        FreeList(RaidControllerList, FreeController);
        ReleaseSystemInfo();
    }

    int refreshes() const { return refreshes_; }
    std::size_t changes() const { return changes_; }

private:
    void runQueue() { refreshes_ += plexortest::playQueue(broker_); }

    bool same(const std::string& when) {
        const auto expectedLines = model_.takeLines();
        const auto lines = FakeHost::takeChangeLines();
        changes_ += lines.size();
        const auto cache = readCache();
        if (cache != model_.controllers()) {
            std::cerr << when << ": the cache differs\n";
            for (const auto& ctrl : cache) std::cerr << "cache " << describe(ctrl);
            for (const auto& ctrl : model_.controllers()) std::cerr << "model " << describe(ctrl);
            return false;
        }
        if (lines != expectedLines) {
            std::cerr << when << ": the log differs\n";
            for (const auto& line : lines) std::cerr << "log   " << line << "\n";
            for (const auto& line : expectedLines) std::cerr << "model " << line << "\n";
            return false;
        }
        return true;
    }

    static bool fail(const char* what) {
        std::cerr << what << "\n";
        return false;
    }

    testbed::Scenario scenario_;
    testbed::Naming naming_;
    testbed::Repository repository_;
    testbed::Broker broker_;
    CacheModel model_;
    ArrayChanger changer_;
    CMPIInstanceMI mi_ = {nullptr, &instMIFT__};
    int refreshes_ = 0;
    std::size_t changes_ = 0;
};

}  // namespace
}  // namespace modeltest

int main(int argc, char** argv) {
    CLI::App app("Compares the provider's cache with a model under random changes");
    unsigned seed = std::random_device()();
    int steps = 10000;
    int longSteps = 0;
    std::string manager = "host";
    app.add_option("--seed", seed, "Seed of the changes; drawn when not given");
    app.add_option("--steps", steps, "Number of requests");
    app.add_option("--long-steps", longSteps, "The number with PLEXOR_LONG in the environment");
    app.add_option("--manager", manager,
                   "Kind of manager, but for random-order and dangling-fails");
    CLI11_PARSE(app, argc, argv);
    if (longSteps > 0 && getenv("PLEXOR_LONG") != nullptr) steps = longSteps;

    std::cout << "seed " << seed << ", " << steps << " steps" << std::endl;
    testbed::BrokerOptions options;
    // The model says in which order things are logged, so it has to know the order of results; and
    // the changes leave references to pools that have gone.
    testbed::chooseManager(options, manager + ",random-order=off,dangling-fails=off");
    modeltest::ModelTest test(seed, options);
    if (!test.start()) return EXIT_FAILURE;
    for (int i = 1; i <= steps; i++) {
        if (test.step()) continue;
        std::cerr << "failed at step " << i << " with seed " << seed << "\n";
        return EXIT_FAILURE;
    }
    test.stop();
    std::cout << "no difference; " << test.refreshes() << " work items, " << test.changes()
              << " change lines\n";
    return EXIT_SUCCESS;
}
