#include "http_server.h"

#include <algorithm>
#include <boost/asio/co_spawn.hpp>
#include <boost/asio/detached.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/redirect_error.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/asio/thread_pool.hpp>
#include <boost/asio/use_awaitable.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/http.hpp>
#include <list>
#include <stdexcept>
#include <thread>
#include <utility>

namespace testbed {
namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
using asio::use_awaitable;
using asio::ip::tcp;
using Clock = std::chrono::steady_clock;
using Parser = http::request_parser<http::string_body>;

constexpr std::chrono::milliseconds kPause{200};  // when there are no descriptors left
constexpr std::size_t kReadSize = 16 * 1024;

/// The status that tells a client what is wrong with what it sends; 0 for one that has gone.
int refusalFor(const beast::error_code& error) {
    if (error == http::error::end_of_stream || error == http::error::partial_message) return 0;
    if (error == http::error::header_limit || error == http::error::buffer_overflow) return 431;
    if (error == http::error::body_limit) return 413;
    if (error == http::error::bad_version) return 505;
    return error.category() == make_error_code(http::error::bad_method).category() ? 400 : 0;
}

/// The status that refuses a request whose headers have arrived; 0 for one that is welcome.
int refusalFor(const Parser& parser) {
    const auto& request = parser.get();
    const auto coding = request.find(http::field::transfer_encoding);
    const auto expectation = request.find(http::field::expect);
    if (coding != request.end() && !beast::iequals(coding->value(), "chunked")) return 501;
    if (expectation != request.end() && !beast::iequals(expectation->value(), "100-continue"))
        return 417;
    const bool hasBody = parser.chunked() || parser.content_length();
    return !hasBody && request.method_string().ends_with("POST") ? 411 : 0;
}

HttpRequest requestFrom(http::request<http::string_body> message) {
    HttpRequest request{
        std::string(message.method_string()), std::string(message.target()), {}, {}};
    for (const auto& field : message)
        request.headers.emplace_back(field.name_string(), field.value());
    request.body = std::move(message.body());
    return request;
}

http::response<http::string_body> messageFrom(HttpResponse response, bool keep) {
    http::response<http::string_body> message;
    message.version(11);
    message.result(static_cast<unsigned>(response.status));
    for (const auto& [name, value] : response.headers) message.insert(name, value);
    message.set(http::field::connection, keep ? "keep-alive" : "close");
    message.body() = std::move(response.body);
    message.prepare_payload();
    return message;
}

/// One client's connection. For the I/O thread, but for what it hands to the workers.
class Connection {
public:
    /// Before Working a connection may be given up for another one; the first ones are first.
    enum class Phase { Draining, Reading, Writing, Working };

    Connection(tcp::socket socket, const HttpServerOptions& options,
               const HttpServer::Handler& handler, asio::thread_pool& workers)
        : stream_(std::move(socket)),
          options_(options),
          handler_(handler),
          workers_(workers),
          buffer_(2 * std::max(options.limits.head, kReadSize)) {
        enter(Phase::Reading, options_.times.request);
    }

    Phase phase() const { return phase_; }
    Clock::time_point since() const { return since_; }  ///< of the phase
    void close() { stream_.close(); }

    /// Answers one request after the other. Throws when the client has gone, is late, or was
    /// given up.
    asio::awaitable<void> serve() {
        for (bool keep = true; keep; enter(Phase::Reading, options_.times.idle)) {
            if (buffer_.size() == 0) co_await receive();
            enter(Phase::Reading, options_.times.request);
            Parser parser;
            parser.header_limit(static_cast<std::uint32_t>(options_.limits.head));
            parser.body_limit(options_.limits.body);
            const int refusal = co_await read(parser);
            HttpResponse response{refusal, {}, {}};
            keep = refusal == 0 && parser.keep_alive();
            if (refusal == 0) response = co_await work(requestFrom(parser.release()));
            co_await respond(messageFrom(std::move(response), keep));
        }
        co_await drain();
    }

private:
    void enter(Phase phase, std::chrono::milliseconds limit) {
        phase_ = phase;
        since_ = Clock::now();
        deadline_ = since_ + limit;
        stream_.expires_at(deadline_);
    }

    /// The stream's own deadline does not stop a client whose bytes are always there already.
    void refuseLate() const {
        if (Clock::now() >= deadline_) throw beast::system_error(beast::error::timeout);
    }

    asio::awaitable<void> receive() {
        buffer_.commit(co_await stream_.async_read_some(buffer_.prepare(kReadSize), use_awaitable));
        refuseLate();
    }

    /// Reads a request whole: 0, or the status that refuses it.
    asio::awaitable<int> read(Parser& parser) {
        int refusal = 0;
        while (refusal == 0 && !parser.is_header_done()) refusal = co_await readSome(parser);
        if (refusal == 0) refusal = refusalFor(parser);
        const bool waits = refusal == 0 && parser.get().count(http::field::expect) > 0 &&
                           !parser.is_done() && buffer_.size() == 0;
        if (waits) co_await tellToGoOn();
        while (refusal == 0 && !parser.is_done()) refusal = co_await readSome(parser);
        co_return refusal;
    }

