// What the standard says about classes beyond their members: which are abstract, what references
// refer to, and what numbers mean.
#pragma once

#include <string>

#include "repository.h"

namespace testbed {

/// Adds Abstract, ValueMap and Values, and the classes of references, to the standard classes of
/// the namespace that have none; whatever a schema has said already stays.
void qualifyStandardClasses(Repository& repository, const std::string& nameSpace);

}  // namespace testbed
