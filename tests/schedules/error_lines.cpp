// Only the thread that runs logs, so the lines need no lock.
#include "error_lines.h"

#include <cstdio>
#include <utility>

namespace schedules {
namespace {

std::vector<std::string> lines;

}  // namespace

void noteErrorLine(const char* format, va_list arguments) {
    char line[512];
    vsnprintf(line, sizeof line, format, arguments);
    lines.emplace_back(line);
}

std::vector<std::string> takeErrorLines() {
    return std::exchange(lines, {});
}

}  // namespace schedules
