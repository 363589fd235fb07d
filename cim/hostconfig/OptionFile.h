// The stand-in for the host's option store: a text file.
//
// One option a line, `path = value`. Empty lines and lines that begin with `#` are comments. A
// value is a decimal number (an integer option), the word `default` (an integer option at its
// default) or anything else (a text option). The last line for a path counts. A missing file has no
// options.
#pragma once

#include <string>

#include "KerncfgAdvancedOption.h"

namespace hostconfig {

/// Names the file; the default is used when it is not set.
inline constexpr char kFileVariable[] = "PLEXOR_HOSTCONFIG_FILE";
inline constexpr char kDefaultFile[] = "/etc/plexor/hostconfig";

/// An option whose value is a text.
class TextOption : public Kerncfg::Adv::AdvancedOption {
public:
    explicit TextOption(std::string value) : value_(std::move(value)) {}
    ~TextOption() override;
    bool IsDefault() const override { return false; }
    const std::string& GetValue() const { return value_; }

private:
    std::string value_;
};

/// The option at `path` in `file`. Throws std::runtime_error when the file exists but cannot be
/// read, is no regular file, or holds more than 64 KiB; std::out_of_range for a number that is no
/// int.
std::unique_ptr<Kerncfg::Adv::AdvancedOption> FindInFile(const std::string& file,
                                                         const std::string& path);

}  // namespace hostconfig
