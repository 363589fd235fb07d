// Connecting, shaking hands, sending and receiving, each before the deadline.
#include "http_post.h"

#include <openssl/ssl.h>
#include <openssl/x509v3.h>

#include <boost/asio/co_spawn.hpp>
#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/redirect_error.hpp>
#include <boost/asio/ssl.hpp>
#include <boost/asio/use_awaitable.hpp>
#include <boost/asio/use_future.hpp>
#include <boost/beast/http/parser.hpp>
#include <boost/beast/http/string_body.hpp>
#include <cerrno>
#include <fstream>
#include <system_error>
#include <utility>

#include "http_channel.h"

namespace testbed {
namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
namespace ssl = asio::ssl;
using asio::use_awaitable;
using asio::ip::tcp;
using Clock = std::chrono::steady_clock;
using ResponseParser = http::response_parser<http::string_body>;

constexpr const char* kLate = "no answer in time";
constexpr std::uint32_t kLargestHead = 64 * 1024;
constexpr std::size_t kBufferSize = std::size_t{2} * kLargestHead;

bool isOfTls(const beast::error_code& error) {
    return error.category() == asio::error::get_ssl_category() ||
           error.category() == ssl::error::get_stream_category();
}

[[noreturn]] void failTls(const beast::error_code& error) {
    const bool cut = error == ssl::error::stream_truncated || error == asio::error::eof;
    throw WbemError("TLS failed: " + (cut ? "the connection was cut" : error.message()));
}

/// Throws what a failed step means; `what` is for an error of the connection.
[[noreturn]] void fail(const std::string& what, const beast::error_code& error) {
    if (error == beast::error::timeout) throw WbemError(kLate);
    if (isOfTls(error)) failTls(error);
    throw WbemError(what + ": " + error.message());
}

void requireReadable(const std::string& file) {
    errno = 0;
    std::ifstream stream(file);
    if (stream && (stream.peek(), errno == 0)) return;
    throw WbemError(file + ": " + std::generic_category().message(errno));
}

ssl::context contextFor(const TlsOptions& options) {
    ssl::context context(ssl::context::tls_client);
    SSL_CTX_set_min_proto_version(context.native_handle(), TLS1_2_VERSION);
    if (!options.verify) return context;
    context.set_verify_mode(ssl::verify_peer);
    beast::error_code error;
    if (options.authorities.empty()) {
        context.set_default_verify_paths(error);
        return context;
    }
    requireReadable(options.authorities);
    context.load_verify_file(options.authorities, error);
    if (error) throw WbemError(options.authorities + ": no certificates in PEM form in this file");
    return context;
}

/// OpenSSL compares the name itself, so that its verdict tells what is wrong.
void expectHost(SSL* session, const std::string& host, bool verify) {
    beast::error_code error;
    asio::ip::make_address(host, error);
    const bool isAddress = !error;
    if (!isAddress) SSL_set_tlsext_host_name(session, host.c_str());
    if (!verify) return;
    if (isAddress) {
        X509_VERIFY_PARAM_set1_ip_asc(SSL_get0_param(session), host.c_str());
    } else {
        SSL_set1_host(session, host.c_str());
    }
}

http::request_header<> headOf(const PostRequest& request) {
    http::request<http::string_body> message(http::verb::post, request.path, 11);
    message.set(http::field::host, request.authority);
    message.keep_alive(false);
    message.set(http::field::te, "trailers");  // a status may follow the body
    for (const auto& [name, value] : request.headers) message.insert(name, value);
    message.content_length(request.body.size());
    return std::move(message.base());
}

PostAnswer answerFrom(http::response<http::string_body> message) {
    PostAnswer answer{
        static_cast<int>(message.result_int()), std::string(message.reason()), {}, {}};
    for (const auto& field : message) {
        answer.headers.emplace_back(field.name_string(), field.value());
    }
    answer.body = std::move(message.body());
    return answer;
}

class Post {
public:
    Post(const PostRequest& request, const PostBounds& bounds)
        : request_(request), bounds_(bounds) {}

    PostAnswer run() {
        const auto whole = [this]() -> asio::awaitable<PostAnswer> {
            co_return co_await exchange(co_await connect());
        };
        return finish(whole());
    }
    PostAnswer runOn(int connected) {
        return finish(exchange(beast::tcp_stream(tcp::socket(io_, tcp::v4(), connected))));
    }

private:
    PostAnswer finish(asio::awaitable<PostAnswer> work) {
        auto answer = asio::co_spawn(io_, std::move(work), asio::use_future);
        io_.run();
        return answer.get();
    }

