// The host's option file, and the polling interval that the provider reads from it.
#include <cstdlib>
#include <stdexcept>

#include "KerncfgAdvancedOption.h"
#include "NodecfgAdvancedIntegerOption.h"
#include "OptionFile.h"
#include "fuzz_target.h"
#include "input_file.h"

namespace {

constexpr const char* kPath = "/UserVars/CIMtvx_plexorProviderPollingInterval";

}  // namespace

PLEXOR_FUZZ_HARNESS(option_file) {
    static const fuzz::InputFile file;
    file.write(bytes);
    try {
        const auto option = hostconfig::FindInFile(file.name(), kPath);
        if (option == nullptr) return;
        const auto* number = dynamic_cast<const Nodecfg::Adv::AdvancedIntegerOption*>(option.get());
        const auto* text = dynamic_cast<const hostconfig::TextOption*>(option.get());
        fuzz::require((number != nullptr) != (text != nullptr), "an option is a number or a text");
        if (number == nullptr) {
            fuzz::require(!text->IsDefault(), "a text is no default");
            return;
        }
        const std::string shown = std::to_string(number->GetValue());
        fuzz::require(number->IsDefault() || !shown.empty(), "a number has a value");
    } catch (const std::out_of_range&) {
    } catch (const std::runtime_error&) {
        fuzz::require(bytes.size() > 64 * 1024, "a file of up to 64 KiB is read");
    }
}
