// The options of a check, its printed result, and the exit status of wrong usage.
#include "check_command.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>
#include <string_view>

namespace testbed {
namespace {

constexpr int kUsage = 2;
constexpr const char* kFlag = "--check";

/// An option that can be given several times, each time with several texts, which `take` reads.
CLI::Option* addTexts(CLI::App& command, const char* name, const char* form,
                      const char* description,
                      const std::function<bool(const std::string&)>& take) {
    const auto takeAll = [take](const std::vector<std::string>& texts) {
        return std::all_of(texts.begin(), texts.end(), take);
    };
    return command.add_option(name, takeAll, description)
        ->type_name(form)
        ->delimiter(',')
        ->take_all()
        ->allow_extra_args(false);
}

void addPolicyOptions(CLI::App& command, CheckPolicy& policy) {
    addTexts(command, "--level", "[KIND:]WORD=LEVEL",
             "what a state means here: ok, warning or critical; DEGRADED=critical",
             [&policy](const std::string& text) { return policy.takeLevel(text); });
    addTexts(command, "--ignore", "KIND:ID",
             "an element whose state is acknowledged, by its DeviceID: drive:C0_32_3",
             [&policy](const std::string& text) { return policy.takeIgnored(text); });
}

}  // namespace

CLI::Option* addJudgingOptions(CLI::App& command, CheckOptions& options) {
    CLI::Option* expect = addTexts(
        command, "--expect", "KIND=N",
        "volumes=N, drives=N, ...: critical when there are fewer, a warning when there are more; "
        "drives>=N: more are fine",
        [&options](const std::string& text) { return takeExpected(text, options.expected); });
    addPolicyOptions(command, options.policy);
    return expect;
}

CLI::Option* addCheckOptions(CLI::App& command, CheckOptions& options, bool isPlugin) {
    CLI::Option* check =
        command.add_flag(kFlag, options.check,
                         "print one line for a monitoring system and exit with 0 (ok), 1 "
                         "(warning), 2 (critical) or 3 (unknown)");
    CLI::Option* expect = addJudgingOptions(command, options);
    if (!isPlugin) expect->needs(check);
    command.add_flag("-v,--verbose", options.verbosity,
                     "behind the line of a check, one for each element that is not ok; twice: for "
                     "each element");
    return check;
}

CheckSummary summaryOf(const std::function<CheckSummary()>& make) {
    try {
        return make();
    } catch (const std::exception& error) {
        return unknownSummary(error.what());
    }
}

std::string checkText(const CheckSummary& summary, int verbosity) {
    std::string text = summary.line() + "\n";
    if (verbosity == 0) return text;
    for (const std::string& detail : verbosity > 1 ? summary.details : summary.problems) {
        text += detail + "\n";
    }
    return text;
}

int printCheck(const CheckSummary& summary, int verbosity) {
    std::cout << checkText(summary, verbosity) << std::flush;
    return summary.status;
}

bool isCheck(int argc, const char* const* argv) {
    return isPluginName(argv[0]) ||
           std::any_of(argv, argv + argc, [](std::string_view word) { return word == kFlag; });
}

int usageStatus(int argc, const char* const* argv) {
    return isCheck(argc, argv) ? printCheck(unknownSummary("wrong usage")) : kUsage;
}

bool isPluginName(const char* program) {
    const std::string_view path = program ? program : "";
    return path.substr(path.rfind('/') + 1) == kPluginName;
}

}  // namespace testbed
