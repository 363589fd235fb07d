// Messages that are refused before any operation runs, and the frame of the answers.
#include "cim_xml_read.h"
#include "wbem_fixture.h"

namespace testbed {
namespace {

class Messages : public WbemFixture {
protected:
    /// "STATUS CIMError" of a request.
    std::string outcome(const std::string& headers, const std::string& body) {
        const Reply reply = exchange(port(), httpRequest(headers, body));
        return std::to_string(reply.status) + " " + reply.header("CIMError");
    }
    /// The same for the good message with a part of it replaced.
    std::string outcomeWith(const std::string& part, const std::string& other) {
        std::string body = good_;
        const std::size_t position = body.find(part);
        EXPECT_NE(position, std::string::npos) << part;
        return outcome(headers_, body.replace(position, part.size(), other));
    }

    const std::string method_ = "EnumerateInstanceNames";
    const std::string good_ = callMessage(method_, classNameParameter("Local_Disk"));
    const std::string headers_ = callHeaders(method_);
};

TEST_F(Messages, AnswerIsFramedAsDemanded) {
    const Reply reply = exchange(port(), httpRequest(headers_, good_));
    EXPECT_EQ(reply.status, 200);
    EXPECT_EQ(reply.header("CIMOperation"), "MethodResponse");
    EXPECT_EQ(reply.header("Content-Type"), "application/xml; charset=\"utf-8\"");
    EXPECT_EQ(
        reply.body,
        R"(<?xml version="1.0" encoding="utf-8"?><CIM CIMVERSION="2.0" DTDVERSION="2.0">)"
        R"(<MESSAGE ID="m1" PROTOCOLVERSION="1.0"><SIMPLERSP>)"
        R"(<IMETHODRESPONSE NAME="EnumerateInstanceNames"><IRETURNVALUE>)"
        R"(<INSTANCENAME CLASSNAME="Local_Disk"><KEYBINDING NAME="Name">)"
        R"(<KEYVALUE VALUETYPE="string" TYPE="string">l0</KEYVALUE></KEYBINDING></INSTANCENAME>)"
        R"(</IRETURNVALUE></IMETHODRESPONSE></SIMPLERSP></MESSAGE></CIM>)");
}

TEST_F(Messages, FailureIsFramedAsDemanded) {
    const Reply reply =
        exchange(port(), callRequest("CreateInstance", classNameParameter("Local_Disk")));
    EXPECT_EQ(reply.status, 200);
    EXPECT_EQ(reply.body,
              R"(<?xml version="1.0" encoding="utf-8"?><CIM CIMVERSION="2.0" DTDVERSION="2.0">)"
              R"(<MESSAGE ID="m1" PROTOCOLVERSION="1.0"><SIMPLERSP>)"
              R"(<IMETHODRESPONSE NAME="CreateInstance"><ERROR CODE="7" )"
              R"(DESCRIPTION="CreateInstance is not served"></ERROR></IMETHODRESPONSE>)"
              R"(</SIMPLERSP></MESSAGE></CIM>)");
}

TEST_F(Messages, OtherOperationsAreNotSupported) {
    for (const char* method :
         {"DeleteInstance", "ModifyInstance", "CreateClass", "ModifyClass", "DeleteClass",
          "GetProperty", "SetProperty", "ExecQuery", "GetQualifier", "SetQualifier",
          "DeleteQualifier", "EnumerateQualifiers", "OpenEnumerateInstances", "PullInstances",
          "Invented"})
        EXPECT_EQ(call(method, ""), std::string("status 7: ") + method + " is not served");
}

TEST_F(Messages, MethodsOfObjectsAreNotSupported) {
    std::string body = good_;
    const std::string path = "<LOCALCLASSPATH>" + localNamespace("root/cimv2") +
                             "<CLASSNAME NAME=\"Local_Disk\"/></LOCALCLASSPATH>";
    body = body.substr(0, body.find("<IMETHODCALL")) + "<METHODCALL NAME=\"Reset\">" + path +
           "</METHODCALL>" + body.substr(body.find("</SIMPLEREQ>"));
    const Reply reply =
        exchange(port(), httpRequest("CIMOperation: MethodCall\r\nCIMMethod: Reset\r\n"
                                     "CIMObject: root%2Fcimv2%3ALocal_Disk\r\n",
                                     body));
    EXPECT_EQ(reply.status, 200);
    EXPECT_NE(reply.body.find("<METHODRESPONSE NAME=\"Reset\"><ERROR CODE=\"7\""),
              std::string::npos)
        << reply.body;
}

TEST_F(Messages, HeadersMustFitTheMessage) {
    const auto with = [&](const std::string& operation, const std::string& method,
                          const std::string& object) {
        return outcome(operation + method + object, good_);
    };
    const std::string operation = "CIMOperation: MethodCall\r\n";
    const std::string method = "CIMMethod: EnumerateInstanceNames\r\n";
    const std::string object = "CIMObject: root%2fcimv2\r\n";
    EXPECT_EQ(with(operation, method, object), "200 ");
    EXPECT_EQ(with("", method, object), "400 unsupported-operation");
    EXPECT_EQ(with("CIMOperation: MethodRequest\r\n", method, object), "400 unsupported-operation");
    EXPECT_EQ(with(operation, "", object), "400 header-mismatch");
    EXPECT_EQ(with(operation, "CIMMethod: GetInstance\r\n", object), "400 header-mismatch");
    EXPECT_EQ(with(operation, method, ""), "400 header-mismatch");
    EXPECT_EQ(with(operation, method, "CIMObject: root/vendor\r\n"), "400 header-mismatch");
    EXPECT_EQ(with(operation, method, object + "CIMProtocolVersion: 1.4\r\n"), "200 ");
    EXPECT_EQ(with(operation, method, object + "CIMProtocolVersion: 2.0\r\n"),
              "501 unsupported-protocol-version");
    EXPECT_EQ(exchange(port(), "POST / HTTP/1.1\r\nContent-Type: text/plain\r\n" + headers_ +
                                   "Content-Length: 0\r\n\r\n")
                  .status,
              415);
}

TEST_F(Messages, VersionsMustBeServed) {
    EXPECT_EQ(outcomeWith("CIMVERSION=\"2.0\"", "CIMVERSION=\"2.9\""), "200 ");
    EXPECT_EQ(outcomeWith("CIMVERSION=\"2.0\"", "CIMVERSION=\"3.0\""),
              "501 unsupported-cim-version");
    EXPECT_EQ(outcomeWith("DTDVERSION=\"2.0\"", "DTDVERSION=\"20.0\""),
              "501 unsupported-dtd-version");
    EXPECT_EQ(outcomeWith("PROTOCOLVERSION=\"1.0\"", "PROTOCOLVERSION=\"2.0\""),
              "501 unsupported-protocol-version");
}

TEST_F(Messages, BadXmlIsNotWellFormed) {
    EXPECT_EQ(outcome(headers_, ""), "400 request-not-well-formed");
    EXPECT_EQ(outcome(headers_, "no xml"), "400 request-not-well-formed");
    EXPECT_EQ(outcomeWith("</CIM>", ""), "400 request-not-well-formed");
    EXPECT_EQ(outcomeWith("<MESSAGE", "<MESS"), "400 request-not-well-formed");
}

TEST_F(Messages, OtherMessagesAreNotValid) {
    const std::string notValid = "400 request-not-loosely-valid";
    EXPECT_EQ(outcome(headers_, "<a/>"), notValid);
    EXPECT_EQ(outcomeWith("CIMVERSION=\"2.0\"", ""), notValid);
    EXPECT_EQ(outcomeWith("ID=\"m1\"", ""), notValid);
    EXPECT_EQ(outcomeWith("<NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/>", ""), notValid);
    EXPECT_EQ(outcomeWith("NAME=\"EnumerateInstanceNames\"", ""), notValid);
    EXPECT_EQ(outcome(headers_,
                      "<CIM CIMVERSION='2.0' DTDVERSION='2.0'><MESSAGE ID='1' "
                      "PROTOCOLVERSION='1.0'><SIMPLEREQ/></MESSAGE></CIM>"),
              notValid);
    EXPECT_EQ(outcome(headers_,
                      "<CIM CIMVERSION='2.0' DTDVERSION='2.0'><MESSAGE ID='1' "
                      "PROTOCOLVERSION='1.0'><SIMPLEREQ><METHODCALL NAME='x'/>"
                      "</SIMPLEREQ></MESSAGE></CIM>"),
              notValid);
}

TEST_F(Messages, SeveralRequestsInOneAreRefused) {
    std::string body = good_;
    body.replace(body.find("<SIMPLEREQ>"), 11, "<MULTIREQ><SIMPLEREQ>");
    body.replace(body.find("</SIMPLEREQ>"), 12, "</SIMPLEREQ></MULTIREQ>");
    EXPECT_EQ(outcome("CIMOperation: MethodCall\r\nCIMBatch:\r\n", body),
              "501 multiple-requests-unsupported");
}

}  // namespace
}  // namespace testbed
