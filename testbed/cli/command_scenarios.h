// The command "scenarios": lists those that come with the tool, and checks files.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command; when it runs it sets `status` to the exit code of the program.
void addScenariosCommand(CLI::App& app, int& status);

}  // namespace testbed
