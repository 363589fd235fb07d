// A provider at work on a scenario: vendor, broker and loaded library together.
#pragma once

#include <chrono>
#include <functional>
#include <string>

#include "broker.h"
#include "inventory.h"
#include "provider_library.h"
#include "scenario.h"

namespace testbed {

class ProviderSession {
public:
    /// Builds the vendor, defines the provider's classes from the schema (the one that locateSchema
    /// finds for `schema`) in the namespace of the requests, and loads the provider. Throws
    /// LoadError, or another std::runtime_error for a schema that cannot be used.
    ProviderSession(const Scenario& scenario, const std::string& library,
                    const std::string& providerName, const std::string& schema = "",
                    const std::string& nameSpace = "root/cimv2");
    /// The same with a vendor and classes of one's own: `prepare` puts them into the broker before
    /// the provider is loaded.
    ProviderSession(const BrokerOptions& options, const std::function<void(Broker&)>& prepare,
                    const std::string& library, const std::string& providerName);
    /// Stops the provider as that manager does, and unloads it.
    ~ProviderSession();
    ProviderSession(const ProviderSession&) = delete;
    ProviderSession& operator=(const ProviderSession&) = delete;

    /// Waits until the provider has all devices: it says so, and two answers in a row are equal.
    /// False when that does not happen in time.
    bool waitForInventory(std::chrono::seconds limit, const std::string& nameSpace);

    InstanceClient client() { return library_.client(); }
    Broker& broker() { return broker_; }
    Repository& repository() { return repository_; }

private:
    using Clock = std::chrono::steady_clock;
    bool waitForDiscovery(Clock::time_point deadline, const std::string& nameSpace);
    bool waitForEqualAnswers(Clock::time_point deadline, const std::string& nameSpace);

    Repository repository_;
    Broker broker_;
    ProviderLibrary library_;
};

}  // namespace testbed
