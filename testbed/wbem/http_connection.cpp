// Reading requests, handing them to workers, and sending answers and streams, as coroutines.
#include "http_connection.h"

#include <algorithm>
#include <boost/asio/co_spawn.hpp>
#include <boost/asio/post.hpp>
#include <boost/asio/redirect_error.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/asio/use_awaitable.hpp>
#include <boost/beast/core/buffers_to_string.hpp>
#include <boost/beast/http/chunk_encode.hpp>
#include <boost/beast/http/parser.hpp>
#include <boost/beast/http/string_body.hpp>

#include "access.h"
#include "http_channel.h"

namespace testbed {
namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
using asio::use_awaitable;
using asio::ip::tcp;
using Clock = HttpConnection::Clock;
using RequestParser = http::request_parser<http::string_body>;
using Response = http::response<http::string_body>;
using Outcome = std::function<HttpOutcome()>;

constexpr std::size_t kReadSize = 16 * 1024;
/// However quiet a stream is, it is asked that often.
constexpr std::chrono::seconds kStreamPause{1};

/// The status that tells a client what is wrong with what it sends; 0 for one that has gone.
int refusalFor(const beast::error_code& error) {
    if (error == http::error::end_of_stream || error == http::error::partial_message) return 0;
    if (error == http::error::header_limit || error == http::error::buffer_overflow) return 431;
    if (error == http::error::body_limit) return 413;
    if (error == http::error::bad_version) return 505;
    return error.category() == make_error_code(http::error::bad_method).category() ? 400 : 0;
}

/// The status that refuses a request whose headers have arrived; 0 for one that is welcome.
int refusalFor(const RequestParser& parser) {
    const auto& request = parser.get();
    const auto coding = request.find(http::field::transfer_encoding);
    const auto expectation = request.find(http::field::expect);
    if (coding != request.end() && !beast::iequals(coding->value(), "chunked")) return 501;
    if (expectation != request.end() && !beast::iequals(expectation->value(), "100-continue")) {
        return 417;
    }
    const bool hasBody = parser.chunked() || parser.content_length();
    return !hasBody && request.method_string().ends_with("POST") ? 411 : 0;
}

HttpRequest requestFrom(http::request<http::string_body> message) {
    HttpRequest request{
        std::string(message.method_string()), std::string(message.target()), {}, {}};
    for (const auto& field : message) {
        request.headers.emplace_back(field.name_string(), field.value());
    }
    request.version = static_cast<int>(message.version());
    request.body = std::move(message.body());
    return request;
}

/// Status and headers, without those that tell how long the body is.
Response headOf(const HttpResponse& response, bool keep) {
    Response message;
    message.version(11);
    message.result(static_cast<unsigned>(response.status));
    for (const auto& [name, value] : response.headers) message.insert(name, value);
    message.set(http::field::connection, keep ? "keep-alive" : "close");
    return message;
}

http::fields fieldsOf(const HttpHeaders& headers) {
    http::fields fields;
    for (const auto& [name, value] : headers) fields.insert(name, value);
    return fields;
}

std::string namesOf(const HttpHeaders& headers) {
    std::string names;
    for (const auto& header : headers) names += (names.empty() ? "" : ", ") + header.first;
    return names;
}

/// What the client did ends its connection.
void require(const beast::error_code& error) {
    if (error) throw beast::system_error(error);
}

class Connection : public HttpConnection {
public:
    Connection(tcp::socket socket, const HttpServerOptions& options,
               const HttpServer::Handler& handler, const HttpWorkers& workers)
        : channel_(beast::tcp_stream(std::move(socket)),
                   2 * std::max(options.limits.head, kReadSize)),
          options_(options),
          handler_(handler),
          workers_(workers) {
        enter(Phase::Reading, options_.times.request);
    }

    void close() override { bottom().close(); }

