// HTTP requests and responses, as far as WBEM needs them.
#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace testbed {

using HttpHeaders = std::vector<std::pair<std::string, std::string>>;

/// The first header of that name, without regard to case; NULL when there is none.
const std::string* findHeader(const HttpHeaders& headers, std::string_view name);

struct HttpRequest {
    std::string method;
    std::string target;
    HttpHeaders headers;
    std::string body;

    const std::string* header(std::string_view name) const { return findHeader(headers, name); }
};

struct HttpResponse {
    int status = 200;
    HttpHeaders headers;  ///< without Content-Length and Connection
    std::string body;
};

}  // namespace testbed
