// The name of the host that the tool runs on.
#pragma once

#include <string>

namespace testbed {

/// "localhost" for a host without a name.
std::string hostName();

}  // namespace testbed
