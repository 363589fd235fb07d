// A live command taken apart: words, and values as the scenario file would have them.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace testbed {

/// A word of a command; NAME=VALUE has both parts, any other word has its text only.
struct CommandWord {
    std::string text;
    std::string name;
    nlohmann::json value;
};

/// Takes a command apart. Words are separated by blanks. A word in quotation marks may hold blanks.
/// Behind NAME= stands JSON when it begins with a quotation mark, a bracket or a brace, and may
/// hold blanks; or a number, true, false or null; everything else is a text. Throws ScenarioError.
std::vector<CommandWord> commandWords(const std::string& command);

/// A text as a word of a command that stands for just this text.
std::string quotedWord(const std::string& text);

/// Throws ScenarioError for a command that cannot be carried out.
[[noreturn]] void refuseCommand(const std::string& what);

}  // namespace testbed
