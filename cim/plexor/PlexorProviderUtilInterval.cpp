// The polling interval from the host's option store.
#include <KerncfgAdvancedOption.h>
#include <NodecfgAdvancedIntegerOption.h>
#include <cxxabi.h>

#include "PlexorProviderUtil.h"

namespace {

constexpr const char kIntervalOption[] = "/UserVars/CIMtvx_plexorProviderPollingInterval";

}  // namespace

// A cancelled thread unwinds without an exception object; naming it as one is what the sanitizer
// objects to, and how it is told from a real one.
int GetSampelInterval() __attribute__((no_sanitize("undefined")));

int GetSampelInterval() {
    try {
        const auto option = Kerncfg::Adv::AdvancedOptionImpl::FindOption(kIntervalOption);
        if (option == nullptr) {
            syslog(LOG_ERR, "%s: %s not found", __func__, kIntervalOption);
            return kDefaultIntervalSeconds;
        }
        if (option->IsDefault()) return kDefaultIntervalSeconds;
        auto* integer = dynamic_cast<Nodecfg::Adv::AdvancedIntegerOption*>(option.get());
        return integer != nullptr ? integer->GetValue() : kDefaultIntervalSeconds;
    } catch (abi::__forced_unwind&) {
        throw;  // the thread is being cancelled; that must not be stopped
    } catch (...) {
        // The option store is another component's: whatever it throws stays here.
        return kDefaultIntervalSeconds;
    }
}
