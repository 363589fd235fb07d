#include "page_access.h"

#include <gtest/gtest.h>

namespace testbed {
namespace {

HttpRequest request(HttpHeaders headers, bool isFromThisHost = true) {
    HttpRequest made;
    made.method = "GET";
    made.target = "/";
    made.headers = std::move(headers);
    made.isFromThisHost = isFromThisHost;
    return made;
}

HttpHeaders command(const PageAccess& access, const std::string& host) {
    return {{"Host", host}, {"Origin", "http://" + host}, {kTokenHeader, access.token()}};
}

const PageAccess kOpen("box", false, std::nullopt);
const PageAccess kLocked("box", true, Credentials{"Aladdin", "open sesame"});
const std::pair<std::string, std::string> kKnown{"Authorization",
                                                 "Basic QWxhZGRpbjpvcGVuIHNlc2FtZQ=="};

TEST(PageAccess, NamesOfOthersAreRefused) {
    for (const char* host : {"localhost:5988", "127.0.0.1:5988", "[::1]:5988", "box", "BOX:1",
                             "10.0.0.7:5988", "127.0.0.1"})
        EXPECT_EQ(kOpen.refusalOf(request({{"Host", host}})), 0) << host;
    for (const char* host : {"evil.example", "localhost.evil.example:5988",
                             "127.0.0.1.evil.example", "", "[", "[::1", "boxes"})
        EXPECT_EQ(kOpen.refusalOf(request({{"Host", host}})), 421) << host;
    EXPECT_EQ(kOpen.refusalOf(request({})), 421);
}

TEST(PageAccess, OtherSitesMayLinkButNotRead) {
    const auto from = [](const char* site, const char* mode) {
        return kOpen.refusalOf(
            request({{"Host", "box"}, {"Sec-Fetch-Site", site}, {"Sec-Fetch-Mode", mode}}));
    };
    EXPECT_EQ(from("cross-site", "navigate"), 0);
    EXPECT_EQ(from("same-origin", "cors"), 0);
    EXPECT_EQ(from("none", "navigate"), 0);
    EXPECT_EQ(from("cross-site", "no-cors"), 403);
    EXPECT_EQ(from("same-site", "cors"), 403);
}

TEST(PageAccess, WithoutAUserOnlyThisHostSteers) {
    EXPECT_TRUE(kOpen.maySteer(request({{"Host", "localhost:5988"}})));
    EXPECT_FALSE(kOpen.maySteer(request({{"Host", "localhost:5988"}}, false)));
    // Not by names and addresses that proxies and other networks use.
    EXPECT_FALSE(kOpen.maySteer(request({{"Host", "box:5988"}})));
    EXPECT_FALSE(kOpen.maySteer(request({{"Host", "10.0.0.7:5988"}})));
}

TEST(PageAccess, AUserSteersFromAnywhere) {
    EXPECT_TRUE(kLocked.maySteer(request({{"Host", "box"}, kKnown}, false)));
    EXPECT_FALSE(kLocked.maySteer(request({{"Host", "localhost"}})));
    EXPECT_EQ(kLocked.refusalOf(request({{"Host", "box"}})), 401);
    EXPECT_EQ(kLocked.refusalOf(request({{"Host", "box"}, kKnown})), 0);
}

TEST(PageAccess, CommandsComeFromTheServersOwnPage) {
    const auto accepts = [](HttpHeaders headers) {
        return kOpen.isOwnCommand(request(std::move(headers)));
    };
    const std::string host = "localhost:5988";
    EXPECT_TRUE(accepts(command(kOpen, host)));
    EXPECT_FALSE(accepts({{"Host", host}, {kTokenHeader, kOpen.token()}}));
    EXPECT_FALSE(
        accepts({{"Host", host}, {"Origin", "http://localhost"}, {kTokenHeader, kOpen.token()}}));
    EXPECT_FALSE(
        accepts({{"Host", host}, {"Origin", "https://" + host}, {kTokenHeader, kOpen.token()}}));
    EXPECT_FALSE(accepts({{"Host", host}, {"Origin", "http://" + host}}));
    EXPECT_FALSE(accepts({{"Host", host}, {"Origin", "http://" + host}, {kTokenHeader, ""}}));
    EXPECT_FALSE(accepts(command(kLocked, host)));
    EXPECT_EQ(kOpen.token().size(), 32u);
    EXPECT_NE(kOpen.token(), kLocked.token());
}

}  // namespace
}  // namespace testbed
