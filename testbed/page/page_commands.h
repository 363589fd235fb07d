// The live commands that a page offers, in the words of the command line.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

namespace testbed {

/// By kind ("drive", "enclosure", …, and "time" and "faults" for what is about no element): lists
/// of "label", "command" and "help". "{}" in a command stands for what it calls the element.
nlohmann::ordered_json commandsAsJson();

/// True for a command that changes the array, its time, or how the server fails. Those that write
/// files or end the server are not for pages.
bool isForPages(const std::string& command);

}  // namespace testbed
