// The tables of commands for each kind of element, and which commands a page may give.
#include "page_commands.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <span>
#include <string_view>

#include "array_commands.h"
#include "cim_words.h"
#include "scenario.h"

namespace testbed {
namespace {

using nlohmann::ordered_json;

constexpr std::string_view kSessionVerbs[] = {"pause", "play", "speed", "reset", "server"};

/// What is about the whole array: its time, and faults of vendor and server.
constexpr const char* kTimeCommands[] = {
    "pause", "play", "speed 1", "speed 10", "speed 60", "reset",
};

constexpr const char* kFaultCommands[] = {
    "latency 0 0",
    "latency 200 800",
    "fault call=associators rc=1 times=5 message=\"the agent is busy\"",
    "clear faults",
    "server http=503 times=6",
    "server status=1 times=6",
    "clear server",
};

std::string verbOf(std::string_view command) {
    return std::string(command.substr(0, command.find(' ')));
}

/// What the command line's help says of a verb, for a kind where it says it apart.
std::string helpFor(const std::string& verb, const std::string& kind) {
    std::string found;
    for (const CommandHelp& row : commandHelp()) {
        const std::string_view syntax = row.syntax;
        if (verbOf(syntax) != verb) continue;
        if (found.empty() || syntax.find(kind) != std::string_view::npos) found = row.summary;
    }
    return found;
}

ordered_json entry(const std::string& label, const std::string& command, const std::string& kind) {
    return {{"label", label}, {"command", command}, {"help", helpFor(verbOf(command), kind)}};
}

ordered_json commandsOf(const std::string& kind) {
    ordered_json list = ordered_json::array();
    for (const StateVerb& row : stateVerbs()) {
        if (kind == row.kind) {
            list.push_back(entry(row.verb, row.verb + (" " + kind) + " {}", kind));
        }
    }
    if (kind == "drive") {
        list.push_back(entry("replace", "replace drive {}", kind));
        list.push_back(entry("remove", "remove drive {}", kind));
    }
    return list;
}

/// Commands for which the command itself is label enough.
ordered_json wholeCommands(std::span<const char* const> commands) {
    ordered_json list = ordered_json::array();
    for (const char* command : commands) {
        list.push_back(
            entry(command, command, command == std::string_view("clear server") ? command : ""));
    }
    return {{"buttons", list}, {"states", ordered_json::array()}};
}

ordered_json choicesOf(const char* kind, StateWords states) {
    ordered_json list = ordered_json::array();
    for (const StateWord& state : states) {
        list.push_back(entry(
            state.word, std::string("set ") + kind + " {} state=" + ordered_json(state.word).dump(),
            kind));
    }
    return list;
}

}  // namespace

ordered_json commandsAsJson() {
    ordered_json commands = ordered_json::object();
    for (const char* kind : {"drive", "volume", "port", "battery", "enclosure"}) {
        commands[kind] = {{"buttons", commandsOf(kind)}, {"states", ordered_json::array()}};
    }
    commands["drive"]["states"] = choicesOf("drive", driveStates());
    commands["volume"]["states"] = choicesOf("volume", volumeStates());
    commands["battery"]["states"] = choicesOf("battery", batteryStates());
    commands["time"] = wholeCommands(kTimeCommands);
    commands["faults"] = wholeCommands(kFaultCommands);
    return commands;
}

bool isForPages(const std::string& command) {
    const std::string verb = verbOf(command);
    if (std::find(std::begin(kSessionVerbs), std::end(kSessionVerbs), verb) !=
        std::end(kSessionVerbs)) {
        return true;
    }
    try {
        checkArrayCommand(command);
        return true;
    } catch (const ScenarioError&) {
        return false;
    }
}

}  // namespace testbed
