// The command "show": what a client sees of a scenario, as a tree or as JSON.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command; when it runs it sets `status` to the exit code of the program: 0, or 3 when
/// the provider answers with errors or its inventory does not arrive in time. A scenario or a
/// library that cannot be used ends it with an exception whose text is for the user.
void addShowCommand(CLI::App& app, int& status);

}  // namespace testbed
