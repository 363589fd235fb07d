// A CIM-XML server in the test's own process, over a small repository and a fake provider.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <pugixml.hpp>
#include <string>
#include <vector>

#include "cim_server.h"
#include "fake_provider.h"
#include "http_server.h"
#include "raw_client.h"

namespace testbed {

/// The path of a box or a disk in root/vendor.
ObjectPath vendorPath(const char* className, const char* name);
/// A namespace path in XML.
std::string localNamespace(const std::string& nameSpace);
/// The message for an intrinsic operation; `parameters` are IPARAMVALUE elements.
std::string callMessage(const std::string& method, const std::string& parameters,
                        const std::string& nameSpace = "root/cimv2");
/// The whole HTTP request for a message; `headers` replace CIMOperation, CIMMethod and CIMObject.
std::string httpRequest(const std::string& headers, const std::string& body);
std::string callHeaders(const std::string& method, const std::string& nameSpace = "root/cimv2");
std::string callRequest(const std::string& method, const std::string& parameters,
                        const std::string& nameSpace = "root/cimv2");

// Parameters.
std::string classNameParameter(const std::string& className, const char* name = "ClassName");
std::string valueParameter(const char* name, const std::string& value);
std::string listParameter(const char* name, const std::vector<std::string>& values);
/// An instance name with string keys.
std::string instanceNameParameter(const char* name, const std::string& className,
                                  const std::vector<std::pair<std::string, std::string>>& keys);

/// root/cimv2: CIM_Thing (Name, Caption) > CIM_Disk (Caption again, Size), below it the provider's
/// Served_Disk (Speed) and Local_Disk, which the repository has an instance of.
/// root/vendor: Vendor_Box and Vendor_Disk, joined by Vendor_Holds.
class WbemFixture : public ::testing::Test {
protected:
    WbemFixture();

    void serve(HttpServerOptions options = {}, std::optional<Credentials> credentials = {});
    std::uint16_t port() const { return http_->port(); }

    /// The answer's text when the operation succeeds; "status N: DESCRIPTION" when it does not,
    /// "HTTP N CIMError" when HTTP said no.
    std::string call(const std::string& method, const std::string& parameters,
                     const std::string& nameSpace = "root/cimv2");
    /// The answer's texts at an XPath.
    std::vector<std::string> callFor(const std::string& path, const std::string& method,
                                     const std::string& parameters,
                                     const std::string& nameSpace = "root/cimv2");
    /// Still answers a good request.
    bool isAlive();

    Repository repository_;
    Broker broker_{repository_};
    FakeProvider provider_{broker_};
    ServerFaults faults_;
    std::unique_ptr<ObjectManager> manager_;
    std::unique_ptr<CimServer> cim_;
    std::unique_ptr<HttpServer> http_;
};

}  // namespace testbed
