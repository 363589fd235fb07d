// Reading the file within bounds, and making an option of the value that counts.
#include "OptionFile.h"

#include <fcntl.h>
#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <optional>
#include <sstream>
#include <stdexcept>

#include "NodecfgAdvancedIntegerOption.h"

namespace hostconfig {
namespace {

constexpr char kBlanks[] = " \t\r";
constexpr std::size_t kMostBytes = 64UL * 1024;

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

/// A descriptor that closes itself.
class Descriptor {
public:
    explicit Descriptor(int number) : number_(number) {}
    ~Descriptor() {
        if (number_ >= 0) close(number_);
    }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    int Number() const { return number_; }

private:
    int number_;
};

/// What the file holds; nothing when it does not exist. Whoever reads it must not be held up: a
/// named pipe is not waited for, and what has no end is not read.
std::optional<std::string> ReadAll(const std::string& file) {
    const Descriptor descriptor(open(file.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (descriptor.Number() < 0 && errno == ENOENT) return std::nullopt;
    struct stat status = {};
    if (descriptor.Number() < 0 || fstat(descriptor.Number(), &status) != 0 ||
        !S_ISREG(status.st_mode)) {
        throw std::runtime_error("cannot read " + file);
    }
    std::string text(kMostBytes + 1, '\0');
    std::size_t size = 0;
    for (;;) {
        const ssize_t part = read(descriptor.Number(), text.data() + size, text.size() - size);
        if (part < 0 && errno == EINTR) continue;
        if (part < 0) throw std::runtime_error("cannot read " + file);
        if (part == 0) break;
        size += static_cast<std::size_t>(part);
        // Some regular files, those of /proc among them, are longer than they say.
        if (size > kMostBytes) throw std::runtime_error("cannot read " + file);
    }
    text.resize(size);
    return text;
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
    const auto text = ReadAll(file);
    if (!text) return nullptr;
    std::istringstream lines(*text);
    const auto value = LastValue(lines, path);
    return value ? MakeOption(*value) : nullptr;
}

}  // namespace hostconfig

namespace Kerncfg::Adv {

AdvancedOption::~AdvancedOption() = default;

std::unique_ptr<AdvancedOption> AdvancedOptionImpl::FindOption(const std::string& path) {
    // A set-user-id process does not let whoever starts it choose the file.
    const char* file = secure_getenv(hostconfig::kFileVariable);
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
