// Requests of all kinds, one after the other.
#pragma once

#include <chrono>
#include <cstddef>
#include <stdexcept>
#include <string>
#include <vector>

#include "instance_client.h"
#include "inventory.h"

namespace bench {

/// A measurement that cannot be made. One line for the user.
struct BenchError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// Goes through the six classes and the three operations in turn.
class MixedRequests {
public:
    /// Asks for the names of everything once. Throws BenchError when a class has no instances.
    explicit MixedRequests(testbed::InstanceClient client);

    /// Makes the next request and gives its time. Throws BenchError when it fails.
    std::chrono::nanoseconds next();

private:
    testbed::InstanceClient client_;
    std::vector<std::vector<testbed::ObjectPath>> paths_;  // by class
    std::size_t count_ = 0;
};

}  // namespace bench
