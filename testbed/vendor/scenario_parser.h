// Scenario files: JSON in, plain data out.
#pragma once

#include <nlohmann/json.hpp>
#include <string>

#include "scenario.h"

namespace testbed {

/// Reads a scenario file. Throws ScenarioError.
Scenario readScenario(const std::string& file);

/// The scenario file as JSON, repetitions written out, for those who change it while the array
/// runs. It can be read as a scenario. Throws ScenarioError.
nlohmann::json readScenarioDocument(const std::string& file);

/// A document of readScenarioDocument, perhaps changed, as a scenario. Errors name its elements by
/// their ids; `name` stands before them.
Scenario scenarioOf(const nlohmann::json& document, const std::string& name);

/// The same for a text; `name` stands for the file in error messages.
Scenario parseScenario(const std::string& text, const std::string& name);

}  // namespace testbed
