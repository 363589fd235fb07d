// The answer of a monitoring check: one line and an exit status, as monitoring systems expect them.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "check_policy.h"
#include "inventory.h"

namespace testbed {

/// Exit statuses.
enum CheckStatus { kCheckOk = 0, kCheckWarning = 1, kCheckCritical = 2, kCheckUnknown = 3 };

/// "ok", "warning", "critical" or "unknown".
const char* statusName(int status);

struct CheckSummary {
    int status = kCheckUnknown;
    std::string text;     ///< "1 drive failed: …"
    std::string numbers;  ///< "drives=8 …", performance data; "" when nothing was counted
    /// "critical: Drive 32_3 on controller C0 (failed)", of each element that was judged.
    std::vector<std::string> details = {};
    std::vector<std::string> problems = {};  ///< the details of those that are not ok

    /// "PLEXOR CRITICAL - 1 drive failed: … | drives=8 …", without a line end. Printable UTF-8, and
    /// "|" but once, before the numbers. So are the details, without any "|".
    std::string line() const;
};

/// How long the asking took, and how long it might have taken.
struct AskTime {
    double seconds;
    unsigned limitSeconds;
};

/// What a summary depends on beside the inventory.
struct CheckTerms {
    /// Why there is no more than the inventory; "" when it is whole.
    std::string failure = "";
    ExpectedCounts expected = {};
    CheckPolicy policy = {};
    /// What changed while it was asked; "" when nothing did.
    std::string arriving = "";
    std::optional<AskTime> time = {};
};

/// Judges every instance. A failure, a class that was answered with an error, signs of an inventory
/// that is not complete, and one without controllers or (when they were not asked for) without
/// anything make the result unknown unless it is critical already.
CheckSummary summarize(const Inventory& inventory, const CheckTerms& terms = {});

/// The status that a request for a class was answered with, in words for people.
std::string statusLine(const ClassAnswer& answer);

/// When there is nothing to judge.
CheckSummary unknownSummary(const std::string& reason);

}  // namespace testbed
