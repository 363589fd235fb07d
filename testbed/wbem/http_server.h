// An HTTP server that clients cannot hold up.
//
// One thread reads and writes all connections without waiting for any of them; only a request that
// has arrived whole takes a worker. Connections, sizes and times are bounded: when there are too
// many, the one that has kept the server waiting the longest is closed for a new one.
#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "file_descriptor.h"
#include "http_connection.h"
#include "http_message.h"
#include "worker_pool.h"

namespace testbed {

struct HttpServerOptions {
    std::string address = "127.0.0.1";  ///< a numeric address, IPv4 or IPv6
    std::uint16_t port = 5988;          ///< 0: any that is free
    unsigned workers = 16;              ///< a request that its provider does not answer keeps one
    std::size_t connections = 256;
    HttpLimits limits;
    HttpTimes times;
};

class HttpServer {
public:
    /// Called on a worker's thread, several at a time. An exception becomes status 500.
    using Handler = std::function<HttpResponse(const HttpRequest&)>;

    /// Listens from now on. Throws std::runtime_error when it cannot.
    HttpServer(const HttpServerOptions& options, Handler handler);
    /// Waits for requests at work, then closes everything.
    ~HttpServer();
    HttpServer(const HttpServer&) = delete;
    HttpServer& operator=(const HttpServer&) = delete;

    std::uint16_t port() const { return port_; }

private:
    struct Answer {
        std::uint64_t connection;
        HttpResponse response;
    };
    using Connections = std::map<std::uint64_t, HttpConnection>;

    void run();
    void acceptAll();
    bool makeRoom();
    void add(FileDescriptor socket);
    void handle(std::uint64_t id, std::uint32_t events);
    /// Hands a complete request to a worker, arms the socket for what is awaited, or closes.
    void follow(Connections::iterator position);
    void work(std::uint64_t id, const HttpRequest& request);
    void deliverAnswers();
    void closeLate();

    HttpServerOptions options_;
    Handler handler_;
    FileDescriptor listener_;
    FileDescriptor epoll_;
    FileDescriptor wake_;  // an eventfd: an answer is there, or the server stops
    std::uint16_t port_ = 0;
    std::atomic<bool> stopping_ = false;

    std::uint64_t nextId_ = 2;  // the I/O thread's, as connections_; 0 and 1 are not connections
    Connections connections_;

    std::mutex answersMutex_;
    std::vector<Answer> answers_;  // guarded by answersMutex_
    std::unique_ptr<WorkerPool> pool_;
    std::thread thread_;
};

}  // namespace testbed
