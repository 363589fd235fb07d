// Collecting the words of value maps, the kinds of elements and the commands into one JSON object.
#include "page_about.h"

#include <nlohmann/json.hpp>

#include "cim_words.h"
#include "element_views.h"
#include "inventory.h"
#include "page_commands.h"
#include "printable.h"

namespace testbed {
namespace {

using nlohmann::ordered_json;

ordered_json wordsAsJson(CodeWords words) {
    ordered_json all = ordered_json::object();
    for (const CodeWord& word : words) all[std::to_string(word.code)] = word.word;
    return all;
}

}  // namespace

ordered_json pageAbout(const std::string& source, bool steers) {
    ordered_json about = {{"source", printable(source)}, {"looks", looksAsJson()}};
    for (const ServedClass& served : servedClasses()) {
        about["kinds"][served.singular] = {
            {"class", served.name}, {"heading", served.heading}, {"plural", served.plural}};
    }
    about["words"] = {{"OperationalStatus", wordsAsJson(operationalStatusWords())},
                      {"HealthState", wordsAsJson(healthStateWords())},
                      {"EnabledState", wordsAsJson(enabledStateWords())},
                      {"ExtentStatus", wordsAsJson(extentStatusWords())},
                      {"BatteryStatus", wordsAsJson(batteryStatusWords())},
                      {"PortType", wordsAsJson(portTypeWords())},
                      {"UsageRestriction", wordsAsJson(usageRestrictionWords())}};
    about["commands"] = steers ? commandsAsJson() : nullptr;
    return about;
}

}  // namespace testbed
