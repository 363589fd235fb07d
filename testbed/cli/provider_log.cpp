// The tool's own `syslog`, which hands the provider's lines to whoever wants them.
#include "provider_log.h"

#include <syslog.h>

#include <cstdarg>
#include <cstdio>
#include <iostream>
#include <mutex>

#include "whole_line.h"

namespace testbed {
namespace {

std::mutex sinkMutex;
std::function<void(int, const std::string&)> currentSink;  // guarded by sinkMutex

[[gnu::format(printf, 2, 0)]] void deliver(int priority, const char* format, va_list args) {
    if ((setlogmask(0) & LOG_MASK(LOG_PRI(priority))) == 0) return;
    char line[4096];
    vsnprintf(line, sizeof line, format, args);
    std::string text = line;
    while (!text.empty() && text.back() == '\n') text.pop_back();
    const std::lock_guard lock(sinkMutex);
    if (currentSink) currentSink(LOG_PRI(priority), text);
}

}  // namespace

void directProviderLog(int priority, std::function<void(int, const std::string&)> sink) {
    const std::lock_guard lock(sinkMutex);
    currentSink = std::move(sink);
    setlogmask(LOG_UPTO(priority));
}

void showProviderLog(bool show) {
    if (!show) return directProviderLog(LOG_ERR, nullptr);
    directProviderLog(LOG_DEBUG, [](int, const std::string& line) { printLine(std::cerr, line); });
}

}  // namespace testbed

// Plain and fortified names: which one a provider calls depends on how it was compiled.

extern "C" void syslog(int priority, const char* format, ...) {
    va_list args;
    va_start(args, format);
    testbed::deliver(priority, format, args);
    va_end(args);
}

extern "C" [[gnu::format(printf, 3, 4)]] void __syslog_chk(int priority, int, const char* format,
                                                           ...) {
    va_list args;
    va_start(args, format);
    testbed::deliver(priority, format, args);
    va_end(args);
}
