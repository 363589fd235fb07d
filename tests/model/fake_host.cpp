#include "fake_host.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <utility>

namespace modeltest {

std::time_t FakeHost::now = 1'000'000'000;
std::function<void()> FakeHost::whileSleeping;

namespace {

std::vector<std::string> changeLines;

/// Formats of the lines that tell of a change.
constexpr const char* kChangeFormats[] = {
    "%s: disk %s status changed. Old opStat %d extStat %d, new opStat %d extStat %d\n",
    "%s: disk %s pool changed, old %s, new %s\n",
    "%s: volume %s status changed. Old opStat %d extStat %d, new opStat %d extStat %d\n",
    "%s: volume %s capacity changed. Old total blocs %lld free blocks %lld, new total blocks %lld "
    "free blocks %lld\n",
    "%s: volume %s element name changed. Old name %s, new name %s\n",
    "%s: battery %s status changed. Old OperationalStatus %d BatteryStatust %d, new "
    "OperationalStatus %d BatteryStatust %d\n",
    "%s removed from controller %s(%s)\n",
    "%s removed from pool %s\n",
    "%s deleted\n",
    "Volume %s (%s) deleted\n",
    "Battery %s deleted\n",
    "Pool %s deleted\n",
    "%s: disk %p added to the list %p\n",
    "%s: volume %p added to the list\n",
    "%s: pool %p added to the list\n",
    "%s: port %p added to the list\n",
    "%s: battery %p added to the list\n",
};

bool tellsOfChange(const char* format) {
    for (const char* known : kChangeFormats)
        if (strcmp(known, format) == 0) return true;
    return false;
}

/// "0x55d0" becomes "@".
std::string withoutAddresses(const std::string& line) {
    std::string result;
    for (std::size_t i = 0; i < line.size();) {
        if (line.compare(i, 2, "0x") != 0) {
            result += line[i++];
            continue;
        }
        i = line.find_first_not_of("0123456789abcdef", i + 2);
        result += '@';
        if (i == std::string::npos) break;
    }
    return result;
}

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
void record(const char* format, va_list args) {
    if (!tellsOfChange(format)) return;
    char line[1024];
    vsnprintf(line, sizeof line, format, args);
    line[strcspn(line, "\n")] = '\0';
    changeLines.push_back(withoutAddresses(line));
}
#pragma GCC diagnostic pop

}  // namespace

std::vector<std::string> FakeHost::takeChangeLines() {
    return std::exchange(changeLines, {});
}

}  // namespace modeltest

extern "C" std::time_t time(std::time_t* out) noexcept {
    if (out != nullptr) *out = modeltest::FakeHost::now;
    return modeltest::FakeHost::now;
}

extern "C" unsigned int sleep(unsigned int seconds) {
    modeltest::FakeHost::now += seconds;
    if (modeltest::FakeHost::whileSleeping) modeltest::FakeHost::whileSleeping();
    return 0;
}

extern "C" void syslog(int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    modeltest::record(format, args);
    va_end(args);
}

extern "C" void __syslog_chk(int, int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    modeltest::record(format, args);
    va_end(args);
}
