// Looking for scenarios as built and as installed, and finding one by its name.
#include "scenario_locator.h"

#include <CLI/CLI.hpp>

#include "tool_directory.h"

namespace testbed {
namespace {

namespace fs = std::filesystem;

constexpr const char* kScenarioDirectories[] = {BUILT_SCENARIO_DIR, INSTALLED_SCENARIO_DIR};

}  // namespace

fs::path scenarioDirectory() {
    const fs::path here = toolDirectory();
    for (const char* directory : kScenarioDirectories) {
        const fs::path found = (here / directory).lexically_normal();
        if (fs::is_directory(found)) return found;
    }
    return {};
}

std::string locateScenario(const std::string& name) {
    std::error_code none;
    if (fs::exists(name, none) || name.find('/') != std::string::npos) return name;
    for (const std::string& file : {name, name + ".json"}) {
        const fs::path shipped = scenarioDirectory() / file;
        if (fs::is_regular_file(shipped, none)) return shipped.string();
    }
    return name;
}

void addScenarioOption(CLI::App& command, std::string& file) {
    command
        .add_option("--scenario", file,
                    "scenario file, or the name of one that plexor-testbed scenarios lists")
        ->required()
        ->transform([](const std::string& name) { return locateScenario(name); });
}

}  // namespace testbed
