// Requests that lenient servers take and the protocol does not: each is refused, and says why.
#include "wbem_fixture.h"

namespace testbed {
namespace {

class StrictRequests : public WbemFixture {
protected:
    /// "STATUS CIMError" of a request with those headers beside the usual ones of a call.
    std::string outcome(const std::string& headers, const std::string& body) {
        const Reply reply = exchange(
            port(), "POST /cimom HTTP/1.1\r\n" + headers + callHeaders("EnumerateInstanceNames") +
                        "Content-Length: " + std::to_string(body.size()) + "\r\n\r\n" + body);
        return std::to_string(reply.status) + " " + reply.header("CIMError");
    }
    std::string outcomeOf(const std::string& body) { return outcome(kHost + kType, body); }
    /// With a part of the good message replaced.
    std::string outcomeWith(const std::string& part, const std::string& other) {
        std::string body = good_;
        body.replace(body.find(part), part.size(), other);
        return outcomeOf(body);
    }

    const std::string kHost = "Host: box\r\n";
    const std::string kType = "Content-Type: application/xml; charset=\"utf-8\"\r\n";
    const std::string kNotWellFormed = "400 request-not-well-formed";
    const std::string good_ =
        callMessage("EnumerateInstanceNames", classNameParameter("Local_Disk"));
};

TEST_F(StrictRequests, ContentType) {
    for (const char* type : {"text/xml", "Application/XML", "text/xml; charset=utf-8",
                             "application/xml;x=y; Charset = \"UTF-8\""})
        EXPECT_EQ(outcome(kHost + "Content-Type: " + type + "\r\n", good_), "200 ") << type;
    for (const char* type : {"text/plain", "application/xmlish", "text/html; charset=utf-8", "",
                             "application/xml; charset=iso-8859-1", "text/xml;charset=utf-16"})
        EXPECT_EQ(outcome(kHost + "Content-Type: " + type + "\r\n", good_), "415 ") << type;
    EXPECT_EQ(outcome(kHost, good_), "415 ");
}

TEST_F(StrictRequests, CodingOnAPlainBody) {
    EXPECT_EQ(outcome(kHost + kType + "Content-Encoding: identity\r\n", good_), "200 ");
    for (const char* coding : {"gzip", "deflate", "identity, gzip"})
        EXPECT_EQ(outcome(kHost + kType + "Content-Encoding: " + coding + "\r\n", good_), "415 ");
}

TEST_F(StrictRequests, Host) {
    EXPECT_EQ(outcome(kHost + kType, good_), "200 ");
    EXPECT_EQ(outcome(kType, good_), "400 ");
    EXPECT_EQ(outcome(kHost + kHost + kType, good_), "400 ");
    const std::string old = "POST / HTTP/1.0\r\n" + kType + callHeaders("EnumerateInstanceNames") +
                            "Content-Length: " + std::to_string(good_.size()) + "\r\n\r\n" + good_;
    EXPECT_EQ(exchange(port(), old).status, 200);
}

TEST_F(StrictRequests, Encoding) {
    EXPECT_EQ(outcomeWith("encoding=\"utf-8\"", "encoding=\"UTF-8\""), "200 ");
    EXPECT_EQ(outcomeWith(" encoding=\"utf-8\"", ""), "200 ");
    EXPECT_EQ(outcomeWith("encoding=\"utf-8\"", "encoding=\"iso-8859-1\""), kNotWellFormed);
    EXPECT_EQ(outcomeWith("encoding=\"utf-8\"", "encoding=\"utf-16\""), kNotWellFormed);
    for (const char* bytes : {"\xe9", "\xc0\xaf", "\xed\xa0\x80", "\xf5\x80\x80\x80", "\x01"})
        EXPECT_EQ(outcomeWith("Local_Disk", std::string("Local_") + bytes), kNotWellFormed);
}

TEST_F(StrictRequests, WellFormedness) {
    const std::pair<const char*, const char*> changes[] = {
        {"ID=\"m1\"", "ID=\"m1\" ID=\"m1\""},
        {"ID=\"m1\"", "ID=m1"},
        {"ID=\"m1\"", "ID=\"<\""},
        {"ID=\"m1\"", "ID=\"&unknown;\""},
        {"ID=\"m1\"", "ID=\"a&b\""},
        {"<SIMPLEREQ>", "<SIMPLEREQ>]]>"},
        {"<SIMPLEREQ>", "<SIMPLEREQ><!-- -- -->"},
        {"<SIMPLEREQ>", "<SIMPLEREQ><2/>"},
        {"</CIM>", "</CIM>text"},
        {"</CIM>", "</CIM><CIM/>"},
        {"</CIM>", "</cim>"},
        {"<CIM ", "<!DOCTYPE CIM [<!ENTITY a \"b\">]><CIM "},
    };
    for (const auto& [part, other] : changes)
        EXPECT_EQ(outcomeWith(part, other), kNotWellFormed) << other;
    EXPECT_EQ(outcomeOf(" " + good_), kNotWellFormed);
    EXPECT_EQ(outcomeWith("<CIM ", "<!DOCTYPE CIM SYSTEM \"cim.dtd\"><CIM "), "200 ");
    EXPECT_EQ(outcomeWith("ID=\"m1\"", "ID=\"&lt;&#x41;\""), "200 ");
}

}  // namespace
}  // namespace testbed