    asio::awaitable<void> serve() override {
        const Welcome welcome = options_.welcome ? options_.welcome() : Welcome::Serve;
        if (welcome == Welcome::Reset) co_return reset();
        if (welcome == Welcome::Stall) co_await swallow();
        if (options_.tls) {
            channel_.secure(*options_.tls);
            require(co_await channel_.shakeHands(asio::ssl::stream_base::server));
        }
        for (bool keep = true; keep; enter(Phase::Reading, options_.times.idle)) {
            if (!channel_.hasReceived()) co_await receive();
            enter(Phase::Reading, options_.times.request);
            RequestParser parser;
            parser.header_limit(static_cast<std::uint32_t>(options_.limits.head));
            parser.body_limit(options_.limits.body);
            const int refusal = co_await read(parser);
            HttpResponse response{refusal, {}, {}};
            keep = refusal == 0 && parser.keep_alive();
            if (refusal == 0) response = co_await work(received(parser));
            keep = keep && !response.mishap.cutAt && !response.stream;
            co_await respond(std::move(response), keep);
        }
        co_await drain();
    }

private:
    beast::tcp_stream& bottom() { return channel_.socket(); }

    void enter(Phase phase, std::chrono::milliseconds limit) {
        note(phase);
        deadline_ = since() + limit;
        bottom().expires_at(deadline_);
    }

    /// The stream's own deadline does not stop a client whose bytes are always there already.
    void refuseLate() const {
        if (Clock::now() >= deadline_) throw beast::system_error(beast::error::timeout);
    }

    void reset() {
        bottom().socket().set_option(asio::socket_base::linger(true, 0));
        bottom().close();
    }

    /// Reads what comes, below TLS, until the client goes or has stayed for long.
    asio::awaitable<void> swallow() {
        bottom().expires_after(options_.times.stall);
        for (;;) {
            channel_.forgetReceived();
            require(co_await channel_.receive(kReadSize));
        }
    }

    asio::awaitable<void> receive() {
        require(co_await channel_.receive(kReadSize));
        refuseLate();
    }

    /// Reads a request whole: 0, or the status that refuses it.
    asio::awaitable<int> read(RequestParser& parser) {
        int refusal = 0;
        while (refusal == 0 && !parser.is_header_done()) refusal = co_await readSome(parser);
        if (refusal == 0) refusal = refusalFor(parser);
        const bool waits = refusal == 0 && parser.get().count(http::field::expect) > 0 &&
                           !parser.is_done() && !channel_.hasReceived();
        if (waits) co_await tellToGoOn();
        while (refusal == 0 && !parser.is_done()) refusal = co_await readSome(parser);
        co_return refusal;
    }

    asio::awaitable<int> readSome(RequestParser& parser) {
        refuseLate();
        const beast::error_code error = co_await channel_.readSome(parser);
        if (!error) co_return 0;
        const int refusal = refusalFor(error);
        if (refusal == 0) throw beast::system_error(error);
        co_return refusal;
    }

    asio::awaitable<void> tellToGoOn() {
        require(co_await channel_.write("HTTP/1.1 100 Continue\r\n\r\n"));
    }

    HttpRequest received(RequestParser& parser) {
        HttpRequest request = requestFrom(parser.release());
        request.isFromThisHost =
            !isPublic(bottom().socket().remote_endpoint().address().to_string());
        return request;
    }

    /// Runs `make` on one of the workers.
    static asio::awaitable<HttpOutcome> runOn(const asio::any_io_executor& workers,
                                              const Outcome& make) {
        const auto job = [&make]() -> asio::awaitable<HttpOutcome> {
            try {
                co_return make();
            } catch (const std::exception&) {
            }
            co_return HttpResponse{500, {}, {}};
        };
        co_return co_await asio::co_spawn(workers, job, use_awaitable);
    }

