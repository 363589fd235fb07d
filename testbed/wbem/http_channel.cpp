// Reading and writing on either kind of stream, and messages as texts.
#include "http_channel.h"

#include <algorithm>
#include <boost/asio/redirect_error.hpp>
#include <boost/asio/use_awaitable.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/core/ostream.hpp>
#include <boost/beast/core/read_size.hpp>
#include <boost/beast/http/error.hpp>
#include <boost/beast/http/write.hpp>
#include <sstream>

namespace testbed {
namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = beast::http;
using asio::use_awaitable;
using Error = HttpChannel::Error;

constexpr std::size_t kUsualRead = 16 * 1024;
constexpr std::size_t kLargestRead = 64 * 1024;

template <bool isRequest>
std::string textOf(const http::header<isRequest>& head) {
    std::ostringstream text;
    text << head;
    return std::move(text).str();
}

}  // namespace

HttpChannel::HttpChannel(beast::tcp_stream socket, std::size_t bufferLimit)
    : socket_(std::move(socket)), buffer_(bufferLimit) {
    // What comes at once is parsed at once: a head in several pieces may have twice its limit.
    buffer_.reserve(std::min(bufferLimit, kUsualRead));
}

HttpChannel::TlsStream& HttpChannel::secure(asio::ssl::context& context) {
    return tls_.emplace(socket_, context);
}

asio::awaitable<Error> HttpChannel::shakeHands(Role role) {
    Error error;
    co_await tls_->async_handshake(role, asio::redirect_error(use_awaitable, error));
    co_return error;
}

asio::awaitable<Error> HttpChannel::shutDownTls() {
    Error error;
    co_await tls_->async_shutdown(asio::redirect_error(use_awaitable, error));
    co_return error;
}

asio::awaitable<Error> HttpChannel::receive(std::size_t most) {
    const std::size_t size = beast::read_size(buffer_, most);
    if (size == 0) co_return http::error::buffer_overflow;
    const asio::mutable_buffer room = buffer_.prepare(size);
    Error error;
    std::size_t count = 0;
    if (tls_) {
        count = co_await tls_->async_read_some(room, asio::redirect_error(use_awaitable, error));
    } else {
        count = co_await socket_.async_read_some(room, asio::redirect_error(use_awaitable, error));
    }
    buffer_.commit(count);
    co_return error;
}

template <bool isRequest>
asio::awaitable<Error> HttpChannel::parseSome(http::basic_parser<isRequest>& parser) {
    for (;;) {
        Error error = http::error::need_more;
        if (hasReceived()) buffer_.consume(parser.put(buffer_.cdata(), error));
        if (error != http::error::need_more) co_return error;
        error = co_await receive(kLargestRead);
        if (error != asio::error::eof) {
            if (error) co_return error;
            continue;
        }
        if (!parser.got_some()) co_return http::error::end_of_stream;
        error = {};
        parser.put_eof(error);
        co_return error;
    }
}

asio::awaitable<Error> HttpChannel::readSome(http::basic_parser<true>& request) {
    return parseSome(request);
}

asio::awaitable<Error> HttpChannel::readSome(http::basic_parser<false>& response) {
    return parseSome(response);
}

asio::awaitable<Error> HttpChannel::write(std::string_view bytes) {
    Error error;
    const asio::const_buffers_1 buffer = asio::buffer(bytes);
    if (tls_) {
        co_await asio::async_write(*tls_, buffer, asio::redirect_error(use_awaitable, error));
    } else {
        co_await asio::async_write(socket_, buffer, asio::redirect_error(use_awaitable, error));
    }
    co_return error;
}

std::string headText(const http::request_header<>& head) {
    return textOf(head);
}

std::string headText(const http::response_header<>& head) {
    return textOf(head);
}

}  // namespace testbed
