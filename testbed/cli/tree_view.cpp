#include "tree_view.h"

#include <algorithm>
#include <optional>

#include "cim_words.h"
#include "colour.h"

namespace testbed {
namespace {

/// A line of the tree with the lines beneath it.
struct Branch {
    std::string text;
    std::vector<Branch> children;
};

struct Root {
    std::string controllerId;
    Branch branch;
};

/// Text of a vendor on a terminal: no control characters.
std::string printable(std::string text) {
    for (char& c : text)
        if (static_cast<unsigned char>(c) < 0x20 || c == 0x7f) c = '?';
    return text;
}

std::string textOf(const Instance& instance, const char* property) {
    const CimValue* value = instance.find(property);
    return value ? value->asString() : "";
}

/// The key that says to which controller an instance belongs, without its prefix.
std::optional<std::string> identityOf(const Instance& instance, const ServedClass& served) {
    const CimValue* key = instance.path.findKey(served.identityKey);
    if (!key) key = instance.find(served.identityKey);
    const std::string prefix = served.prefix;
    if (!key || !key->asString().starts_with(prefix)) return std::nullopt;
    return key->asString().substr(prefix.size());
}

void appendState(std::string& text, const Instance& instance, const char* property,
                 const char* label, CodeWords words) {
    const CimValue* value = instance.find(property);
    if (!value || value->isNull) return;
    const std::uint64_t code = value->asUnsigned();
    const std::string_view word = wordOf(words, code);
    text += text.empty() ? "" : ", ";
    text += std::string(label) + " " + (word.empty() ? std::to_string(code) : std::string(word));
}

std::string statesOf(const Instance& instance) {
    std::string text;
    appendState(text, instance, "HealthState", "health", healthStateWords());
    appendState(text, instance, "OperationalStatus", "status", operationalStatusWords());
    appendState(text, instance, "BatteryStatus", "battery", batteryStatusWords());
    return text.empty() ? "" : "  [" + text + "]";
}

std::string lineOf(const Instance& instance, const ServedClass& served, bool colours) {
    std::string name = textOf(instance, "VersionString");
    if (name.empty()) name = textOf(instance, "ElementName");
    if (name.empty()) name = instance.path.text();
    const std::string states = statesOf(instance);
    const auto verdict = colours ? judge(served.name, instance) : std::nullopt;
    if (!verdict) return printable(name + states);
    // What is well is not to be louder than what is not.
    if (verdict->level == CheckLevel::Ok)
        return printable(name) + painted(printable(states), verdict->level);
    return painted(printable(name + states), verdict->level);
}

bool belongsTo(const std::string& identity, const ServedClass& served,
               const std::string& controllerId) {
    return served.isDevice ? identity.starts_with(controllerId + "_") : identity == controllerId;
}

/// The controller with the longest id that fits; NULL without one.
Root* ownerOf(std::vector<Root>& roots, const Instance& instance, const ServedClass& served) {
    const auto identity = identityOf(instance, served);
    Root* owner = nullptr;
    for (Root& root : roots) {
        if (!identity || !belongsTo(*identity, served, root.controllerId)) continue;
        if (!owner || owner->controllerId.size() < root.controllerId.size()) owner = &root;
    }
    return owner;
}

/// The branch of a class beneath a root's, made when it is first needed.
Branch& section(std::vector<Branch>& children, const std::string& heading) {
    const auto found = std::find_if(children.begin(), children.end(),
                                    [&](const Branch& child) { return child.text == heading; });
    if (found != children.end()) return *found;
    return children.emplace_back(Branch{heading, {}});
}

void print(std::string& out, const std::vector<Branch>& branches, const std::string& indent) {
    for (const Branch& branch : branches) {
        const bool last = &branch == &branches.back();
        out += indent + (last ? "└─ " : "├─ ") + branch.text + "\n";
        print(out, branch.children, indent + (last ? "   " : "│  "));
    }
}

/// Headings get the number of what is beneath them.
void countChildren(std::vector<Branch>& sections) {
    for (Branch& branch : sections)
        branch.text += " (" + std::to_string(branch.children.size()) + ")";
}

std::vector<Root> controllersOf(const Inventory& inventory, bool colours) {
    std::vector<Root> roots;
    const ServedClass& controllers = servedClasses().front();
    for (const ClassAnswer& answer : inventory) {
        if (!sameName(answer.className, controllers.name)) continue;
        for (const Instance& instance : answer.response.instances)
            roots.push_back({identityOf(instance, controllers).value_or(""),
                             {lineOf(instance, controllers, colours), {}}});
    }
    return roots;
}

}  // namespace

std::string treeView(const Inventory& inventory, bool colours) {
    std::vector<Root> roots = controllersOf(inventory, colours);
    std::vector<Branch> strays;
    for (const ClassAnswer& answer : inventory) {
        const ServedClass* served = findServedClass(answer.className);
        if (!served || served == &servedClasses().front()) continue;
        for (const Instance& instance : answer.response.instances) {
            Root* owner = ownerOf(roots, instance, *served);
            std::vector<Branch>& parent = owner ? owner->branch.children : strays;
            section(parent, served->heading)
                .children.push_back({lineOf(instance, *served, colours), {}});
        }
    }
    std::string out;
    for (Root& root : roots) {
        countChildren(root.branch.children);
        out += root.branch.text + "\n";
        print(out, root.branch.children, "");
    }
    countChildren(strays);
    for (const Branch& branch : strays) {
        out += branch.text + "\n";
        print(out, branch.children, "");
    }
    return out.empty() ? "nothing\n" : out;
}

}  // namespace testbed
