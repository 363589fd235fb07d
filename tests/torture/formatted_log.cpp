#include "formatted_log.h"

#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstring>

namespace torture {
namespace {

std::atomic<std::uint64_t> lineCount = 0;
std::atomic<std::uint64_t> turnedAwayCount = 0;

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
void format(const char* format, va_list args) {
    char line[2048];
    vsnprintf(line, sizeof line, format, args);
    lineCount++;
    if (strcmp(format, "No pool associated with volume %s\n") == 0) turnedAwayCount++;
}
#pragma GCC diagnostic pop

}  // namespace

std::uint64_t FormattedLog::lines() {
    return lineCount;
}
std::uint64_t FormattedLog::volumesTurnedAway() {
    return turnedAwayCount;
}

}  // namespace torture

extern "C" void syslog(int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    torture::format(format, args);
    va_end(args);
}

extern "C" void __syslog_chk(int, int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    torture::format(format, args);
    va_end(args);
}
