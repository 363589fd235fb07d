// Turns a scenario into the vendor that a provider meets: classes, objects, behaviour.
#pragma once

#include "broker.h"
#include "naming.h"
#include "scenario.h"

namespace testbed {

/// Defines the classes and creates everything that the scenario describes.
void buildVendor(Repository& repository, const Scenario& scenario);

/// Defines the namespaces and classes only.
void defineVendorClasses(Repository& repository, const Scenario& scenario);

/// The controller with all its devices, put into the repository or taken out of it.
void placeController(Repository& repository, const Naming& naming,
                     const ControllerDescription& controller);
void withdrawController(Repository& repository, const Naming& naming,
                        const ControllerDescription& controller);

/// Gives the broker the scenario's faults and latency.
void applyBehaviour(Broker& broker, const Scenario& scenario);

}  // namespace testbed
