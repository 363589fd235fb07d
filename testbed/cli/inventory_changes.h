// What differs between two answers of a provider, in lines for people.
#pragma once

#include <string>
#include <vector>

#include "inventory.h"

namespace testbed {

/// "HealthState 5 -> 30, …"; names are shown once, so Caption is left out. "" for equal ones.
std::string propertyChanges(const Instance& before, const Instance& after);

/// One line for each instance that has come ("+ "), gone ("- ") or changed ("~ ", its name, the old
/// and the new values of its properties), in the order of the new answer, those that have gone
/// first.
std::vector<std::string> changeLines(const Inventory& before, const Inventory& after);

}  // namespace testbed
