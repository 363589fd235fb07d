// What each of these programs does around its measurement.
#pragma once

#include <functional>

namespace CLI {
class App;
}

namespace bench {

/// Reads the program's options, lets the provider's lines up to a syslog priority through, and
/// measures. The exit status; what `measure` throws is told in one line.
int runProgram(CLI::App& options, int argc, char** argv, int logged,
               const std::function<void()>& measure);

}  // namespace bench
