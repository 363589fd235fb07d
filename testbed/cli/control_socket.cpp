// Both ends of the control socket: taking connections and their lines, and sending one command.
#include "control_socket.h"

#include <fcntl.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <optional>
#include <stdexcept>

namespace testbed {
namespace {

constexpr std::size_t kMostConnections = 16;
constexpr std::size_t kLongestCommand = 65536;
constexpr std::chrono::seconds kPatience{5};
constexpr std::chrono::seconds kAnswerLimit{60};
constexpr const char* kOkReply = "ok\n";
constexpr const char* kRefusedReply = "refused\n";

[[noreturn]] void failAt(const std::string& path, const std::string& what) {
    throw std::runtime_error(path + ": " + what);
}

sockaddr_un addressOf(const std::string& path) {
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof address.sun_path) failAt(path, "too long for the name of a socket");
    path.copy(address.sun_path, path.size());
    return address;
}

FileDescriptor connectTo(const std::string& path) {
    const sockaddr_un address = addressOf(path);
    FileDescriptor descriptor(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
    if (connect(descriptor.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) !=
        0) {
        return FileDescriptor();
    }
    return descriptor;
}

void limitWaits(int descriptor, std::chrono::seconds limit) {
    const timeval time = {limit.count(), 0};
    setsockopt(descriptor, SOL_SOCKET, SO_SNDTIMEO, &time, sizeof time);
    setsockopt(descriptor, SOL_SOCKET, SO_RCVTIMEO, &time, sizeof time);
}

bool sendAll(int descriptor, const std::string& text) {
    for (std::size_t sent = 0; sent < text.size();) {
        const ssize_t size = send(descriptor, text.data() + sent, text.size() - sent, MSG_NOSIGNAL);
        if (size < 0 && errno == EINTR) continue;
        if (size <= 0) return false;
        sent += static_cast<std::size_t>(size);
    }
    return true;
}

/// What arrives without waiting. False when the other side has gone.
bool receiveWaiting(int descriptor, std::string& received) {
    char buffer[4096];
    ssize_t size = 0;
    while ((size = recv(descriptor, buffer, sizeof buffer, MSG_DONTWAIT)) > 0) {
        received.append(buffer, static_cast<std::size_t>(size));
        if (received.size() > kLongestCommand) return true;
    }
    return size < 0 && (errno == EAGAIN || errno == EINTR);
}

void answer(int descriptor, const CommandResult& result) {
    fcntl(descriptor, F_SETFL, 0);
    limitWaits(descriptor, kPatience);
    sendAll(descriptor, (result.refused ? kRefusedReply : kOkReply) + result.text);
}

}  // namespace

ControlSocket::ControlSocket(std::string path) : path_(std::move(path)) {
    if (path_.empty()) return;
    const sockaddr_un address = addressOf(path_);
    struct stat status = {};
    if (lstat(path_.c_str(), &status) == 0 && S_ISSOCK(status.st_mode)) {
        if (connectTo(path_).isOpen()) failAt(path_, "another server listens there");
        unlink(path_.c_str());
    }
    listener_ = FileDescriptor(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
    const mode_t mask = umask(0077);
    const bool bound =
        bind(listener_.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0;
    const int error = errno;
    umask(mask);
    if (!bound) {
        path_.clear();
        failAt(address.sun_path, std::strerror(error));
    }
    listen(listener_.get(), kMostConnections);
}

ControlSocket::~ControlSocket() {
    if (listener_.isOpen()) unlink(path_.c_str());
}

void ControlSocket::watch(std::vector<pollfd>& sources) const {
    if (!listener_.isOpen()) return;
    sources.push_back({listener_.get(), POLLIN, 0});
    for (const Connection& connection : connections_) {
        sources.push_back({connection.descriptor.get(), POLLIN, 0});
    }
}

void ControlSocket::takeConnections() {
    while (listener_.isOpen()) {
        FileDescriptor descriptor(
            accept4(listener_.get(), nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK));
        if (!descriptor.isOpen()) return;
        if (connections_.size() == kMostConnections) connections_.pop_front();
        connections_.push_back(
            {std::move(descriptor), "", std::chrono::steady_clock::now() + kPatience});
    }
}

bool ControlSocket::attend(const std::function<CommandResult(const std::string&)>& carryOut) {
    takeConnections();
    for (auto it = connections_.begin(); it != connections_.end();) {
        const auto connection = it++;
        const int descriptor = connection->descriptor.get();
        const bool isOpen = receiveWaiting(descriptor, connection->received);
        const std::size_t end = connection->received.find('\n');
        if (end != std::string::npos) {
            const CommandResult result = carryOut(connection->received.substr(0, end));
            answer(descriptor, result);
            if (result.quits) return false;
        } else if (connection->received.size() > kLongestCommand) {
            answer(descriptor, {true, false, "the command is too long"});
        } else if (isOpen && std::chrono::steady_clock::now() < connection->end) {
            continue;
        }
        connections_.erase(connection);
    }
    return true;
}

CommandResult tellSocket(const std::string& path, const std::string& command) {
    const FileDescriptor descriptor = connectTo(path);
    if (!descriptor.isOpen()) failAt(path, std::strerror(errno));
    limitWaits(descriptor.get(), kAnswerLimit);
    std::string line = command;
    for (char& c : line) {
        if (c == '\n') c = ' ';
    }
    std::string reply;
    char buffer[4096];
    if (sendAll(descriptor.get(), line + "\n")) {
        for (ssize_t size = 0; (size = recv(descriptor.get(), buffer, sizeof buffer, 0)) > 0;) {
            reply.append(buffer, static_cast<std::size_t>(size));
        }
    }
    if (reply.starts_with(kOkReply)) return {false, false, reply.substr(std::strlen(kOkReply))};
    if (reply.starts_with(kRefusedReply)) {
        return {true, false, reply.substr(std::strlen(kRefusedReply))};
    }
    failAt(path, "no answer");
}

}  // namespace testbed
