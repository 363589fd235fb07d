// Prints the table of managers and their behaviours.
#include "command_managers.h"

#include <CLI/CLI.hpp>
#include <iostream>

#include "manager_kinds.h"

namespace testbed {

void addManagersCommand(CLI::App& app, int& status) {
    CLI::App* command = app.add_subcommand(
        "managers", "Prints the kinds of managers for --manager, and what each of them does");
    command->callback([&status] {
        std::cout << managerTable() << std::flush;
        status = 0;
    });
}

}  // namespace testbed
