// Width and character set of the terminal, and the line that tells how long one has been waiting.
#include "terminal.h"

#include <langinfo.h>
#include <locale.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <charconv>
#include <chrono>
#include <cstdlib>
#include <iostream>
#include <string_view>

namespace testbed {
namespace {

constexpr int kQuietSeconds = 2;
constexpr const char* kClearedLine = "\r\x1b[K";

std::size_t columnsInEnvironment() {
    const char* value = getenv("COLUMNS");
    const std::string_view text = value ? value : "";
    std::size_t columns = 0;
    const auto [stop, error] = std::from_chars(text.data(), text.data() + text.size(), columns);
    return error == std::errc() && stop == text.data() + text.size() ? columns : 0;
}

}  // namespace

std::size_t outputColumns() {
    if (const std::size_t columns = columnsInEnvironment()) return columns;
    winsize size = {};
    return ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 ? size.ws_col : 0;
}

bool localeIsUtf8() {
    const locale_t locale = newlocale(LC_CTYPE_MASK, "", nullptr);
    if (locale == nullptr) return false;
    const bool isUtf8 = std::string_view(nl_langinfo_l(CODESET, locale)) == "UTF-8";
    freelocale(locale);
    return isUtf8;
}

Progress::Progress(std::function<std::string(int)> text) : text_(std::move(text)) {
    if (isatty(STDERR_FILENO) == 1) thread_ = std::thread([this] { run(); });
}

Progress::~Progress() {
    if (!thread_.joinable()) return;
    {
        const std::lock_guard lock(mutex_);
        end_ = true;
    }
    ended_.notify_one();
    thread_.join();
}

void Progress::run() {
    std::unique_lock lock(mutex_);
    const auto start = std::chrono::steady_clock::now();
    bool shown = false;
    for (int seconds = kQuietSeconds;; seconds++) {
        const auto next = start + std::chrono::seconds(seconds);
        if (ended_.wait_until(lock, next, [this] { return end_; })) break;
        std::cerr << (kClearedLine + text_(seconds)) << std::flush;
        shown = true;
    }
    if (shown) std::cerr << kClearedLine << std::flush;
}

}  // namespace testbed
