// A log that takes every line, in front of the C library's: it is formatted and written to where
// nothing is kept. The least that an open log costs; what a log service does with it comes on top.
#include <fcntl.h>
#include <unistd.h>

#include <syslog.h>
#include <algorithm>
#include <cstdarg>
#include <cstdio>

namespace {

[[gnu::format(printf, 2, 0)]] void write(int priority, const char* format, va_list args) {
    static const int nowhere = open("/dev/null", O_WRONLY | O_CLOEXEC);
    if ((setlogmask(0) & LOG_MASK(LOG_PRI(priority))) == 0) return;
    char line[1024];
    const int length = std::vsnprintf(line, sizeof line, format, args);
    const auto size = std::min(static_cast<std::size_t>(std::max(length, 0)), sizeof line);
    [[maybe_unused]] const ssize_t written = ::write(nowhere, line, size);
}

}  // namespace

// Which name the provider calls depends on how it was compiled.
extern "C" void syslog(int priority, const char* format, ...) {
    va_list args;
    va_start(args, format);
    write(priority, format, args);
    va_end(args);
}
extern "C" void __syslog_chk(int priority, int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    write(priority, format, args);
    va_end(args);
}
