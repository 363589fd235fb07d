// The command "serve": the provider behind CIM-XML over HTTP, for any WBEM client.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command; when it runs it sets `status` to the exit code of the program.
void addServeCommand(CLI::App& app, int& status);

}  // namespace testbed
