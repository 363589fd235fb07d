// One HTTP request, and its answer within bounds.
#pragma once

#include <string>
#include <string_view>

#include "byte_stream.h"
#include "http_message.h"

namespace testbed {

struct PostAnswer {
    int status = 0;
    std::string reason;
    HttpHeaders headers;
    std::string body;

    /// The first header of that name, without regard to case; "" without one.
    const std::string& header(std::string_view name) const;
};

struct PostRequest {
    std::string host;  ///< for the header Host
    std::string path;
    HttpHeaders headers;
    std::string body;
};

/// Posts the request and reads the answer; the server is asked to close afterwards. Throws
/// WbemError for an answer that is no HTTP, ends early, or has a body beyond `largestBody` bytes.
PostAnswer httpPost(ByteStream& stream, const PostRequest& request, std::size_t largestBody);

}  // namespace testbed
