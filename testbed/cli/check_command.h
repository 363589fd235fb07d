// What the commands that can check have in common.
#pragma once

#include <functional>

#include "check_summary.h"

namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace testbed {

struct CheckOptions {
    bool check = false;
    int verbosity = 0;  ///< 0: one line; 1: also what is not ok; 2: also what is
    ExpectedCounts expected;
    CheckPolicy policy;
};

/// Adds --check, which is returned, --expect, --level, --ignore and --verbose. A plugin is nothing
/// but a check, so that --check is taken for granted.
CLI::Option* addCheckOptions(CLI::App& command, CheckOptions& options, bool isPlugin = false);

/// Adds --expect, which is returned, --level and --ignore.
CLI::Option* addJudgingOptions(CLI::App& command, CheckOptions& options);

/// The summary that `make` gives, or one that tells what it threw.
CheckSummary summaryOf(const std::function<CheckSummary()>& make);

/// A summary's line and, as verbosity wants, what it knows of each element.
std::string checkText(const CheckSummary& summary, int verbosity);
/// Prints that text. The exit status.
int printCheck(const CheckSummary& summary, int verbosity = 0);

/// Whether the command line is one of a check, however wrong it is.
bool isCheck(int argc, const char* const* argv);

/// The exit status for wrong usage: 2; for a check, to which 2 means something else, 3 with a line.
int usageStatus(int argc, const char* const* argv);

/// What the plugin of monitoring systems is called.
inline constexpr const char* kPluginName = "check_plexor";
bool isPluginName(const char* program);

}  // namespace testbed
