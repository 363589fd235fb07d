#include <netdb.h>
#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <utility>

#include "byte_stream.h"
#include "file_descriptor.h"

namespace testbed {
namespace {

using Clock = std::chrono::steady_clock;

constexpr const char* kLate = "no answer in time";

/// False when nothing has happened by the deadline.
bool waitFor(int descriptor, short events, Deadline deadline) {
    for (;;) {
        const auto left =
            std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now()).count();
        constexpr decltype(left) kLongest = 60'000;
        pollfd entry = {descriptor, events, 0};
        const int count = poll(&entry, 1, static_cast<int>(std::clamp(left, {}, kLongest)));
        if (count > 0) return true;
        if (count < 0 && errno != EINTR) return true;  // the next call says what is wrong
        if (Clock::now() >= deadline) return false;
    }
}

class TcpStream : public ByteStream {
public:
    TcpStream(FileDescriptor socket, Deadline deadline)
        : socket_(std::move(socket)), deadline_(deadline) {}

    std::size_t read(char* buffer, std::size_t size) override {
        for (;;) {
            // A peer that never pauses does not get past the deadline either.
            if (Clock::now() >= deadline_) throw WbemError(kLate);
            const ssize_t count = recv(socket_.get(), buffer, size, 0);
            if (count >= 0) return static_cast<std::size_t>(count);
            await(POLLIN, "the server closed the connection");
        }
    }

    void write(std::string_view bytes) override {
        while (!bytes.empty()) {
            const ssize_t count = send(socket_.get(), bytes.data(), bytes.size(), MSG_NOSIGNAL);
            if (count >= 0)
                bytes.remove_prefix(static_cast<std::size_t>(count));
            else
                await(POLLOUT, "the server takes no request");
        }
    }

private:
    /// After a call that failed: waits if that helps. Throws WbemError otherwise.
    void await(short events, const char* failure) {
        if (errno == EINTR) return;
        if (errno != EAGAIN && errno != EWOULDBLOCK)
            throw WbemError(std::string(failure) + ": " + std::strerror(errno));
        if (!waitFor(socket_.get(), events, deadline_)) throw WbemError(kLate);
    }

    FileDescriptor socket_;
    Deadline deadline_;
};

/// 0, or the number of the error.
int connectTo(const FileDescriptor& socket, const addrinfo& address, Deadline deadline) {
    if (connect(socket.get(), address.ai_addr, address.ai_addrlen) == 0) return 0;
    if (errno != EINPROGRESS) return errno;
    if (!waitFor(socket.get(), POLLOUT, deadline)) return ETIMEDOUT;
    int error = 0;
    socklen_t size = sizeof error;
    return getsockopt(socket.get(), SOL_SOCKET, SO_ERROR, &error, &size) == 0 ? error : errno;
}

using Addresses = std::unique_ptr<addrinfo, decltype(&freeaddrinfo)>;

Addresses addressesOf(const std::string& host, unsigned short port) {
    addrinfo hints = {};
    hints.ai_socktype = SOCK_STREAM;
    addrinfo* found = nullptr;
    const int error = getaddrinfo(host.c_str(), std::to_string(port).c_str(), &hints, &found);
    if (error != 0) throw WbemError("the host is not known: " + std::string(gai_strerror(error)));
    return {found, freeaddrinfo};
}

/// An address that never answers must leave time for the next one.
Deadline deadlineOf(const addrinfo& address, Deadline deadline) {
    const Deadline now = Clock::now();
    return address.ai_next == nullptr || now >= deadline ? deadline : now + (deadline - now) / 2;
}

}  // namespace

std::unique_ptr<ByteStream> connectTcp(const std::string& host, unsigned short port,
                                       Deadline deadline) {
    const Addresses addresses = addressesOf(host, port);
    int error = 0;
    for (const addrinfo* address = addresses.get(); address; address = address->ai_next) {
        FileDescriptor socket(
            ::socket(address->ai_family, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0));
        error =
            !socket.isOpen() ? errno : connectTo(socket, *address, deadlineOf(*address, deadline));
        if (error == 0) return std::make_unique<TcpStream>(std::move(socket), deadline);
    }
    throw WbemError("no connection: " + std::string(std::strerror(error)));
}

}  // namespace testbed
