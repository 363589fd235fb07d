// A client's requests, made on an instance provider's function table the way a manager makes them.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "broker.h"

namespace testbed {

/// The outcome of one request.
struct Response {
    CMPIrc rc = CMPI_RC_OK;
    std::optional<std::string> message;  ///< absent when the status has no message object
    int doneCalls = 0;                   ///< how often the provider called returnDone
    std::vector<ObjectPath> paths;       ///< from enumerateInstanceNames
    std::vector<Instance> instances;     ///< from the other two
};

using PropertyList = std::optional<std::vector<std::string>>;

/// Thread-safe as far as the provider is: each request runs in a call scope of its own.
class InstanceClient {
public:
    /// Both must outlive the client.
    InstanceClient(Broker& broker, CMPIInstanceMI* mi) : broker_(broker), mi_(mi) {}

    Response enumerateInstanceNames(const std::string& className,
                                    const std::string& nameSpace = "root/cimv2");
    Response enumerateInstances(const std::string& className, const PropertyList& properties = {},
                                const std::string& nameSpace = "root/cimv2");
    Response getInstance(const ObjectPath& path, const PropertyList& properties = {});
    CMPIrc cleanup(bool terminating);
    CMPIInstanceMI* mi() const { return mi_; }

private:
    Broker& broker_;
    CMPIInstanceMI* mi_;
};

}  // namespace testbed
