// An inventory as a tree for people: controllers, and beneath each what belongs to it.
#pragma once

#include <string>

#include "check_policy.h"
#include "inventory.h"

namespace testbed {

struct TreeStyle {
    bool colours = false;       ///< what a check would say of an element shows in its line
    bool ascii = false;         ///< nothing beyond ASCII
    std::size_t columns = 0;    ///< longer lines are folded; 0: none is
    bool problemsOnly = false;  ///< what a check would be content with, or ignores, is left out
    CheckPolicy policy = {};

    /// As standard output can show it.
    static TreeStyle ofOutput(bool colours);
};

/// Instances whose controller is not in the inventory come last, by class.
std::string treeView(const Inventory& inventory, const TreeStyle& style = {});

}  // namespace testbed
