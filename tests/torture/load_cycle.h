// One life of the provider's library in a process: loaded, used, unloaded, gone.
#pragma once

#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "inventory.h"
#include "provider_library.h"
#include "scenario.h"

namespace torture {

/// A cycle that did not go as it must. The text says what went wrong.
struct CycleError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// In which state of the provider the manager unloads it.
enum class Moment {
    InUse,         ///< refreshes are running; the manager stops
    IdleTimeOver,  ///< refused at first, then the idle time passes
    Inventory,     ///< the first devices are being built
    AtOnce,        ///< the factory has just returned, the workers are still attaching
};
constexpr Moment kMoments[] = {Moment::InUse, Moment::IdleTimeOver, Moment::Inventory,
                               Moment::AtOnce};
const char* momentName(Moment moment);

/// The vendor and the broker outlive all cycles.
class LoadCycles {
public:
    LoadCycles(const testbed::Scenario& scenario, std::string library);

    /// Throws CycleError.
    void run(Moment moment);
    /// A worker that is stuck in the vendor's provider while the manager unloads. Takes more than
    /// half a minute. Throws CycleError.
    void runStuck();

private:
    std::unique_ptr<testbed::ProviderLibrary> load();
    void delayAttach();
    void waitForInventory(testbed::ProviderLibrary& library);
    /// Asks for every class once. How many requests were refused.
    static int ask(testbed::ProviderLibrary& library);
    void askFromManyThreads(testbed::ProviderLibrary& library);
    void checkInventory(testbed::InstanceClient client);
    void unload(testbed::ProviderLibrary& library, Moment moment);
    void checkGone(std::size_t threadsBefore);
    void checkBooks();

    const testbed::Scenario& scenario_;
    std::string file_;
    testbed::Repository repository_;
    testbed::Broker broker_;
};

}  // namespace torture
