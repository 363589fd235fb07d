// The provider's log, watched: the executable exports syslog in front of the C library's. Nothing
// is written anywhere.
#pragma once

namespace loadtest {

/// Begins to watch anew.
void forgetLog();
/// Whether both workers have come to a wait since then. One that has not reached its first wait yet
/// does not hear the call to stop.
bool bothWorkersHaveWaited();

}  // namespace loadtest
