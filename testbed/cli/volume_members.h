// The drives that a volume's name tells.
#pragma once

#include <string>
#include <vector>

namespace testbed {

/// The members in "…, Drives(a,b) - OPTIMAL"; without the last one where the text was cut.
std::vector<std::string> membersIn(const std::string& name);

/// "3e1", slot and enclosure: no drive's id tells whether it is there.
bool isPlace(const std::string& member);

}  // namespace testbed
