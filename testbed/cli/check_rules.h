// What a monitoring check says about the state of a volume, drive, port or battery.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "cim_object.h"

namespace testbed {

/// In rising order.
enum class CheckLevel { Ok, Warning, Critical };

/// A state as the provider shows it, and what it means. docs/operating.md has the same table.
struct StateRule {
    const char* className;
    const char* word;  ///< at the end of the element's name; "" for classes whose names have none
    std::optional<std::uint16_t> operationalStatus;  ///< none: any that no other rule has
    std::uint16_t healthState;
    CheckLevel level;
    const char* finding;  ///< "failed"; "" for what the word of the OperationalStatus tells
};

std::span<const StateRule> stateRules();

/// What a BatteryStatus means, whatever the battery's OperationalStatus is.
struct ChargeRule {
    std::uint16_t batteryStatus;
    CheckLevel level;
};

/// Those that are not ok.
std::span<const ChargeRule> chargeRules();

struct Verdict {
    CheckLevel level = CheckLevel::Ok;
    std::string finding = "";  ///< "failed", for a summary; "" when all is well
    /// "FAILED" for the state of a volume or drive that the table of states has; otherwise the word
    /// for the number that decided: "no contact".
    std::string word = "";
    bool isTableState = false;  ///< the word is one of the table's
    bool ignored = false;       ///< not OK, but acknowledged; the level is that of the state
};

/// "ok", "warning" or "critical".
const char* levelName(CheckLevel level);

/// None for classes that are not judged: a controller's HealthState is always 5, and its
/// OperationalStatus is as old as the loaded provider.
std::optional<Verdict> judge(const std::string& className, const Instance& instance);

/// The element's name without firmware, members and state.
std::string shortName(const Instance& instance);

}  // namespace testbed
