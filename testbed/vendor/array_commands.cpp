// The tables of verbs and kinds, and one function for each verb.
#include "array_commands.h"

#include <algorithm>
#include <set>
#include <vector>

#include "json_reader.h"

namespace testbed {
namespace {

using nlohmann::json;
using Words = std::vector<CommandWord>;

struct Kind {
    const char* word;
    const char* list;
};

constexpr Kind kKinds[] = {
    {"drive", "drives"}, {"volume", "volumes"},    {"pool", "pools"},  {"enclosure", "enclosures"},
    {"port", "ports"},   {"battery", "batteries"}, {"other", "others"}};

constexpr StateVerb kStateVerbs[] = {
    {"fail", "drive", "state", "failed"},
    {"fail", "port", "state", "failed"},
    {"fail", "battery", "state", "dead"},
    {"fail", "volume", "state", "offline"},
    {"fail", "enclosure", "status", "lost"},
    {"predict", "drive", "state", "predictive failure"},
    {"rebuild", "drive", "state", "rebuild"},
    {"learn", "battery", "state", "learning"},
    {"charge", "battery", "state", "charging and low"},
    {"replace", "battery", "state", "charging and low"},
    {"restore", "drive", "state", "online"},
    {"restore", "port", "state", "up"},
    {"restore", "battery", "state", "optimal"},
    {"restore", "volume", "state", "optimal"},
    {"restore", "enclosure", "status", "ok"},
};

constexpr CommandHelp kHelp[] = {
    {"set KIND CONTROLLER ID NAME=VALUE...", "change members, as the scenario file has them"},
    {"set controller CONTROLLER NAME=VALUE...", "change members of a controller"},
    {"add KIND CONTROLLER NAME=VALUE...", "add a thing"},
    {"remove KIND CONTROLLER ID", "take a thing away"},
    {"fail drive|port|battery|volume|enclosure CONTROLLER ID", "let it fail"},
    {"predict drive CONTROLLER ID", "let a drive announce its failure"},
    {"rebuild drive CONTROLLER ID", "let a drive be rebuilt"},
    {"replace drive|battery CONTROLLER ID", "put a new one into its place"},
    {"restore drive|port|battery|volume|enclosure CONTROLLER ID", "make it well again"},
    {"learn battery CONTROLLER ID", "begin a learning cycle"},
    {"charge battery CONTROLLER ID", "begin to charge"},
    {"latency MINIMUM MAXIMUM", "milliseconds that each answer of the vendor takes"},
    {"fault NAME=VALUE...", "add an entry to the faults"},
    {"clear faults", "take all faults away"},
    {"server NAME=VALUE...", "for serve: let the server fail, see plexor-testbed(1)"},
    {"clear server", "for serve: let the server work again"},
    {"pause", "let the array's time stand still"},
    {"play", "let the array's time go on"},
    {"speed N", "let N seconds of the array's time pass in a second"},
    {"reset", "go back to the scenario as the file has it"},
    {"save FILE", "write the present state as a scenario"},
    {"wait SECONDS", "take no command of this input meanwhile"},
    {"show", "print the tree"},
    {"help", "print this list"},
    {"quit", "end"},
};

const std::string& text(const Words& words, std::size_t i, const char* what) {
    if (words.size() <= i) refuseCommand(std::string(what) + " is missing");
    return words[i].text;
}

void expectEnd(const Words& words, std::size_t size) {
    if (words.size() > size) refuseCommand("unexpected \"" + words[size].text + "\"");
}

std::uint64_t milliseconds(const Words& words, std::size_t i) {
    const std::string& number = text(words, i, "a number of milliseconds");
    const json value = json::parse(number, nullptr, false);
    if (!value.is_number_unsigned()) refuseCommand("not a number of milliseconds: " + number);
    return value.get<std::uint64_t>();
}

const char* listOfKind(const std::string& kind) {
    for (const Kind& row : kKinds) {
        if (kind == row.word) return row.list;
    }
    std::string known;
    for (const Kind& row : kKinds) known += std::string(known.empty() ? "" : ", ") + row.word;
    refuseCommand("unknown kind \"" + kind + "\" (known: " + known + ")");
}

/// What a state stands for, member by member; a new state must not be overruled by old numbers.
void forgetState(json& element) {
    for (const char* name :
         {"state", "status", "operationalStatus", "extentStatus", "batteryStatus", "primordial"}) {
        element.erase(name);
    }
}

void setMembers(json& object, const Words& words, std::size_t first) {
    if (words.size() <= first) refuseCommand("NAME=VALUE is missing");
    std::set<std::string> names;
    for (std::size_t i = first; i < words.size(); i++) {
        if (words[i].name.empty()) refuseCommand("not NAME=VALUE: " + words[i].text);
        if (!names.insert(words[i].name).second) {
            refuseCommand("\"" + words[i].name + "\" is given twice");
        }
    }
    if (names.contains("state")) forgetState(object);
    if (names.contains("status")) object.erase("operationalStatus");
    if (names.contains("operationalStatus")) object.erase("status");
    for (std::size_t i = first; i < words.size(); i++) object[words[i].name] = words[i].value;
}

json& elementIn(json& owner, const std::string& list, const std::string& kind,
                const std::string& id) {
    json* element = findElement(owner, list, id);
    if (!element) refuseCommand("no " + kind + " \"" + id + "\"");
    return *element;
}

json& controllerIn(json& document, const Words& words, std::size_t i) {
    return elementIn(document, "controllers", "controller", text(words, i, "the controller"));
}

/// Of several pools none.
std::string poolOf(const json& drive) {
    const auto pool = drive.find("pool");
    return pool != drive.end() && !pool->is_array() ? textIn(drive, "pool") : "";
}

/// The pool in which the drive had its place, as the pools remember it or as the drive says.
std::string homeOf(json& controller, const json& drive) {
    for (const json& pool : controller.value("pools", json::array())) {
        const json members = pool.value("members", json::array());
        if (std::find(members.begin(), members.end(), idOf(drive)) != members.end()) {
            return idOf(pool);
        }
    }
    const json* pool = findElement(controller, "pools", poolOf(drive));
    return pool && !pool->value("primordial", false) ? idOf(*pool) : "";
}

void replaceDrive(json& controller, json& drive) {
    const std::string id = idOf(drive);
    drive.erase("before");
    for (const json& other : controller["drives"]) {
        if (textIn(other, "spareFor") != id) continue;
        movePool(drive, poolOf(other));
        return setState(drive, "copy back");
    }
    const std::string home = homeOf(controller, drive);
    if (home.empty()) return setState(drive, "unconfigured good");
    movePool(drive, home);
    setState(drive, "rebuild");
}

void applyStateVerb(json& controller, json& element, const StateVerb& verb) {
    const bool isDrive = std::string(verb.kind) == "drive";
    if (std::string(verb.member) == "state") forgetState(element);
    element.erase("operationalStatus");
    element[verb.member] = verb.value;
    if (isDrive && std::string(verb.verb) == "restore" && homeOf(controller, element).empty()) {
        setState(element, "unconfigured good");
    }
}

void changeElement(json& document, const Words& words) {
    const std::string& verb = words[0].text;
    const std::string& kind = text(words, 1, "the kind");
    if (verb == "set" && kind == "controller") {
        return setMembers(controllerIn(document, words, 2), words, 3);
    }
    const char* list = listOfKind(kind);
    json& controller = controllerIn(document, words, 2);
    if (verb == "add") {
        json element = json::object();
        setMembers(element, words, 3);
        controller[list].push_back(element);
        return;
    }
    const std::string& id = text(words, 3, "the id");
    json& element = elementIn(controller, list, kind, id);
    if (verb == "set") return setMembers(element, words, 4);
    expectEnd(words, 4);
    if (verb == "remove") {
        json& elements = controller[list];
        elements.erase(elements.begin() + (&element - &elements[0]));
        return;
    }
    if (verb == "replace" && kind == "drive") return replaceDrive(controller, element);
    for (const StateVerb& row : kStateVerbs) {
        if (verb == row.verb && kind == row.kind) return applyStateVerb(controller, element, row);
    }
    refuseCommand("unknown command \"" + verb + " " + kind + "\"; help lists the known ones");
}

void setLatency(json& document, const Words& words) {
    document["latencyMs"] = {milliseconds(words, 1), milliseconds(words, 2)};
    expectEnd(words, 3);
}

void addFault(json& document, const Words& words) {
    json fault = json::object();
    setMembers(fault, words, 1);
    document["faults"].push_back(fault);
}

void clearFaults(json& document, const Words& words) {
    if (text(words, 1, "what to clear") != "faults") refuseCommand("only faults can be cleared");
    expectEnd(words, 2);
    document.erase("faults");
}

struct Verb {
    const char* word;
    void (*change)(json&, const Words&);
};

constexpr Verb kVerbs[] = {
    {"set", changeElement},     {"add", changeElement},     {"remove", changeElement},
    {"fail", changeElement},    {"predict", changeElement}, {"rebuild", changeElement},
    {"replace", changeElement}, {"restore", changeElement}, {"learn", changeElement},
    {"charge", changeElement},  {"latency", setLatency},    {"fault", addFault},
    {"clear", clearFaults},
};

const Verb& verbOf(const Words& words) {
    for (const Verb& row : kVerbs) {
        if (words.at(0).text == row.word) return row;
    }
    refuseCommand("unknown command \"" + words[0].text + "\"; help lists the known ones");
}

}  // namespace

std::span<const StateVerb> stateVerbs() {
    return kStateVerbs;
}

std::span<const CommandHelp> commandHelp() {
    return kHelp;
}

std::string commandHelpText() {
    std::string lines;
    for (const CommandHelp& row : kHelp) {
        std::string syntax = row.syntax;
        syntax.resize(std::max<std::size_t>(syntax.size() + 2, 60), ' ');
        lines += (lines.empty() ? "" : "\n") + syntax + row.summary;
    }
    return lines;
}

json* findElement(json& owner, const std::string& list, const std::string& id) {
    const auto elements = owner.find(list);
    if (elements == owner.end() || !elements->is_array()) return nullptr;
    for (json& element : *elements) {
        if (idOf(element) == id) return &element;
    }
    return nullptr;
}

void setState(json& element, const std::string& state) {
    forgetState(element);
    element["state"] = state;
}

void movePool(json& drive, const std::string& pool) {
    drive.erase("pools");
    drive.erase("noPool");
    drive["pool"] = pool;
}

void changeArray(json& document, const std::string& command) {
    const Words words = commandWords(command);
    if (words.empty()) return;
    verbOf(words).change(document, words);
}

void checkArrayCommand(const std::string& command) {
    const Words words = commandWords(command);
    if (words.empty()) refuseCommand("a command is missing");
    verbOf(words);
}

}  // namespace testbed
