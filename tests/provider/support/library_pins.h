// Calls that keep the provider's library mapped for good.
#pragma once

namespace plexortest {

/// How many there have been in this process.
int libraryPins();

}  // namespace plexortest
