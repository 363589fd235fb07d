// The terminal's codes for green, yellow and red, and when standard output gets them.
#include "colour.h"

#include <unistd.h>

#include <CLI/CLI.hpp>
#include <cstdlib>
#include <string_view>

namespace testbed {
namespace {

/// What the variable says; "" without it.
std::string_view variable(const char* name) {
    const char* value = getenv(name);
    return value ? value : "";
}

}  // namespace

std::string painted(const std::string& text, CheckLevel level) {
    static constexpr const char* kCodes[] = {"32", "33", "31"};
    return std::string("\x1b[") + kCodes[static_cast<int>(level)] + "m" + text + "\x1b[0m";
}

bool ColourChoice::onStandardOutput() const {
    if (when != "auto") return when == "always";
    return variable("NO_COLOR").empty() && variable("TERM") != "dumb" && isatty(STDOUT_FILENO) == 1;
}

void addColourOption(CLI::App& command, ColourChoice& choice) {
    command
        .add_option("--colour,--color", choice.when,
                    "colours by state; auto: on a terminal, unless NO_COLOR is set")
        ->check(CLI::IsMember({"auto", "always", "never"}))
        ->capture_default_str();
}

}  // namespace testbed
