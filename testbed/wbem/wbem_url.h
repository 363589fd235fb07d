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
    std::string path = "/cimom";
    std::optional<Credentials> credentials;

    /// "host:port" for messages and the Host header; never has the credentials.
    std::string authority() const;
};

/// http[s]://[user[:password]@]host[:port][/path]; user and password may be percent-encoded. Ports
/// default to 5988 and, with https, 5989. Throws WbemError.
WbemUrl parseWbemUrl(const std::string& text);

}  // namespace testbed
