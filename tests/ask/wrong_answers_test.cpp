// What must never be OK: answers of servers that are wrong in all kinds of ways, each with the line
// that the check prints.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>

#include "canned_answers.h"
#include "elements.h"
#include "printable.h"
#include "scripted_server.h"
#include "tool_process.h"

namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using std::chrono::steady_clock;

constexpr const char* kPassword = "s3cretWord";
/// "mon:s3cretWord"
constexpr const char* kToken = "bW9uOnMzY3JldFdvcmQ=";
constexpr int kTimeoutSeconds = 2;
// Without a time limit the slow ones would take a minute.
constexpr seconds kInTime{20};

/// A way to answer the request for drives; everything else is answered as it should be.
struct WrongAnswer {
    const char* what;
    std::string answer;
    /// Of the line behind "PLEXOR UNKNOWN - ", the server's address and its ": " left out.
    std::string text;
};

void PrintTo(const WrongAnswer& wrong, std::ostream* stream) {
    *stream << wrong.what;
}

std::string drive(const std::string& id = "d0", const std::string& name = "Drive d0") {
    return namedInstance(kDrive, "DeviceID", "tvxStorageExtC0_" + id, name + " - ONLINE", 2, 5);
}

std::string good() {
    return cimInstances(drive());
}

std::string replaced(std::string text, const std::string& part, const std::string& other) {
    const std::size_t at = text.find(part);
    EXPECT_NE(at, std::string::npos) << part;
    return text.replace(at, part.size(), other);
}

/// The good answer with something in it changed.
std::string with(const std::string& part, const std::string& other) {
    return http(replaced(good(), part, other));
}

std::string chunkHead(const std::string& headers = "") {
    return "HTTP/1.1 200 OK\r\n" + headers + "Transfer-Encoding: chunked\r\n\r\n";
}

std::string chunk(const std::string& data) {
    char size[20];
    std::snprintf(size, sizeof size, "%zx\r\n", data.size());
    return size + data + "\r\n";
}

/// A chunked answer with that behind its body.
std::string trailed(const std::string& trailers, const std::string& body = cimInstances("")) {
    return chunkHead("Trailer: CIMStatusCode\r\n") + (body.empty() ? "" : chunk(body)) + "0\r\n" +
           trailers + "\r\n";
}

std::string status(const std::string& text) {
    return "Tovexa_PlexorStorageExtent answered with status " + text;
}

std::string notXml(const std::string& text) {
    return "the answer is no CIM-XML: " + text;
}

std::string notHttp(const std::string& text) {
    return "the answer is no HTTP: " + text;
}

std::string repeated(const std::string& text, int count) {
    std::string all;
    for (int i = 0; i < count; i++) all += text;
    return all;
}

