// What a server tells about itself in root/interop, where clients look for it: its namespaces and
// its object manager.
#pragma once

#include <string>
#include <vector>

#include "repository.h"

namespace testbed {

inline constexpr const char* kInteropNamespace = "root/interop";

/// Defines CIM_ObjectManager, CIM_Namespace and __Namespace in root/interop.
void defineInteropClasses(Repository& repository);

/// The instances of the class and of all below it; `system` is the name of this host.
std::vector<Instance> interopInstances(const Repository& repository, const std::string& nameSpace,
                                       const std::string& className, const std::string& system);

}  // namespace testbed
