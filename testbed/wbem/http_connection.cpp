#include "http_connection.h"

#include <sys/socket.h>

#include <cerrno>
#include <utility>

namespace testbed {

HttpConnection::HttpConnection(FileDescriptor socket, const HttpLimits& limits,
                               const HttpTimes& times)
    : socket_(std::move(socket)), times_(times), reader_(limits) {
    enter(Phase::Reading, times_.request);
}

void HttpConnection::enter(Phase phase, std::chrono::milliseconds limit) {
    phase_ = phase;
    since_ = Clock::now();
    deadline_ = since_ + limit;
}

void HttpConnection::receive() {
    char buffer[16 * 1024];
    while (phase_ == Phase::Reading || phase_ == Phase::Draining) {
        const ssize_t size = recv(socket(), buffer, sizeof buffer, 0);
        if (size < 0 && errno == EINTR) continue;
        if (size < 0 && (errno == EAGAIN || errno == EWOULDBLOCK)) return;
        if (size <= 0) return close();
        if (phase_ == Phase::Draining) continue;
        if (!hasBegun_) enter(Phase::Reading, times_.request);
        hasBegun_ = true;
        readOn(reader_.add({buffer, static_cast<std::size_t>(size)}));
    }
}

void HttpConnection::readOn(HttpReader::Progress progress) {
    switch (progress) {
        case HttpReader::Progress::NeedsMore:
            break;
        case HttpReader::Progress::WantsContinue:
            output_ = httpText({100, {}, {}}, true);
            sent_ = 0;
            // A client that does not take these few bytes will not take the response either.
            if (!sendPending()) close();
            break;
        case HttpReader::Progress::Complete:
            request_ = reader_.take();
            keep_ = request_.keepsConnection();
            enter(Phase::Received, {});
            break;
        case HttpReader::Progress::Refused:
            queue({reader_.refusal(), {}, {}}, false);
            break;
    }
}

HttpRequest HttpConnection::takeRequest() {
    phase_ = Phase::Working;
    return std::move(request_);
}

void HttpConnection::respond(const HttpResponse& response) {
    queue(response, keep_);
}

void HttpConnection::queue(const HttpResponse& response, bool keep) {
    keep_ = keep;
    output_ = httpText(response, keep);
    sent_ = 0;
    enter(Phase::Writing, times_.response);
    send();
}

void HttpConnection::send() {
    if (phase_ == Phase::Writing && sendPending()) finish();
}

/// True when all of output_ has been sent. A connection that fails is closed.
bool HttpConnection::sendPending() {
    while (sent_ < output_.size()) {
        const ssize_t size =
            ::send(socket(), output_.data() + sent_, output_.size() - sent_, MSG_NOSIGNAL);
        if (size < 0 && errno == EINTR) continue;
        if (size < 0 && errno != EAGAIN && errno != EWOULDBLOCK) close();
        if (size < 0) return false;
        sent_ += static_cast<std::size_t>(size);
    }
    return true;
}

void HttpConnection::finish() {
    output_ = {};
    if (!keep_) {
        // Closing while the client still sends would reset the connection and lose the response.
        shutdown(socket(), SHUT_WR);
        enter(Phase::Draining, times_.drain);
        return;
    }
    hasBegun_ = !reader_.isIdle();
    enter(Phase::Reading, hasBegun_ ? times_.request : times_.idle);
    if (hasBegun_) readOn(reader_.add(""));
}

}  // namespace testbed
