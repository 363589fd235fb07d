// Starting and stopping a provider, and waiting until its inventory has arrived.
#include "provider_session.h"

#include <pthread.h>

#include <thread>

#include "manager_stop.h"
#include "schema_choice.h"
#include "vendor.h"

namespace testbed {
namespace {

constexpr std::chrono::milliseconds kFlagInterval{100};
/// Longer than the second for which a provider may sleep between two steps of its inventory.
constexpr std::chrono::milliseconds kAnswerInterval{1200};

/// The broker with vendor and faults in place, as the provider's first call must find them.
Broker& prepared(Broker& broker, const std::function<void(Broker&)>& prepare) {
    prepare(broker);
    return broker;
}

/// The flag as its mutex guards it; a library that does not show the mutex is read without.
bool isSet(const unsigned int* flag, pthread_mutex_t* mutex) {
    if (mutex) pthread_mutex_lock(mutex);
    const bool set = __atomic_load_n(flag, __ATOMIC_ACQUIRE) != 0;
    if (mutex) pthread_mutex_unlock(mutex);
    return set;
}

std::vector<std::string> allClasses() {
    std::vector<std::string> names;
    for (const ServedClass& served : servedClasses()) names.push_back(served.name);
    return names;
}

}  // namespace

ProviderSession::ProviderSession(const Scenario& scenario, const std::string& library,
                                 const std::string& providerName, const std::string& schema,
                                 const std::string& nameSpace)
    : ProviderSession(
          scenario.manager,
          [&](Broker& broker) {
              buildVendor(broker.repository(), scenario);
              defineChosenClasses(broker.repository(), nameSpace, schema);
              applyBehaviour(broker, scenario);
          },
          library, providerName) {}

ProviderSession::ProviderSession(const BrokerOptions& options,
                                 const std::function<void(Broker&)>& prepare,
                                 const std::string& library, const std::string& providerName)
    : broker_(repository_, options), library_(prepared(broker_, prepare), library, providerName) {}

ProviderSession::~ProviderSession() {
    InstanceClient requests = client();
    stopAndUnload(broker_, library_, [&] {
        collectInventory(requests, allClasses(), "root/cimv2");
        std::this_thread::sleep_for(kFlagInterval);
    });
}

bool ProviderSession::waitForDiscovery(Clock::time_point deadline, const std::string& nameSpace) {
    const auto* done = static_cast<const unsigned int*>(library_.symbol("ThreadActivityDone"));
    if (done == nullptr) return true;
    // Controllers are there as soon as the library is loaded; without any, nothing will follow.
    InstanceClient requests = client();
    const Inventory controllers =
        collectInventory(requests, {servedClasses().front().name}, nameSpace);
    if (controllers.front().response.instances.empty()) return true;
    auto* mutex = static_cast<pthread_mutex_t*>(library_.symbol("PlexorThreadMutex"));
    while (!isSet(done, mutex)) {
        if (Clock::now() >= deadline) return false;
        std::this_thread::sleep_for(kFlagInterval);
    }
    return true;
}

bool ProviderSession::waitForEqualAnswers(Clock::time_point deadline,
                                          const std::string& nameSpace) {
    InstanceClient requests = client();
    Inventory last = collectInventory(requests, allClasses(), nameSpace);
    do {
        std::this_thread::sleep_for(kAnswerInterval);
        Inventory next = collectInventory(requests, allClasses(), nameSpace);
        if (sameAnswers(last, next)) return true;
        last = std::move(next);
    } while (Clock::now() < deadline);
    return false;
}

bool ProviderSession::waitForInventory(std::chrono::seconds limit, const std::string& nameSpace) {
    const Clock::time_point deadline = Clock::now() + limit;
    return waitForDiscovery(deadline, nameSpace) && waitForEqualAnswers(deadline, nameSpace);
}

}  // namespace testbed