    asio::awaitable<int> readSome(Parser& parser) {
        refuseLate();
        beast::error_code error;
        co_await http::async_read_some(stream_, buffer_, parser,
                                       asio::redirect_error(use_awaitable, error));
        if (!error) co_return 0;
        const int refusal = refusalFor(error);
        if (refusal == 0) throw beast::system_error(error);
        co_return refusal;
    }

    asio::awaitable<void> tellToGoOn() {
        constexpr std::string_view kContinue = "HTTP/1.1 100 Continue\r\n\r\n";
        co_await asio::async_write(stream_, asio::buffer(kContinue), use_awaitable);
    }

    /// Has a worker answer the request.
    asio::awaitable<HttpResponse> work(HttpRequest request) {
        if (!stream_.socket().is_open()) throw beast::system_error(asio::error::operation_aborted);
        enter(Phase::Working, {});
        stream_.expires_never();
        const auto job = [&handler = handler_, &request]() -> asio::awaitable<HttpResponse> {
            try {
                co_return handler(request);
            } catch (const std::exception&) {
            }
            co_return HttpResponse{500, {}, {}};
        };
        co_return co_await asio::co_spawn(workers_.get_executor(), job, use_awaitable);
    }

    asio::awaitable<void> respond(http::response<http::string_body> message) {
        enter(Phase::Writing, options_.times.response);
        co_await http::async_write(stream_, message, use_awaitable);
    }

    /// Closing while the client still sends would reset the connection and lose the response.
    asio::awaitable<void> drain() {
        stream_.socket().shutdown(tcp::socket::shutdown_send);
        enter(Phase::Draining, options_.times.drain);
        for (;;) {
            buffer_.clear();
            co_await receive();
        }
    }

    beast::tcp_stream stream_;
    const HttpServerOptions& options_;
    const HttpServer::Handler& handler_;
    asio::thread_pool& workers_;
    beast::flat_buffer buffer_;
    Phase phase_ = Phase::Reading;
    Clock::time_point since_;
    Clock::time_point deadline_;
};

tcp::acceptor listenOn(asio::io_context& io, const HttpServerOptions& options) {
    beast::error_code error;
    const tcp::endpoint endpoint(asio::ip::make_address(options.address, error), options.port);
    tcp::acceptor acceptor(io);
    if (!error) acceptor.open(endpoint.protocol(), error);
    if (!error) acceptor.set_option(tcp::acceptor::reuse_address(true), error);
    if (!error) acceptor.bind(endpoint, error);
    if (!error) acceptor.listen(tcp::acceptor::max_listen_connections, error);
    if (error)
        throw std::runtime_error("cannot listen on " + options.address + " port " +
                                 std::to_string(options.port) + ": " + error.message());
    return acceptor;
}

}  // namespace

class HttpServer::Engine {
public:
    Engine(const HttpServerOptions& options, Handler handler)
        : options_(options),
          handler_(std::move(handler)),
          acceptor_(listenOn(io_, options)),
          workers_(options.workers) {
        asio::co_spawn(io_, accept(), asio::detached);
        thread_ = std::thread([this] { io_.run(); });
    }

    ~Engine() {
        io_.stop();
        thread_.join();
        workers_.stop();
        workers_.join();
    }

    std::uint16_t port() const { return acceptor_.local_endpoint().port(); }

private:
    asio::awaitable<void> accept() {
        for (;;) {
            beast::error_code error;
            tcp::socket socket =
                co_await acceptor_.async_accept(asio::redirect_error(use_awaitable, error));
            if (error)
                co_await recover(error);
            else if (connections_.size() < options_.connections || makeRoom())
                add(std::move(socket));
        }
    }

    /// Out of descriptors: a client is given up for the next one, or there is a pause.
    asio::awaitable<void> recover(beast::error_code error) {
        const bool exhausted = error == asio::error::no_descriptors ||
                               error == boost::system::errc::too_many_files_open_in_system;
        if (exhausted && makeRoom()) co_return;
        asio::steady_timer timer(io_, kPause);
        co_await timer.async_wait(use_awaitable);
    }

    /// Closes the connection that the server owes least. False when all are at work.
    bool makeRoom() {
        const auto rank = [](const Connection* connection) {
            return std::pair(connection->phase(), connection->since());
        };
        const auto victim =
            std::min_element(connections_.begin(), connections_.end(),
                             [&](const auto* a, const auto* b) { return rank(a) < rank(b); });
        if (victim == connections_.end() || (*victim)->phase() == Connection::Phase::Working)
            return false;
        (*victim)->close();
        connections_.erase(victim);
        return true;
    }

    void add(tcp::socket socket) {
        auto connection =
            std::make_unique<Connection>(std::move(socket), options_, handler_, workers_);
        connections_.push_back(connection.get());
        asio::co_spawn(io_, serve(std::move(connection)), asio::detached);
    }

    asio::awaitable<void> serve(std::unique_ptr<Connection> connection) {
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
    asio::thread_pool workers_;
    std::list<Connection*> connections_;  // the I/O thread's; without those given up
    std::thread thread_;
};

HttpServer::HttpServer(const HttpServerOptions& options, Handler handler)
    : engine_(std::make_unique<Engine>(options, std::move(handler))) {}

HttpServer::~HttpServer() = default;

std::uint16_t HttpServer::port() const {
    return engine_->port();
}

}  // namespace testbed
