// Where the running tool lies.
#pragma once

#include <filesystem>

namespace testbed {

/// Directory of the running program; the current one when the system does not tell.
std::filesystem::path toolDirectory();

}  // namespace testbed
