// What is wrong with a command line, told without what it may hold of secrets.
#pragma once

#include <string>

namespace CLI {
class App;
class ParseError;
}  // namespace CLI

namespace testbed {

/// One line. Values of options that nobody knows are left out, and of every argument with an @, as
/// URLs with a password have it, what stands before it.
std::string usageErrorText(const CLI::App& app, const CLI::ParseError& error, int argc,
                           const char* const* argv);

}  // namespace testbed
