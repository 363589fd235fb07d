// Commands from other processes: one over each connection to a socket in the file system.
#pragma once

#include <poll.h>

#include <chrono>
#include <functional>
#include <list>
#include <string>
#include <vector>

#include "file_descriptor.h"

namespace testbed {

/// What has become of a command.
struct CommandResult {
    bool refused = false;
    bool quits = false;
    std::string text;  ///< an answer, or why it was refused; "" when there is nothing to say
};

/// A client sends a line; it gets "ok" or "refused" and the result's text behind it, and the
/// connection ends. Only the user who made the socket can connect. For one thread.
class ControlSocket {
public:
    /// Without a path nobody can connect. Throws std::runtime_error; a socket that nobody listens
    /// to any more is replaced.
    explicit ControlSocket(std::string path);
    ~ControlSocket();
    ControlSocket(const ControlSocket&) = delete;
    ControlSocket& operator=(const ControlSocket&) = delete;

    /// Adds what is to be waited for.
    void watch(std::vector<pollfd>& sources) const;
    /// Takes connections and lines that have arrived, and answers them. False when a command quits.
    bool attend(const std::function<CommandResult(const std::string&)>& carryOut);

private:
    struct Connection {
        FileDescriptor descriptor;
        std::string received;
        std::chrono::steady_clock::time_point end;
    };
    void takeConnections();

    std::string path_;
    FileDescriptor listener_;
    std::list<Connection> connections_;
};

/// Sends one command to the socket. Throws std::runtime_error when nobody answers.
CommandResult tellSocket(const std::string& path, const std::string& command);

}  // namespace testbed
