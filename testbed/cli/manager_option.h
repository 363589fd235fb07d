// The option --manager of the commands that load the provider.
#pragma once

#include <string>

#include "scenario.h"

namespace CLI {
class App;
}

namespace testbed {

/// A list as chooseManager takes it; another one is wrong usage.
void addManagerOption(CLI::App& command, std::string& manager);

/// The scenario's manager, changed as the option says.
BrokerOptions chosenManager(const Scenario& scenario, const std::string& manager);

}  // namespace testbed
