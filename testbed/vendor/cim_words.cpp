// The tables of codes and words, of states by kind of device, and of RAID levels.
#include "cim_words.h"

#include "cim_object.h"

namespace testbed {
namespace {

constexpr CodeWord kOperationalStatus[] = {
    {0, "unknown"},     {1, "other"},       {2, "ok"},
    {3, "degraded"},    {4, "stressed"},    {5, "predictive failure"},
    {6, "error"},       {7, "broken"},      {8, "starting"},
    {9, "stopping"},    {10, "stopped"},    {11, "in service"},
    {12, "no contact"}, {13, "lost"},       {14, "aborted"},
    {15, "dormant"},    {16, "dependency"}, {17, "completed"},
    {18, "power mode"},
};

constexpr CodeWord kHealthState[] = {
    {0, "unknown"},        {5, "ok"},
    {10, "degraded"},      {15, "minor failure"},
    {20, "major failure"}, {25, "critical failure"},
    {30, "failed"},
};

constexpr CodeWord kEnabledState[] = {
    {0, "unknown"}, {2, "enabled"}, {3, "disabled"}, {5, "not applicable"}, {6, "offline"},
};

constexpr CodeWord kExtentStatus[] = {
    {0, "other"},
    {1, "unknown"},
    {2, "none"},
    {3, "broken"},
    {4, "data lost"},
    {5, "reconfiguring"},
    {6, "exposed"},
    {7, "fractionally exposed"},
    {8, "partially exposed"},
    {9, "unprotected"},
    {10, "readying"},
    {11, "rebuild"},
    {12, "recalculate"},
    {13, "spare"},
    {14, "verify"},
};

constexpr CodeWord kBatteryStatus[] = {
    {1, "other"},
    {2, "unknown"},
    {3, "fully charged"},
    {4, "low"},
    {5, "critical"},
    {6, "charging"},
    {7, "charging and high"},
    {8, "charging and low"},
    {9, "charging and critical"},
    {10, "undefined"},
    {11, "partially charged"},
    {12, "learning"},
    {13, "overcharged"},
};

constexpr CodeWord kPortType[] = {
    {0, "unknown"}, {1, "other"}, {92, "ATA"}, {93, "SATA"}, {94, "SAS"},
};

constexpr CodeWord kUsageRestriction[] = {
    {0, "unknown"},
    {2, "front end"},
    {3, "back end"},
    {4, "not restricted"},
};

constexpr CodeWord kSoftwareClassification[] = {
    {0, "unknown"}, {1, "other"}, {2, "driver"}, {10, "firmware"}, {11, "bios"}, {13, "package"},
};

// Beside the vendor's own words stand those that the tree and the check print.

// word, OperationalStatus, ExtentStatus, unassigned
constexpr StateWord kDriveStates[] = {
    {"online", 2, 2, false},
    {"hot spare", 2, 13, true},
    {"failed", 6, 3, false},
    {"rebuild", 2, 11, false},
    {"rebuilding", 2, 11, false},
    {"copy back", 2, 11, false},
    {"unconfigured good", 2, 2, true},
    {"unconfigured bad", 6, 2, true},
    {"offline", 12, 2, false},
    {"dormant", 15, 2, true},
    {"predictive failure", 5, 2, false},
    {"foreign", 1, 2, true},
    {"undefined", 0, 1, false},
};

// word, OperationalStatus, ExtentStatus
constexpr StateWord kVolumeStates[] = {
    {"optimal", 2, 2, false}, {"degraded", 3, 6, false},  {"rebuilding", 3, 11, false},
    {"offline", 6, 3, false}, {"undefined", 0, 1, false},
};

// word, OperationalStatus, BatteryStatus
constexpr StateWord kBatteryStates[] = {
    {"optimal", 2, 3, false},
    {"charging", 2, 6, false},
    {"charging and low", 2, 8, false},
    {"charging and critical", 3, 9, false},
    {"partially charged", 2, 11, false},
    {"learning", 2, 12, false},
    {"weak", 3, 4, false},
    {"low", 3, 4, false},
    {"overcharged", 3, 13, false},
    {"dead", 6, 5, false},
    {"critical", 6, 5, false},
    {"missing", 12, 2, false},
    {"no contact", 12, 2, false},
    {"undefined", 0, 2, false},
};

// word, OperationalStatus
constexpr StateWord kPortStates[] = {
    {"up", 2, 0, false},       {"down", 12, 0, false},     {"no contact", 12, 0, false},
    {"failed", 6, 0, false},   {"error", 6, 0, false},     {"degraded", 3, 0, false},
    {"dormant", 15, 0, false}, {"undefined", 0, 0, false},
};

constexpr RaidLevel kRaidLevels[] = {
    {"RAID0", 1, 0},  {"RAID1", 2, 1},  {"RAID5", 1, 1},  {"RAID6", 1, 2},
    {"RAID10", 2, 1}, {"RAID50", 1, 1}, {"RAID60", 1, 2},
};

template <typename Table>
std::string joinWords(const Table& table) {
    std::string text;
    for (const auto& row : table) {
        if (!text.empty()) text += ", ";
        text += row.word;
    }
    return text;
}

}  // namespace

CodeWords operationalStatusWords() {
    return kOperationalStatus;
}
CodeWords healthStateWords() {
    return kHealthState;
}
CodeWords enabledStateWords() {
    return kEnabledState;
}
CodeWords extentStatusWords() {
    return kExtentStatus;
}
CodeWords batteryStatusWords() {
    return kBatteryStatus;
}
CodeWords portTypeWords() {
    return kPortType;
}
CodeWords usageRestrictionWords() {
    return kUsageRestriction;
}
CodeWords softwareClassificationWords() {
    return kSoftwareClassification;
}
StateWords driveStates() {
    return kDriveStates;
}
StateWords volumeStates() {
    return kVolumeStates;
}
StateWords batteryStates() {
    return kBatteryStates;
}
StateWords portStates() {
    return kPortStates;
}

std::optional<std::uint16_t> codeOf(CodeWords words, std::string_view word) {
    for (const CodeWord& row : words) {
        if (sameName(row.word, word)) return row.code;
    }
    return std::nullopt;
}

std::string_view wordOf(CodeWords words, std::uint64_t code) {
    for (const CodeWord& row : words) {
        if (row.code == code) return row.word;
    }
    return {};
}

std::string listOf(CodeWords words) {
    return joinWords(words);
}

const StateWord* findState(StateWords states, std::string_view word) {
    for (const StateWord& row : states) {
        if (sameName(row.word, word)) return &row;
    }
    return nullptr;
}

std::string listOf(StateWords states) {
    return joinWords(states);
}

RaidLevels raidLevels() {
    return kRaidLevels;
}

const RaidLevel* findRaidLevel(std::string_view name) {
    std::string letters(name);
    std::erase_if(letters, [](char c) { return c == ' ' || c == '-'; });
    for (const RaidLevel& row : kRaidLevels) {
        if (sameName(row.word, letters)) return &row;
    }
    return nullptr;
}

std::string listOf(RaidLevels levels) {
    return joinWords(levels);
}

}  // namespace testbed
