// A WBEM client: instance operations as CIM-XML over HTTP or HTTPS, on any server.
#pragma once

#include <pugixml.hpp>
#include <string>

#include "http_post.h"
#include "instance_client.h"
#include "wbem_url.h"

namespace testbed {

struct WbemClientOptions {
    Deadline deadline = Deadline::max();                ///< for everything that the client does
    std::size_t largestAnswer = std::size_t{64} << 20;  ///< bytes
    TlsOptions tls;
};

/// Each request has a connection of its own. A status that the server answers with is in the
/// response; whatever else keeps an answer away is a WbemError.
class WbemClient {
public:
    explicit WbemClient(WbemUrl url, WbemClientOptions options = {});

    Response enumerateInstanceNames(const std::string& className,
                                    const std::string& nameSpace = "root/cimv2") const;
    /// Instances of subclasses come along, with all properties that they have.
    Response enumerateInstances(const std::string& className, const PropertyList& properties = {},
                                const std::string& nameSpace = "root/cimv2") const;
    Response getInstance(const ObjectPath& path, const PropertyList& properties = {}) const;

private:
    /// Sends an operation whose message is `request`, and reads what it returns into `response`.
    void call(const std::string& method, const std::string& nameSpace,
              const pugi::xml_document& request, Response& response) const;
    /// The body of the server's answer. Throws WbemError for all but HTTP's 200.
    std::string post(const std::string& method, const std::string& nameSpace,
                     const std::string& body) const;

    WbemUrl url_;
    WbemClientOptions options_;
};

}  // namespace testbed
