// Reading a scenario's times: how long things take, and the timeline of commands.
#include <algorithm>

#include "array_commands.h"
#include "scenario_reading.h"

namespace testbed {
namespace {

constexpr std::uint64_t kLongestSeconds = 100'000'000;

void readSeconds(JsonReader& reader, const char* name, std::uint32_t& seconds) {
    if (const auto number = reader.number(name, kLongestSeconds)) {
        seconds = static_cast<std::uint32_t>(*number);
    }
}

/// Seconds, with a fraction if need be.
double readTime(const JsonPlace& place) {
    const double seconds = place.value->is_number() ? place.value->get<double>() : -1;
    if (seconds < 0 || seconds > kLongestSeconds) {
        place.fail("a number of seconds from 0 to " + std::to_string(kLongestSeconds) +
                   " is needed here");
    }
    return seconds;
}

TimedCommand readTimedCommand(const JsonPlace& place) {
    JsonReader reader(place);
    const auto at = reader.take("at");
    if (!at) reader.fail("\"at\" is missing");
    const TimedCommand entry{readTime(*at), reader.text("command")};
    try {
        checkArrayCommand(entry.command);
    } catch (const ScenarioError& error) {
        place.fail(error.what(), "command");
    }
    reader.finish();
    return entry;
}

}  // namespace

Consequences readConsequences(JsonReader& scenario) {
    Consequences consequences;
    const auto place = scenario.take("consequences");
    if (!place) return consequences;
    if (place->value->is_boolean()) {
        consequences.enabled = place->value->get<bool>();
        return consequences;
    }
    if (!place->value->is_object()) place->fail("true, false or an object is needed here");
    JsonReader reader(*place);
    readSeconds(reader, "rebuildSeconds", consequences.rebuild);
    readSeconds(reader, "copyBackSeconds", consequences.copyBack);
    readSeconds(reader, "learnSeconds", consequences.learn);
    readSeconds(reader, "chargeSeconds", consequences.charge);
    reader.finish();
    return consequences;
}

std::vector<TimedCommand> readTimeline(JsonReader& scenario) {
    std::vector<TimedCommand> timeline;
    for (const JsonPlace& place : scenario.list("timeline")) {
        timeline.push_back(readTimedCommand(place));
    }
    std::stable_sort(
        timeline.begin(), timeline.end(),
        [](const TimedCommand& left, const TimedCommand& right) { return left.at < right.at; });
    return timeline;
}

}  // namespace testbed
