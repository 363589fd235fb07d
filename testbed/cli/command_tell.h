// plexor-testbed tell: sends commands to a server that runs.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command to the tool; `status` becomes the exit status when it runs.
void addTellCommand(CLI::App& app, int& status);

}  // namespace testbed
