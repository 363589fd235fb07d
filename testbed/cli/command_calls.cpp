// Counting the provider's queries by subject and kind, and the table of them.
#include "command_calls.h"

#include <syslog.h>

#include <CLI/CLI.hpp>
#include <iomanip>
#include <iostream>
#include <map>
#include <memory>

#include "exit_status.h"
#include "library_locator.h"
#include "manager_option.h"
#include "provider_log.h"
#include "provider_session.h"
#include "scenario_locator.h"
#include "scenario_parser.h"
#include "schema_choice.h"

namespace testbed {
namespace {

struct CallsOptions {
    std::string scenario;
    std::string library;
    std::string schema;
    std::string manager;
    std::string provider = "PlexorProvider";
    unsigned timeoutSeconds = 60;
};

/// What a query is about, from the class of the object it is made on. Vendor classes are named
/// after the CIM classes they derive from, so the end of the name tells.
std::string subjectOf(const CallRecord& call, Repository& repository,
                      const std::string& nameSpace) {
    static constexpr const char* kSubjects[] = {
        "CIM_DiskDrive",       "CIM_StorageVolume",  "CIM_StoragePool",   "CIM_Chassis",
        "CIM_SASSATAPort",     "CIM_Battery",        "CIM_StorageExtent", "CIM_Slot",
        "CIM_PhysicalPackage", "CIM_PortController", "CIM_ComputerSystem"};
    for (const char* subject : kSubjects) {
        if (repository.isA(nameSpace, call.className, subject)) return subject;
    }
    return call.className;
}

std::string describe(const CallRecord& call) {
    std::string text = entryName(call.entry);
    if (call.assocClass) text += " " + *call.assocClass;
    if (call.resultClass) text += " -> " + *call.resultClass;
    if (call.name) text += " " + *call.name;
    return text;
}

/// Calls by subject and kind; everything that leaves the provider, and the class tests.
std::map<std::string, std::map<std::string, int>> countCalls(ProviderSession& session,
                                                             const std::string& nameSpace) {
    std::map<std::string, std::map<std::string, int>> counts;
    for (const CallRecord& call : session.broker().books().calls()) {
        if (!isQuery(call.entry) && call.entry != Entry::ClassPathIsA) continue;
        counts[subjectOf(call, session.repository(), nameSpace)][describe(call)]++;
    }
    return counts;
}

int printCalls(const CallsOptions& options) {
    Scenario scenario = readScenario(options.scenario);
    scenario.manager = chosenManager(scenario, options.manager);
    directProviderLog(LOG_ERR, nullptr);
    ProviderSession session(scenario, locateLibrary(options.library, scenario.manager),
                            options.provider, options.schema);
    if (!session.waitForInventory(std::chrono::seconds(options.timeoutSeconds), "root/cimv2")) {
        return kProviderFailed;
    }
    int total = 0;
    for (const auto& [subject, calls] : countCalls(session, scenario.vendor.nameSpace)) {
        std::cout << "made on " << subject << "\n";
        for (const auto& [call, count] : calls) {
            std::cout << std::setw(8) << count << "  " << call << "\n";
            total += count;
        }
    }
    std::cout << std::setw(8) << total << "  in all\n";
    return 0;
}

}  // namespace

void addCallsCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<CallsOptions>();
    CLI::App* command =
        app.add_subcommand("calls", "Counts the provider's calls while it builds its inventory");
    addScenarioOption(*command, options->scenario);
    command->add_option("--library", options->library, "the provider's shared library")
        ->envname("PLEXOR_PROVIDER_LIBRARY");
    command->add_option("--provider", options->provider, "name that the factory begins with")
        ->capture_default_str();
    command->add_option("--schema", options->schema, kSchemaHelp);
    addManagerOption(*command, options->manager);
    command->add_option("--timeout", options->timeoutSeconds, "seconds to wait for the inventory")
        ->capture_default_str();
    command->callback([options, &status] { status = printCalls(*options); });
}

}  // namespace testbed
