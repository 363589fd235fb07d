// Finds the provider's schema.
#pragma once

#include <filesystem>
#include <string>

namespace testbed {

/// `chosen` when it is not empty; else the directory of the provider's MOF files as seen from the
/// tool: in the build tree, or where it is installed. Throws std::runtime_error when there is none.
std::filesystem::path locateSchema(const std::string& chosen);

}  // namespace testbed
