// Sockets on this host for what is read from the network.
#pragma once

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <sys/time.h>
#include <unistd.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <utility>

#include "fuzz_target.h"

namespace fuzz {

class Socket {
public:
    Socket() : Socket(socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
        require(number_ >= 0, "there is a socket");
    }
    explicit Socket(int number) : number_(number) {}
    Socket(Socket&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
    Socket& operator=(Socket&&) = delete;
    /// Resets the connection: a closed one would keep its port for a minute.
    ~Socket() {
        if (number_ < 0) return;
        const linger atOnce = {1, 0};
        setsockopt(number_, SOL_SOCKET, SO_LINGER, &atOnce, sizeof atOnce);
        close(number_);
    }

    /// Listens on a port that is free.
    std::uint16_t listenAnywhere() const {
        sockaddr_in address = loopback(0);
        socklen_t size = sizeof address;
        auto* general = reinterpret_cast<sockaddr*>(&address);
        const bool listens = bind(number_, general, size) == 0 && listen(number_, 16) == 0 &&
                             getsockname(number_, general, &size) == 0;
        require(listens, "there is a port");
        return ntohs(address.sin_port);
    }
    Socket accept() const { return Socket(::accept(number_, nullptr, nullptr)); }
    void connectTo(std::uint16_t port) const {
        const sockaddr_in address = loopback(port);
        const auto* general = reinterpret_cast<const sockaddr*>(&address);
        require(connect(number_, general, sizeof address) == 0, "somebody listens");
    }
    /// Sends it all and says that there is no more. A peer that has gone already does not matter.
    void sendLast(std::string_view bytes) const {
        while (!bytes.empty()) {
            const ssize_t sent = send(number_, bytes.data(), bytes.size(), MSG_NOSIGNAL);
            if (sent <= 0) break;
            bytes.remove_prefix(static_cast<std::size_t>(sent));
        }
        shutdown(number_, SHUT_WR);
    }
    /// One piece of what comes; "" at the end, and when the peer has reset the connection.
    std::string receive() const {
        char piece[4096];
        const ssize_t size = recv(number_, piece, sizeof piece, 0);
        return size > 0 ? std::string(piece, static_cast<std::size_t>(size)) : "";
    }
    std::string receiveAll() const {
        std::string all;
        for (std::string piece = receive(); !piece.empty(); piece = receive()) all += piece;
        return all;
    }

private:
    static sockaddr_in loopback(std::uint16_t port) {
        sockaddr_in address = {};
        address.sin_family = AF_INET;
        address.sin_port = htons(port);
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        return address;
    }

    int number_;
};

}  // namespace fuzz
