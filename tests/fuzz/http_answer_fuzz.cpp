// What the client reads from a server: heads, bodies, chunks and trailers. It is the real client,
// on a connection where the answer has come already.
#include "connection.h"
#include "fuzz_target.h"
#include "http_post.h"

namespace {

constexpr std::size_t kLargestBody = 2048;

}  // namespace

PLEXOR_FUZZ_HARNESS(http_answer) {
    static const testbed::PostRequest request{"host", 5988, {}, "host", "/cimom", {}, "body"};
    fuzz::Connection server;
    server.sendLast(bytes);
    try {
        const testbed::PostAnswer answer = testbed::httpPostOn(
            server.handOver(), request,
            {std::chrono::steady_clock::now() + std::chrono::seconds(10), kLargestBody});
        fuzz::require(answer.status / 100 != 1, "what is only on the way is no answer");
        fuzz::require(answer.body.size() <= kLargestBody, "a body is bounded");
        if (!answer.headers.empty()) {
            const auto& [name, value] = answer.headers.front();
            fuzz::require(answer.header(name) == value, "a header is found by its name");
        }
    } catch (const testbed::WbemError& error) {
        fuzz::require(*error.what() != '\0', "a refusal has a text");
    }
}
