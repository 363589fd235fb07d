// Sets the provider's polling interval through the option store, for as long as it lives.
#pragma once

#include <string>

namespace testbed {

class PollingInterval {
public:
    /// Writes an option file and names it in PLEXOR_HOSTCONFIG_FILE. When the variable is set
    /// already, it is left alone. Before the provider is loaded.
    explicit PollingInterval(unsigned seconds);
    ~PollingInterval();
    PollingInterval(const PollingInterval&) = delete;
    PollingInterval& operator=(const PollingInterval&) = delete;

private:
    std::string file_;
};

}  // namespace testbed
