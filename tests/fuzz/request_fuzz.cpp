// What a client sends to the server, after HTTP: header lines, an empty line, and the message.
#include <string>

#include "cim_server.h"
#include "fuzz_target.h"
#include "scenario_parser.h"
#include "vendor.h"
#include "xml_well_formed.h"

namespace {

/// A vendor with one of each kind, so that every operation has something to find.
constexpr const char* kServedArray = R"({"controllers": [{"id": "C0",
    "pools": [{"id": "p0"}],
    "drives": [{"id": "d0", "pool": "p0"}],
    "volumes": [{"id": "v0", "pool": "p0"}],
    "ports": [{"id": "0"}],
    "batteries": [{"id": "0"}]}]})";

constexpr const char* kUsualRequest =
    "Content-Type: application/xml\nCIMOperation: MethodCall\nCIMMethod: EnumerateClassNames\n"
    "CIMObject: root/sample\n\n"
    R"(<CIM CIMVERSION="2.0" DTDVERSION="2.0"><MESSAGE ID="1" PROTOCOLVERSION="1.0"><SIMPLEREQ>)"
    R"(<IMETHODCALL NAME="EnumerateClassNames"><LOCALNAMESPACEPATH><NAMESPACE NAME="root"/>)"
    R"(<NAMESPACE NAME="sample"/></LOCALNAMESPACEPATH></IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>)";

testbed::HttpRequest requestIn(std::string_view bytes);

class Server {
public:
    /// Once a header that no input had was required, and all were refused unread.
    Server() {
        testbed::buildVendor(repository_, testbed::parseScenario(kServedArray, "array"));
        fuzz::require(answer(requestIn(kUsualRequest)).status == 200, "a usual request is served");
    }

    testbed::HttpResponse answer(const testbed::HttpRequest& request) const {
        testbed::HttpOutcome outcome = server_.answer(request);
        if (const auto* slow = std::get_if<testbed::SlowWork>(&outcome)) return (*slow)();
        return std::get<testbed::HttpResponse>(std::move(outcome));
    }

private:
    testbed::Repository repository_;
    testbed::ObjectManager manager_{repository_};
    testbed::CimServer server_{manager_, "host"};
};

/// Takes the first line off the text, without its end.
std::string_view takeLine(std::string_view& text) {
    const std::string_view line = text.substr(0, text.find('\n'));
    text.remove_prefix(std::min(line.size() + 1, text.size()));
    return line;
}

/// Of HTTP/1.0, whose clients need not name the host.
testbed::HttpRequest requestIn(std::string_view bytes) {
    testbed::HttpRequest request{"POST", "/cimom", {}, {}, 10};
    for (std::string_view line = takeLine(bytes); !line.empty(); line = takeLine(bytes)) {
        const std::size_t colon = std::min(line.find(": "), line.size());
        const std::string_view value = line.substr(std::min(colon + 2, line.size()));
        request.headers.emplace_back(line.substr(0, colon), value);
    }
    request.body = bytes;
    return request;
}

}  // namespace

PLEXOR_FUZZ_HARNESS(request) {
    static const Server server;
    const testbed::HttpResponse response = server.answer(requestIn(bytes));
    for (const auto& [name, value] : response.headers) {
        fuzz::require(value.find_first_of("\r\n") == std::string::npos, "a header is one line");
    }
    if (response.status == 200) testbed::requireWellFormed(response.body);
}
