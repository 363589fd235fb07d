// What has changed between two answers, as entries of a list with times.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <vector>

#include "check_policy.h"
#include "inventory.h"

namespace testbed {

struct PageChange {
    std::string time;   ///< "2026-11-22T04:05:06Z"
    std::string key;    ///< of the element; "" for what is about none
    std::string level;  ///< of the state that it has come to; "" for none
    std::string text;   ///< "Drive 32_1 on controller C0: online → failed"
};

/// Now, as a page's list has it.
std::string timeStamp();

/// What has come, gone and changed; of the classes that both times were answered.
std::vector<PageChange> changesBetween(const Inventory& before, const Inventory& after,
                                       const CheckPolicy& policy);

nlohmann::ordered_json changesAsJson(const std::vector<PageChange>& changes);

}  // namespace testbed
