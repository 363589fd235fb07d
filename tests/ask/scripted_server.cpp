#include "scripted_server.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cstdlib>
#include <stdexcept>

#include "canned_answers.h"

namespace {

/// Head and body of a request, as far as they come.
std::string readRequest(int connection) {
    std::string request;
    std::size_t wanted = std::string::npos;
    char buffer[4096];
    while (request.size() < wanted) {
        const ssize_t count = recv(connection, buffer, sizeof buffer, 0);
        if (count <= 0) break;
        request.append(buffer, static_cast<std::size_t>(count));
        const std::size_t end = request.find("\r\n\r\n");
        if (end == std::string::npos) continue;
        const std::size_t length = request.find("Content-Length: ");
        wanted = end + 4;
        if (length < end) wanted += std::strtoul(request.c_str() + length + 16, nullptr, 10);
    }
    return request;
}

bool sendAll(int connection, std::string_view bytes) {
    while (!bytes.empty()) {
        const ssize_t count = send(connection, bytes.data(), bytes.size(), MSG_NOSIGNAL);
        if (count <= 0) return false;
        bytes.remove_prefix(static_cast<std::size_t>(count));
    }
    return true;
}

}  // namespace

ScriptedServer::ScriptedServer(Script script) : script_(std::move(script)) {
    listener_ = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    sockaddr_in address = {};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof address;
    auto* plain = reinterpret_cast<sockaddr*>(&address);
    if (bind(listener_, plain, size) != 0 || listen(listener_, 16) != 0 ||
        getsockname(listener_, plain, &size) != 0 || pipe(wake_) != 0)
        throw std::runtime_error("no port to listen on");
    port_ = ntohs(address.sin_port);
    thread_ = std::thread([this] { run(); });
}

ScriptedServer::~ScriptedServer() {
    close(wake_[1]);
    thread_.join();
    close(wake_[0]);
    close(listener_);
}

std::string ScriptedServer::url() const {
    return "http://127.0.0.1:" + std::to_string(port_);
}

std::vector<std::string> ScriptedServer::requests() const {
    const std::lock_guard lock(mutex_);
    return requests_;
}

void ScriptedServer::setPauses(std::chrono::milliseconds before,
                               std::chrono::milliseconds between) {
    const std::lock_guard lock(mutex_);
    before_ = before;
    between_ = between;
}

void ScriptedServer::run() {
    for (;;) {
        pollfd entries[] = {{listener_, POLLIN, 0}, {wake_[0], POLLIN, 0}};
        poll(entries, 2, -1);
        if (entries[1].revents != 0) return;
        const int connection = accept(listener_, nullptr, nullptr);
        if (connection < 0) continue;
        answer(connection);
        close(connection);
    }
}

void ScriptedServer::answer(int connection) {
    const std::string request = readRequest(connection);
    std::chrono::milliseconds before, between;
    {
        const std::lock_guard lock(mutex_);
        requests_.push_back(request);
        before = before_;
        between = between_;
    }
    const std::string text = withId(script_(request), request);
    if (!pause(before)) return;
    if (between.count() == 0) {
        sendAll(connection, text);
        return;
    }
    for (const char& byte : text)
        if (!sendAll(connection, {&byte, 1}) || !pause(between)) return;
}

bool ScriptedServer::pause(std::chrono::milliseconds time) const {
    pollfd entry = {wake_[0], POLLIN, 0};
    return time.count() == 0 || poll(&entry, 1, static_cast<int>(time.count())) == 0;
}
