// What a site wants of a check beside the table of states.
#pragma once

#include <cstddef>
#include <map>
#include <set>
#include <string>
#include <utility>

#include "check_rules.h"
#include "inventory.h"

namespace testbed {

/// How many there should be.
struct ExpectedCount {
    ExpectedCount(std::size_t number = 0, bool exactly = false) : count(number), exact(exactly) {}

    std::size_t count;
    bool exact;  ///< more is a warning; fewer is critical in any case
};

/// By plural: "drives" -> 9.
using ExpectedCounts = std::map<std::string, ExpectedCount>;

/// Reads "drives=9" (exactly) or "drives>=9" (at least). False for anything else.
bool takeExpected(const std::string& text, ExpectedCounts& counts);

class CheckPolicy {
public:
    /// Reads "DEGRADED=critical" or "volume:OFFLINE=warning": a state word of the table, for
    /// volumes and drives both unless it says which, without regard to case, "-" or "_" for a
    /// blank. False for anything else.
    bool takeLevel(const std::string& text);
    /// Reads "drive:C0_32_3": a kind, and controller and device as DeviceID joins them, with or
    /// without what stands before them there; "controller:C0". False for anything else.
    bool takeIgnored(const std::string& text);

    /// The verdict of the table as the policy changes it; none for classes that are not judged.
    std::optional<Verdict> judge(const std::string& className, const Instance& instance) const;
    /// True for an element that is acknowledged, whatever its state is.
    bool ignores(const ServedClass& served, const Instance& instance) const;

private:
    std::map<std::pair<std::string, std::string>, CheckLevel> levels_;  // by class and word
    std::set<std::pair<std::string, std::string>> ignored_;             // class and identity
};

}  // namespace testbed
