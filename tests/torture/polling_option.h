// The host's option store with nothing but the provider's polling interval, as a temporary file.
#pragma once

#include <stdlib.h>
#include <unistd.h>

#include <fstream>
#include <stdexcept>
#include <string>

namespace torture {

/// Removed with the object. Make it before the provider starts.
class PollingOption {
public:
    explicit PollingOption(int seconds) {
        char name[] = "/tmp/plexor-options-XXXXXX";
        const int file = mkstemp(name);
        if (file < 0) throw std::runtime_error("cannot make an option file in /tmp");
        close(file);
        file_ = name;
        std::ofstream(file_) << "/UserVars/CIMtvx_plexorProviderPollingInterval = " << seconds
                             << "\n";
        setenv("PLEXOR_HOSTCONFIG_FILE", name, 1);
    }
    ~PollingOption() { unlink(file_.c_str()); }
    PollingOption(const PollingOption&) = delete;
    PollingOption& operator=(const PollingOption&) = delete;

private:
    std::string file_;
};

}  // namespace torture
