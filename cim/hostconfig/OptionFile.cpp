#include "OptionFile.h"

#include <stdlib.h>
#include <unistd.h>

#include <cerrno>
#include <fstream>
#include <optional>
#include <stdexcept>

#include "NodecfgAdvancedIntegerOption.h"

namespace hostconfig {
namespace {

constexpr char kBlanks[] = " \t\r";

std::string Trim(const std::string& text) {
    const auto first = text.find_first_not_of(kBlanks);
    if (first == std::string::npos) return "";
    return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

bool IsNumber(const std::string& text) {
    const std::size_t start = text[0] == '-' || text[0] == '+' ? 1 : 0;
    return text.size() > start && text.find_first_not_of("0123456789", start) == std::string::npos;
}

std::unique_ptr<Kerncfg::Adv::AdvancedOption> MakeOption(const std::string& value) {
    using Nodecfg::Adv::AdvancedIntegerOption;
    if (value == "default") return std::make_unique<AdvancedIntegerOption>(0, true);
    if (!value.empty() && IsNumber(value)) {
        return std::make_unique<AdvancedIntegerOption>(std::stoi(value), false);
    }
    return std::make_unique<TextOption>(value);
}

/// Value of the last line for `path`.
std::optional<std::string> LastValue(std::istream& lines, const std::string& path) {
    std::optional<std::string> value;
    for (std::string line; std::getline(lines, line);) {
        const std::string text = Trim(line);
        const auto equals = text.find('=');
        if (text.empty() || text[0] == '#' || equals == std::string::npos) continue;
        if (Trim(text.substr(0, equals)) == path) value = Trim(text.substr(equals + 1));
    }
    return value;
}

}  // namespace

TextOption::~TextOption() = default;

std::unique_ptr<Kerncfg::Adv::AdvancedOption> FindInFile(const std::string& file,
                                                         const std::string& path) {
    if (access(file.c_str(), F_OK) != 0 && errno == ENOENT) return nullptr;
    std::ifstream lines(file);
    if (!lines) throw std::runtime_error("cannot read " + file);
    const auto value = LastValue(lines, path);
    if (lines.bad()) throw std::runtime_error("cannot read " + file);
    return value ? MakeOption(*value) : nullptr;
}

}  // namespace hostconfig

namespace Kerncfg::Adv {

AdvancedOption::~AdvancedOption() = default;

std::unique_ptr<AdvancedOption> AdvancedOptionImpl::FindOption(const std::string& path) {
    const char* file = getenv(hostconfig::kFileVariable);
    return hostconfig::FindInFile(file != nullptr ? file : hostconfig::kDefaultFile, path);
}

}  // namespace Kerncfg::Adv

namespace Nodecfg::Adv {

AdvancedIntegerOption::~AdvancedIntegerOption() = default;
bool AdvancedIntegerOption::IsDefault() const {
    return isDefault_;
}
int AdvancedIntegerOption::GetValue() const {
    return value_;
}

}  // namespace Nodecfg::Adv
