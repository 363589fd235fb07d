// An inventory as JSON.
#pragma once

#include <string>

#include "inventory.h"

namespace testbed {

/// One member for each class: a list of objects with "path", "keys" and "properties". Ends with a
/// line end.
std::string jsonView(const Inventory& inventory);

}  // namespace testbed
