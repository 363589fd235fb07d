// A controller's objects: port controller, system, card and software.
#include "vendor_graphs.h"

namespace testbed {
namespace {

CimValue numbers(const std::vector<std::uint16_t>& values) {
    std::vector<CimValue> elements;
    for (const std::uint16_t value : values) elements.push_back(CimValue::uint16(value));
    return CimValue::array(CMPI_uint16, std::move(elements));
}

void addSoftware(ObjectGraph& graph, const Naming& naming, const ControllerDescription& controller,
                 const SoftwareDescription& software) {
    const ObjectPath path = naming.software(controller, software);
    graph.add("CIM_SoftwareIdentity", path,
              {{"Classifications", numbers(software.classifications)},
               {"VersionString", CimValue::string(software.version)},
               {"IsEntity", CimValue::boolean(true)}},
              software.tweaks);
    graph.link("CIM_ElementSoftwareIdentity", path, naming.system(controller));
}

void addCard(ObjectGraph& graph, const Naming& naming, const ControllerDescription& controller) {
    const ObjectPath path = naming.card(controller);
    graph.add("CIM_PhysicalPackage", path,
              {{"Model", CimValue::string(controller.model)},
               {"HealthState", CimValue::uint16(controller.healthState)}},
              controller.part("package"));
    graph.link("CIM_Realizes", path, naming.portController(controller));
}

}  // namespace

ObjectGraph controllerGraph(const Naming& naming, const ControllerDescription& controller) {
    ObjectGraph graph(naming);
    const ObjectPath port = naming.portController(controller);
    graph.add("CIM_PortController", port,
              {{"ElementName", CimValue::string("Controller " + controller.id)},
               {"OperationalStatus", CimValue::uint16Array({controller.operationalStatus})}},
              controller.tweaks);
    if (!controller.noPackage) addCard(graph, naming, controller);
    if (controller.noSystem) return graph;
    const ObjectPath system = naming.system(controller);
    graph.add("CIM_ComputerSystem", system,
              {{"ElementName", CimValue::string("RAID controller " + controller.id)},
               {"OperationalStatus", CimValue::uint16Array({controller.operationalStatus})}},
              controller.part("system"));
    graph.link("CIM_LogicalIdentity", system, port);
    for (const SoftwareDescription& software : controller.software) {
        addSoftware(graph, naming, controller, software);
    }
    return graph;
}

}  // namespace testbed
