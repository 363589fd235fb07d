#include "raw_client.h"

#include <arpa/inet.h>
#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <cstring>
#include <sstream>
#include <stdexcept>

#include "cim_object.h"

namespace testbed {
namespace {

/// The answer in the text, when it is whole; its size is told in `size`.
bool readReply(const std::string& text, Reply& reply, std::size_t& size) {
    const std::size_t end = text.find("\r\n\r\n");
    if (end == std::string::npos) return false;
    std::istringstream head(text.substr(0, end));
    std::string line;
    std::getline(head, line);
    reply = {};
    reply.status = std::atoi(line.c_str() + std::strlen("HTTP/1.1 "));
    while (std::getline(head, line)) {
        const std::size_t colon = line.find(':');
        const std::size_t length = line.ends_with('\r') ? line.size() - 1 : line.size();
        reply.headers.emplace_back(line.substr(0, colon),
                                   line.substr(colon + 2, length - colon - 2));
    }
    const std::size_t expected = std::strtoul(reply.header("Content-Length").c_str(), nullptr, 10);
    reply.body = text.substr(end + 4, expected);
    size = end + 4 + expected;
    return reply.body.size() == expected;
}

}  // namespace

std::string Reply::header(std::string_view name) const {
    for (const auto& [known, value] : headers)
        if (sameName(known, name)) return value;
    return "";
}

RawClient::RawClient(std::uint16_t port) : socket_(socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
    sockaddr_in address = {};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    if (connect(socket_.get(), reinterpret_cast<sockaddr*>(&address), sizeof address) != 0)
        throw std::runtime_error(std::string("connect: ") + std::strerror(errno));
}

bool RawClient::send(std::string_view bytes) {
    while (!bytes.empty()) {
        const ssize_t size = ::send(socket_.get(), bytes.data(), bytes.size(), MSG_NOSIGNAL);
        if (size < 0) return false;
        bytes.remove_prefix(static_cast<std::size_t>(size));
    }
    return true;
}

void RawClient::endSending() {
    shutdown(socket_.get(), SHUT_WR);
}

/// False at the end of the connection or of the time.
bool RawClient::waitForBytes(std::chrono::steady_clock::time_point deadline) {
    const auto left =
        std::chrono::ceil<std::chrono::milliseconds>(deadline - std::chrono::steady_clock::now());
    pollfd source = {socket_.get(), POLLIN, 0};
    if (poll(&source, 1, std::max(0, static_cast<int>(left.count()))) <= 0) return false;
    char buffer[65536];
    const ssize_t size = recv(socket_.get(), buffer, sizeof buffer, 0);
    if (size > 0) arrived_.append(buffer, static_cast<std::size_t>(size));
    return size > 0;
}

Reply RawClient::receive(std::chrono::milliseconds limit) {
    const auto deadline = std::chrono::steady_clock::now() + limit;
    Reply reply;
    std::size_t size = 0;
    while (!readReply(arrived_, reply, size))
        if (!waitForBytes(deadline)) return reply;
    arrived_.erase(0, size);
    return reply;
}

std::string RawClient::receiveUntil(std::string_view mark, int count) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    std::size_t end = 0;
    while (count > 0) {
        const std::size_t found = arrived_.find(mark, end);
        if (found != std::string::npos) {
            end = found + mark.size();
            count--;
        } else if (!waitForBytes(deadline)) {
            end = arrived_.size();
            break;
        }
    }
    std::string text = arrived_.substr(0, end);
    arrived_.erase(0, end);
    return text;
}

bool RawClient::isClosedWithin(std::chrono::milliseconds limit) {
    const auto deadline = std::chrono::steady_clock::now() + limit;
    while (waitForBytes(deadline)) {
    }
    return std::chrono::steady_clock::now() < deadline;
}

Reply exchange(std::uint16_t port, std::string_view request) {
    RawClient client(port);
    client.send(request);
    return client.receive();
}

}  // namespace testbed
