// Another component's functions and variables that happen to have the provider's names.
#pragma once

namespace loadtest {

/// How often one of the functions was called since the start.
int decoyCalls();
/// Whether a variable has been written.
bool decoysAreUntouched();
/// Whether the names of this executable are what other libraries find first.
bool decoysAreExported();

}  // namespace loadtest
