// An inventory as a tree for people: controllers, and beneath each what belongs to it.
#pragma once

#include <string>

#include "inventory.h"

namespace testbed {

/// Instances whose controller is not in the inventory come last, by class. With `colours`, what a
/// check would say of an element shows in its line.
std::string treeView(const Inventory& inventory, bool colours = false);

}  // namespace testbed
