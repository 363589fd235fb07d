// What only the simulator knows of an array: enclosures and slots, progress, time.
#pragma once

#include <memory>
#include <nlohmann/json.hpp>
#include <string>

#include "array_clock.h"
#include "element_views.h"
#include "live_array.h"

namespace testbed {

/// A snapshot for a page. Drives and the like are named by their keys in the page.
struct SimulatedArray {
    nlohmann::ordered_json racks;  ///< enclosures with their slots; a drive, or how to put one in
    nlohmann::ordered_json progress;  ///< by key: percent, and a text
    nlohmann::ordered_json timeline;  ///< speed, whether time stands, and what comes next
    CommandTargets targets;
    DrivePlaces places;

    bool operator==(const SimulatedArray& other) const = default;
};

SimulatedArray simulatedArray(const LiveArray& array, const ArrayClock& clock);

/// "35 s", "2 min 5 s", "3 h 20 min"
std::string durationText(double seconds);

}  // namespace testbed
