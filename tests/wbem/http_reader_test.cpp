// HTTP requests, in pieces of any size.
#include "http_reader.h"

#include <gtest/gtest.h>

namespace testbed {
namespace {

using Progress = HttpReader::Progress;

constexpr HttpLimits kLimits{256, 64};

/// "complete BODY", "refused STATUS" or "needs more", read in pieces of that many bytes.
std::string outcome(const std::string& text, std::size_t piece) {
    HttpReader reader(kLimits);
    for (std::size_t i = 0; i < text.size(); i += piece) {
        const Progress progress = reader.add(std::string_view(text).substr(i, piece));
        if (progress == Progress::Refused) return "refused " + std::to_string(reader.refusal());
        if (progress == Progress::Complete) return "complete " + reader.take().body;
    }
    return "needs more";
}

struct Case {
    const char* text;
    const char* outcome;
};

const Case kCases[] = {
    {"GET / HTTP/1.1\r\n\r\n", "complete "},
    {"\r\n\r\nGET / HTTP/1.0\n\n", "complete "},
    {"POST / HTTP/1.1\r\nContent-Length: 3\r\n\r\nabc", "complete abc"},
    {"POST / HTTP/1.1\r\nContent-Length:0\r\n\r\n", "complete "},
    {"POST / HTTP/1.1\r\nContent-Length: 3\r\nContent-Length: 3\r\n\r\nabc", "complete abc"},
    {"POST / HTTP/1.1\r\nContent-Length: 3\r\n\r\nab", "needs more"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n2;x=y\r\nab\r\n1\r\nc\r\n0\r\nT: "
     "v\r\n\r\n",
     "complete abc"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n2\r\nabc\r\n", "refused 400"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\nx\r\n", "refused 400"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: "
     "chunked\r\n\r\n20\r\n0123456789abcdef0123456789abcdef\r\n"
     "21\r\n",
     "refused 413"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\nffffffffffffffffff\r\n", "refused 413"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: gzip\r\n\r\n", "refused 501"},
    {"POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\nContent-Length: 1\r\n\r\n", "refused 400"},
    {"POST / HTTP/1.1\r\nContent-Length: 1\r\nContent-Length: 2\r\n\r\n", "refused 400"},
    {"POST / HTTP/1.1\r\nContent-Length: -1\r\n\r\n", "refused 400"},
    {"POST / HTTP/1.1\r\nContent-Length: 65\r\n\r\n", "refused 413"},
    {"POST / HTTP/1.1\r\nContent-Length: 99999999999999999999\r\n\r\n", "refused 413"},
    {"POST / HTTP/1.1\r\n\r\n", "refused 411"},
    {"POST / HTTP/1.1\r\nExpect: more\r\nContent-Length: 1\r\n\r\n", "refused 417"},
    {"POST / HTTP/2.0\r\n\r\n", "refused 505"},
    {"POST /\r\n\r\n", "refused 400"},
    {"P@ST / HTTP/1.1\r\n\r\n", "refused 400"},
    {"POST / x HTTP/1.1\r\n\r\n", "refused 400"},
    {"POST / FTP/1.1\r\n\r\n", "refused 400"},
    {"GET / HTTP/1.1\r\nno colon\r\n\r\n", "refused 400"},
    {"GET / HTTP/1.1\r\nName : v\r\n\r\n", "refused 400"},
    {"GET / HTTP/1.1\r\n folded: v\r\n\r\n", "refused 400"},
};

TEST(HttpReader, ReadsWholeAndInPieces) {
    for (const auto& [text, expected] : kCases)
        for (const std::size_t piece : {1000, 1, 2, 7})
            EXPECT_EQ(outcome(text, piece), expected) << text << " in pieces of " << piece;
}

TEST(HttpReader, RefusesAHeadWithoutEnd) {
    EXPECT_EQ(outcome("GET /" + std::string(300, 'x'), 1), "refused 431");
    EXPECT_EQ(outcome("GET / HTTP/1.1\r\n" + std::string(300, '\n'), 1000), "complete ");
    std::string many = "GET / HTTP/1.1\r\n";
    for (int i = 0; i < 100; i++) many += "a: b\r\n";
    EXPECT_EQ(outcome(many, 1000), "refused 431");
    EXPECT_EQ(outcome(std::string(300, '\n'), 1000), "refused 431");
    std::string trailers = "POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n0\r\n";
    for (int i = 0; i < 100; i++) trailers += "a: b\r\n";
    EXPECT_EQ(outcome(trailers, 1000), "refused 431");
}

TEST(HttpReader, KeepsWhatComesBehindARequest) {
    HttpReader reader(kLimits);
    EXPECT_EQ(reader.add("POST /a HTTP/1.1\r\nContent-Length: 1\r\n\r\nxGET /b HTTP/1.1\r\n\r\nGE"),
              Progress::Complete);
    EXPECT_EQ(reader.take().target, "/a");
    EXPECT_EQ(reader.add(""), Progress::Complete);
    EXPECT_EQ(reader.take().target, "/b");
    EXPECT_EQ(reader.add(""), Progress::NeedsMore);
    EXPECT_FALSE(reader.isIdle());
    EXPECT_EQ(reader.add("T /c HTTP/1.1\r\n\r\n"), Progress::Complete);
    EXPECT_EQ(reader.take().target, "/c");
    EXPECT_TRUE(reader.isIdle());
}

TEST(HttpReader, TellsOnceThatTheClientWaits) {
    HttpReader reader(kLimits);
    EXPECT_EQ(reader.add("POST / HTTP/1.1\r\nExpect: 100-continue\r\nContent-Length: 2\r\n\r\n"),
              Progress::WantsContinue);
    EXPECT_EQ(reader.add("a"), Progress::NeedsMore);
    EXPECT_EQ(reader.add("b"), Progress::Complete);
}

TEST(HttpRequest, KeepsTheConnectionByVersionAndWish) {
    const auto keeps = [](int minor, const char* wish) {
        HttpRequest request;
        request.minorVersion = minor;
        if (*wish) request.headers = {{"connection", wish}};
        return request.keepsConnection();
    };
    EXPECT_TRUE(keeps(1, ""));
    EXPECT_FALSE(keeps(1, "Close"));
    EXPECT_TRUE(keeps(1, "Keep-Alive, TE"));
    EXPECT_FALSE(keeps(0, ""));
    EXPECT_TRUE(keeps(0, "keep-alive"));
}

}  // namespace
}  // namespace testbed
