// One end of an HTTP connection: bytes and messages to and from a peer, in the clear or over TLS.
#pragma once

// First: this release of Asio forgets to include what it takes from <utility>.
#include <utility>

#include <boost/asio/awaitable.hpp>
#include <boost/asio/ssl/context.hpp>
#include <boost/asio/ssl/stream.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/core/tcp_stream.hpp>
#include <boost/beast/http/basic_parser.hpp>
#include <boost/beast/http/message.hpp>
#include <optional>
#include <string>
#include <string_view>

namespace testbed {

/// Each step gives the error with which it ended. The deadline of all steps is that of socket().
///
/// What waits for the peer is compiled once, here, for both kinds of streams: the library's own
/// functions for whole messages are made anew for each kind of stream and message, which takes
/// longer to compile than the rest of the test bed.
class HttpChannel {
public:
    using Error = boost::beast::error_code;
    using TlsStream = boost::asio::ssl::stream<boost::beast::tcp_stream&>;
    using Role = boost::asio::ssl::stream_base::handshake_type;

    /// Keeps at most so many bytes that have come and are not read yet.
    HttpChannel(boost::beast::tcp_stream socket, std::size_t bufferLimit);
    HttpChannel(const HttpChannel&) = delete;
    HttpChannel& operator=(const HttpChannel&) = delete;

    /// Below TLS.
    boost::beast::tcp_stream& socket() { return socket_; }
    /// From the handshake on bytes go over TLS. The context must outlive the channel.
    TlsStream& secure(boost::asio::ssl::context& context);
    boost::asio::awaitable<Error> shakeHands(Role role);
    /// Ends TLS, so that the peer knows that nothing was cut off.
    boost::asio::awaitable<Error> shutDownTls();

    bool hasReceived() const { return buffer_.size() > 0; }
    /// Waits for bytes of the peer; they stay for readSome().
    boost::asio::awaitable<Error> receive(std::size_t most);
    void forgetReceived() { buffer_.clear(); }
    /// Gives the parser what has come, waiting for it if nothing has.
    boost::asio::awaitable<Error> readSome(boost::beast::http::basic_parser<true>& request);
    boost::asio::awaitable<Error> readSome(boost::beast::http::basic_parser<false>& response);

    boost::asio::awaitable<Error> write(std::string_view bytes);

private:
    template <bool isRequest>
    boost::asio::awaitable<Error> parseSome(boost::beast::http::basic_parser<isRequest>& parser);

    boost::beast::tcp_stream socket_;
    std::optional<TlsStream> tls_;
    boost::beast::flat_buffer buffer_;
};

/// The start line, the headers and the empty line.
std::string headText(const boost::beast::http::request_header<>& head);
std::string headText(const boost::beast::http::response_header<>& head);

}  // namespace testbed
