// Placing all graphs of a scenario.
#include "vendor.h"

#include "class_catalogue.h"
#include "vendor_graphs.h"

namespace testbed {
namespace {

/// The controller itself, and each of its devices, in the order in which they are built.
std::vector<ObjectGraph> graphsOf(const Naming& naming, const ControllerDescription& controller) {
    std::vector<ObjectGraph> graphs{controllerGraph(naming, controller)};
    const auto append = [&](const auto& list, auto graphOf) {
        for (const auto& item : list) graphs.push_back(graphOf(naming, controller, item));
    };
    append(controller.pools, poolGraph);
    append(controller.enclosures, enclosureGraph);
    append(controller.drives, driveGraph);
    append(controller.volumes, volumeGraph);
    append(controller.ports, portGraph);
    append(controller.batteries, batteryGraph);
    append(controller.others, otherGraph);
    return graphs;
}

}  // namespace

void defineVendorClasses(Repository& repository, const Scenario& scenario) {
    // An association between two namespaces is known in both.
    for (const std::string& nameSpace :
         {std::string(kProfileNamespace), scenario.vendor.nameSpace, std::string(kHostNamespace)}) {
        defineClasses(repository, nameSpace, scenario.vendor.classPrefix);
    }
    defineClassBelow(repository, kHostNamespace, "OMC_UnitaryComputerSystem", "CIM_ComputerSystem");
}

void placeController(Repository& repository, const Naming& naming,
                     const ControllerDescription& controller) {
    for (const ObjectGraph& graph : graphsOf(naming, controller)) graph.place(repository);
}

void withdrawController(Repository& repository, const Naming& naming,
                        const ControllerDescription& controller) {
    for (const ObjectGraph& graph : graphsOf(naming, controller)) graph.withdraw(repository);
}

void buildVendor(Repository& repository, const Scenario& scenario) {
    defineVendorClasses(repository, scenario);
    const Naming naming(scenario.vendor, scenario.host);
    hostGraph(naming, scenario.host).place(repository);
    for (const ControllerDescription& controller : scenario.controllers) {
        placeController(repository, naming, controller);
    }
    for (const ProfileDescription& profile : scenario.profiles) {
        profileGraph(naming, profile, scenario.controllers).place(repository);
    }
    if (scenario.shuffle) repository.shuffleResults(*scenario.shuffle);
}

void applyBehaviour(Broker& broker, const Scenario& scenario) {
    for (const FaultRule& rule : scenario.faults) broker.faults().add(rule);
    broker.faults().setLatency(scenario.latency.minimum, scenario.latency.maximum);
}

}  // namespace testbed
