// The command "ask": what a WBEM server answers for the provider's classes.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command; when it runs it sets `status` to the exit code of the program: 0, 3 when the
/// server answers with a status or its inventory is still arriving, or that of a check. Without a
/// check, a server that cannot be asked ends it with an exception whose text is for the user.
void addAskCommand(CLI::App& app, int& status);

/// Makes the application the plugin of monitoring systems: "ask --check" without these words.
void makePlugin(CLI::App& app, int& status);

}  // namespace testbed
