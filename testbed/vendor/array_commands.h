// The commands that change an array: what each of them does to the scenario's document.
#pragma once

#include <nlohmann/json.hpp>
#include <span>
#include <string>

#include "command_words.h"

namespace testbed {

/// A line of the help.
struct CommandHelp {
    const char* syntax;
    const char* summary;
};

/// A verb that gives a thing of one kind a state.
struct StateVerb {
    const char* verb;
    const char* kind;
    const char* member;
    const char* value;
};

std::span<const StateVerb> stateVerbs();

/// The commands of changeArray, then those that a session carries out itself.
std::span<const CommandHelp> commandHelp();
/// "syntax  summary" lines.
std::string commandHelpText();

/// Carries out a command on a document whose repetitions are written out. Throws ScenarioError; the
/// document may then be half changed.
void changeArray(nlohmann::json& document, const std::string& command);

/// Throws ScenarioError for a command that no document would take.
void checkArrayCommand(const std::string& command);

/// Gives a drive, volume, port or battery a state, in the place of all numbers of an earlier one.
void setState(nlohmann::json& element, const std::string& state);
/// Puts a drive into a pool, out of all others.
void movePool(nlohmann::json& drive, const std::string& pool);

/// The element of a list with that id; NULL without one.
nlohmann::json* findElement(nlohmann::json& owner, const std::string& list, const std::string& id);

}  // namespace testbed
