// Requests in every form that HTTP has for them, whole and in pieces, and those that are refused.
#include <gtest/gtest.h>

#include "eventually.h"
#include "http_server.h"
#include "raw_client.h"

namespace testbed {
namespace {

/// A server with narrow limits whose answer is what it was asked.
class HttpRequests : public ::testing::Test {
protected:
    static HttpServerOptions options() {
        HttpServerOptions options;
        options.port = 0;
        options.limits = {512, 64};
        return options;
    }

    /// "BODY" of what was answered with success, or the status; in pieces of that many bytes.
    std::string outcome(const std::string& text, std::size_t piece) const {
        RawClient client(server_.port());
        for (std::size_t i = 0; i < text.size(); i += piece) {
            if (i > 0) std::this_thread::sleep_for(std::chrono::milliseconds(1));
            client.send(text.substr(i, piece));
        }
        const Reply reply = client.receive(std::chrono::seconds(5));
        return reply.status == 200 ? reply.body : std::to_string(reply.status);
    }

    HttpServer server_{options(), [](const HttpRequest& request) {
                           return HttpResponse{
                               200, {}, request.method + " " + request.target + " " + request.body};
                       }};
};

struct Case {
    const char* text;
    const char* outcome;
};

const Case kCases[] = {
    {"GET / HTTP/1.1\r\n\r\n", "GET / "},
    {"M-POST /a?b HTTP/1.0\r\nContent-Length: 3\r\n\r\nabc", "M-POST /a?b abc"},
    {"POST / HTTP/1.1\r\nContent-Length:0\r\n\r\n", "POST / "},
    {"POST / HTTP/1.1\r\nContent-Length: 64\r\n\r\n"
     "0123456789abcdef0123456789abcdef0123456789abcdef0123456789abcdef",
     "POST / 0123456789abcdef0123456789abcdef0123456789abcdef0123456789abcdef"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n2;x=y\r\nab\r\n1\r\nc\r\n0\r\nT: "
     "v\r\n\r\n",
     "POST / abc"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\nx\r\n", "400"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: "
     "chunked\r\n\r\n20\r\n0123456789abcdef0123456789abcdef\r\n"
     "21\r\n",
     "413"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: gzip\r\n\r\n", "501"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: gzip, chunked\r\n\r\n", "501"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\nContent-Length: 1\r\n\r\n", "400"},
    {"POST / HTTP/1.1\r\nContent-Length: 1\r\nContent-Length: 2\r\n\r\n", "400"},
    {"POST / HTTP/1.1\r\nContent-Length: -1\r\n\r\n", "400"},
    {"POST / HTTP/1.1\r\nContent-Length: 65\r\n\r\n", "413"},
    {"POST / HTTP/1.1\r\n\r\n", "411"},
    {"M-POST / HTTP/1.1\r\n\r\n", "411"},
    {"POST / HTTP/1.1\r\nExpect: more\r\nContent-Length: 1\r\n\r\n", "417"},
    {"POST / HTTP/2.0\r\n\r\n", "505"},
    {"POST /\r\n\r\n", "400"},
    {"P@ST / HTTP/1.1\r\n\r\n", "400"},
    {"GET / HTTP/1.1\r\nno colon\r\n\r\n", "400"},
};

TEST_F(HttpRequests, AreReadWholeAndInPieces) {
    for (const auto& [text, expected] : kCases)
        for (const std::size_t piece : {1000, 1, 7})
            EXPECT_EQ(outcome(text, piece), expected) << text << " in pieces of " << piece;
}

TEST_F(HttpRequests, HaveABoundedHead) {
    EXPECT_EQ(outcome("GET /" + std::string(600, 'x'), 1000), "431");
    std::string many = "GET / HTTP/1.1\r\n";
    for (int i = 0; i < 100; i++) many += "a: b\r\n";
    EXPECT_EQ(outcome(many + "\r\n", 1000), "431");
    const std::string chunked = "POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n";
    EXPECT_EQ(outcome(chunked + "1;" + std::string(100'000, 'x'), 100'000), "431");
}

TEST_F(HttpRequests, OfTheOldVersionEndTheConnectionUnlessTheyWishOtherwise) {
    for (const auto& [request, wish] :
         {std::pair("GET / HTTP/1.0\r\n\r\n", "close"),
          std::pair("GET / HTTP/1.0\r\nConnection: Keep-Alive\r\n\r\n", "keep-alive"),
          std::pair("GET / HTTP/1.1\r\n\r\n", "keep-alive"),
          std::pair("GET / HTTP/1.1\r\nconnection: Close\r\n\r\n", "close")}) {
        RawClient client(server_.port());
        client.send(request);
        EXPECT_EQ(client.receive().header("Connection"), wish) << request;
    }
}

TEST_F(HttpRequests, MayComeBeforeTheAnswer) {
    RawClient client(server_.port());
    client.send("POST /a HTTP/1.1\r\nContent-Length: 1\r\n\r\nxGET /b HTTP/1.1\r\n\r\nGE");
    EXPECT_EQ(client.receive().body, "POST /a x");
    EXPECT_EQ(client.receive().body, "GET /b ");
    client.send("T /c HTTP/1.1\r\n\r\n");
    EXPECT_EQ(client.receive().body, "GET /c ");
}

TEST_F(HttpRequests, EndInTimeHoweverTheyAreSpread) {
    HttpServerOptions hurried = options();
    hurried.times.request = std::chrono::milliseconds(300);
    hurried.limits.body = 100'000;
    const HttpServer server(hurried, [](const HttpRequest&) { return HttpResponse(); });
    RawClient client(server.port());
    client.send("POST / HTTP/1.1\r\nContent-Length: 100000\r\n\r\n");
    // A byte a millisecond would take longer than is waited for.
    EXPECT_TRUE(plexortest::eventually([&] { return !client.send("x"); }));
}

}  // namespace
}  // namespace testbed
