// Asks the system for the host's name.
#include "host_name.h"

#include <unistd.h>

namespace testbed {

std::string hostName() {
    char name[256] = "";
    gethostname(name, sizeof name - 1);
    return *name == '\0' ? "localhost" : name;
}

}  // namespace testbed
