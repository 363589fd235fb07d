// Log lines in forms that a test can spell out: as they are, or as texts with the priority in front
// and addresses by name.
#pragma once

#include <cstdlib>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "captured_syslog.h"

namespace plexortest {

inline LogLine debugLine(std::string text) {
    return {LOG_DEBUG, std::move(text)};
}
inline LogLine infoLine(std::string text) {
    return {LOG_INFO, std::move(text)};
}
inline LogLine warningLine(std::string text) {
    return {LOG_WARNING, std::move(text)};
}
inline LogLine errorLine(std::string text) {
    return {LOG_ERR, std::move(text)};
}

/// The calling thread's lines without those of the lists and of released records.
inline std::vector<LogLine> inventoryLog() {
    constexpr const char* kListLines[] = {"Adding data ",  "Data ", "Removing data ",
                                          "Freeing list ", "List ", "PutItem: Fifo("};
    std::vector<LogLine> found;
    for (const LogLine& line : CapturedSyslog::lines()) {
        bool skipped =
            line.thread != std::this_thread::get_id() || line.text.ends_with(" deleted\n");
        for (const char* start : kListLines) skipped = skipped || line.text.starts_with(start);
        if (!skipped) found.push_back(line);
    }
    return found;
}

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
