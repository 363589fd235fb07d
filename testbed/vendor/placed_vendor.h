// The vendor's objects as they stand in a repository, while the array changes.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "vendor_graphs.h"

namespace testbed {

/// Keeps the graphs that were placed, so that a change costs what it concerns: what a scenario
/// describes as before is not described anew.
class PlacedVendor {
public:
    /// `scenario` is what stands in the repository, or will before the first change. The
    /// repository must outlive this.
    PlacedVendor(Repository& repository, const Scenario& scenario);

    /// Turns what `before` describes, which stands, into what `after` describes. Only the
    /// differences are touched, so what stays keeps its place in the order of the vendor's answers.
    /// Host and vendor (namespace, class prefix) must be the same.
    void change(const Scenario& before, const Scenario& after);

    /// A graph with the identities of its objects and associations, in their order.
    struct Placed {
        explicit Placed(ObjectGraph described);
        ObjectGraph graph;
        std::vector<std::string> objects;
        std::vector<std::string> links;
    };
    /// Shared by the scenarios before and after a change.
    using Graphs = std::vector<std::shared_ptr<const Placed>>;

private:
    Graphs describe(const Scenario* before, const Scenario& after) const;

    Repository& repository_;
    const Naming naming_;
    Graphs graphs_;
};

}  // namespace testbed
