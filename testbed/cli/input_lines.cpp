// Reading and waiting, with terminals of other jobs and named pipes that get a next writer.
#include "input_lines.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>

namespace testbed {
namespace {

constexpr const char* kStandardInput = "/proc/self/fd/0";

/// A terminal gives its lines to the job in the foreground only.
bool belongsToAnotherJob(int descriptor) {
    const pid_t foreground = tcgetpgrp(descriptor);
    return foreground >= 0 && foreground != getpgrp();
}

/// A pipe that has a name in the file system can get another writer.
bool isNamedPipe(int descriptor) {
    struct stat status = {};
    char name[2] = "";
    return fstat(descriptor, &status) == 0 && S_ISFIFO(status.st_mode) &&
           readlink(kStandardInput, name, 1) == 1 && name[0] == '/';
}

}  // namespace

InputLines::InputLines(Pipe pipe) : pipe_(pipe), descriptor_(STDIN_FILENO) {
    // Between the look at the terminal and the read the job may go to the background.
    signal(SIGTTIN, SIG_IGN);
}

std::optional<std::string> InputLines::next(std::chrono::milliseconds limit, int interrupt) {
    using Clock = std::chrono::steady_clock;
    constexpr std::chrono::milliseconds kLongestPause{1000};
    const auto deadline = Clock::now() + limit;
    while (true) {
        if (auto line = take()) return line;
        const auto left =
            std::max(std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now()), {});
        // A negative descriptor is one that nothing is awaited from.
        pollfd sources[] = {{descriptor(), POLLIN, 0}, {interrupt, POLLIN, 0}};
        const int ready = poll(sources, std::size(sources),
                               static_cast<int>(std::min(left, kLongestPause).count()));
        if (sources[1].revents != 0 || (ready == 0 && left <= kLongestPause)) return std::nullopt;
        if (ready < 0 && errno != EINTR) return std::nullopt;
        if (ready > 0) receive();
    }
}

int InputLines::descriptor() const {
    return ended_ || belongsToAnotherJob(descriptor_) ? -1 : descriptor_;
}

/// The first line that has arrived; at the end also one that nothing ends.
std::optional<std::string> InputLines::take() {
    const std::size_t end = arrived_.find('\n');
    if (end == std::string::npos && !(ended_ && !arrived_.empty())) return std::nullopt;
    std::string line = arrived_.substr(0, end);
    arrived_.erase(0, end == std::string::npos ? end : end + 1);
    return line;
}

/// A new reader of the named pipe, which waits for its next writer. False for anything else.
bool InputLines::reopen() {
    if (pipe_ != Pipe::Reopens || !isNamedPipe(descriptor_)) return false;
    const int again = open(kStandardInput, O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    if (again < 0) return false;
    dup2(again, descriptor_);
    close(again);
    // A writer's last line is a line, whether it has an end or not.
    if (!arrived_.empty() && arrived_.back() != '\n') arrived_ += '\n';
    return true;
}

void InputLines::receive() {
    char buffer[4096];
    const ssize_t size = read(descriptor_, buffer, sizeof buffer);
    if (size > 0) {
        arrived_.append(buffer, static_cast<std::size_t>(size));
        return;
    }
    const bool tryAgain = size < 0 && (errno == EINTR || errno == EAGAIN ||
                                       (errno == EIO && belongsToAnotherJob(descriptor_)));
    ended_ = !tryAgain && !reopen();
}

}  // namespace testbed
