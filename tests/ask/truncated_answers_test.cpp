// A real answer, cut at every byte, is never OK.
#include <gtest/gtest.h>
#include <httplib.h>

#include <cstdlib>
#include <regex>
#include <vector>

#include "canned_answers.h"
#include "elements.h"
#include "scripted_server.h"
#include "tool_process.h"
#include "wbem_client.h"

namespace {

/// What the client sends for batteries, with kSameId as its message's id.
std::string batteryRequest() {
    const ScriptedServer server([](const std::string&) { return http(cimInstances("")); });
    testbed::WbemClient(testbed::parseWbemUrl(server.url())).enumerateInstances(kBattery);
    const std::string request = server.requests().at(0);
    const std::string body = request.substr(request.find("\r\n\r\n") + 4);
    return std::regex_replace(body, std::regex("ID=\"[0-9]{8}\""),
                              std::string("ID=\"") + kSameId + "\"");
}

/// The body of the answer of `serve` for the one battery of an array.
std::string realAnswer() {
    const ServingTool serving("--scenario " SCENARIO_DIR "/healthy-array.json --library " PROVIDER);
    httplib::Client client(serving.url().substr(0, serving.url().rfind('/')));
    const httplib::Headers headers = {{"CIMOperation", "MethodCall"},
                                      {"CIMMethod", "EnumerateInstances"},
                                      {"CIMObject", "root%2Fcimv2"}};
    const std::string request = batteryRequest();
    std::string body;
    const auto end = std::chrono::steady_clock::now() + std::chrono::minutes(1);
    while (body.find("<INSTANCE ") == std::string::npos && std::chrono::steady_clock::now() < end) {
        const auto result = client.Post("/cimom", headers, request, "application/xml");
        body = result ? result->body : "";
    }
    return body;
}

std::string chunked(const std::string& body) {
    char size[20];
    std::snprintf(size, sizeof size, "%zx\r\n", body.size());
    return "HTTP/1.1 200 OK\r\nTrailer: CIMStatusCode\r\nTransfer-Encoding: chunked\r\n\r\n" +
           std::string(size) + body + "\r\n0\r\nCIMStatusCode: 0\r\n\r\n";
}

/// Every 11th byte for the tool, whose start is what takes the time; the client alone is asked at
/// every one. With PLEXOR_LONG in the environment the tool as well.
std::size_t stride() {
    return getenv("PLEXOR_LONG") != nullptr ? 1 : 11;
}

TEST(TruncatedAnswers, AreUnknownToTheCheck) {
    const std::string whole = http(realAnswer());
    ASSERT_NE(whole.find(kSameId), std::string::npos);
    std::size_t size = whole.size();
    const ScriptedServer server([&](const std::string&) { return whole.substr(0, size); });
    const std::string command =
        "ask --check --refresh 0 --class " + std::string(kBattery) + " " + server.url();
    ASSERT_EQ(runTool(command).status, 0);
    std::vector<std::size_t> cuts = {whole.size() - 1, whole.find("\r\n\r\n") + 4};
    for (std::size_t cut = 0; cut < whole.size(); cut += stride()) cuts.push_back(cut);
    for (const std::size_t cut : cuts) {
        size = cut;
        const Outcome outcome = runTool(command);
        ASSERT_EQ(outcome.status, 3) << size << ": " << outcome.output;
        ASSERT_EQ(outcome.output.find("PLEXOR UNKNOWN - 127.0.0.1:"), 0u) << outcome.output;
        ASSERT_EQ(outcome.output.find('\n'), outcome.output.size() - 1);
    }
}

TEST(TruncatedAnswers, AreNoAnswersAtEveryByteInAnyForm) {
    const std::string body = realAnswer();
    const std::size_t lastTag = body.rfind('>');
    const std::string untilTheEnd = "HTTP/1.1 200 OK\r\n\r\n" + body.substr(0, lastTag + 1);
    for (const std::string& whole : {http(body), chunked(body), untilTheEnd}) {
        std::size_t size = whole.size();
        const ScriptedServer server([&](const std::string&) { return whole.substr(0, size); });
        testbed::WbemClient client(testbed::parseWbemUrl(server.url()),
                                   {.largestAnswer = std::size_t{1} << 30});
        ASSERT_EQ(client.enumerateInstances(kBattery).instances.size(), 1u);
        for (size = 0; size < whole.size(); size++)
            ASSERT_THROW(client.enumerateInstances(kBattery), testbed::WbemError) << size;
    }
}

}  // namespace
