// Describing what has changed, and exchanging the old graphs for the new ones.
#include "placed_vendor.h"

#include <algorithm>
#include <string_view>
#include <unordered_map>
#include <unordered_set>

namespace testbed {
namespace {

using Placed = PlacedVendor::Placed;
using Graphs = PlacedVendor::Graphs;

std::shared_ptr<const Placed> placed(ObjectGraph graph) {
    return std::make_shared<const Placed>(std::move(graph));
}

/// Whether two things have the same path, and so have what they are tied to.
template <class Description>
bool sameIdentity(const Description& left, const Description& right) {
    return static_cast<const Described&>(left) == static_cast<const Described&>(right);
}
bool sameEnclosure(const EnclosureDescription& left, const EnclosureDescription& right) {
    return sameIdentity(left, right) && left.tag == right.tag;
}

/// The graphs of one controller. Those of what `before` describes in the same way are taken from
/// `old`, which has the graphs of `before` from the iterator on.
class ControllerGraphs {
public:
    ControllerGraphs(const Naming& naming, const ControllerDescription* before,
                     const ControllerDescription& after, Graphs::const_iterator old)
        : naming_(naming), before_(before), after_(after), old_(old) {}

    void appendTo(Graphs& graphs) {
        // Names of devices come from the controller, those of pools and enclosures from them.
        const bool sameNames = before_ != nullptr && sameIdentity(*before_, after_);
        const bool sameGroups =
            sameNames &&
            std::ranges::equal(before_->pools, after_.pools, sameIdentity<PoolDescription>) &&
            std::ranges::equal(before_->enclosures, after_.enclosures, sameEnclosure);
        graphs.push_back(sameNames && sameController(*before_, after_)
                             ? *old_
                             : placed(controllerGraph(naming_, after_)));
        if (before_ != nullptr) ++old_;
        append(graphs, &ControllerDescription::pools, poolGraph, sameNames);
        append(graphs, &ControllerDescription::enclosures, enclosureGraph, sameNames);
        append(graphs, &ControllerDescription::drives, driveGraph, sameGroups);
        append(graphs, &ControllerDescription::volumes, volumeGraph, sameGroups);
        append(graphs, &ControllerDescription::ports, portGraph, sameNames);
        append(graphs, &ControllerDescription::batteries, batteryGraph, sameNames);
        append(graphs, &ControllerDescription::others, otherGraph, sameNames);
    }

private:
    static bool sameController(const ControllerDescription& left,
                               const ControllerDescription& right) {
        return left.model == right.model && left.healthState == right.healthState &&
               left.operationalStatus == right.operationalStatus &&
               left.noSystem == right.noSystem && left.noPackage == right.noPackage &&
               left.software == right.software;
    }

    template <class Item, class GraphOf>
    void append(Graphs& graphs, std::vector<Item> ControllerDescription::*list, GraphOf graphOf,
                bool reusable) {
        static const std::vector<Item> nothing;
        const std::vector<Item>& known = before_ != nullptr ? before_->*list : nothing;
        auto next = known.begin();
        for (const Item& item : after_.*list) {
            const auto same =
                reusable ? std::find_if(next, known.end(),
                                        [&](const Item& other) { return other.id == item.id; })
                         : known.end();
            if (same != known.end() && *same == item) {
                graphs.push_back(old_[same - known.begin()]);
            } else {
                graphs.push_back(placed(graphOf(naming_, after_, item)));
            }
            if (same != known.end()) next = same + 1;
        }
        old_ += static_cast<std::ptrdiff_t>(known.size());
    }

    const Naming& naming_;
    const ControllerDescription* const before_;
    const ControllerDescription& after_;
    Graphs::const_iterator old_;
};

/// How many graphs a controller has.
std::size_t countOf(const ControllerDescription& controller) {
    return 1 + controller.pools.size() + controller.enclosures.size() + controller.drives.size() +
           controller.volumes.size() + controller.ports.size() + controller.batteries.size() +
           controller.others.size();
}

std::string identityOf(const GraphLink& link) {
    return link.cimAssociation + "\n" + link.left.identity() + "\n" + link.right.identity();
}

/// Looks up what a list of graphs has; the graphs must outlive it.
struct Contents {
    std::unordered_map<std::string_view, const Instance*> objects;
    std::unordered_set<std::string_view> links;

