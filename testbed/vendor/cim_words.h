// Words for the numbers of CIM's value maps, both ways.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace testbed {

/// A number of a value map with the word for it.
struct CodeWord {
    std::uint16_t code;
    const char* word;
};

using CodeWords = std::span<const CodeWord>;

CodeWords operationalStatusWords();
CodeWords healthStateWords();
CodeWords enabledStateWords();
CodeWords extentStatusWords();
CodeWords batteryStatusWords();
CodeWords portTypeWords();
CodeWords usageRestrictionWords();
CodeWords softwareClassificationWords();

/// The first code with that word, without regard to letter case.
std::optional<std::uint16_t> codeOf(CodeWords words, std::string_view word);
/// The word of a code, "" when the map has none.
std::string_view wordOf(CodeWords words, std::uint64_t code);
/// "ok, degraded, …" for messages.
std::string listOf(CodeWords words);

/// A state as people name it, with the numbers that a vendor publishes for it.
struct StateWord {
    const char* word;
    std::uint16_t operationalStatus;
    std::uint16_t detail;  ///< the kind's second number: extent status or battery status
    bool primordial;       ///< drives: belongs to the pool of unassigned capacity
};

using StateWords = std::span<const StateWord>;

StateWords driveStates();
StateWords volumeStates();
StateWords batteryStates();
StateWords portStates();

/// NULL when there is no such word; letter case does not matter.
const StateWord* findState(StateWords states, std::string_view word);
std::string listOf(StateWords states);

/// The redundancies that belong to a RAID level.
struct RaidLevel {
    const char* word;
    std::uint16_t dataRedundancy;
    std::uint16_t packageRedundancy;
};

using RaidLevels = std::span<const RaidLevel>;

RaidLevels raidLevels();

/// NULL for a level that is not in the table; letter case, blanks and hyphens do not matter.
const RaidLevel* findRaidLevel(std::string_view name);
std::string listOf(RaidLevels levels);

}  // namespace testbed
