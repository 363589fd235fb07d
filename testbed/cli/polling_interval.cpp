// Writing the option file, and removing it with its variable at the end.
#include "polling_interval.h"

#include <unistd.h>

#include <cstdlib>
#include <stdexcept>

namespace testbed {
namespace {

constexpr const char* kVariable = "PLEXOR_HOSTCONFIG_FILE";
constexpr const char* kOption = "/UserVars/CIMtvx_plexorProviderPollingInterval";

}  // namespace

PollingInterval::PollingInterval(unsigned seconds) {
    if (getenv(kVariable) != nullptr) return;
    const char* folder = getenv("TMPDIR");
    file_ = std::string(folder != nullptr ? folder : "/tmp") + "/plexor-testbed-XXXXXX";
    const int descriptor = mkstemp(file_.data());
    const std::string text = std::string(kOption) + " = " + std::to_string(seconds) + "\n";
    if (descriptor < 0 || write(descriptor, text.data(), text.size()) < 0) {
        throw std::runtime_error("cannot write " + file_);
    }
    close(descriptor);
    setenv(kVariable, file_.c_str(), 1);
}

PollingInterval::~PollingInterval() {
    if (file_.empty()) return;
    unsetenv(kVariable);
    unlink(file_.c_str());
}

}  // namespace testbed
