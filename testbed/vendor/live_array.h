// The array while it runs: changed by commands, by time, or by a new version of its scenario file.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <utility>
#include <vector>

#include "broker.h"
#include "consequences.h"
#include "placed_vendor.h"
#include "pulled_drives.h"
#include "scenario.h"
#include "schedule.h"

namespace testbed {

/// Owns the scenario's document and keeps the vendor's objects, faults and latency in step with it.
/// For one thread; the provider may ask the vendor meanwhile. Its time begins with 0 and is the one
/// that `advance` was told last, in seconds of the scenario.
class LiveArray {
public:
    /// `broker` must outlive the array; its repository is empty as yet. Throws ScenarioError.
    LiveArray(Broker& broker, const std::string& file);

    const Scenario& scenario() const { return scenario_; }

    /// Carries out one command, see commandHelp. Throws ScenarioError, and then nothing has
    /// changed.
    void apply(const std::string& command);
    /// Takes the scenario file as it is now; its timeline begins. Throws ScenarioError, and then
    /// nothing has changed.
    void reload();
    /// Goes back to the scenario file as it was read last, with its faults and its timeline.
    void reset();
    /// Writes the present state as a scenario, with what is still to come as its timeline. Throws
    /// ScenarioError.
    void save(const std::string& file) const;

    /// A command whose time has come, and why it was refused, "" when it was not.
    struct Done {
        double at;
        std::string command;
        std::string refusal;
    };
    /// Carries out what is due up to that time.
    std::vector<Done> advance(double now);
    /// The time of the next command that waits; negative when none does.
    double nextDue() const;
    /// What waits, in the order of time.
    const std::vector<ScheduledCommand>& upcoming() const { return schedule_.commands(); }

    /// The scenario as its file has it.
    const Scenario& original() const { return begun_; }
    /// What the file has, but not the array as it is now.
    std::vector<PulledDrive> pulled() const { return pulledDrives(original_, document_); }

private:
    /// `next` is what the document describes.
    void adopt(nlohmann::json document, Scenario next);
    void begin(nlohmann::json document, Scenario next);
    void armFaults(const nlohmann::json& document, const Scenario& scenario);
    void follow(const Aftermath& aftermath);

    Broker& broker_;
    std::string file_;
    nlohmann::json original_;  // as the file was read last
    nlohmann::json document_;
    Scenario scenario_;
    PlacedVendor vendor_;
    Scenario begun_;                                     // what original_ describes
    std::vector<std::pair<nlohmann::json, int>> armed_;  // faults and their numbers in the broker
    Schedule schedule_;
    double now_ = 0;
};

}  // namespace testbed
