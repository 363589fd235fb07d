// What stands in the repository for each thing that a scenario describes.
//
// Every function gives the objects and associations of one thing only; what it is attached to
// (the controller of a drive, say) has a graph of its own.
#pragma once

#include "object_graph.h"

namespace testbed {

ObjectGraph hostGraph(const Naming& naming, const HostDescription& host);
/// The profile with its associations to the controllers that conform to it.
ObjectGraph profileGraph(const Naming& naming, const ProfileDescription& profile,
                         const std::vector<ControllerDescription>& controllers);
/// Port controller, computer system, card and software; none of the devices.
ObjectGraph controllerGraph(const Naming& naming, const ControllerDescription& controller);
ObjectGraph poolGraph(const Naming& naming, const ControllerDescription& controller,
                      const PoolDescription& pool);
ObjectGraph enclosureGraph(const Naming& naming, const ControllerDescription& controller,
                           const EnclosureDescription& enclosure);
/// Drive, extent, firmware, package and slot.
ObjectGraph driveGraph(const Naming& naming, const ControllerDescription& controller,
                       const DriveDescription& drive);
/// Volume and setting.
ObjectGraph volumeGraph(const Naming& naming, const ControllerDescription& controller,
                        const VolumeDescription& volume);
ObjectGraph portGraph(const Naming& naming, const ControllerDescription& controller,
                      const PortDescription& port);
ObjectGraph batteryGraph(const Naming& naming, const ControllerDescription& controller,
                         const BatteryDescription& battery);
ObjectGraph otherGraph(const Naming& naming, const ControllerDescription& controller,
                       const OtherDescription& other);

}  // namespace testbed
