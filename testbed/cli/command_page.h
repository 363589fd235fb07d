// The command "page": what a WBEM server answers, as a page in the browser.
#pragma once

namespace CLI {
class App;
}

namespace testbed {

/// Adds the command to the tool; `status` becomes the exit status when it runs.
void addPageCommand(CLI::App& app, int& status);

}  // namespace testbed