    asio::awaitable<PostAnswer> exchange(beast::tcp_stream stream) {
        HttpChannel channel(std::move(stream), kBufferSize);
        channel.socket().expires_at(bounds_.deadline);
        if (!request_.tls) co_return co_await ask(channel);
        ssl::context context = contextFor(*request_.tls);
        SSL* session = channel.secure(context).native_handle();
        expectHost(session, request_.host, request_.tls->verify);
        co_await shakeHands(channel, session);
        co_return co_await ask(channel);
    }

    tcp::resolver::results_type addresses() {
        beast::error_code error;
        auto found =
            tcp::resolver(io_).resolve(request_.host, std::to_string(request_.port), error);
        if (error) throw WbemError("the host is not known: " + error.message());
        return found;
    }

    /// Tries the host's addresses one after the other.
    asio::awaitable<beast::tcp_stream> connect() {
        const auto found = addresses();
        std::size_t left = found.size();
        beast::error_code error;
        for (const auto& address : found) {
            beast::tcp_stream stream(io_);
            stream.expires_at(deadlineWith(--left));
            co_await stream.async_connect(address.endpoint(),
                                          asio::redirect_error(use_awaitable, error));
            if (!error) co_return stream;
        }
        if (error == beast::error::timeout) error = asio::error::timed_out;
        throw WbemError("no connection: " + error.message());
    }

    /// An address that never answers must leave time for the others.
    Deadline deadlineWith(std::size_t others) const {
        const Deadline now = Clock::now();
        return others == 0 || now >= bounds_.deadline ? bounds_.deadline
                                                      : now + (bounds_.deadline - now) / 2;
    }

    static asio::awaitable<void> shakeHands(HttpChannel& channel, SSL* session) {
        const beast::error_code error = co_await channel.shakeHands(ssl::stream_base::client);
        if (!error) co_return;
        const long verdict = SSL_get_verify_result(session);
        if (verdict != X509_V_OK) {
            throw WbemError("the server's certificate is not trusted: " +
                            std::string(X509_verify_cert_error_string(verdict)));
        }
        if (error == beast::error::timeout) throw WbemError(kLate);
        failTls(error);
    }

    asio::awaitable<PostAnswer> ask(HttpChannel& channel) {
        const auto error = co_await channel.write(headText(headOf(request_)) + request_.body);
        if (error) fail("the server takes no request", error);
        std::optional<ResponseParser> parser;
        do {
            parser.emplace();
            parser->header_limit(kLargestHead);
            parser->body_limit(bounds_.largestBody);
            while (!parser->is_header_done()) co_await readSome(channel, *parser);
        } while (parser->get().result_int() / 100 == 1);  // the real one follows
        refuseCodings(*parser);
        while (!parser->is_done()) co_await readSome(channel, *parser);
        co_return answerFrom(parser->release());
    }

    asio::awaitable<void> readSome(HttpChannel& channel, ResponseParser& parser) {
        // The stream's own deadline does not stop a peer whose bytes are always there already.
        if (Clock::now() >= bounds_.deadline) throw WbemError(kLate);
        const beast::error_code error = co_await channel.readSome(parser);
        if (error) failRead(error);
    }

    [[noreturn]] void failRead(const beast::error_code& error) const {
        if (error == http::error::body_limit) {
            throw WbemError("the answer has more than " + std::to_string(bounds_.largestBody) +
                            " bytes");
        }
        if (error == http::error::end_of_stream) throw WbemError("the server sent no answer");
        if (error == http::error::partial_message) throw WbemError("the answer ends early");
        if (error.category() == make_error_code(http::error::bad_version).category()) {
            throw WbemError("the answer is no HTTP: " + error.message());
        }
        fail("the server closed the connection", error);
    }

    static void refuseCodings(const ResponseParser& parser) {
        const auto& message = parser.get();
        const auto coding = message.find(http::field::content_encoding);
        if (coding != message.end() && !beast::iequals(coding->value(), "identity")) {
            throw WbemError("the answer is compressed, which was not asked for");
        }
        const auto transfer = message.find(http::field::transfer_encoding);
        if (transfer != message.end() && !beast::iequals(transfer->value(), "chunked") &&
            !beast::iequals(transfer->value(), "identity")) {
            throw WbemError("the answer comes in a form that was not asked for");
        }
    }

    const PostRequest& request_;
    const PostBounds& bounds_;
    asio::io_context io_{1};
};

}  // namespace

std::string PostAnswer::header(std::string_view name) const {
    const std::string* value = findHeader(headers, name);
    return value ? *value : "";
}

PostAnswer httpPost(const PostRequest& request, const PostBounds& bounds) {
    return Post(request, bounds).run();
}

PostAnswer httpPostOn(int connected, const PostRequest& request, const PostBounds& bounds) {
    return Post(request, bounds).runOn(connected);
}

}  // namespace testbed
