// What follows from a change in an array, at once and later, as controllers have it.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "scenario.h"
#include "schedule.h"

namespace testbed {

/// What follows later: commands with their delays in `at`, and the subjects whose earlier commands
/// have lost their meaning.
struct Aftermath {
    std::vector<ScheduledCommand> commands;
    std::vector<std::string> cancelled;
};

/// Changes a document, which was `before` and has been changed since, by what follows at once:
///  - the drives of an enclosure that is lost go offline, and come back with it;
///  - a hot spare of sufficient size joins a group that has lost a drive and is rebuilt; the lost
///    drive leaves the group when that is done;
///  - a replaced drive is rebuilt, or has its data copied back from the spare, which then is free;
///  - volumes and pools get the state that their drives leave them. A volume that is offline stays
///    so until drives that it lost come back.
/// Later, rebuilding and copying back end, and a battery's learning and charging go on. `after` is
/// what the document describes, and is so in the end. `name` stands before errors. Throws
/// ScenarioError for a document that cannot be read.
Aftermath followChange(nlohmann::json& document, const Scenario& before, Scenario& after,
                       const std::string& name);

}  // namespace testbed
