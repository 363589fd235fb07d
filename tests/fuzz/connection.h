// Both ends of a connection within this process, for what is read from the network.
#pragma once

#include <sys/socket.h>
#include <unistd.h>

#include <string>
#include <string_view>
#include <utility>

#include "fuzz_target.h"

namespace fuzz {

/// A pair of local sockets: no ports, and no thread for the peer. What one end is sent waits for
/// the other.
class Connection {
public:
    Connection() {
        require(socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends_) == 0,
                "there are sockets");
    }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;
    ~Connection() {
        for (const int end : ends_) {
            if (end >= 0) close(end);
        }
    }

    /// The other end, for whom to close it.
    int handOver() { return std::exchange(ends_[1], -1); }
    /// Sends it all and says that there is no more.
    void sendLast(std::string_view bytes) const {
        const ssize_t sent = send(ends_[0], bytes.data(), bytes.size(), MSG_NOSIGNAL);
        require(sent == static_cast<ssize_t>(bytes.size()), "there is room for what is sent");
        shutdown(ends_[0], SHUT_WR);
    }
    /// All that has come, from a peer that has closed its end.
    std::string received() const {
        std::string all;
        char piece[4096];
        for (ssize_t size = 1; size > 0; all.append(piece, size > 0 ? size : 0))
            size = recv(ends_[0], piece, sizeof piece, MSG_DONTWAIT);
        return all;
    }

private:
    int ends_[2] = {-1, -1};
};

}  // namespace fuzz
