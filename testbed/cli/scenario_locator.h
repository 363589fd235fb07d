// Where the scenarios are that come with the tool.
#pragma once

#include <filesystem>
#include <string>

namespace CLI {
class App;
}

namespace testbed {

/// The directory of the scenarios that were built or installed together with the tool; empty when
/// it is missing.
std::filesystem::path scenarioDirectory();

/// A file of that name, else the scenario that comes with the tool under that name, with or without
/// ".json"; else the name itself.
std::string locateScenario(const std::string& name);

/// Adds the required option --scenario, which takes files and names.
void addScenarioOption(CLI::App& command, std::string& file);

}  // namespace testbed
