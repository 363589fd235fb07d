// One client's connection to an HTTP server, in the clear or over TLS.
#pragma once

// First: this release of Asio forgets to include what it takes from <utility>.
#include "http_server.h"

#include <boost/asio/any_io_executor.hpp>
#include <boost/asio/awaitable.hpp>
#include <boost/asio/ip/tcp.hpp>

namespace testbed {

/// Who answers: workers for what does not take long, and others.
struct HttpWorkers {
    boost::asio::any_io_executor quick, slow;
};

/// For the I/O thread, but for what it hands to the workers.
class HttpConnection {
public:
    using Clock = std::chrono::steady_clock;
    /// Before Working a connection may be given up for another one; the first ones are first.
    enum class Phase { Draining, Reading, Streaming, Writing, Working };

    HttpConnection() = default;
    virtual ~HttpConnection() = default;
    HttpConnection(const HttpConnection&) = delete;
    HttpConnection& operator=(const HttpConnection&) = delete;

    Phase phase() const { return phase_; }
    Clock::time_point since() const { return since_; }  ///< of the phase
    virtual void close() = 0;
    /// Answers one request after the other. Throws when the client has gone, is late, or was
    /// given up.
    virtual boost::asio::awaitable<void> serve() = 0;

protected:
    void note(Phase phase) {
        phase_ = phase;
        since_ = Clock::now();
    }

private:
    Phase phase_ = Phase::Reading;
    Clock::time_point since_ = Clock::now();
};

/// A connection over TLS when the options have a context for it, else one in the clear. The
/// options, the handler and the workers must outlive it.
std::unique_ptr<HttpConnection> makeConnection(boost::asio::ip::tcp::socket socket,
                                               const HttpServerOptions& options,
                                               const HttpServer::Handler& handler,
                                               const HttpWorkers& workers);

}  // namespace testbed
