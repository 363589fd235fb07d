// One client's connection: what has arrived, what is to be sent, and until when.
#pragma once

#include <chrono>
#include <string>

#include "file_descriptor.h"
#include "http_reader.h"

namespace testbed {

/// What a client may take, from the first byte to the last, however it spreads them.
struct HttpTimes {
    std::chrono::milliseconds request{10'000};
    std::chrono::milliseconds idle{30'000};      ///< between two requests
    std::chrono::milliseconds response{30'000};  ///< to take a response
    std::chrono::milliseconds drain{2'000};      ///< to stop sending after a refusal
};

/// Never waits: the socket is non-blocking. For one thread.
class HttpConnection {
public:
    using Clock = std::chrono::steady_clock;
    /// Before Received a connection may be given up for another one; the first ones are first.
    enum class Phase { Draining, Reading, Writing, Received, Working, Closed };

    HttpConnection(FileDescriptor socket, const HttpLimits& limits, const HttpTimes& times);

    int socket() const { return socket_.get(); }
    Phase phase() const { return phase_; }
    Clock::time_point since() const { return since_; }  ///< of the phase
    bool mayBeGivenUp() const { return phase_ < Phase::Received; }
    bool isLate(Clock::time_point now) const { return mayBeGivenUp() && now >= deadline_; }

    /// Reads what is there. In Reading, a request that has arrived whole leads to Received, one
    /// that must be refused to Writing.
    void receive();
    /// In Received: the request, and on to Working.
    HttpRequest takeRequest();
    /// In Working: sends the response, as far as the socket takes it.
    void respond(const HttpResponse& response);
    /// Sends on, in Writing; behind the last byte come Reading, Draining or Closed.
    void send();
    void close() { phase_ = Phase::Closed; }

private:
    void enter(Phase phase, std::chrono::milliseconds limit);
    void readOn(HttpReader::Progress progress);
    void queue(const HttpResponse& response, bool keep);
    void finish();
    bool sendPending();

    FileDescriptor socket_;
    HttpTimes times_;
    HttpReader reader_;
    HttpRequest request_;
    std::string output_;
    std::size_t sent_ = 0;
    bool keep_ = true;
    bool hasBegun_ = false;  // something of the next request has arrived
    Phase phase_ = Phase::Reading;
    Clock::time_point since_;
    Clock::time_point deadline_;
};

}  // namespace testbed
