// An inventory as JSON.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

#include "check_summary.h"
#include "inventory.h"

namespace testbed {

/// The document that jsonView prints.
nlohmann::ordered_json jsonDocument(const Inventory& inventory, const CheckPolicy& policy = {},
                                    const CheckSummary* check = nullptr);
/// On one line, whatever bytes a vendor's texts have.
std::string jsonLine(const nlohmann::ordered_json& document);

/// "format": 1; one member for each class, a list of objects with "path", "keys", "properties" and
/// "verdict"; "errors", the classes that were answered with a status; and, with a summary, "check".
/// ASCII, everything else escaped. Ends with a line end.
std::string jsonView(const Inventory& inventory, const CheckPolicy& policy = {},
                     const CheckSummary* check = nullptr);

}  // namespace testbed
