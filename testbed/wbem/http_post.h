// One HTTP request, and its answer within bounds.
#pragma once

#include <chrono>
#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

#include "http_message.h"
#include "wbem_error.h"

namespace testbed {

using Deadline = std::chrono::steady_clock::time_point;

/// How the server's certificate is judged.
struct TlsOptions {
    std::string authorities;  ///< file with certificates to trust; "" for the system's
    bool verify = true;
};

struct PostRequest {
    std::string host;  ///< a name or a numeric address
    unsigned short port = 0;
    std::optional<TlsOptions> tls;  ///< plain HTTP without
    std::string authority;          ///< for the header Host
    std::string path;
    HttpHeaders headers;
    std::string body;
};

/// What the answer may take.
struct PostBounds {
    Deadline deadline = Deadline::max();
    std::size_t largestBody = 0;  ///< bytes
};

struct PostAnswer {
    int status = 0;
    std::string reason;
    HttpHeaders headers;  ///< trailers, which follow a chunked body, among them
    std::string body;

    /// The first header of that name, without regard to case; "" without one.
    std::string header(std::string_view name) const;
};

/// Posts the request on a connection of its own and reads the answer. Looking the host up is not
/// bounded by the deadline. Throws WbemError for a server that cannot be reached or not be trusted,
/// and for an answer that is no HTTP, ends early, or is beyond the bounds.
PostAnswer httpPost(const PostRequest& request, const PostBounds& bounds);
/// The same on a connection that is there already, whose descriptor it closes.
PostAnswer httpPostOn(int connected, const PostRequest& request, const PostBounds& bounds);

}  // namespace testbed
