// What answers tell of an inventory that is not complete yet.
#pragma once

#include <string>
#include <vector>

#include "check_policy.h"
#include "inventory.h"

namespace testbed {

/// What has come and gone between two askings, "20 drives have come within 3 s"; "" when the same
/// elements exist. Their states may differ.
std::string differenceOf(const Inventory& before, const Inventory& after);

/// One text for each sign in one inventory: a volume that names a drive or more drives than its
/// controller has, a controller without devices that the policy does not ignore. Only of classes
/// that were answered.
std::vector<std::string> gapsIn(const Inventory& inventory, const CheckPolicy& policy);

}  // namespace testbed
