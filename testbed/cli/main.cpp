// plexor-testbed: a RAID provider on the desk, with a simulated array behind it. Called by the name
// check_plexor it is a plugin of monitoring systems.
#include <CLI/CLI.hpp>
#include <exception>
#include <iostream>

#include "check_command.h"
#include "command_ask.h"
#include "command_calls.h"
#include "command_managers.h"
#include "command_page.h"
#include "command_scenarios.h"
#include "command_serve.h"
#include "command_show.h"
#include "command_tell.h"
#include "command_watch.h"
#include "output_status.h"
#include "printable.h"
#include "usage_error.h"

namespace {

constexpr int kFailed = 1;

int refuse(const CLI::App& app, const CLI::ParseError& error, int argc, char** argv) {
    std::cerr << app.get_name() << ": " << testbed::usageErrorText(app, error, argc, argv) << "\n";
    return testbed::usageStatus(argc, argv);
}

int run(CLI::App& app, const int& status, int argc, char** argv) {
    try {
        app.parse(argc, argv);
        return status;
    } catch (const CLI::ParseError& error) {
        const bool isAnswer = error.get_exit_code() == 0;  // help or version
        return isAnswer ? app.exit(error) : refuse(app, error, argc, argv);
    } catch (const std::exception& error) {
        std::cerr << app.get_name() << ": " << testbed::printable(error.what()) << "\n";
        return kFailed;
    }
}

int runPlugin(int argc, char** argv) {
    CLI::App app(
        "Checks what a WBEM server tells of its RAID controllers: plexor-testbed ask --check",
        testbed::kPluginName);
    int status = 0;
    testbed::makePlugin(app, status);
    app.set_version_flag("-V,--version", std::string(testbed::kPluginName) + " " PLEXOR_VERSION);
    return run(app, status, argc, argv);
}

int runTool(int argc, char** argv) {
    CLI::App app("Runs a CMPI instance provider against a simulated RAID vendor", "plexor-testbed");
    int status = 0;
    testbed::addShowCommand(app, status);
    testbed::addWatchCommand(app, status);
    testbed::addCallsCommand(app, status);
    testbed::addAskCommand(app, status);
    testbed::addServeCommand(app, status);
    testbed::addPageCommand(app, status);
    testbed::addManagersCommand(app, status);
    testbed::addTellCommand(app, status);
    testbed::addScenariosCommand(app, status);
    app.set_version_flag("-V,--version", "plexor-testbed " PLEXOR_VERSION);
    for (CLI::App* command : app.get_subcommands(nullptr)) {
        command->set_version_flag("-V,--version", "plexor-testbed " PLEXOR_VERSION);
    }
    app.callback([&app] {
        if (app.get_subcommands().empty()) {
            throw CLI::RequiredError(
                "a command (ask, calls, managers, page, scenarios, serve, show, tell or watch)");
        }
    });
    return run(app, status, argc, argv);
}

}  // namespace

int main(int argc, char** argv) {
    const int status = testbed::isPluginName(argv[0]) ? runPlugin(argc, argv) : runTool(argc, argv);
    return testbed::statusOfOutput(status, testbed::isCheck(argc, argv));
}
