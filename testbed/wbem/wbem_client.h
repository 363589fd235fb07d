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
    std::size_t largestAnswer = std::size_t{16} << 20;  ///< bytes of all answers together
    TlsOptions tls = {};
};

struct AskedOperation;

/// Each request has a connection of its own. A status that the server answers with, in its message,
/// in a header or behind the body, is in the response; whatever else keeps an answer away is a
/// WbemError. No text of either has the user's password. For one thread at a time.
class WbemClient {
public:
    explicit WbemClient(WbemUrl url, WbemClientOptions options = {});

    Response enumerateInstanceNames(const std::string& className,
                                    const std::string& nameSpace = "root/cimv2");
    /// Instances of subclasses come along, with all properties that they have.
    Response enumerateInstances(const std::string& className, const PropertyList& properties = {},
                                const std::string& nameSpace = "root/cimv2");
    Response getInstance(const ObjectPath& path, const PropertyList& properties = {});

private:
    /// Sends a request and reads what it is answered with.
    Response call(const AskedOperation& asked, const pugi::xml_document& request);
    /// Throws WbemError for all but HTTP's 200.
    PostAnswer post(const std::string& method, const std::string& nameSpace,
                    const std::string& body);
    /// A server's text in which neither the password nor its encoded form is left.
    std::string withoutSecrets(std::string text) const;

    WbemUrl url_;
    WbemClientOptions options_;
    std::string token_;         ///< user and password as HTTP has them
    std::size_t received_ = 0;  ///< bytes
};

}  // namespace testbed
