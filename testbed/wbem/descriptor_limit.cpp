// Asks the system for the limit of descriptors and raises it.
#include "descriptor_limit.h"

#include <sys/resource.h>

#include <algorithm>

namespace testbed {

std::size_t raiseDescriptorLimit(std::size_t wanted) {
    rlimit limit = {};
    if (getrlimit(RLIMIT_NOFILE, &limit) != 0) return 0;
    if (limit.rlim_cur >= wanted) return limit.rlim_cur;
    const rlim_t before = limit.rlim_cur;
    limit.rlim_cur = std::min<rlim_t>(wanted, limit.rlim_max);
    return setrlimit(RLIMIT_NOFILE, &limit) == 0 ? limit.rlim_cur : before;
}

}  // namespace testbed
