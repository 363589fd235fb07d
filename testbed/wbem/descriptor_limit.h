// How many files and connections this process may have open.
#pragma once

#include <cstddef>

namespace testbed {

/// Raises the limit to `wanted` as far as the system allows it. The number that is allowed now.
std::size_t raiseDescriptorLimit(std::size_t wanted);

}  // namespace testbed
