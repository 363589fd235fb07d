// The objects of enclosures, ports, batteries and other devices.
#include "vendor_graphs.h"

namespace testbed {
namespace {

/// A device that is one object hanging off the controller's system.
ObjectGraph deviceGraph(const Naming& naming, const ControllerDescription& controller,
                        const char* cimClass, const ObjectPath& path,
                        std::vector<NamedValue> properties, const Tweaks& tweaks) {
    ObjectGraph graph(naming);
    graph.add(cimClass, path, std::move(properties), tweaks);
    graph.link("CIM_SystemDevice", naming.system(controller), path);
    return graph;
}

}  // namespace

ObjectGraph enclosureGraph(const Naming& naming, const ControllerDescription& controller,
                           const EnclosureDescription& enclosure) {
    ObjectGraph graph(naming);
    const ObjectPath path = naming.enclosure(controller, enclosure);
    graph.add("CIM_Chassis", path,
              {{"OperationalStatus", CimValue::uint16Array({enclosure.operationalStatus})}},
              enclosure.tweaks);
    graph.link("CIM_SystemPackaging", path, naming.system(controller));
    return graph;
}

ObjectGraph portGraph(const Naming& naming, const ControllerDescription& controller,
                      const PortDescription& port) {
    return deviceGraph(naming, controller, "CIM_SASSATAPort", naming.port(controller, port),
                       {{"ElementName", CimValue::string(port.name)},
                        {"PortType", CimValue::uint16(port.portType)},
                        {"UsageRestriction", CimValue::uint16(port.usageRestriction)},
                        {"OperationalStatus", CimValue::uint16Array({port.operationalStatus})}},
                       port.tweaks);
}

ObjectGraph batteryGraph(const Naming& naming, const ControllerDescription& controller,
                         const BatteryDescription& battery) {
    return deviceGraph(naming, controller, "CIM_Battery", naming.battery(controller, battery),
                       {{"BatteryStatus", CimValue::uint16(battery.batteryStatus)},
                        {"OperationalStatus", CimValue::uint16Array({battery.operationalStatus})}},
                       battery.tweaks);
}

ObjectGraph otherGraph(const Naming& naming, const ControllerDescription& controller,
                       const OtherDescription& other) {
    return deviceGraph(naming, controller, "CIM_LogicalDevice", naming.other(controller, other),
                       {{"ElementName", CimValue::string(other.name)},
                        {"OperationalStatus", CimValue::uint16Array({other.operationalStatus})}},
                       other.tweaks);
}

}  // namespace testbed
