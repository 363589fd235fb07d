// Where these tests define classes.
#pragma once

namespace testbed {

inline constexpr const char* kSpace = "root/cimv2";

}  // namespace testbed