std::vector<WrongAnswer> statuses() {
    return {
        {"trailer with a code", trailed("CIMStatusCode: 1\r\n"), status("1")},
        {"trailer with a text",
         trailed("CIMStatusCode: 1\r\nCIMStatusCodeDescription: the%20array%20is%20gone\r\n"),
         status("1 (the array is gone)")},
        {"trailer behind a cut list",
         trailed("cimstatuscode: 6\r\n", good().substr(0, good().size() / 2)), status("6")},
        {"trailer behind nothing", trailed("CIMStatusCode: 7\r\n", ""), status("7")},
        {"trailer behind good drives", trailed("CIMStatusCode: 1\r\n", good()), status("1")},
        {"trailer without a number", trailed("CIMStatusCode: failed\r\n", good()), status("1")},
        {"trailer with an empty code", trailed("CIMStatusCode:\r\n", good()), status("1")},
        {"trailer with more than a number", trailed("CIMStatusCode: 0x0\r\n", good()), status("1")},
        {"trailer with a huge number", trailed("CIMStatusCode: 99999999999\r\n"), status("1")},
        {"trailer with a negative number", trailed("CIMStatusCode: -1\r\n"), status("1")},
        {"second trailer fails", trailed("CIMStatusCode: 0\r\nCIMStatusCode: 4\r\n", good()),
         status("4")},
        {"text without a code", trailed("CIMStatusCodeDescription: out of memory\r\n", good()),
         status("1 (out of memory)")},
        {"CIMError behind the body", trailed("CIMError: request-not-valid\r\n", good()),
         "HTTP status 200 OK, CIMError request-not-valid"},
        {"detail behind the body", trailed("PGErrorDetail: no%20provider\r\n", good()),
         "HTTP status 200 OK, PGErrorDetail no%20provider"},
        {"code in a header", http(good(), "200 OK", "CIMStatusCode: 2\r\n"), status("2")},
        {"CIMError in a header", http(good(), "200 OK", "CIMError: unsupported\r\n"),
         "HTTP status 200 OK, CIMError unsupported"},
        {"trailers that end early", chunkHead() + chunk(good()) + "0\r\nCIMStatusCode: 0\r\n",
         "the answer ends early"},
        {"no trailers and no end", chunkHead() + chunk(good()) + "0\r\n", "the answer ends early"},
        {"status of an error", http(cimError(1, "failed")), status("1 (failed)")},
        {"error beside drives",
         http(cimResponse("<ERROR CODE=\"4\"/><IRETURNVALUE>" + drive() + "</IRETURNVALUE>")),
         status("4")},
        {"error behind drives",
         http(cimResponse("<IRETURNVALUE>" + drive() + "</IRETURNVALUE><ERROR CODE=\"4\"/>")),
         status("4")},
        {"error with code 0", http(cimError(0, "")), status("1")},
        {"error with a word", http(cimResponse("<ERROR CODE=\"none\"/>")), status("1")},
        {"error without a code", http(cimResponse("<ERROR/>")), status("1")},
        {"HTTP 500 with drives", http(good(), "500 Oops"), "HTTP status 500 Oops"},
        {"HTTP 401", http("", "401 No"),
         "HTTP status 401 No: user name or password are missing or wrong"},
        {"HTTP 403 with drives", http(good(), "403 No"), "HTTP status 403 No"},
        {"HTTP 302", http(good(), "302 Found", "Location: http://x/\r\n"),
         "HTTP status 302 Found: it is at http://x/"},
        {"HTTP 201", http(good(), "201 Created"), "HTTP status 201 Created"},
        {"HTTP 206", http(good(), "206 Partial Content"), "HTTP status 206 Partial Content"},
        {"HTTP 204", "HTTP/1.1 204 No Content\r\n\r\n", "HTTP status 204 No Content"},
        {"HTTP 503 with a reason", http("", "503 Busy", "PGErrorDetail: later\r\n"),
         "HTTP status 503 Busy, PGErrorDetail later"},
    };
}

