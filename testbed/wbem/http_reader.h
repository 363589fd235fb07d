// Reads HTTP/1 requests out of what arrives, in pieces of any size and with every size bounded.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "http_message.h"

namespace testbed {

struct HttpLimits {
    std::size_t head = 16 * 1024;   ///< bytes of request line and headers, and of trailers
    std::size_t body = 256 * 1024;  ///< bytes
};

class HttpReader {
public:
    enum class Progress {
        NeedsMore,
        WantsContinue,  ///< the client waits for "100 Continue"; reported once
        Complete,       ///< take() gives the request
        Refused         ///< refusal() tells the status; nothing more can be read
    };

    explicit HttpReader(const HttpLimits& limits) : limits_(limits) {}

    /// Takes what has arrived and reads on.
    Progress add(std::string_view bytes);
    /// The request that is complete. Reading begins anew with what has arrived behind it; add("")
    /// tells how far that goes.
    HttpRequest take();
    /// The HTTP status that says why the request was refused.
    int refusal() const { return refusal_; }
    /// True when nothing of a request has arrived.
    bool isIdle() const { return state_ == State::RequestLine && input_.empty(); }

private:
    enum class State {
        RequestLine,
        Headers,
        Body,
        ChunkSize,
        ChunkData,
        ChunkEnd,
        Trailers,
        Complete,
        Refused
    };

    bool step();
    bool takeLine(std::string& line);
    bool refuse(int status);
    bool readRequestLine(std::string line);
    bool readHeader(const std::string& line);
    bool endHeaders();
    bool readLength(const std::string& text);
    bool readChunkSize(const std::string& line);
    bool readBody(State next);

    HttpLimits limits_;
    State state_ = State::RequestLine;
    std::string input_;
    std::size_t searched_ = 0;   // of input_, without a line end
    std::size_t headSize_ = 0;   // bytes of lines that have been read
    std::size_t remaining_ = 0;  // bytes of the body or the chunk that have not been read
    bool wantsContinue_ = false;
    int refusal_ = 0;
    HttpRequest request_;
};

}  // namespace testbed
