// Captured log lines in a form that a test can spell out: priority in front, addresses by name.
#pragma once

#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

#include "captured_syslog.h"

namespace plexortest {

/// Names for the addresses that a test knows.
using AddressNames = std::vector<std::pair<const void*, std::string>>;

inline std::string priorityName(int priority) {
    switch (priority) {
        case LOG_ERR:
            return "ERR";
        case LOG_WARNING:
            return "WARNING";
        case LOG_INFO:
            return "INFO";
        case LOG_DEBUG:
            return "DEBUG";
        default:
            return "PRIORITY " + std::to_string(priority);
    }
}

inline std::string addressName(const std::string& digits, const AddressNames& names) {
    const auto* address = reinterpret_cast<const void*>(std::strtoull(digits.c_str(), nullptr, 16));
    for (const auto& [known, name] : names)
        if (known == address) return "<" + name + ">";
    return "<?>";
}

/// The text with every address as "<name>", or "<?>" for one without a name.
inline std::string withNamedAddresses(const std::string& text, const AddressNames& names) {
    std::string result;
    std::size_t done = 0;
    for (std::size_t at = text.find("0x"); at != std::string::npos; at = text.find("0x", done)) {
        std::size_t end = text.find_first_not_of("0123456789abcdef", at + 2);
        if (end == std::string::npos) end = text.size();
        result += text.substr(done, at - done) + addressName(text.substr(at, end - at), names);
        done = end;
    }
    return result + text.substr(done);
}

/// "DEBUG text", "ERR text", …
inline std::string logText(const LogLine& line, const AddressNames& names = {}) {
    return priorityName(line.priority) + " " + withNamedAddresses(line.text, names);
}

/// Every captured line, in order.
inline std::vector<std::string> logLines(const AddressNames& names = {}) {
    std::vector<std::string> texts;
    for (const LogLine& line : CapturedSyslog::lines()) texts.push_back(logText(line, names));
    return texts;
}

}  // namespace plexortest
