// The command "watch": what a client sees while the array changes.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command; when it runs it sets `status` to the exit code of the program.
void addWatchCommand(CLI::App& app, int& status);

}  // namespace testbed
