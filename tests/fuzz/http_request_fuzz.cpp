// What the server reads from a connection: heads, bodies, chunks and trailers, one request after
// the other. The real server's connection, on one thread.
#include "connection.h"
#include "fuzz_target.h"
#include "http_server.h"

namespace {

/// Tells what was understood, with trailers if the target asks for them.
testbed::HttpOutcome echo(const testbed::HttpRequest& request) {
    testbed::HttpResponse response{200, {{"Content-Type", "text/plain"}}, request.body};
    for (const auto& [name, value] : request.headers) {
        fuzz::require(!name.empty(), "a header has a name");
        fuzz::require(value.find('\n') == std::string::npos, "a header is one line");
    }
    if (request.target == "/t") response.mishap.trailers = {{"CIMStatusCode", "1"}};
    return response;
}

testbed::HttpServerOptions optionsOfServer() {
    testbed::HttpServerOptions options;
    options.limits = {2048, 2048};
    return options;
}

}  // namespace

PLEXOR_FUZZ_HARNESS(http_request) {
    static const testbed::HttpServerOptions options = optionsOfServer();
    fuzz::Connection client;
    client.sendLast(bytes);
    testbed::serveHttp(client.handOver(), options, echo);
    const std::string answer = client.received();
    fuzz::require(answer.empty() || answer.starts_with("HTTP/1.1 "), "an answer is one of HTTP");
}
