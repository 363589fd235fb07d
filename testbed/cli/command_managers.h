// plexor-testbed managers: the object managers that the test bed can be.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

void addManagersCommand(CLI::App& app, int& status);

}  // namespace testbed
