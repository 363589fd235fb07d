// Exit statuses that several commands have in common.
#pragma once

namespace testbed {

constexpr int kRefusedStatus = 1;   ///< a steering command was refused
constexpr int kProviderFailed = 3;  ///< the provider did not answer as it should

}  // namespace testbed
