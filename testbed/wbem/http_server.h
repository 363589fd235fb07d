// An HTTP server that clients cannot hold up.
//
// One thread reads and writes all connections without waiting for any of them; only a request that
// has arrived whole takes a worker. What may take long is done by workers of its own, so that all
// other requests go on however much of it hangs. Connections, sizes and times are bounded: when
// there are too many, the one that has kept the server waiting the longest is closed for a new one.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include "http_message.h"
#include "tls_context.h"

namespace testbed {

struct HttpLimits {
    std::size_t head = 16 * 1024;   ///< bytes of request line and headers
    std::size_t body = 256 * 1024;  ///< bytes
};

/// What a client may take, from the first byte to the last, however it spreads them.
struct HttpTimes {
    std::chrono::milliseconds request{10'000};
    std::chrono::milliseconds idle{30'000};      ///< between two requests
    std::chrono::milliseconds response{30'000};  ///< to take a response
    std::chrono::milliseconds drain{2'000};      ///< to stop sending after a refusal
    std::chrono::minutes stall{60};              ///< to give up a connection that is stalled
};

/// What happens to a connection that a client has opened.
enum class Welcome {
    Serve,
    Reset,  ///< it is reset at once
    Stall,  ///< nothing is ever said on it, not even a TLS handshake's answer
};

struct HttpServerOptions {
    std::string address = "127.0.0.1";  ///< a numeric address, IPv4 or IPv6
    std::uint16_t port = 5988;          ///< 0: any that is free
    unsigned workers = 8;               ///< for what does not take long
    unsigned slowWorkers = 32;          ///< a request that its provider does not answer keeps one
    std::size_t connections = 4096;
    HttpLimits limits;
    HttpTimes times;
    std::shared_ptr<TlsContext> tls;  ///< serves HTTPS when there is one
    /// Asked for each connection, on the I/O thread; none: all are served.
    std::function<Welcome()> welcome = nullptr;
};

class HttpServer {
public:
    /// Called on a worker's thread, several at a time. An exception becomes status 500.
    using Handler = std::function<HttpOutcome(const HttpRequest&)>;

    /// Listens from now on. Throws std::runtime_error when it cannot.
    HttpServer(const HttpServerOptions& options, Handler handler);
    /// Waits for requests at work, then closes everything.
    ~HttpServer();
    HttpServer(const HttpServer&) = delete;
    HttpServer& operator=(const HttpServer&) = delete;

    std::uint16_t port() const;
    /// Stops listening, so that connections are refused, or begins again. Takes effect soon.
    void listen(bool wanted);

private:
    class Engine;
    std::unique_ptr<Engine> engine_;
};

/// Serves one connection, whose descriptor it closes, and has the calling thread do all of it.
/// Returns when the connection ends.
void serveHttp(int connected, const HttpServerOptions& options, const HttpServer::Handler& handler);

}  // namespace testbed
