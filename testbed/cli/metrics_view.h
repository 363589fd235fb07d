// An inventory as metrics for a collector.
#pragma once

#include <optional>

#include "check_summary.h"
#include "inventory.h"

namespace testbed {

/// How the asking went.
struct AskOutcome {
    bool up = false;        ///< every class was answered with its instances
    bool complete = false;  ///< and nothing tells of elements that are still arriving
    double seconds = 0;
};

/// OpenMetrics text, which the older text format of collectors reads as well: whether the server
/// answered, how long it took, how many elements there are, and the level of each: 0 ok, 1 warning,
/// 2 critical. Of a class that was not answered there is nothing. Ends with "# EOF".
std::string metricsView(const Inventory& inventory, const CheckPolicy& policy,
                        const AskOutcome& outcome);

}  // namespace testbed
