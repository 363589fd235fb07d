// The process's syslog, in front of the C library's: every line is formatted and dropped, so that
// whatever the provider hands over is read, as it is on a host that logs everything.
#pragma once

#include <cstdint>

namespace torture {

struct FormattedLog {
    static std::uint64_t lines();
    /// Lines that tell of a volume turned away for want of a pool.
    static std::uint64_t volumesTurnedAway();
};

}  // namespace torture
