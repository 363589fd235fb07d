#include "formatted_log.h"

#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstring>

namespace torture {
namespace {

std::atomic<std::uint64_t> lineCount = 0;
std::atomic<std::uint64_t> turnedAwayCount = 0;

constexpr char kTurnedAway[] = "No pool associated with volume ";

[[gnu::format(printf, 1, 0)]] void format(const char* format, va_list args) {
    char line[2048];
    vsnprintf(line, sizeof line, format, args);
    lineCount++;
    if (strncmp(line, kTurnedAway, sizeof kTurnedAway - 1) == 0) turnedAwayCount++;
}

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
