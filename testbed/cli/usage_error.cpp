// Naming the option, command or argument that is wrong, and leaving out values and passwords.
#include "usage_error.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <string_view>

#include "printable.h"

namespace testbed {
namespace {

/// "-x" for whatever begins with one dash, as its value may be attached to it; "--name" without a
/// value.
std::string optionName(std::string_view argument) {
    if (!argument.starts_with("--")) return std::string(argument.substr(0, 2));
    return std::string(argument.substr(0, argument.find('=')));
}

bool isOption(std::string_view argument) {
    return argument.size() > 1 && argument[0] == '-';
}

std::string commandNames(const CLI::App& app) {
    std::string names;
    for (const CLI::App* command : app.get_subcommands(nullptr)) {
        names += (names.empty() ? "" : ", ") + command->get_name();
    }
    return names;
}

/// The command that was given; the application itself without one.
const CLI::App& commandIn(const CLI::App& app) {
    const auto given = app.get_subcommands();
    return given.empty() ? app : *given.front();
}

/// A word that may be a mistyped command, and hardly anything secret.
bool isWord(std::string_view argument) {
    constexpr std::size_t kLongest = 12;
    return !argument.empty() && argument.size() <= kLongest &&
           std::all_of(argument.begin(), argument.end(),
                       [](char c) { return c >= 'a' && c <= 'z'; });
}

/// What was given beyond what is known.
std::string unexpected(const CLI::App& app, const std::string& first) {
    const bool commandMissing =
        &commandIn(app) == &app && !app.get_subcommands(nullptr).empty() && !isOption(first);
    if (commandMissing) {
        return "there is no command " + (isWord(first) ? first : "of that name") +
               "; commands are " + commandNames(app);
    }
    const auto arguments = app.remaining(true);
    const auto option = std::find_if(arguments.begin(), arguments.end(), isOption);
    if (option != arguments.end()) return "there is no option " + optionName(*option);
    return "there is an argument too many";
}

/// The text without what stands before an @ in one of the arguments.
std::string withoutCredentials(std::string text, int argc, const char* const* argv) {
    for (int i = 1; i < argc; i++) {
        const std::string argument = argv[i];
        for (const std::size_t begin : {std::size_t{0}, argument.find('=') + 1}) {
            const std::string value = argument.substr(begin);
            const std::size_t at = value.rfind('@');
            if (at == std::string::npos) continue;
            for (std::size_t found; (found = text.find(value)) != std::string::npos;) {
                text.replace(found, value.size(), "***" + value.substr(at + 1));
            }
        }
    }
    return text;
}

}  // namespace

std::string usageErrorText(const CLI::App& app, const CLI::ParseError& error, int argc,
                           const char* const* argv) {
    const std::string name = commandIn(app).get_name();
    const bool isTop = &commandIn(app) == &app;
    const std::string hint = (isTop ? name : app.get_name() + " " + name) + " --help tells more";
    const bool extras = dynamic_cast<const CLI::ExtrasError*>(&error) != nullptr;
    const std::string text = extras ? unexpected(app, argc > 1 ? argv[1] : "")
                                    : withoutCredentials(error.what(), argc, argv);
    return printable(text + "; " + hint);
}

}  // namespace testbed
