#include "captured_syslog.h"

#include <algorithm>
#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <mutex>

namespace plexortest {
namespace {

std::mutex linesMutex;
std::vector<LogLine> captured;  // guarded by linesMutex
std::atomic<bool> capturing{true};

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
std::string format(const char* text, va_list args) {
    va_list again;
    va_copy(again, args);
    const int length = vsnprintf(nullptr, 0, text, args);
    std::string line(static_cast<std::size_t>(std::max(length, 0)), '\0');
    vsnprintf(line.data(), line.size() + 1, text, again);
    va_end(again);
    return line;
}
#pragma GCC diagnostic pop

void record(int priority, const char* text, va_list args) {
    std::string line = format(text, args);
    if (!capturing) return;
    std::lock_guard lock(linesMutex);
    captured.push_back({priority, std::move(line), std::this_thread::get_id()});
}

}  // namespace

std::vector<LogLine> CapturedSyslog::lines() {
    std::lock_guard lock(linesMutex);
    return captured;
}

std::vector<std::string> CapturedSyslog::linesAt(int priority) {
    std::vector<std::string> found;
    for (const LogLine& line : lines())
        if (line.priority == priority) found.push_back(line.text);
    return found;
}

std::vector<std::string> CapturedSyslog::texts() {
    std::vector<std::string> found;
    for (const LogLine& line : lines()) found.push_back(line.text);
    return found;
}

std::size_t CapturedSyslog::count(const std::string& text) {
    const auto all = texts();
    return static_cast<std::size_t>(std::count(all.begin(), all.end(), text));
}

std::size_t CapturedSyslog::count(int priority, const std::string& text) {
    const auto all = linesAt(priority);
    return static_cast<std::size_t>(std::count(all.begin(), all.end(), text));
}

std::size_t CapturedSyslog::countContaining(const std::string& part) {
    const auto all = texts();
    return static_cast<std::size_t>(std::count_if(
        all.begin(), all.end(),
        [&](const std::string& text) { return text.find(part) != std::string::npos; }));
}

int CapturedSyslog::indexOf(const std::string& text, int from) {
    const auto all = texts();
    for (std::size_t i = static_cast<std::size_t>(from); i < all.size(); i++)
        if (all[i] == text) return static_cast<int>(i);
    return -1;
}

void CapturedSyslog::clear() {
    std::lock_guard lock(linesMutex);
    captured.clear();
}

void CapturedSyslog::capture(bool on) { capturing = on; }

}  // namespace plexortest

// Plain and fortified names: which one the compiler chooses depends on its flags.

extern "C" void vsyslog(int priority, const char* text, va_list args) {
    plexortest::record(priority, text, args);
}

extern "C" void __vsyslog_chk(int priority, int, const char* text, va_list args) {
    plexortest::record(priority, text, args);
}

extern "C" void syslog(int priority, const char* text, ...) {
    va_list args;
    va_start(args, text);
    plexortest::record(priority, text, args);
    va_end(args);
}

extern "C" void __syslog_chk(int priority, int, const char* text, ...) {
    va_list args;
    va_start(args, text);
    plexortest::record(priority, text, args);
    va_end(args);
}
