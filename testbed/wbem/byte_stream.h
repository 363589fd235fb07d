// A connection to a server, every step of which ends at a deadline.
#pragma once

#include <chrono>
#include <cstddef>
#include <memory>
#include <string>
#include <string_view>

#include "wbem_error.h"

namespace testbed {

using Deadline = std::chrono::steady_clock::time_point;

class ByteStream {
public:
    virtual ~ByteStream() = default;
    /// At least one byte, or 0 when the peer has ended the stream. Throws WbemError.
    virtual std::size_t read(char* buffer, std::size_t size) = 0;
    /// All of it. Throws WbemError.
    virtual void write(std::string_view bytes) = 0;
};

/// Tries the host's addresses one after the other. Looking the name up is not bounded by the
/// deadline. Throws WbemError.
std::unique_ptr<ByteStream> connectTcp(const std::string& host, unsigned short port,
                                       Deadline deadline);

/// How the server's certificate is judged.
struct TlsOptions {
    std::string authorities;  ///< file with certificates to trust; "" for the system's
    bool verify = true;
};

/// Carries out the handshake. Throws WbemError.
std::unique_ptr<ByteStream> startTls(std::unique_ptr<ByteStream> transport, const std::string& host,
                                     const TlsOptions& options);

}  // namespace testbed
