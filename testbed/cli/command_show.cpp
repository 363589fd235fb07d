// Loading the provider, waiting for its inventory, and printing it as tree, JSON or check.
#include "command_show.h"

#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "check_command.h"
#include "colour.h"
#include "exit_status.h"
#include "inventory.h"
#include "json_view.h"
#include "library_locator.h"
#include "manager_option.h"
#include "provider_log.h"
#include "provider_session.h"
#include "scenario_locator.h"
#include "scenario_parser.h"
#include "schema_choice.h"
#include "terminal.h"
#include "tree_view.h"
#include "whole_line.h"

namespace testbed {
namespace {

struct ShowOptions {
    std::string scenario;
    std::string library;
    std::string schema;
    std::string manager;
    std::string provider = "PlexorProvider";
    std::string className;
    std::string nameSpace = "root/cimv2";
    unsigned timeoutSeconds = 60;
    bool json = false;
    bool problems = false;
    CheckOptions check;
    bool log = false;
    ColourChoice colour;
};

std::vector<std::string> classesToShow(const ShowOptions& options) {
    if (!options.className.empty()) return {options.className};
    std::vector<std::string> names;
    for (const ServedClass& served : servedClasses()) names.push_back(served.name);
    return names;
}

bool reportFailures(const Inventory& inventory) {
    bool failed = false;
    for (const ClassAnswer& answer : inventory) {
        if (answer.response.rc == CMPI_RC_OK) continue;
        printLine(std::cerr, "plexor-testbed: " + answer.className +
                                 ": the provider answered status " +
                                 std::to_string(answer.response.rc));
        failed = true;
    }
    return failed;
}

/// What the provider has when its inventory is complete, or when time has run out.
struct Answers {
    Inventory inventory;
    bool complete = false;
};

Answers ask(const ShowOptions& options) {
    Scenario scenario = readScenario(options.scenario);
    scenario.manager = chosenManager(scenario, options.manager);
    showProviderLog(options.log);
    ProviderSession session(scenario, locateLibrary(options.library, scenario.manager),
                            options.provider, options.schema, options.nameSpace);
    Answers answers;
    const Progress progress(
        [](int seconds) { return "waiting for the inventory, " + std::to_string(seconds) + " s"; });
    answers.complete =
        session.waitForInventory(std::chrono::seconds(options.timeoutSeconds), options.nameSpace);
    InstanceClient client = session.client();
    answers.inventory = collectInventory(client, classesToShow(options), options.nameSpace);
    return answers;
}

std::string incomplete(const ShowOptions& options) {
    return "the inventory is not complete after " + std::to_string(options.timeoutSeconds) + " s";
}

int show(const ShowOptions& options) {
    const auto [inventory, complete] = ask(options);
    if (!complete) printLine(std::cerr, "plexor-testbed: " + incomplete(options));
    const bool colours = options.colour.onStandardOutput();
    TreeStyle style = TreeStyle::ofOutput(colours);
    style.problemsOnly = options.problems;
    style.policy = options.check.policy;
    std::cout << (options.json ? jsonView(inventory, options.check.policy)
                               : treeView(inventory, style))
              << std::flush;
    const bool failed = reportFailures(inventory);
    return complete && !failed ? 0 : kProviderFailed;
}

int check(const ShowOptions& options) {
    Answers answers;
    const CheckSummary summary = summaryOf([&] {
        answers = ask(options);
        return summarize(answers.inventory, {.failure = answers.complete ? "" : incomplete(options),
                                             .expected = options.check.expected,
                                             .policy = options.check.policy});
    });
    if (!options.json) return printCheck(summary, options.check.verbosity);
    std::cout << jsonView(answers.inventory, options.check.policy, &summary) << std::flush;
    return summary.status;
}

std::vector<std::string> knownClasses() {
    return classesToShow({});
}

}  // namespace

void addShowCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<ShowOptions>();
    CLI::App* command = app.add_subcommand("show", "Shows what a client sees of a scenario");
    addScenarioOption(*command, options->scenario);
    command->add_option("--library", options->library, "the provider's shared library")
        ->envname("PLEXOR_PROVIDER_LIBRARY");
    command->add_option("--provider", options->provider, "name that the factory begins with")
        ->capture_default_str();
    command->add_option("--schema", options->schema, kSchemaHelp);
    addManagerOption(*command, options->manager);
    command->add_option("--class", options->className, "show this class only")
        ->check(CLI::IsMember(knownClasses()));
    command->add_option("--namespace", options->nameSpace, "namespace of the requests")
        ->capture_default_str();
    command->add_option("--timeout", options->timeoutSeconds, "seconds to wait for the inventory")
        ->capture_default_str();
    command->add_flag("--json", options->json, "print JSON instead of a tree or a line");
    CLI::Option* checkFlag = addCheckOptions(*command, options->check);
    command->add_flag("--problems", options->problems, "show only what is not ok")
        ->excludes(checkFlag);
    addColourOption(*command, options->colour);
    command->add_flag("--log", options->log, "print the provider's log lines on standard error");
    command->callback(
        [options, &status] { status = options->check.check ? check(*options) : show(*options); });
}

}  // namespace testbed
