#include "input_lines.h"

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>

namespace testbed {

std::optional<std::string> InputLines::next(std::chrono::milliseconds limit, int interrupt) {
    using Clock = std::chrono::steady_clock;
    const auto deadline = Clock::now() + limit;
    while (true) {
        if (auto line = takeLine()) return line;
        const auto left =
            std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now()).count();
        // A negative descriptor is one that nothing is awaited from.
        pollfd sources[] = {{ended_ ? -1 : STDIN_FILENO, POLLIN, 0}, {interrupt, POLLIN, 0}};
        const int ready = poll(sources, std::size(sources), std::max(0, static_cast<int>(left)));
        if (ready == 0 || sources[1].revents != 0) return std::nullopt;
        if (ready < 0 && errno != EINTR) return std::nullopt;
        if (ready > 0) receive();
    }
}

/// The first line that has arrived; at the end also one that nothing ends.
std::optional<std::string> InputLines::takeLine() {
    const std::size_t end = arrived_.find('\n');
    if (end == std::string::npos && !(ended_ && !arrived_.empty())) return std::nullopt;
    std::string line = arrived_.substr(0, end);
    arrived_.erase(0, end == std::string::npos ? end : end + 1);
    return line;
}

void InputLines::receive() {
    char buffer[4096];
    const ssize_t size = read(STDIN_FILENO, buffer, sizeof buffer);
    if (size > 0) arrived_.append(buffer, static_cast<std::size_t>(size));
    ended_ = size == 0 || (size < 0 && errno != EINTR && errno != EAGAIN);
}

}  // namespace testbed
