// Passing each command on to the server's control socket and printing what it answers.
#include "command_tell.h"

#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "control_socket.h"
#include "exit_status.h"

namespace testbed {
namespace {

struct TellOptions {
    std::string socket;
    std::vector<std::string> commands;
};

/// One after the other, up to the first one that is refused.
int tell(const TellOptions& options) {
    for (const std::string& command : options.commands) {
        const CommandResult result = tellSocket(options.socket, command);
        if (result.refused) {
            std::cerr << "plexor-testbed: " << result.text << "\n";
            return kRefusedStatus;
        }
        std::cout << (result.text.empty() ? "done: " + command : result.text) << "\n";
    }
    return 0;
}

}  // namespace

void addTellCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<TellOptions>();
    CLI::App* command = app.add_subcommand(
        "tell", "Sends commands to a serve that runs; the result is the exit status and a line");
    command->add_option("socket", options->socket, "what --control of serve names")->required();
    command
        ->add_option("command", options->commands,
                     "a command of watch and serve, as one argument; help lists them")
        ->required();
    command->callback([options, &status] { status = tell(*options); });
}

}  // namespace testbed
