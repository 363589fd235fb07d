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
    std::map<std::string, std::size_t> expected;
};

/// Adds --check, which is returned, and --expect.
CLI::Option* addCheckOptions(CLI::App& command, CheckOptions& options);

/// Prints the line of the summary that `make` gives, or that tells what it threw. The exit status.
int printCheck(const std::function<CheckSummary()>& make);

/// The exit status for wrong usage: 2; for a check, to which 2 means something else, 3 with a line.
int usageStatus(int argc, const char* const* argv);

}  // namespace testbed
