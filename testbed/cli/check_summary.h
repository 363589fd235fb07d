// The answer of a monitoring check: one line and an exit status, as monitoring systems expect them.
#pragma once

#include <map>
#include <string>

#include "inventory.h"

namespace testbed {

/// Exit statuses.
enum CheckStatus { kCheckOk = 0, kCheckWarning = 1, kCheckCritical = 2, kCheckUnknown = 3 };

struct CheckSummary {
    int status = kCheckUnknown;
    /// "PLEXOR CRITICAL - 1 drive failed: … | drives=8 …", without a line end; no control
    /// characters, and "|" but once, before the numbers.
    std::string line;
};

/// What a summary depends on beside the inventory.
struct CheckTerms {
    /// Why there is no more than the inventory; "" when it is whole.
    std::string failure = "";
    /// How many there should be at least: "drives" -> 9.
    std::map<std::string, std::size_t> expected = {};
};

/// True for what can be expected: "controllers", "volumes", "drives", "ports", "batteries".
bool isCounted(const std::string& plural);

/// Judges every instance. A failure, and a class that was answered with an error, make the result
/// unknown unless it is critical already; so does an inventory without controllers, or (when they
/// were not asked for) without anything.
CheckSummary summarize(const Inventory& inventory, const CheckTerms& terms = {});

/// The status that a request for a class was answered with, in words for people.
std::string statusLine(const ClassAnswer& answer);

/// When there is nothing to judge.
CheckSummary unknownSummary(const std::string& reason);

}  // namespace testbed
