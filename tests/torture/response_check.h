// What can be said of one response while the array changes all the time.
#pragma once

#include <string>
#include <vector>

#include "failures.h"
#include "instance_client.h"
#include "inventory.h"
#include "scenario.h"

namespace torture {

/// The key by which clients know a device (empty for a controller's own instances).
std::string identityOf(const testbed::ServedClass& served, const std::string& controllerId,
                       const std::string& deviceId);
/// Identities in a response, sorted.
std::vector<std::string> identitiesIn(const testbed::ServedClass& served,
                                      const testbed::Response& response);

/// Every response has status OK and each device at most once, all controllers, and all devices of
/// the one controller that nobody changes. Thread-safe.
class ResponseCheck {
public:
    /// `scenario` is read here only. The last controller is the steady one.
    ResponseCheck(Failures& failures, const testbed::Scenario& scenario);

    /// `complete`: the initial inventory was done before the request was made.
    void enumeration(const testbed::ServedClass& served, const testbed::Response& response,
                     bool complete) const;
    void get(const testbed::ServedClass& served, const testbed::ObjectPath& path,
             const testbed::Response& response) const;

private:
    struct SteadyIds {
        std::string className;
        bool always;  // also before the inventory is done
        std::vector<std::string> ids;
    };
    const SteadyIds& steady(const testbed::ServedClass& served) const;
    void status(const char* operation, const std::string& what,
                const testbed::Response& response) const;

    Failures& failures_;
    std::vector<SteadyIds> steady_;
};

}  // namespace torture