    /// Has workers answer the request.
    asio::awaitable<HttpResponse> work(HttpRequest request) {
        if (!bottom().socket().is_open()) throw beast::system_error(asio::error::operation_aborted);
        enter(Phase::Working, {});
        bottom().expires_never();
        const Outcome begin = [&] { return handler_(request); };
        HttpOutcome outcome = co_await runOn(workers_.quick, begin);
        if (const auto* slow = std::get_if<SlowWork>(&outcome)) {
            const Outcome finish = [rest = *slow] { return rest(); };
            outcome = co_await runOn(workers_.slow, finish);
        }
        co_return std::get<HttpResponse>(std::move(outcome));
    }

    asio::awaitable<void> respond(HttpResponse response, bool keep) {
        const HttpMishap& mishap = response.mishap;
        if (mishap.delay.count() > 0) {
            asio::steady_timer timer(bottom().get_executor(), mishap.delay);
            co_await timer.async_wait(use_awaitable);
        }
        enter(Phase::Writing, options_.times.response);
        auto message = headOf(response, keep);
        if (response.stream) co_return co_await follow(std::move(message), *response.stream);
        if (!mishap.trailers.empty()) {
            co_await writeWithTrailers(std::move(message), response);
            co_return;
        }
        message.content_length(response.body.size());
        std::string& body = response.body;
        if (mishap.cutAt && *mishap.cutAt < body.size()) {
            body.resize(*mishap.cutAt);  // the length stays that of the whole
        }
        require(co_await channel_.write(headText(message) + body));
    }

    asio::awaitable<void> writeWithTrailers(Response message, const HttpResponse& response) {
        message.set(http::field::trailer, namesOf(response.mishap.trailers));
        message.chunked(true);
        require(co_await channel_.write(headText(message)));
        if (!response.body.empty()) {
            const auto chunk = http::make_chunk(asio::buffer(response.body));
            require(co_await channel_.write(beast::buffers_to_string(chunk)));
        }
        const http::fields trailers = fieldsOf(response.mishap.trailers);
        const auto end = http::make_chunk_last(trailers);
        require(co_await channel_.write(beast::buffers_to_string(end)));
    }

    /// Sends what the stream has until the client goes. The connection ends with it, so that the
    /// body needs no length.
    asio::awaitable<void> follow(Response message, HttpStream& source) {
        const auto timer = std::make_shared<asio::steady_timer>(bottom().get_executor());
        source.onNews([executor = bottom().get_executor(), weak = std::weak_ptr(timer)] {
            asio::post(executor, [weak] {
                if (const auto waiting = weak.lock()) waiting->cancel();
            });
        });
        require(co_await channel_.write(headText(message)));
        for (;;) {
            enter(Phase::Streaming, options_.times.response);
            while (const HttpStream::Text text = source.next()) {
                require(co_await channel_.write(*text));
                enter(Phase::Streaming, options_.times.response);
            }
            bottom().expires_never();
            beast::error_code error;
            timer->expires_after(kStreamPause);
            co_await timer->async_wait(asio::redirect_error(use_awaitable, error));
            if (!bottom().socket().is_open()) {
                throw beast::system_error(asio::error::operation_aborted);
            }
        }
    }

    /// Closing while the client still sends would reset the connection and lose the response.
    asio::awaitable<void> drain() {
        enter(Phase::Draining, options_.times.drain);
        if (options_.tls) {
            require(co_await channel_.shutDownTls());
            co_return;
        }
        bottom().socket().shutdown(tcp::socket::shutdown_send);
        for (;;) {
            channel_.forgetReceived();
            co_await receive();
        }
    }

    HttpChannel channel_;
    const HttpServerOptions& options_;
    const HttpServer::Handler& handler_;
    const HttpWorkers& workers_;
    Clock::time_point deadline_;
};

}  // namespace

std::unique_ptr<HttpConnection> makeConnection(tcp::socket socket, const HttpServerOptions& options,
                                               const HttpServer::Handler& handler,
                                               const HttpWorkers& workers) {
    return std::make_unique<Connection>(std::move(socket), options, handler, workers);
}

}  // namespace testbed
