// HTTP requests and responses, as far as WBEM needs them.
#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace testbed {

using HttpHeaders = std::vector<std::pair<std::string, std::string>>;

struct HttpRequest {
    std::string method;
    std::string target;
    int minorVersion = 1;  ///< of HTTP/1.x
    HttpHeaders headers;
    std::string body;

    /// The first header of that name, without regard to case; NULL when there is none.
    const std::string* header(std::string_view name) const;
    /// What the client wishes, by the version's default and the header Connection.
    bool keepsConnection() const;
};

struct HttpResponse {
    int status = 200;
    HttpHeaders headers;  ///< without Content-Length and Connection
    std::string body;
};

/// The response as it travels. `keepConnection` tells the client whether it may ask again.
std::string httpText(const HttpResponse& response, bool keepConnection);

}  // namespace testbed
