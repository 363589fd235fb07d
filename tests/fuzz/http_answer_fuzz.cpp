// What the client reads from a server: heads, bodies, chunks and trailers. It is the real client,
// over the loopback interface.
#include <mutex>
#include <thread>

#include "fuzz_target.h"
#include "http_post.h"
#include "loopback.h"

namespace {

constexpr std::size_t kLargestBody = 2048;

/// Answers everybody with the same bytes. Ends with the process.
class AnsweringServer {
public:
    AnsweringServer() {
        std::thread([this] { serve(); }).detach();
    }
    std::uint16_t port() const { return port_; }
    void answerWith(std::string_view bytes) {
        const std::lock_guard lock(mutex_);
        answer_ = bytes;
    }

private:
    [[noreturn]] void serve() {
        for (;;) {
            const fuzz::Socket peer = listener_.accept();
            peer.receive();
            peer.sendLast(answer());
            peer.receiveAll();
        }
    }
    std::string answer() {
        const std::lock_guard lock(mutex_);
        return answer_;
    }

    fuzz::Socket listener_;
    const std::uint16_t port_ = listener_.listenAnywhere();
    std::mutex mutex_;
    std::string answer_;  // guarded by mutex_
};

}  // namespace

PLEXOR_FUZZ_HARNESS(http_answer) {
    // Not ended: its thread is not.
    static AnsweringServer& server = *new AnsweringServer;
    server.answerWith(bytes);
    const testbed::PostRequest request{"127.0.0.1", server.port(), {}, "host", "/cimom",
                                       {},          "body"};
    try {
        const testbed::PostAnswer answer = testbed::httpPost(
            request, {std::chrono::steady_clock::now() + std::chrono::seconds(10), kLargestBody});
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
