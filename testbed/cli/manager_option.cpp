// Defining the option, checking its list, and applying it to the scenario's manager.
#include "manager_option.h"

#include <CLI/CLI.hpp>

#include "manager_kinds.h"

namespace testbed {
namespace {

/// What is wrong with the list, "" for nothing.
std::string checkManager(const std::string& words) {
    BrokerOptions options;
    try {
        chooseManager(options, words);
    } catch (const UnknownManager& error) {
        return error.what();
    }
    return "";
}

}  // namespace

void addManagerOption(CLI::App& command, std::string& manager) {
    command
        .add_option(
            "--manager", manager,
            "kind of manager and behaviours, such as large,no-keys=off; the command managers "
            "prints all (default: the scenario's)")
        ->check(CLI::Validator(checkManager, "KIND[,BEHAVIOUR...]"));
}

BrokerOptions chosenManager(const Scenario& scenario, const std::string& manager) {
    BrokerOptions options = scenario.manager;
    chooseManager(options, manager);
    return options;
}

}  // namespace testbed
