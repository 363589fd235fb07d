// Brings the provider's cache up to date with an array that has stopped changing.
#pragma once

#include "instance_client.h"

namespace torture {

/// Asks until every class of every controller has been refreshed from the array as it stands now
/// and the workers are idle. False when that does not happen within a minute.
bool settle(testbed::InstanceClient& client);

}  // namespace torture
