// HTTP requests and responses, as far as WBEM needs them.
#pragma once

#include <chrono>
#include <functional>
#include <memory>
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
    int version = 11;             ///< 10 or 11
    bool isFromThisHost = false;  ///< over a loopback address

    const std::string* header(std::string_view name) const { return findHeader(headers, name); }
};

/// What befalls a response on its way, so that authors of clients see it happen.
struct HttpMishap {
    std::chrono::milliseconds delay{0};  ///< before the first byte
    std::optional<std::size_t> cutAt;    ///< bytes of the body, then the connection ends
    HttpHeaders trailers;                ///< behind a body that comes in chunks
};

/// A body that goes on for as long as its client stays.
class HttpStream {
public:
    using Text = std::shared_ptr<const std::string>;

    virtual ~HttpStream() = default;
    /// What there is to send now; NULL for nothing. Called on the I/O thread when the stream has
    /// been woken, and once a second; must not wait. A client that has gone is noticed by sending.
    virtual Text next() = 0;
    /// From now on, `wake` is called when there may be something to send; it can be called by any
    /// thread, but not after the stream has been destroyed.
    virtual void onNews(std::function<void()> wake) = 0;
};

struct HttpResponse {
    int status = 200;
    HttpHeaders headers;  ///< without Content-Length and Connection
    std::string body;
    HttpMishap mishap = {};
    std::shared_ptr<HttpStream> stream = nullptr;  ///< in the place of body and mishap
};

/// Makes a response in its own time.
using SlowWork = std::function<HttpResponse()>;
/// What becomes of a request: the response, or work that may take long and must hold up nobody.
using HttpOutcome = std::variant<HttpResponse, SlowWork>;

}  // namespace testbed
