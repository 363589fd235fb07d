// Fortified headers define syslog themselves; this file has to define all forms of it.
#undef _FORTIFY_SOURCE

#include "captured_syslog.h"

#include <stdarg.h>
#include <stdio.h>

#include <algorithm>
#include <atomic>
#include <mutex>
#include <ostream>

namespace plexortest {
namespace {

std::mutex logMutex;
std::vector<LogLine> captured;                 // guarded by logMutex
std::function<void(const LogLine&)> lineHook;  // guarded by logMutex
std::atomic<bool> masked{false};
std::atomic<bool> discarded{false};

std::string __attribute__((format(printf, 1, 0))) vformatted(const char* format, va_list args) {
    va_list again;
    va_copy(again, args);
    const int length = vsnprintf(nullptr, 0, format, again);
    va_end(again);
    if (length <= 0) return "";
    std::string text(static_cast<std::size_t>(length) + 1, '\0');
    vsnprintf(text.data(), text.size(), format, args);
    text.pop_back();
    return text;
}

bool heldBack(int priority) {
    return masked.load(std::memory_order_relaxed) &&
           (setlogmask(0) & LOG_MASK(LOG_PRI(priority))) == 0;
}

void __attribute__((format(printf, 2, 0))) capture(int priority, const char* format, va_list args) {
    if (heldBack(priority)) return;
    LogLine line{priority, vformatted(format, args), std::this_thread::get_id()};
    if (discarded.load(std::memory_order_relaxed)) return;
    std::function<void(const LogLine&)> hook;
    {
        std::lock_guard lock(logMutex);
        captured.push_back(line);
        hook = lineHook;
    }
    if (hook) hook(line);
}

std::string listing() {
    std::string text;
    for (const LogLine& line : CapturedSyslog::lines()) {
        text += "  <" + std::to_string(line.priority) + "> " + ::testing::PrintToString(line.text) +
                "\n";
    }
    return text.empty() ? "  (nothing)\n" : text;
}

}  // namespace

void PrintTo(const LogLine& line, std::ostream* out) {
    *out << "<" << line.priority << "> " << ::testing::PrintToString(line.text);
}

std::vector<LogLine> CapturedSyslog::lines() {
    std::lock_guard lock(logMutex);
    return captured;
}

std::vector<std::string> CapturedSyslog::linesAt(int priority) {
    std::lock_guard lock(logMutex);
    std::vector<std::string> texts;
    for (const LogLine& line : captured) {
        if (line.priority == priority) texts.push_back(line.text);
    }
    return texts;
}

std::size_t CapturedSyslog::count(const std::string& text) {
    std::lock_guard lock(logMutex);
    return static_cast<std::size_t>(std::count_if(
        captured.begin(), captured.end(), [&](const LogLine& line) { return line.text == text; }));
}

std::size_t CapturedSyslog::countContaining(const std::string& part) {
    std::lock_guard lock(logMutex);
    return static_cast<std::size_t>(std::count_if(
        captured.begin(), captured.end(),
        [&](const LogLine& line) { return line.text.find(part) != std::string::npos; }));
}

void CapturedSyslog::clear() {
    std::lock_guard lock(logMutex);
    captured.clear();
}

void CapturedSyslog::honourMask(bool on) {
    masked = on;
}

void CapturedSyslog::discard(bool on) {
    discarded = on;
}

void CapturedSyslog::onLine(std::function<void(const LogLine&)> hook) {
    std::lock_guard lock(logMutex);
    lineHook = std::move(hook);
}

void CapturedSyslog::reset() {
    honourMask(false);
    discard(false);
    onLine(nullptr);
    clear();
}

std::string formatted(const char* format, ...) {
    va_list args;
    va_start(args, format);
    std::string text = vformatted(format, args);
    va_end(args);
    return text;
}

::testing::AssertionResult logged(int priority, const std::string& text) {
    const LogLine wanted{priority, text};
    const auto lines = CapturedSyslog::lines();
    if (std::find(lines.begin(), lines.end(), wanted) != lines.end()) {
        return ::testing::AssertionSuccess() << "logged: " << ::testing::PrintToString(wanted);
    }
    return ::testing::AssertionFailure()
           << "not logged: " << ::testing::PrintToString(wanted) << "\nlogged were:\n"
           << listing();
}

::testing::AssertionResult loggedInOrder(const std::vector<LogLine>& wanted) {
    const auto lines = CapturedSyslog::lines();
    auto from = lines.begin();
    for (const LogLine& line : wanted) {
        from = std::find(from, lines.end(), line);
        if (from == lines.end()) {
            return ::testing::AssertionFailure()
                   << "not logged in its place: " << ::testing::PrintToString(line)
                   << "\nlogged were:\n"
                   << listing();
        }
        ++from;
    }
    return ::testing::AssertionSuccess();
}

}  // namespace plexortest

extern "C" {

void syslog(int priority, const char* format, ...) {
    va_list args;
    va_start(args, format);
    plexortest::capture(priority, format, args);
    va_end(args);
}

void vsyslog(int priority, const char* format, va_list args) {
    plexortest::capture(priority, format, args);
}

void __syslog_chk(int priority, int flag, const char* format, ...)
    __attribute__((format(printf, 3, 4)));
void __syslog_chk(int priority, int, const char* format, ...) {
    va_list args;
    va_start(args, format);
    plexortest::capture(priority, format, args);
    va_end(args);
}

void __vsyslog_chk(int priority, int flag, const char* format, va_list args)
    __attribute__((format(printf, 3, 0)));
void __vsyslog_chk(int priority, int, const char* format, va_list args) {
    plexortest::capture(priority, format, args);
}

}  // extern "C"
