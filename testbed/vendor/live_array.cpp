#include "live_array.h"

#include <map>
#include <utility>

#include "scenario_parser.h"
#include "vendor.h"

namespace testbed {

using nlohmann::json;

namespace {

const std::map<std::string, std::string> kLists = {
    {"drive", "drives"}, {"volume", "volumes"},    {"pool", "pools"},  {"enclosure", "enclosures"},
    {"port", "ports"},   {"battery", "batteries"}, {"other", "others"}};

const std::map<std::string, std::string> kDriveVerbs = {{"fail", "failed"}, {"rebuild", "rebuild"}};

[[noreturn]] void refuse(const std::string& what) {
    throw ScenarioError("command: " + what);
}

/// Blank-separated words; double quotes hold a word together, also behind "name=".
std::vector<std::string> splitWords(const std::string& command) {
    std::vector<std::string> words;
    std::string word;
    bool quoted = false, open = false;
    for (char c : command) {
        if (c == '"') {
            quoted = !quoted;
            open = true;
        } else if (!quoted && (c == ' ' || c == '\t')) {
            if (open) words.push_back(std::exchange(word, ""));
            open = false;
        } else {
            word += c;
            open = true;
        }
    }
    if (quoted) refuse("a quotation mark is missing");
    if (open) words.push_back(word);
    return words;
}

/// A number, truth value, list or object as JSON has it; everything else is a text.
json valueOf(const std::string& text) {
    json value = json::parse(text, nullptr, false);
    return value.is_discarded() ? json(text) : value;
}

void setMembers(json& object, const std::vector<std::string>& words, std::size_t first) {
    if (words.size() <= first) refuse("NAME=VALUE is missing");
    for (std::size_t i = first; i < words.size(); i++) {
        const auto equals = words[i].find('=');
        if (equals == std::string::npos || equals == 0) refuse("not NAME=VALUE: " + words[i]);
        object[words[i].substr(0, equals)] = valueOf(words[i].substr(equals + 1));
    }
}

/// The id of an element as the scenario file has it: text or number.
std::string idOf(const json& element) {
    for (const char* name : {"id", "number", "tag"}) {
        if (!element.contains(name)) continue;
        return element[name].is_string() ? element[name].get<std::string>() : element[name].dump();
    }
    return "";
}

json& elementIn(json& list, const std::string& kind, const std::string& id) {
    for (json& element : list)
        if (idOf(element) == id) return element;
    refuse("no " + kind + " \"" + id + "\"");
}

const std::string& word(const std::vector<std::string>& words, std::size_t i, const char* what) {
    if (words.size() <= i) refuse(std::string(what) + " is missing");
    return words[i];
}

std::uint64_t milliseconds(const std::vector<std::string>& words, std::size_t i) {
    const json value = valueOf(word(words, i, "a number of milliseconds"));
    if (!value.is_number_unsigned()) refuse("not a number of milliseconds: " + words[i]);
    return value.get<std::uint64_t>();
}

}  // namespace

LiveArray::LiveArray(Broker& broker, const std::string& file)
    : broker_(broker),
      file_(file),
      document_(readScenarioDocument(file)),
      scenario_(scenarioOf(document_, file)) {
    buildVendor(broker_.repository(), scenario_);
    applyBehaviour(broker_, scenario_);
}

void LiveArray::adopt(json document) {
    Scenario next = scenarioOf(document, file_);
    const bool sameVendor = next.vendor.nameSpace == scenario_.vendor.nameSpace &&
                            next.vendor.classPrefix == scenario_.vendor.classPrefix;
    if (!sameVendor || next.host.id != scenario_.host.id)
        throw ScenarioError(file_ + ": host and vendor cannot change while the array runs");
    changeVendor(broker_.repository(), scenario_, next);
    broker_.faults().clear();
    applyBehaviour(broker_, next);
    document_ = std::move(document);
    scenario_ = std::move(next);
}

void LiveArray::reload() {
    adopt(readScenarioDocument(file_));
}

void LiveArray::apply(const std::string& command) {
    const Words words = splitWords(command);
    if (words.empty()) return;
    adopt(changed(words));
}

json& LiveArray::controllerIn(json& document, const std::string& id) const {
    return elementIn(document["controllers"], "controller", id);
}

json LiveArray::changed(const Words& words) const {
    json document = document_;
    const std::string& verb = words[0];
    if (verb == "latency") {
        document["latencyMs"] = {milliseconds(words, 1), milliseconds(words, 2)};
        return document;
    }
    if (verb == "fault") {
        json fault = json::object();
        setMembers(fault, words, 1);
        document["faults"].push_back(fault);
        return document;
    }
    if (verb == "clear") {
        if (word(words, 1, "what to clear") != "faults") refuse("only faults can be cleared");
        document.erase("faults");
        return document;
    }

    const std::string& kind = word(words, 1, "the kind");
    json& controller = controllerIn(document, word(words, 2, "the controller"));
    if (verb == "set" && kind == "controller") {
        setMembers(controller, words, 3);
        return document;
    }
    const auto list = kLists.find(kind);
    if (list == kLists.end()) refuse("unknown kind \"" + kind + "\"");
    json& elements = controller[list->second];
    if (elements.is_null()) elements = json::array();
    if (verb == "add") {
        json element = json::object();
        setMembers(element, words, 3);
        elements.push_back(element);
        return document;
    }
    json& element = elementIn(elements, kind, word(words, 3, "the id"));
    const auto driveVerb = kDriveVerbs.find(verb);
    if (verb == "set") {
        setMembers(element, words, 4);
    } else if (verb == "remove") {
        elements.erase(elements.begin() + (&element - &elements[0]));
    } else if (driveVerb != kDriveVerbs.end() && kind == "drive") {
        element["state"] = driveVerb->second;
        element.erase("operationalStatus");
        element.erase("extentStatus");
    } else {
        refuse("unknown command \"" + verb + " " + kind + "\"");
    }
    return document;
}

}  // namespace testbed
