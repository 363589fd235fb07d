// Comparing the drives of two documents, and the command that inserts one again.
#include "pulled_drives.h"

#include "command_words.h"
#include "json_reader.h"

namespace testbed {
namespace {

using nlohmann::json;

const json* elementOf(const json& owner, const char* list, const std::string& id) {
    const auto elements = owner.find(list);
    if (elements == owner.end() || !elements->is_array()) return nullptr;
    for (const json& element : *elements) {
        if (idOf(element) == id) return &element;
    }
    return nullptr;
}

/// A value as a command has it: a text that cannot be taken for anything else stands as it is.
std::string valueText(const json& value) {
    if (!value.is_string()) return value.dump();
    const auto& text = value.get_ref<const std::string&>();
    const bool isPlain =
        quotedWord(text) == text && json::parse(text, nullptr, false).is_discarded();
    return isPlain ? text : value.dump();
}

/// Members that tell how the old drive was.
bool isOfTheOldDrive(const std::string& name, const json& value) {
    for (const char* number : {"status", "operationalStatus", "extentStatus", "enabledState",
                               "primordial", "spareFor", "before"}) {
        if (name == number) return true;
    }
    return name == "state" && value != "hot spare" && value != "unconfigured good";
}

std::string insertCommand(const std::string& controller, const json& drive) {
    std::string command = "add drive " + quotedWord(controller) + " id=" + valueText(idOf(drive));
    for (const auto& [name, value] : drive.items()) {
        if (name != "id" && !isOfTheOldDrive(name, value)) {
            command += " " + name + "=" + valueText(value);
        }
    }
    return command;
}

}  // namespace

std::vector<PulledDrive> pulledDrives(const json& original, const json& document) {
    std::vector<PulledDrive> pulled;
    for (const json& controller : original.value("controllers", json::array())) {
        const std::string id = idOf(controller);
        const json* now = elementOf(document, "controllers", id);
        if (!now) continue;
        for (const json& drive : controller.value("drives", json::array())) {
            if (!elementOf(*now, "drives", idOf(drive))) {
                pulled.push_back({id, idOf(drive), insertCommand(id, drive)});
            }
        }
    }
    return pulled;
}

}  // namespace testbed
