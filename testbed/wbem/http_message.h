// HTTP requests and responses, as far as WBEM needs them.
#pragma once

#include <chrono>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
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
    int version = 11;  ///< 10 or 11

    const std::string* header(std::string_view name) const { return findHeader(headers, name); }
};

/// What befalls a response on its way, so that authors of clients see it happen.
struct HttpMishap {
    std::chrono::milliseconds delay{0};  ///< before the first byte
    std::optional<std::size_t> cutAt;    ///< bytes of the body, then the connection ends
    HttpHeaders trailers;                ///< behind a body that comes in chunks
};

struct HttpResponse {
    int status = 200;
    HttpHeaders headers;  ///< without Content-Length and Connection
    std::string body;
    HttpMishap mishap = {};
};

/// Makes a response in its own time.
using SlowWork = std::function<HttpResponse()>;
/// What becomes of a request: the response, or work that may take long and must hold up nobody.
using HttpOutcome = std::variant<HttpResponse, SlowWork>;

}  // namespace testbed
