// What a terminal can show, and what it is told while one waits.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

namespace testbed {

/// Columns of standard output: what the variable COLUMNS says, else the terminal's width; 0, no
/// limit, when there is neither.
std::size_t outputColumns();

/// True when the user's locale (LC_ALL, LC_CTYPE, LANG) has UTF-8.
bool localeIsUtf8();

/// While it lives, and after two seconds, shows a line on standard error when that is a terminal,
/// anew every second, and takes it away at the end.
class Progress {
public:
    /// `text` is called on another thread with the seconds that have passed.
    explicit Progress(std::function<std::string(int seconds)> text);
    ~Progress();
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

private:
    void run();

    std::function<std::string(int)> text_;
    std::mutex mutex_;
    std::condition_variable ended_;
    bool end_ = false;  // guarded by mutex_
    std::thread thread_;
};

}  // namespace testbed
