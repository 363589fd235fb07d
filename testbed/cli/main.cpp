// plexor-testbed: a RAID provider on the desk, with a simulated array behind it.
#include <CLI/CLI.hpp>
#include <exception>
#include <iostream>

#include "check_command.h"
#include "command_ask.h"
#include "command_calls.h"
#include "command_managers.h"
#include "command_scenarios.h"
#include "command_serve.h"
#include "command_show.h"
#include "command_tell.h"
#include "command_watch.h"

namespace {

constexpr int kFailed = 1;

}  // namespace

int main(int argc, char** argv) {
    CLI::App app("Runs a CMPI instance provider against a simulated RAID vendor", "plexor-testbed");
    app.require_subcommand(1);
    int status = 0;
    testbed::addShowCommand(app, status);
    testbed::addWatchCommand(app, status);
    testbed::addCallsCommand(app, status);
    testbed::addAskCommand(app, status);
    testbed::addServeCommand(app, status);
    testbed::addManagersCommand(app, status);
    testbed::addTellCommand(app, status);
    testbed::addScenariosCommand(app, status);
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return app.exit(error) == 0 ? 0 : testbed::usageStatus(argc, argv);
    } catch (const std::exception& error) {
        std::cerr << "plexor-testbed: " << error.what() << "\n";
        return kFailed;
    }
    return status;
}
