// A client that sends exactly the bytes it is told to.
#pragma once

#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "file_descriptor.h"

namespace testbed {

/// What came back; status 0 when the server closed without an answer.
struct Reply {
    int status = 0;
    std::vector<std::pair<std::string, std::string>> headers;
    std::string body;

    /// "" without such a header.
    std::string header(std::string_view name) const;
};

class RawClient {
public:
    /// Throws std::runtime_error when there is no connection.
    explicit RawClient(std::uint16_t port);

    /// False when the server has closed.
    bool send(std::string_view bytes);
    /// Says that nothing more will be sent.
    void endSending();
    /// The next answer; as far as it came when the server closes or the time is over.
    Reply receive(std::chrono::milliseconds limit = std::chrono::seconds(20));
    /// Everything as it comes, up to the `count`th `mark` and with it; less when the server closes
    /// or the time is over.
    std::string receiveUntil(std::string_view mark, int count);
    /// True when the server closes the connection within the time.
    bool isClosedWithin(std::chrono::milliseconds limit);

private:
    bool waitForBytes(std::chrono::steady_clock::time_point deadline);

    FileDescriptor socket_;
    std::string arrived_;
};

/// One request on a connection of its own.
Reply exchange(std::uint16_t port, std::string_view request);

}  // namespace testbed
