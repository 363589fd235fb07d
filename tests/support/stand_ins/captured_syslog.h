// The system log that the provider writes to: `syslog` and `vsyslog` of the test executable.
#pragma once

#include <syslog.h>

#include <cstddef>
#include <functional>
#include <iosfwd>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

namespace plexortest {

/// One line of the log. Lines are equal when priority and text are.
struct LogLine {
    int priority = 0;
    std::string text;
    std::thread::id thread = {};

    bool operator==(const LogLine& other) const {
        return priority == other.priority && text == other.text;
    }
};

void PrintTo(const LogLine& line, std::ostream* out);

/// What was logged since the last `clear`. Thread-safe. `setlogmask` stays the C library's.
class CapturedSyslog {
public:
    static std::vector<LogLine> lines();
    /// The texts logged at one priority, in order.
    static std::vector<std::string> linesAt(int priority);
    /// How many lines have exactly that text, at whatever priority.
    static std::size_t count(const std::string& text);
    static std::size_t countContaining(const std::string& part);
    static void clear();

    /// Leaves out lines that the process's log mask holds back. Off by default.
    static void honourMask(bool on);
    /// Formats lines but keeps none, and takes no lock for it: the capture's own lock would order
    /// the threads and hide their races.
    static void discard(bool on);
    /// Called for each line on the logging thread, without a lock; empty for none.
    static void onLine(std::function<void(const LogLine&)> hook);
    /// Everything back to how a test finds it: no lines, no hook, mask ignored, lines kept.
    static void reset();
};

/// printf to a string: the text that a line must have.
std::string formatted(const char* format, ...) __attribute__((format(printf, 1, 2)));

/// Whether a line of that priority and text was logged; the failure lists what was.
::testing::AssertionResult logged(int priority, const std::string& text);
/// Whether these lines were logged in this order, others before, between and after them.
::testing::AssertionResult loggedInOrder(const std::vector<LogLine>& wanted);

}  // namespace plexortest
