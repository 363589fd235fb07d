// Colours of a terminal, by what a check says.
#pragma once

#include <string>

#include "check_rules.h"

namespace CLI {
class App;
}

namespace testbed {

/// The text in green, yellow or red.
std::string painted(const std::string& text, CheckLevel level);

/// What a user wants: "auto", "always" or "never".
struct ColourChoice {
    std::string when = "auto";

    /// "auto" has colours on a terminal that knows them, unless NO_COLOR is set.
    bool onStandardOutput() const;
};

/// Adds the option --colour, also spelt --color.
void addColourOption(CLI::App& command, ColourChoice& choice);

}  // namespace testbed
