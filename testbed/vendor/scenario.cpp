// Finding the parts of a scenario by name and id.
#include "scenario.h"

namespace testbed {

const Tweaks& Described::part(const std::string& name) const {
    static const Tweaks none;
    const auto found = parts.find(name);
    return found == parts.end() ? none : found->second;
}

const ControllerDescription* Scenario::findController(const std::string& id) const {
    return findById(controllers, id);
}

}  // namespace testbed
