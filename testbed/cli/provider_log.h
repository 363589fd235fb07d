// The provider's system log lines, caught on their way to the log.
//
// A provider in this process calls `syslog` of the C library through its symbol, and the tool
// exports one of its own in front.
#pragma once

#include <functional>
#include <string>

namespace testbed {

/// Where lines go whose priority is at most `priority` (LOG_ERR, …); nowhere without a sink. The
/// sink gets the formatted line without its newline, on the logging thread, one line at a time.
void directProviderLog(int priority, std::function<void(int priority, const std::string&)> sink);

/// All lines go to standard error, or, unless they are to be shown, nowhere: they are masked as
/// managers mask them.
void showProviderLog(bool show);

}  // namespace testbed
