// Whether what was printed has arrived.
#pragma once

namespace testbed {

/// Flushes standard output. The status; when something could not be written, that is told on
/// standard error, and the status is 1, for a check 3 unless it is critical.
int statusOfOutput(int status, bool isCheck);

}  // namespace testbed
