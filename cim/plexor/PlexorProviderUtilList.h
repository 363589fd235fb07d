// What the lists tell of themselves beyond the exported functions.
#pragma once

#include <cstdint>

/// How many entries have been removed from lists so far, whichever; counted before the entry is
/// freed. While the number stays, an entry that was in its list still is.
std::uint64_t EntriesRemoved();
