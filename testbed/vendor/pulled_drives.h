// Drives that the scenario's file has and the running array lacks: what one can put back.
#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace testbed {

struct PulledDrive {
    std::string controller;
    std::string id;
    std::string insert;  ///< the command that puts a new drive in its place
};

/// Of controllers that both documents have, in the order of the first one. A drive that was in a
/// pool comes back without data, any other one as it was or, when it was not well, as a new one.
std::vector<PulledDrive> pulledDrives(const nlohmann::json& original,
                                      const nlohmann::json& document);

}  // namespace testbed
