// A line for each scenario: its description, or what is wrong with its file.
#include "command_scenarios.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>
#include <memory>
#include <vector>

#include "scenario_locator.h"
#include "scenario_parser.h"

namespace testbed {
namespace {

namespace fs = std::filesystem;

constexpr int kWrong = 1;

std::vector<fs::path> shippedScenarios() {
    std::vector<fs::path> files;
    const fs::path directory = scenarioDirectory();
    if (directory.empty()) return files;
    for (const auto& entry : fs::directory_iterator(directory)) {
        if (entry.path().extension() == ".json") files.push_back(entry.path());
    }
    std::sort(files.begin(), files.end());
    return files;
}

/// A name and a description in a line each.
void listScenarios() {
    for (const fs::path& file : shippedScenarios()) {
        std::string name = file.stem().string();
        name.resize(std::max<std::size_t>(name.size() + 1, 20), ' ');
        std::cout << name << readScenario(file.string()).description << "\n";
    }
}

/// A line for each file. False when one of them is wrong.
bool checkScenarios(const std::vector<std::string>& names) {
    bool allFine = true;
    for (const std::string& name : names) {
        try {
            const std::string file = locateScenario(name);
            readScenario(file);
            std::cout << file << ": fine\n";
        } catch (const ScenarioError& error) {
            std::cout << error.what() << "\n";
            allFine = false;
        }
    }
    return allFine;
}

}  // namespace

void addScenariosCommand(CLI::App& app, int& status) {
    const auto files = std::make_shared<std::vector<std::string>>();
    CLI::App* command = app.add_subcommand(
        "scenarios", "Lists the scenarios that come with the tool, or checks scenario files");
    command->add_option("file", *files, "scenario files to check");
    command->callback([files, &status] {
        if (files->empty()) return listScenarios();
        status = checkScenarios(*files) ? 0 : kWrong;
    });
}

}  // namespace testbed
