// Scenario files, as far as the vendor that they describe.
#include <nlohmann/json.hpp>

#include "fuzz_target.h"
#include "input_file.h"
#include "scenario_parser.h"
#include "vendor.h"

namespace {

using nlohmann::json;

/// A scenario may have a million elements in a few bytes; here that would only take long.
constexpr double kMostElements = 500;

double elementsOf(const json& value) {
    if (!value.is_structured()) return 0;
    double sum = 0;
    for (const json& child : value) sum += 1 + elementsOf(child);
    double times = 1;
    if (value.is_object() && value.contains("count")) {
        const json& count = value["count"];
        if (count.is_number()) times = count.get<double>();
        if (count.is_string()) times = std::atof(count.get_ref<const std::string&>().c_str());
    }
    return sum * std::max(times, 1.0);
}

bool isLarge(std::string_view bytes) {
    const json document = json::parse(bytes, nullptr, false);
    return !document.is_discarded() && elementsOf(document) > kMostElements;
}

void build(const testbed::Scenario& scenario) {
    testbed::Repository repository;
    testbed::Broker broker(repository, scenario.manager);
    testbed::buildVendor(repository, scenario);
    testbed::applyBehaviour(broker, scenario);
}

}  // namespace

PLEXOR_FUZZ_HARNESS(scenario) {
    static const fuzz::InputFile file;
    if (isLarge(bytes)) return;
    file.write(bytes);
    try {
        build(testbed::readScenario(file.name()));
    } catch (const testbed::ScenarioError& error) {
        fuzz::require(*error.what() != '\0', "a refusal has a text");
    }
}
