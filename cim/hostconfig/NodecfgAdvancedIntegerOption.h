// An option whose value is a number.
#pragma once

#include "KerncfgAdvancedOption.h"

namespace Nodecfg::Adv {

class AdvancedIntegerOption : public Kerncfg::Adv::AdvancedOption {
public:
    AdvancedIntegerOption(int value, bool isDefault) : value_(value), isDefault_(isDefault) {}
    ~AdvancedIntegerOption() override;
    bool IsDefault() const override;
    /// The current value, unbounded.
    virtual int GetValue() const;

private:
    int value_;
    bool isDefault_;
};

}  // namespace Nodecfg::Adv
