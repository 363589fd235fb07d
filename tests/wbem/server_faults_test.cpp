// Faults of the server itself: their words, and what a client meets.
#include "server_faults.h"

#include "wbem_fixture.h"

namespace testbed {
namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;

std::string complaintAbout(const char* words) {
    try {
        parseServerFault(words);
    } catch (const ServerFaultError& error) {
        return error.what();
    }
    return "";
}

TEST(ServerFaultWords, AreRead) {
    const ServerFault fault = parseServerFault(
        "  delay=20 class=CIM_DiskDrive\toperation=EnumerateInstances times=3 trailer=1 "
        "message=\"out of \\\"order\\\"\" cut=0 type=\"text/html; a=b\"");
    EXPECT_EQ(fault.delay, milliseconds(20));
    EXPECT_EQ(fault.className, "CIM_DiskDrive");
    EXPECT_EQ(fault.operation, "EnumerateInstances");
    EXPECT_EQ(fault.times, 3);
    EXPECT_EQ(fault.trailerStatus, 1);
    EXPECT_EQ(fault.message, "out of \"order\"");
    EXPECT_EQ(fault.cutAt, 0U);
    EXPECT_EQ(fault.contentType, "text/html; a=b");
    EXPECT_EQ(fault.connection, ServerFault::Connection::None);
    EXPECT_EQ(parseServerFault("http=503").httpStatus, 503);
    EXPECT_EQ(parseServerFault("type= status=5").contentType, "");
    EXPECT_EQ(parseServerFault("connection=stall times=1").connection,
              ServerFault::Connection::Stall);
}

TEST(ServerFaultWords, AreRefused) {
    EXPECT_EQ(complaintAbout(""), "what is to go wrong is missing");
    EXPECT_EQ(complaintAbout("times=1 class=CIM_Disk"), "what is to go wrong is missing");
    EXPECT_EQ(complaintAbout("http"), "not NAME=VALUE: http");
    EXPECT_EQ(complaintAbout("http 500=1"), "not NAME=VALUE: http 500");
    EXPECT_EQ(complaintAbout("http=500 http=500"), "http comes twice");
    EXPECT_EQ(complaintAbout("htp=500"), "no fault has a \"htp\"");
    EXPECT_EQ(complaintAbout("http=200"), "http: a number from 400 to 599 expected, not \"200\"");
    EXPECT_EQ(complaintAbout("status=0"), "status: a number from 1 to 28 expected, not \"0\"");
    EXPECT_EQ(complaintAbout("delay=-1"),
              "delay: a number from 0 to 1000000000 expected, not \"-1\"");
    EXPECT_EQ(complaintAbout("cut=1x"), "cut: a number from 0 to 1000000000 expected, not \"1x\"");
    EXPECT_EQ(complaintAbout("times=0 http=500"),
              "times: a number from 1 to 1000000000 expected, not \"0\"");
    EXPECT_EQ(complaintAbout("message=\"open"), "message: a quotation mark is missing");
    EXPECT_EQ(complaintAbout("connection=slow"),
              "connection: refuse, reset or stall expected, not \"slow\"");
    EXPECT_EQ(complaintAbout("connection=reset http=500"), "http is nothing that a connection has");
    EXPECT_EQ(complaintAbout("connection=refuse times=2"), "refused connections cannot be counted");
}

class ServerFailures : public WbemFixture {
protected:
    Reply ask(const char* className = "Local_Disk") {
        return exchange(port(),
                        callRequest("EnumerateInstanceNames", classNameParameter(className)));
    }
    std::string outcome(const char* className = "Local_Disk") {
        const std::string text = call("EnumerateInstanceNames", classNameParameter(className));
        return text.starts_with("<?xml") ? "fine" : text;
    }
    void fail(const char* words) { faults_.add(parseServerFault(words)); }
};

TEST_F(ServerFailures, StatusOfHttpANumberOfTimes) {
    fail("http=503 times=2");
    EXPECT_EQ(outcome(), "HTTP 503 ");
    EXPECT_EQ(outcome("Served_Disk"), "HTTP 503 ");
    EXPECT_EQ(outcome(), "fine");
    fail("http=401");
    EXPECT_EQ(ask().header("WWW-Authenticate"), "Basic realm=\"plexor-testbed\"");
    faults_.clear();
    EXPECT_EQ(outcome(), "fine");
}

TEST_F(ServerFailures, StatusOfCimByClassAndOperation) {
    fail("status=1 message=\"the array sleeps\" class=served_disk");
    fail("status=2 operation=getclass");
    EXPECT_EQ(outcome("Served_Disk"), "status 1: the array sleeps");
    EXPECT_TRUE(provider_.questions().empty());
    EXPECT_EQ(
        call("GetInstance", instanceNameParameter("InstanceName", "Served_Disk", {{"Name", "s0"}})),
        "status 1: the array sleeps");
    EXPECT_EQ(outcome(), "fine");
    EXPECT_EQ(call("GetClass", classNameParameter("CIM_Disk")), "status 2: CIM_ERR_ACCESS_DENIED");
}

TEST_F(ServerFailures, BodyCutAtAByte) {
    fail("cut=40");
    const Reply reply = ask();
    EXPECT_EQ(reply.status, 200);
    EXPECT_EQ(reply.body, "<?xml version=\"1.0\" encoding=\"utf-8\"?><C");
    EXPECT_GT(std::stoi(reply.header("Content-Length")), 40);
    EXPECT_EQ(reply.header("Connection"), "close");
}

TEST_F(ServerFailures, ErrorInTheTrailers) {
    fail("trailer=1 message=\"half way\"");
    RawClient client(port());
    client.send(callRequest("EnumerateInstanceNames", classNameParameter("Local_Disk")));
    const std::string text = client.receiveUntil("\r\n\r\n", 2);
    EXPECT_NE(text.find("Transfer-Encoding: chunked\r\n"), std::string::npos) << text;
    EXPECT_NE(text.find("Trailer: CIMStatusCode, CIMStatusCodeDescription\r\n"), std::string::npos);
    EXPECT_NE(text.find("</CIM>\r\n0\r\n"), std::string::npos) << text;
    EXPECT_NE(text.find("\r\nCIMStatusCode: 1\r\n"), std::string::npos) << text;
    EXPECT_NE(text.find("\r\nCIMStatusCodeDescription: half way\r\n"), std::string::npos) << text;
    faults_.clear();
    client.send(callRequest("EnumerateInstanceNames", classNameParameter("Local_Disk")));
    EXPECT_EQ(client.receive().status, 200);
}

TEST_F(ServerFailures, WrongContentType) {
    fail("type=text/html");
    EXPECT_EQ(ask().header("Content-Type"), "text/html");
}

TEST_F(ServerFailures, DelayHoldsUpNobodyElse) {
    fail("delay=600000 class=Served_Disk");
    std::vector<std::unique_ptr<RawClient>> waiting;
    for (int i = 0; i < 100; i++) {
        waiting.push_back(std::make_unique<RawClient>(port()));
        waiting.back()->send(
            callRequest("EnumerateInstanceNames", classNameParameter("Served_Disk")));
    }
    EXPECT_EQ(outcome(), "fine");
    EXPECT_EQ(waiting[0]->receive(milliseconds(100)).status, 0);
    faults_.clear();
    fail("delay=50");
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(outcome(), "fine");
    EXPECT_GE(std::chrono::steady_clock::now() - begin, milliseconds(50));
}

TEST_F(ServerFailures, ConnectionsAreResetOrStalled) {
    fail("connection=reset times=1");
    fail("connection=stall times=1");
    EXPECT_EQ(ask().status, 0);
    RawClient stalled(port());
    stalled.send(callRequest("EnumerateInstanceNames", classNameParameter("Local_Disk")));
    EXPECT_FALSE(stalled.isClosedWithin(milliseconds(200)));
    EXPECT_EQ(outcome(), "fine");
}

TEST_F(ServerFailures, ConnectionsAreRefusedUntilTheServerListensAgain) {
    const auto isRefused = [&] {
        try {
            RawClient client(port());
            return false;
        } catch (const std::runtime_error&) {
            return true;
        }
    };
    const auto comesTrue = [](const auto& condition) {
        for (int i = 0; i < 1000; i++) {
            if (condition()) return true;
            std::this_thread::sleep_for(milliseconds(20));
        }
        return false;
    };
    http_->listen(false);
    EXPECT_TRUE(comesTrue(isRefused));
    http_->listen(true);
    EXPECT_TRUE(comesTrue([&] { return !isRefused(); }));
    EXPECT_EQ(outcome(), "fine");
}

}  // namespace
}  // namespace testbed
