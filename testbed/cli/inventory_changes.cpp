// Comparing two inventories, instance by instance and property by property.
#include "inventory_changes.h"

#include "check_rules.h"
#include "printable.h"

namespace testbed {

std::string propertyChanges(const Instance& before, const Instance& after) {
    std::string text;
    for (const auto& [name, value] : after.properties) {
        const CimValue* old = before.find(name);
        if (sameName(name, "Caption") || (old != nullptr && *old == value)) continue;
        text += text.empty() ? "" : ", ";
        text += name + " " + (old != nullptr ? old->text() : "-") + " -> " + value.text();
    }
    return text;
}

namespace {

const Instance* findPath(const ClassAnswer& answer, const ObjectPath& path) {
    for (const Instance& instance : answer.response.instances) {
        if (instance.path == path) return &instance;
    }
    return nullptr;
}

void compareClass(const ClassAnswer& before, const ClassAnswer& after,
                  std::vector<std::string>& lines) {
    for (const Instance& old : before.response.instances) {
        if (findPath(after, old.path) == nullptr) lines.push_back("- " + nameOf(old));
    }
    for (const Instance& now : after.response.instances) {
        const Instance* old = findPath(before, now.path);
        if (old == nullptr) {
            lines.push_back("+ " + nameOf(now));
        } else if (const std::string text = propertyChanges(*old, now); !text.empty()) {
            lines.push_back("~ " + shortName(now) + ": " + text);
        }
    }
}

}  // namespace

std::vector<std::string> changeLines(const Inventory& before, const Inventory& after) {
    std::vector<std::string> lines;
    for (std::size_t i = 0; i < before.size() && i < after.size(); i++) {
        compareClass(before[i], after[i], lines);
    }
    for (std::string& line : lines) line = printable(line);
    return lines;
}

}  // namespace testbed
