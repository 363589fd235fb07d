#include "drive_shelf.h"

#include <nlohmann/json.hpp>

#include "scenario_parser.h"

namespace bench {

testbed::Scenario driveShelf(int drives, std::chrono::milliseconds answerTime) {
    const nlohmann::json drive = {{"count", drives}, {"id", "{n}"},        {"slot", "{n}"},
                                  {"enclosure", 1},  {"pool", "DG0"},      {"state", "online"},
                                  {"capacityGB", 1}, {"firmware", "1.0.0"}};
    const nlohmann::json controller = {{"id", "C0"},
                                       {"model", "bench"},
                                       {"pools", {{{"id", "DG0"}, {"totalGB", drives}}}},
                                       {"enclosures", {{{"number", 1}}}},
                                       {"drives", nlohmann::json::array({drive})}};
    const nlohmann::json document = {
        {"host", {{"name", "bench"}, {"elementName", "bench"}}},
        {"controllers", nlohmann::json::array({controller})},
    };
    testbed::Scenario scenario = testbed::parseScenario(document.dump(), "bench");
    scenario.latency = {answerTime, answerTime};
    return scenario;
}

}  // namespace bench