    explicit Contents(const Graphs& graphs) {
        for (const auto& placed : graphs) {
            for (std::size_t i = 0; i < placed->objects.size(); ++i) {
                objects[placed->objects[i]] = &placed->graph.objects()[i].instance;
            }
            links.insert(placed->links.begin(), placed->links.end());
        }
    }
    bool hasObject(std::string_view identity, const Instance& instance) const {
        const auto found = objects.find(identity);
        if (found == objects.end()) return false;
        return found->second == &instance || *found->second == instance;
    }
};

/// Links after all objects: an object that is listed exists.
void placeNew(Repository& repository, const Graphs& after, const Contents& old) {
    for (const auto& placed : after) {
        for (std::size_t i = 0; i < placed->objects.size(); ++i) {
            const GraphObject& object = placed->graph.objects()[i];
            if (old.hasObject(placed->objects[i], object.instance)) continue;
            ObjectGraph::placeObject(repository, object);
        }
    }
    std::unordered_set<std::string_view> done;
    for (const auto& placed : after) {
        for (std::size_t i = 0; i < placed->links.size(); ++i) {
            const std::string_view identity = placed->links[i];
            if (old.links.contains(identity) || !done.insert(identity).second) continue;
            placed->graph.placeLink(repository, placed->graph.links()[i]);
        }
    }
}

void withdrawOld(Repository& repository, const Graphs& before, const Contents& fresh) {
    for (const auto& placed : before) {
        for (std::size_t i = 0; i < placed->links.size(); ++i) {
            if (fresh.links.contains(placed->links[i])) continue;
            placed->graph.withdrawLink(repository, placed->graph.links()[i]);
        }
        for (std::size_t i = 0; i < placed->objects.size(); ++i) {
            if (fresh.objects.contains(placed->objects[i])) continue;
            repository.remove(placed->graph.objects()[i].instance.path);
        }
    }
}

}  // namespace

PlacedVendor::Placed::Placed(ObjectGraph described) : graph(std::move(described)) {
    for (const GraphObject& object : graph.objects()) {
        objects.push_back(object.instance.path.identity());
    }
    for (const GraphLink& link : graph.links()) links.push_back(identityOf(link));
}

PlacedVendor::PlacedVendor(Repository& repository, const Scenario& scenario)
    : repository_(repository),
      naming_(scenario.vendor, scenario.host),
      graphs_(describe(nullptr, scenario)) {}

/// Everything but the host.
PlacedVendor::Graphs PlacedVendor::describe(const Scenario* before, const Scenario& after) const {
    std::unordered_map<std::string_view, std::pair<const ControllerDescription*, std::size_t>> old;
    std::size_t begin = 0;
    if (before != nullptr) {
        for (const ControllerDescription& controller : before->controllers) {
            old.try_emplace(controller.id, &controller, begin);
            begin += countOf(controller);
        }
    }
    Graphs graphs;
    for (const ControllerDescription& controller : after.controllers) {
        const auto known = old.find(controller.id);
        const auto [same, at] = known != old.end() ? known->second : decltype(known->second){};
        ControllerGraphs(naming_, same, controller,
                         graphs_.begin() + static_cast<std::ptrdiff_t>(at))
            .appendTo(graphs);
    }
    // A profile is tied to controllers.
    const bool sameControllers =
        before != nullptr && std::ranges::equal(before->controllers, after.controllers,
                                                sameIdentity<ControllerDescription>);
    for (std::size_t i = 0; i < after.profiles.size(); ++i) {
        const ProfileDescription& profile = after.profiles[i];
        const bool isSame =
            sameControllers && i < before->profiles.size() && before->profiles[i] == profile;
        graphs.push_back(isSame ? graphs_[begin + i]
                                : placed(profileGraph(naming_, profile, after.controllers)));
    }
    return graphs;
}

void PlacedVendor::change(const Scenario& before, const Scenario& after) {
    Graphs next = describe(&before, after);
    if (next == graphs_) return;
    placeNew(repository_, next, Contents(graphs_));
    withdrawOld(repository_, graphs_, Contents(next));
    graphs_ = std::move(next);
}

}  // namespace testbed
