// The command "calls": what the provider asked the vendor to build its inventory.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command; when it runs it sets `status` to the exit code of the program.
void addCallsCommand(CLI::App& app, int& status);

}  // namespace testbed
