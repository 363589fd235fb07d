// A server that fails like servers do, on request: for authors of clients.
#pragma once

#include <chrono>
#include <mutex>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "http_message.h"
#include "http_server.h"

namespace testbed {

/// Words that name no fault; the text is for the user.
struct ServerFaultError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// What goes wrong, with which requests, and how often.
struct ServerFault {
    /// Faults of a connection befall it before any request is known; Refuse stops listening.
    enum class Connection { None, Refuse, Reset, Stall };

    Connection connection = Connection::None;
    std::optional<std::string> operation;  ///< none: any
    std::optional<std::string> className;  ///< that the request names; none: any
    int times = -1;                        ///< -1: for ever

    std::chrono::milliseconds delay{0};
    std::optional<int> httpStatus;           ///< instead of an answer
    std::optional<int> cimStatus;            ///< instead of a result
    std::string message;                     ///< of the status; empty: the status's name
    std::optional<int> trailerStatus;        ///< behind a result that looks whole
    std::optional<std::size_t> cutAt;        ///< byte of the body
    std::optional<std::string> contentType;  ///< in the place of the right one
};

/// Reads blank-separated NAME=VALUE, a value quoted when it has blanks:
///   connection=refuse|reset|stall   delay=MILLISECONDS   http=STATUS   status=N   trailer=N
///   message=TEXT   cut=BYTE   type=TEXT   operation=NAME   class=NAME   times=N
/// A fault of a connection takes no more than times, and refuse not even that. Throws
/// ServerFaultError.
ServerFault parseServerFault(std::string_view words);

/// Thread-safe. The first fault that fits and has not run out decides.
class ServerFaults {
public:
    void add(ServerFault fault);
    void clear();
    /// Connections are to be refused.
    bool refusesConnections() const;
    /// What befalls the next connection; counted.
    Welcome welcome();
    /// What befalls a request; counted. `className` is empty when it names none.
    std::optional<ServerFault> match(std::string_view operation, std::string_view className);

private:
    template <class Fits>
    std::optional<ServerFault> take(Fits fits);

    mutable std::mutex mutex_;
    std::vector<ServerFault> faults_;  // guarded by mutex_
};

/// Lets the fault befall a response that was made as if nothing had happened.
void befall(const ServerFault& fault, HttpResponse& response);

}  // namespace testbed
