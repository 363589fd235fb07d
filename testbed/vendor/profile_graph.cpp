// The objects of the host and of the vendor's registered profiles.
#include <algorithm>

#include "vendor_graphs.h"

namespace testbed {

ObjectGraph hostGraph(const Naming& naming, const HostDescription& host) {
    ObjectGraph graph(naming);
    if (host.absent) return graph;
    graph.add("CIM_ComputerSystem", naming.host(host),
              {{"ElementName", CimValue::string(host.elementName)},
               {"OperationalStatus", CimValue::uint16Array({2})}},
              host.tweaks);
    return graph;
}

ObjectGraph profileGraph(const Naming& naming, const ProfileDescription& profile,
                         const std::vector<ControllerDescription>& controllers) {
    ObjectGraph graph(naming);
    const ObjectPath path = naming.profile(profile);
    graph.add("CIM_RegisteredProfile", path,
              {{"RegisteredOrganization", CimValue::uint16(profile.organization)},
               {"RegisteredName", CimValue::string(profile.registeredName)},
               {"RegisteredVersion", CimValue::string(profile.version)}},
              profile.tweaks);
    for (const ControllerDescription& controller : controllers) {
        const auto& chosen = profile.controllers;
        if (chosen && std::find(chosen->begin(), chosen->end(), controller.id) == chosen->end()) {
            continue;
        }
        graph.link("CIM_ElementConformsToProfile", path, naming.portController(controller));
    }
    return graph;
}

}  // namespace testbed
