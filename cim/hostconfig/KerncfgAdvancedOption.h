// The host's advanced options, as much of them as the provider needs.
#pragma once

#include <memory>
#include <string>

namespace Kerncfg::Adv {

/// One option of the host's store, a snapshot of its state when it was looked up.
class AdvancedOption {
public:
    virtual ~AdvancedOption();
    /// Whether the option stands at its default, so that its current value says nothing.
    virtual bool IsDefault() const = 0;
};

class AdvancedOptionImpl {
public:
    /// The option at `path`, null when the store has none. Throws when the store cannot be read.
    static std::unique_ptr<AdvancedOption> FindOption(const std::string& path);
};

}  // namespace Kerncfg::Adv
