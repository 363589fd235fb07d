// Finds the provider's shared library.
#pragma once

#include <string>

#include "broker_options.h"

namespace testbed {

/// `chosen` when it is not empty; else the library beside the tool: in the tool's own directory,
/// where the build puts it, or where it is installed; of two builds the one for that manager.
/// Throws LoadError when there is none.
std::string locateLibrary(const std::string& chosen, const BrokerOptions& manager);

}  // namespace testbed
