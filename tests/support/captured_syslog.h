// The test program's own `syslog`, in front of the C library's: captures every line.
#pragma once

#include <syslog.h>

#include <string>
#include <thread>
#include <vector>

namespace plexortest {

struct LogLine {
    int priority;
    std::string text;  ///< formatted, with its newline if it has one
    std::thread::id thread;
};

/// Thread-safe. `setlogmask` stays the C library's and does not filter what is captured.
class CapturedSyslog {
public:
    static std::vector<LogLine> lines();
    /// Texts of the lines with that priority, in order.
    static std::vector<std::string> linesAt(int priority);
    static std::vector<std::string> texts();
    /// How many lines have exactly this text (at that priority).
    static std::size_t count(const std::string& text);
    static std::size_t count(int priority, const std::string& text);
    /// How many lines contain this text.
    static std::size_t countContaining(const std::string& part);
    /// Place of the first line with exactly this text at or behind `from`; -1 without one.
    static int indexOf(const std::string& text, int from = 0);
    static void clear();
    /// Off: lines are formatted and forgotten, for long runs.
    static void capture(bool on);
};

}  // namespace plexortest
