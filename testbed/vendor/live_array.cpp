// Applying commands, what follows from them, and reloads, and arming the faults anew.
#include "live_array.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fstream>

#include "array_commands.h"
#include "json_reader.h"
#include "scenario_parser.h"
#include "vendor.h"

namespace testbed {

using nlohmann::json;

LiveArray::LiveArray(Broker& broker, const std::string& file)
    : broker_(broker),
      file_(file),
      original_(readScenarioDocument(file)),
      document_(original_),
      scenario_(scenarioOf(document_, file)),
      vendor_(broker.repository(), scenario_) {
    buildVendor(broker_.repository(), scenario_);
    begin(original_, scenario_);
}

/// The faults that stay remain as far used up as they are; all that is new is armed behind them.
void LiveArray::armFaults(const json& document, const Scenario& scenario) {
    const json faults = document.value("faults", json::array());
    std::vector<std::pair<json, int>> staying;
    for (std::size_t i = 0; i < faults.size(); ++i) {
        const auto known = std::find_if(armed_.begin(), armed_.end(), [&](const auto& armed) {
            return armed.first == faults[i];
        });
        if (known != armed_.end()) {
            staying.push_back(std::move(*known));
            armed_.erase(known);
        } else {
            staying.emplace_back(faults[i], broker_.faults().add(scenario.faults.at(i)));
        }
    }
    for (const auto& [fault, id] : armed_) broker_.faults().remove(id);
    if (faults.empty()) broker_.faults().clear();
    armed_ = std::move(staying);
}

void LiveArray::adopt(json document, Scenario next) {
    const bool sameVendor = next.vendor.nameSpace == scenario_.vendor.nameSpace &&
                            next.vendor.classPrefix == scenario_.vendor.classPrefix;
    if (!sameVendor || next.host.id != scenario_.host.id) {
        throw ScenarioError(file_ + ": host and vendor cannot change while the array runs");
    }
    vendor_.change(scenario_, next);
    armFaults(document, next);
    broker_.faults().setLatency(next.latency.minimum, next.latency.maximum);
    document_ = std::move(document);
    scenario_ = std::move(next);
}

/// The document as it stands, all faults armed anew, and its timeline from now on.
void LiveArray::begin(json document, Scenario next) {
    std::vector<std::pair<json, int>> old;
    old.swap(armed_);
    try {
        adopt(std::move(document), std::move(next));
    } catch (const ScenarioError&) {
        armed_ = std::move(old);
        throw;
    }
    for (const auto& [fault, id] : old) broker_.faults().remove(id);
    begun_ = scenario_;
    schedule_.clear();
    for (const TimedCommand& entry : scenario_.timeline) {
        schedule_.add({now_ + entry.at, entry.command, ""});
    }
}

void LiveArray::reload() {
    json document = readScenarioDocument(file_);
    begin(document, scenarioOf(document, "command"));
    original_ = std::move(document);
}

void LiveArray::reset() {
    begin(original_, begun_);
}

void LiveArray::apply(const std::string& command) {
    json document = document_;
    changeArray(document, command);
    if (document == document_) return;
    // A command may add a repeated element; what follows looks for each of them by its id.
    limitRepetitions({&document, "command", "", ElementNames::Ids});
    expandRepetitions(document);
    Scenario next = scenarioOf(document, "command");
    Aftermath aftermath;
    if (scenario_.consequences.enabled) {
        aftermath = followChange(document, scenario_, next, "command");
    }
    adopt(std::move(document), std::move(next));
    follow(aftermath);
}

void LiveArray::follow(const Aftermath& aftermath) {
    for (const std::string& subject : aftermath.cancelled) schedule_.cancel(subject);
    for (ScheduledCommand command : aftermath.commands) {
        schedule_.cancel(command.subject);
        command.at += now_;
        schedule_.add(std::move(command));
    }
}

std::vector<LiveArray::Done> LiveArray::advance(double now) {
    std::vector<Done> done;
    while (const auto command = schedule_.takeDue(now)) {
        // What follows from a command counts from the time that it was for.
        now_ = command->at;
        done.push_back({command->at, command->command, ""});
        try {
            apply(command->command);
        } catch (const ScenarioError& error) {
            done.back().refusal = error.what();
        }
    }
    now_ = now;
    return done;
}

double LiveArray::nextDue() const {
    return schedule_.commands().empty() ? -1 : schedule_.commands().front().at;
}

void LiveArray::save(const std::string& file) const {
    json document = document_;
    document.erase("timeline");
    for (const ScheduledCommand& entry : schedule_.commands()) {
        document["timeline"].push_back(
            {{"at", std::max(0.0, entry.at - now_)}, {"command", entry.command}});
    }
    errno = 0;
    std::ofstream stream(file);
    stream << document.dump(2) << std::endl;
    if (!stream) throw ScenarioError(file + ": " + std::strerror(errno != 0 ? errno : EIO));
}

}  // namespace testbed
