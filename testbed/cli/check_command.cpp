#include "check_command.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <charconv>
#include <iostream>
#include <string_view>

namespace testbed {
namespace {

constexpr int kUsage = 2;
constexpr const char* kFlag = "--check";

CheckSummary made(const std::function<CheckSummary()>& make) {
    try {
        return make();
    } catch (const std::exception& error) {
        return unknownSummary(error.what());
    }
}

/// Reads "drives=9". False for anything else.
bool takeExpected(const std::string& text, std::map<std::string, std::size_t>& expected) {
    const std::size_t equals = std::min(text.find('='), text.size());
    const std::string plural = text.substr(0, equals);
    const std::string number = text.substr(std::min(equals + 1, text.size()));
    const char* end = number.data() + number.size();
    std::size_t count = 0;
    const auto [stop, error] = std::from_chars(number.data(), end, count);
    if (!isCounted(plural) || error != std::errc() || stop != end) return false;
    expected[plural] = count;
    return true;
}

}  // namespace

CLI::Option* addCheckOptions(CLI::App& command, CheckOptions& options) {
    CLI::Option* check =
        command.add_flag(kFlag, options.check,
                         "print one line for a monitoring system and exit with 0 (ok), 1 "
                         "(warning), 2 (critical) or 3 (unknown)");
    const auto take = [&options](const std::vector<std::string>& texts) {
        return std::all_of(texts.begin(), texts.end(), [&](const std::string& text) {
            return takeExpected(text, options.expected);
        });
    };
    command
        .add_option("--expect", take,
                    "critical when there are fewer: volumes=N, drives=N, batteries=N, ...")
        ->type_name("KIND=N")
        ->delimiter(',')
        ->take_all()
        ->needs(check);
    return check;
}

int printCheck(const std::function<CheckSummary()>& make) {
    const CheckSummary summary = made(make);
    std::cout << summary.line << std::endl;
    return summary.status;
}

int usageStatus(int argc, const char* const* argv) {
    const bool check =
        std::any_of(argv, argv + argc, [](std::string_view word) { return word == kFlag; });
    return check ? printCheck([] { return unknownSummary("wrong usage"); }) : kUsage;
}

}  // namespace testbed
