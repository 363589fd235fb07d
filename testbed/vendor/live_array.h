// The array while it runs: changed by commands, or by a new version of its scenario file.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "broker.h"
#include "scenario.h"

namespace testbed {

/// Owns the scenario's document and keeps the vendor's objects, faults and latency in step with it.
/// For one thread; the provider may ask the vendor meanwhile.
///
/// Commands (words are separated by blanks; a value may be quoted, or be JSON):
///   set KIND CONTROLLER ID NAME=VALUE...   change members, as the scenario file has them
///   add KIND CONTROLLER NAME=VALUE...      a new thing
///   remove KIND CONTROLLER ID
///   fail|rebuild drive CONTROLLER ID       the same as set ... state=failed|rebuild
///   latency MINIMUM MAXIMUM                milliseconds of each answer
///   fault NAME=VALUE...                    an entry of "faults"
///   clear faults
/// KIND is drive, volume, pool, enclosure, port, battery or other; set controller CONTROLLER
/// NAME=VALUE... changes a controller itself.
class LiveArray {
public:
    /// `broker` must outlive the array; its repository is empty as yet. Throws ScenarioError.
    LiveArray(Broker& broker, const std::string& file);

    const Scenario& scenario() const { return scenario_; }

    /// Carries out one command. Throws ScenarioError, and then nothing has changed.
    void apply(const std::string& command);
    /// Takes the scenario file as it is now. Throws ScenarioError, and then nothing has changed.
    void reload();

private:
    using Words = std::vector<std::string>;

    void adopt(nlohmann::json document);
    nlohmann::json changed(const Words& words) const;
    nlohmann::json& controllerIn(nlohmann::json& document, const std::string& id) const;

    Broker& broker_;
    std::string file_;
    nlohmann::json document_;
    Scenario scenario_;
};

}  // namespace testbed
