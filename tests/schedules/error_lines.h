// What the provider has logged as an error during a schedule.
#pragma once

#include <cstdarg>
#include <string>
#include <vector>

namespace schedules {

[[gnu::format(printf, 1, 0)]] void noteErrorLine(const char* format, va_list arguments);
/// Those since the last call. After the schedule has ended.
std::vector<std::string> takeErrorLines();

}  // namespace schedules
