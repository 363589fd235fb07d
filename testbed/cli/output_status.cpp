// Flushing standard output, and the exit status when that fails.
#include "output_status.h"

#include <cerrno>
#include <iostream>
#include <system_error>

#include "check_summary.h"

namespace testbed {

int statusOfOutput(int status, bool isCheck) {
    errno = 0;
    std::cout.flush();
    if (std::cout.good()) return status;
    std::cerr << "plexor-testbed: standard output cannot be written"
              << (errno != 0 ? ": " + std::generic_category().message(errno) : "") << std::endl;
    if (!isCheck) return 1;
    return status == kCheckCritical ? status : kCheckUnknown;
}

}  // namespace testbed
