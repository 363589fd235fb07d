// The address of a WBEM server.
#pragma once

#include <optional>
#include <string>

#include "credentials.h"
#include "wbem_error.h"

namespace testbed {

struct WbemUrl {
    bool tls = false;
    std::string host;  ///< without the brackets of an IPv6 address
    unsigned short port = 5988;
    std::string path = "/cimom";  ///< where the server takes requests
    std::string nameSpace;        ///< what the URL's path names; "" without one
    std::optional<Credentials> credentials;
    bool hasPassword = false;  ///< false for http://user@host, which leaves it to others

    /// "host:port" for messages and the Host header; never has the credentials.
    std::string authority() const;
};

/// http[s]://[user[:password]@]host[:port][/namespace]; user, password and namespace may be
/// percent-encoded. The first /, ? or # ends what names the host. The path /cimom, the server's
/// own, names no namespace. Ports default to 5988 and, with https, 5989. Throws WbemError.
WbemUrl parseWbemUrl(const std::string& text);

}  // namespace testbed