std::vector<WrongAnswer> messages() {
    const std::string id = std::string("ID=\"") + kSameId;
    return {
        {"empty body", http(""), notXml("No document element found at byte 0")},
        {"text", http("fine"), notXml("No document element found at byte 4")},
        {"HTML", http("<html>fine</html>"), notXml("no CIM message")},
        {"empty CIM", http("<CIM/>"), notXml("CIM: no MESSAGE")},
        {"two messages", with("</CIM>", "<MESSAGE ID=\"1\" PROTOCOLVERSION=\"1.0\"/></CIM>"),
         notXml("CIM: more than one MESSAGE")},
        {"two documents", http(good() + "<CIM/>"), notXml("more than one element at the top")},
        {"another's id", with(id, "ID=\"12345678"),
         notXml("MESSAGE: its ID is \"12345678\", not that of the request")},
        {"no id", with(id, "ID=\""), notXml("MESSAGE: no attribute ID")},
        {"a request",
         http("<CIM><MESSAGE ID=\"" + std::string(kSameId) + "\"><SIMPLEREQ/></MESSAGE></CIM>"),
         notXml("MESSAGE: no SIMPLERSP")},
        {"several responses", with("</SIMPLERSP>", "</SIMPLERSP><SIMPLERSP/>"),
         notXml("MESSAGE: more than one SIMPLERSP")},
        {"another method", http(cimInstances(drive(), "EnumerateInstanceNames")),
         notXml(
             "IMETHODRESPONSE: its NAME is \"EnumerateInstanceNames\", not that of the request")},
        {"no method", http(cimInstances(drive(), "")),
         notXml("IMETHODRESPONSE: no attribute NAME")},
        {"method of an object",
         http(replaced(replaced(good(), "<IMETHODRESPONSE", "<METHODRESPONSE"), "</IMETHODRESPONSE",
                       "</METHODRESPONSE")),
         notXml("SIMPLERSP: no IMETHODRESPONSE")},
        {"two values", with("</IRETURNVALUE>", "</IRETURNVALUE><IRETURNVALUE/>"),
         notXml("IMETHODRESPONSE: more than one IRETURNVALUE")},
        {"a value of its own", http(cimResponse("<RETURNVALUE/>")),
         notXml("IMETHODRESPONSE: no IRETURNVALUE")},
        {"text as the response", http(cimResponse("out of memory")),
         notXml("IMETHODRESPONSE: no IRETURNVALUE")},
        {"text as the value", http(cimInstances("out of memory")),
         notXml("IRETURNVALUE: a text instead of elements")},
        {"names", http(cimInstances("<INSTANCENAME CLASSNAME=\"X\"/>")),
         notXml("IRETURNVALUE: a INSTANCENAME, which was not asked for")},
        {"paths", http(cimInstances("<OBJECTPATH><INSTANCEPATH/></OBJECTPATH>")),
         notXml("IRETURNVALUE: a OBJECTPATH, which was not asked for")},
        {"a class", http(cimInstances("<CLASS NAME=\"X\"/>")), notXml("CLASS: no INSTANCE")},
        {"entities", http("<!DOCTYPE a [<!ENTITY b \"c\">]><CIM>&b;</CIM>"),
         notXml("CIM: no MESSAGE")},
        {"a NUL", http(std::string("<CIM>\0</CIM>", 12)), notXml("a NUL character in the message")},
        {"deep", http(repeated("<A>", 65) + repeated("</A>", 65)),
         notXml("elements nested more than 64 levels deep")},
        {"many elements", http(repeated("<a/>", 600'001)), notXml("more than 600000 characters <")},
        {"many attributes", http("<a " + repeated("b='' ", 600'001) + "/>"),
         notXml("more than 600000 characters =")},
        {"huge", http(std::string((std::size_t{16} << 20) + 1, 'x')), "the answer has more than "},
    };
}

std::vector<WrongAnswer> instances() {
    const std::string volume =
        namedInstance(kVolume, "DeviceID", "tvxStorageVolumeC0_0", "v - OPTIMAL", 2, 5);
    return {
        {"a volume", http(cimInstances(volume)),
         "an instance of Tovexa_PlexorStorageVolume in the answer for Tovexa_PlexorStorageExtent"},
        {"a volume among drives", http(cimInstances(drive() + volume)),
         "an instance of Tovexa_PlexorStorageVolume in the answer for Tovexa_PlexorStorageExtent"},
        {"a superclass", http(cimInstances("<INSTANCE CLASSNAME=\"CIM_StorageExtent\"/>")),
         "an instance of CIM_StorageExtent in the answer for Tovexa_PlexorStorageExtent"},
        {"a volume with a drive's name",
         with("<INSTANCE CLASSNAME=\"Tovexa_PlexorStorageExtent",
              "<INSTANCE CLASSNAME=\"Tovexa_PlexorStorageVolume"),
         notXml("VALUE.NAMEDINSTANCE: an instance of Tovexa_PlexorStorageVolume with the name of "
                "one of Tovexa_PlexorStorageExtent")},
        {"a drive twice", http(cimInstances(drive() + drive())),
         "the same instance twice in the answer for Tovexa_PlexorStorageExtent"},
        {"a name without a drive",
         http(cimInstances("<VALUE.NAMEDINSTANCE><INSTANCENAME "
                           "CLASSNAME=\"X\"/></VALUE.NAMEDINSTANCE>")),
         notXml("VALUE.NAMEDINSTANCE: no INSTANCE")},
        {"no class", http(cimInstances("<INSTANCE/>")), notXml("INSTANCE: no attribute CLASSNAME")},
        {"a number that is too large", with("<VALUE>5</VALUE>", "<VALUE>65541</VALUE>"),
         notXml("PROPERTY: HealthState: ")},
        {"a number that is none", with("<VALUE>5</VALUE>", "<VALUE>good</VALUE>"),
         notXml("PROPERTY: HealthState: ")},
        {"an unknown type", with("TYPE=\"uint16\"><VALUE>5", "TYPE=\"word\"><VALUE>5"),
         notXml("PROPERTY: no type is named \"word\"")},
        {"another namespace",
         http(cimInstances(
             "<VALUE.OBJECTWITHLOCALPATH><LOCALINSTANCEPATH><LOCALNAMESPACEPATH><NAMESPACE "
             "NAME=\"other\"/></LOCALNAMESPACEPATH><INSTANCENAME "
             "CLASSNAME=\"Tovexa_PlexorStorageExtent\"/></LOCALINSTANCEPATH><INSTANCE "
             "CLASSNAME=\"Tovexa_PlexorStorageExtent\"/></VALUE.OBJECTWITHLOCALPATH>")),
         "an instance in other in the answer for root/cimv2"},
        {"a wicked class", http(cimInstances("<INSTANCE CLASSNAME=\"a\xe2\x80\xae|b&#10;c\"/>")),
         "an instance of a?/b?c in the answer for Tovexa_PlexorStorageExtent"},
        {"our secrets in an error",
         http(cimError(1, std::string("mon ") + kPassword + " " + kToken)),
         status("1 (mon *** ***)")},
        {"our secrets in a header", http("", std::string("500 ") + kPassword + " " + kToken),
         "HTTP status 500 *** ***"},
        {"wicked bytes in an error", http(cimError(1, "a\xe2\x80\xae\xff\x1b[2J|b&#7;")),
         status("1 (a???[2J/b?)")},
    };
}

std::vector<WrongAnswer> connections() {
    const std::string body = good();
    const std::string length = "Content-Length: " + std::to_string(body.size());
    return {
        {"nothing", "", "the server sent no answer"},
        {"zeros", std::string(20, '\0'), notHttp("bad version")},
        {"another protocol", "SSH-2.0-server\r\n", notHttp("bad version")},
        {"a bad status", "HTTP/1.1 2OO OK\r\n\r\n", notHttp("bad status")},
        {"HTTP 2", "HTTP/2.0 200 OK\r\n\r\n" + body, notHttp("bad version")},
        {"no end of the head", "HTTP/1.1 200 OK\r\n" + length + "\r\n", "the answer ends early"},
        {"an endless head", "HTTP/1.1 200 OK\r\nX: " + std::string(200'000, 'x'),
         notHttp("header limit exceeded")},
        {"endless waits", repeated("HTTP/1.1 100 Continue\r\n\r\n", 3),
         "the server sent no answer"},
        {"a negative length", http(body, "200 OK", "Content-Length: -5\r\n"),
         notHttp("bad Content-Length")},
        {"a huge length", "HTTP/1.1 200 OK\r\nContent-Length: 99999999999999999999\r\n\r\n" + body,
         notHttp("bad Content-Length")},
        {"two lengths", http(body, "200 OK", "Content-Length: 3\r\n"),
         notHttp("bad Content-Length")},
        {"a length that is too large",
         "HTTP/1.1 200 OK\r\nContent-Length: " + std::to_string(body.size() + 1) + "\r\n\r\n" +
             body,
         "the answer ends early"},
        {"a length that is too small",
         "HTTP/1.1 200 OK\r\nContent-Length: " + std::to_string(body.size() - 20) + "\r\n\r\n" +
             body,
         notXml("")},
        {"compressed", http(body, "200 OK", "Content-Encoding: gzip\r\n"),
         "the answer is compressed, which was not asked for"},
        {"compressed on its way",
         "HTTP/1.1 200 OK\r\nTransfer-Encoding: gzip, chunked\r\n\r\n" + chunk(body) + "0\r\n\r\n",
         "the answer comes in a form that was not asked for"},
        {"a huge chunk", chunkHead() + "ffffffffffffffff\r\nx", "the answer has more than "},
        {"a negative chunk", chunkHead() + "-1\r\nx", notHttp("bad chunk")},
        {"a chunk with no size", chunkHead() + "\r\n" + body, notHttp("bad chunk")},
        {"a chunk that is too long", chunkHead() + "1\r\nxyz\r\n0\r\n\r\n", notHttp("bad chunk")},
        {"a chunk that is too short", chunkHead() + "fffff\r\n" + body, "the answer ends early"},
        {"no last chunk", chunkHead() + chunk(body), "the answer ends early"},
        {"no chunk", chunkHead(), "the answer ends early"},
    };
}

std::vector<WrongAnswer> allWrong() {
    std::vector<WrongAnswer> all;
    for (const auto& group : {statuses(), messages(), instances(), connections()})
        all.insert(all.end(), group.begin(), group.end());
    return all;
}

/// A small array whose answer for drives is another.
class Scripted {
public:
    explicit Scripted(std::string drives)
        : drives_(std::move(drives)), server_([this](const std::string& request) {
              return request.find(std::string("\"") + kDrive + "\"") == std::string::npos
                         ? array_.answerTo(request)
                         : drives_;
          }) {}

    ScriptedServer& server() { return server_; }
    std::string authority() const { return server_.url().substr(7); }
    Outcome check() const {
        return runTool("ask --check --refresh 0 --timeout " + std::to_string(kTimeoutSeconds) +
                       " http://mon:" + kPassword + "@" + authority());
    }

private:
    SmallArray array_;
    std::string drives_;
    ScriptedServer server_;
};

/// One printable line of an unknown result, and nothing secret.
void expectOneUnknownLine(const Outcome& outcome) {
    EXPECT_EQ(outcome.status, 3) << outcome.output;
    EXPECT_EQ(outcome.output.find("PLEXOR UNKNOWN - "), 0u) << outcome.output;
    EXPECT_EQ(outcome.errors, "");
    ASSERT_TRUE(outcome.output.ends_with('\n'));
    const std::string line = outcome.output.substr(0, outcome.output.size() - 1);
    EXPECT_EQ(testbed::printable(line), line);
    EXPECT_EQ(line.find(kPassword), std::string::npos) << line;
    EXPECT_EQ(line.find(kToken), std::string::npos) << line;
    EXPECT_LT(line.size(), 1000u);
}

TEST(WrongAnswersTable, IsLong) {
    EXPECT_GE(allWrong().size(), 80u);
}

class WrongAnswers : public ::testing::TestWithParam<WrongAnswer> {};

TEST_P(WrongAnswers, AreUnknown) {
    const WrongAnswer& wrong = GetParam();
    const Scripted scripted(wrong.answer);
    const auto start = steady_clock::now();
    const Outcome outcome = scripted.check();
    EXPECT_LT(steady_clock::now() - start, kInTime);
    expectOneUnknownLine(outcome);
    const std::string said = "PLEXOR UNKNOWN - " +
                             (wrong.text.starts_with(kDrive) ? "" : scripted.authority() + ": ") +
                             wrong.text;
    EXPECT_EQ(outcome.output.find(said), 0u) << outcome.output;
}

TEST(SlowAnswers, AreUnknownInTime) {
    const struct {
        milliseconds before, between;
    } pauses[] = {{seconds(60), {}}, {{}, milliseconds(50)}, {milliseconds(900), {}}};
    for (const auto& [before, between] : pauses) {
        Scripted scripted(http(good()));
        scripted.server().setPauses(before, between);
        const auto start = steady_clock::now();
        const Outcome outcome = scripted.check();
        EXPECT_LT(steady_clock::now() - start, kInTime);
        expectOneUnknownLine(outcome);
        EXPECT_NE(outcome.output.find("no answer in time"), std::string::npos) << outcome.output;
    }
}

INSTANTIATE_TEST_SUITE_P(All, WrongAnswers, ::testing::ValuesIn(allWrong()));

}  // namespace
