// Responses that go on for as long as their client stays.
#include <gtest/gtest.h>

#include <algorithm>
#include <mutex>

#include "http_server.h"
#include "raw_client.h"

namespace testbed {
namespace {

/// What is said goes to all clients.
class Speaker {
public:
    std::shared_ptr<HttpStream> stream() { return std::make_shared<Stream>(*this); }

    void say(const std::string& text) {
        const std::lock_guard lock(mutex_);
        for (Stream* stream : streams_) stream->take(text);
    }
    std::size_t listeners() {
        const std::lock_guard lock(mutex_);
        return streams_.size();
    }
    bool hasListeners(std::size_t count) {
        for (int i = 0; i < 1000 && listeners() != count; i++)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        return listeners() == count;
    }

private:
    class Stream : public HttpStream {
    public:
        explicit Stream(Speaker& speaker) : speaker_(speaker) {
            const std::lock_guard lock(speaker_.mutex_);
            speaker_.streams_.push_back(this);
        }
        ~Stream() override {
            const std::lock_guard lock(speaker_.mutex_);
            std::erase(speaker_.streams_, this);
        }
        Text next() override {
            const std::lock_guard lock(speaker_.mutex_);
            if (texts_.empty()) return nullptr;
            Text text = texts_.front();
            texts_.erase(texts_.begin());
            return text;
        }
        void onNews(std::function<void()> wake) override {
            const std::lock_guard lock(speaker_.mutex_);
            wake_ = std::move(wake);
        }
        void take(const std::string& text) {
            texts_.push_back(std::make_shared<const std::string>(text));
            if (wake_) wake_();
        }

    private:
        Speaker& speaker_;
        std::vector<Text> texts_;
        std::function<void()> wake_;
    };

    std::mutex mutex_;
    std::vector<Stream*> streams_;
};

class HttpStreams : public ::testing::Test {
protected:
    static HttpServerOptions options() {
        HttpServerOptions options;
        options.port = 0;
        options.connections = 3;
        return options;
    }

    Speaker speaker_;
    HttpServer server_{options(), [this](const HttpRequest& request) {
                           if (request.target == "/peer")
                               return HttpResponse{request.isFromThisHost ? 200 : 403, {}, {}};
                           return HttpResponse{200, {}, {}, {}, speaker_.stream()};
                       }};
    const std::string request_ = "GET / HTTP/1.1\r\nHost: a\r\n\r\n";
};

TEST_F(HttpStreams, EverybodyGetsWhatIsSaid) {
    RawClient first(server_.port()), second(server_.port());
    for (RawClient* client : {&first, &second}) client->send(request_);
    ASSERT_TRUE(speaker_.hasListeners(2));
    speaker_.say("one\n");
    speaker_.say("two\n");
    for (RawClient* client : {&first, &second}) {
        const std::string text = client->receiveUntil("two\n", 1);
        EXPECT_TRUE(text.starts_with("HTTP/1.1 200 OK\r\nConnection: close\r\n\r\none\n")) << text;
    }
    speaker_.say("three\n");
    EXPECT_EQ(first.receiveUntil("\n", 1), "three\n");
}

TEST_F(HttpStreams, WhoHasGoneIsForgotten) {
    {
        RawClient client(server_.port());
        client.send(request_);
        ASSERT_TRUE(speaker_.hasListeners(1));
    }
    for (int i = 0; i < 1000 && speaker_.listeners() > 0; i++) {
        speaker_.say("still there?\n");
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    EXPECT_EQ(speaker_.listeners(), 0u);
}

TEST_F(HttpStreams, GiveWayToNewClients) {
    RawClient first(server_.port()), second(server_.port()), third(server_.port());
    first.send(request_);
    ASSERT_TRUE(speaker_.hasListeners(1));
    for (RawClient* client : {&second, &third}) client->send(request_);
    ASSERT_TRUE(speaker_.hasListeners(3));
    EXPECT_EQ(exchange(server_.port(), "GET /peer HTTP/1.1\r\nHost: a\r\n\r\n").status, 200);
    first.receiveUntil("\r\n\r\n", 1);
    EXPECT_TRUE(first.isClosedWithin(std::chrono::seconds(20)));
    speaker_.say("on\n");
    EXPECT_TRUE(second.receiveUntil("on\n", 1).ends_with("on\n"));
}

}  // namespace
}  // namespace testbed
