// Accepting clients, making room when there are too many, and starting and ending the threads.
#include "http_server.h"

#include <algorithm>
#include <boost/asio/co_spawn.hpp>
#include <boost/asio/detached.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/post.hpp>
#include <boost/asio/redirect_error.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/asio/thread_pool.hpp>
#include <boost/asio/use_awaitable.hpp>
#include <list>
#include <stdexcept>
#include <thread>
#include <utility>

#include "http_connection.h"

namespace testbed {
namespace {

namespace asio = boost::asio;
using asio::use_awaitable;
using asio::ip::tcp;

constexpr std::chrono::milliseconds kPause{200};

tcp::acceptor listenOn(asio::io_context& io, const HttpServerOptions& options) {
    boost::system::error_code error;
    const tcp::endpoint endpoint(asio::ip::make_address(options.address, error), options.port);
    tcp::acceptor acceptor(io);
    if (!error) acceptor.open(endpoint.protocol(), error);
    if (!error) acceptor.set_option(tcp::acceptor::reuse_address(true), error);
    if (!error) acceptor.bind(endpoint, error);
    if (!error) acceptor.listen(tcp::acceptor::max_listen_connections, error);
    if (error) {
        throw std::runtime_error("cannot listen on " + options.address + " port " +
                                 std::to_string(options.port) + ": " + error.message());
    }
    return acceptor;
}

}  // namespace

class HttpServer::Engine {
public:
    Engine(const HttpServerOptions& options, Handler handler)
        : options_(options),
          handler_(std::move(handler)),
          acceptor_(listenOn(io_, options)),
          quick_(options.workers),
          slow_(options.slowWorkers) {
        options_.port = acceptor_.local_endpoint().port();
        asio::co_spawn(io_, accept(), asio::detached);
        thread_ = std::thread([this] { io_.run(); });
    }

    ~Engine() {
        io_.stop();
        thread_.join();
        for (asio::thread_pool* pool : {&quick_, &slow_}) pool->stop();
        for (asio::thread_pool* pool : {&quick_, &slow_}) pool->join();
    }

    std::uint16_t port() const { return options_.port; }

    void listen(bool wanted) {
        asio::post(io_, [this, wanted] {
            boost::system::error_code error;
            if (!wanted) {
                acceptor_.close(error);
            } else if (!acceptor_.is_open()) {
                acceptor_ = listenOn(io_, options_);
            }
        });
    }

private:
    asio::awaitable<void> accept() {
        for (;;) {
            boost::system::error_code error;
            tcp::socket socket =
                co_await acceptor_.async_accept(asio::redirect_error(use_awaitable, error));
            if (error) {
                co_await recover(error);
            } else if (connections_.size() < options_.connections || makeRoom()) {
                add(std::move(socket));
            }
        }
    }

    /// Out of descriptors: a client is given up for the next one. Else, and while nothing is to be
    /// accepted, there is a pause.
    asio::awaitable<void> recover(boost::system::error_code error) {
        const bool exhausted = error == asio::error::no_descriptors ||
                               error == boost::system::errc::too_many_files_open_in_system;
        if (exhausted && makeRoom()) co_return;
        asio::steady_timer timer(io_, kPause);
        co_await timer.async_wait(use_awaitable);
    }

    /// Closes the connection that the server owes least. False when all are at work.
    bool makeRoom() {
        const auto rank = [](const HttpConnection* connection) {
            return std::pair(connection->phase(), connection->since());
        };
        const auto victim =
            std::min_element(connections_.begin(), connections_.end(),
                             [&](const auto* a, const auto* b) { return rank(a) < rank(b); });
        if (victim == connections_.end() || (*victim)->phase() == HttpConnection::Phase::Working) {
            return false;
        }
        (*victim)->close();
        connections_.erase(victim);
        return true;
    }

    void add(tcp::socket socket) {
        auto connection = makeConnection(std::move(socket), options_, handler_, workers_);
        connections_.push_back(connection.get());
        asio::co_spawn(io_, serve(std::move(connection)), asio::detached);
    }

    asio::awaitable<void> serve(std::unique_ptr<HttpConnection> connection) {
        try {
            co_await connection->serve();
        } catch (const std::exception&) {
            // However a client ends, it is the end of its connection only.
        }
        connections_.remove(connection.get());
    }

    HttpServerOptions options_;
    Handler handler_;
    // In this order: what waits for a worker belongs to connections, and these to the context.
    asio::io_context io_{1};
    tcp::acceptor acceptor_;
    asio::thread_pool quick_, slow_;
    const HttpWorkers workers_{quick_.get_executor(), slow_.get_executor()};
    std::list<HttpConnection*> connections_;  // the I/O thread's; without those given up
    std::thread thread_;
};

HttpServer::HttpServer(const HttpServerOptions& options, Handler handler)
    : engine_(std::make_unique<Engine>(options, std::move(handler))) {}

HttpServer::~HttpServer() = default;

std::uint16_t HttpServer::port() const {
    return engine_->port();
}

void HttpServer::listen(bool wanted) {
    engine_->listen(wanted);
}

void serveHttp(int connected, const HttpServerOptions& options,
               const HttpServer::Handler& handler) {
    asio::io_context io{1};
    const HttpWorkers itself{io.get_executor(), io.get_executor()};
    const auto connection =
        makeConnection(tcp::socket(io, tcp::v4(), connected), options, handler, itself);
    // A client that has gone is the end of the connection, like any other.
    asio::co_spawn(io, connection->serve(), [](const std::exception_ptr&) {});
    io.run();
}

}  // namespace testbed
