// JSON text as a document, with what the format leaves open decided: no two members of one name,
// no nesting without end, no number that does not fit.
#pragma once

#include <nlohmann/json.hpp>
#include <string>

namespace testbed {

/// Throws ScenarioError: `name`, line and column, what is wrong.
nlohmann::json parseJson(const std::string& text, const std::string& name);

/// The line of the value at a place such as "controllers[0].drives[3]", or of the value around it
/// that there is; 0 for a text that is not JSON.
std::size_t lineOf(const std::string& text, const std::string& place);

}  // namespace testbed
