#include "fake_host.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <string_view>
#include <utility>

namespace modeltest {

std::time_t FakeHost::now = 1'000'000'000;
std::function<void()> FakeHost::whileSleeping;

namespace {

std::vector<std::string> changeLines;

/// Words of the lines that tell of a change, as they stand in their formats, too.
constexpr const char* kChangeWords[] = {" changed", " removed from ", " deleted",
                                        " added to the list"};
/// What such lines begin with when they tell of an entry of a list, or of what never changes.
constexpr const char* kOtherBeginnings[] = {"Data ", "Chassis ", "Controller ",
                                            "BuildSingleChassisInfo: ", "BuildControllerInfo: "};

bool hasChangeWord(const char* text) {
    return std::ranges::any_of(kChangeWords,
                               [&](const char* word) { return strstr(text, word) != nullptr; });
}

bool tellsOfChange(std::string_view line) {
    return std::ranges::none_of(kOtherBeginnings,
                                [&](const char* other) { return line.starts_with(other); });
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

[[gnu::format(printf, 1, 0)]] void record(const char* format, va_list args) {
    if (!hasChangeWord(format)) return;  // most lines: not worth formatting
    char line[1024];
    vsnprintf(line, sizeof line, format, args);
    line[strcspn(line, "\n")] = '\0';
    if (tellsOfChange(line)) changeLines.push_back(withoutAddresses(line));
}

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
