// Comparing two inventories for the page: who came, who went, whose state changed.
#include "page_changes.h"

#include <ctime>
#include <map>
#include <nlohmann/json.hpp>

#include "element_views.h"
#include "inventory_changes.h"
#include "printable.h"

namespace testbed {
namespace {

using nlohmann::ordered_json;

/// Of more that come or go together only the number is told.
constexpr std::size_t kMostNamed = 3;

class Comparison {
public:
    Comparison(const ServedClass& served, const CheckPolicy& policy,
               std::vector<PageChange>& changes)
        : served_(served), policy_(policy), changes_(changes) {}

    void compare(const std::vector<Instance>& before, const std::vector<Instance>& after) {
        std::map<std::string, const Instance*> old;
        for (const Instance& instance : before) old.emplace(instance.path.identity(), &instance);
        std::vector<const Instance*> come, gone;
        for (const Instance& instance : after) {
            const auto known = old.find(instance.path.identity());
            if (known == old.end()) {
                come.push_back(&instance);
                continue;
            }
            if (!(*known->second == instance)) addChange(*known->second, instance);
            old.erase(known);
        }
        for (const auto& [identity, instance] : old) gone.push_back(instance);
        addAll(come, "come");
        addAll(gone, "gone");
    }

private:
    std::string word(const Instance& instance) const {
        return stateOf(served_.name, instance, policy_).word;
    }

    void addAll(const std::vector<const Instance*>& instances, const std::string& what) {
        const std::size_t count = instances.size();
        if (count > kMostNamed) {
            changes_.push_back({timeStamp(), "", "",
                                std::to_string(count) + " " + served_.plural + " have " + what});
        }
        for (std::size_t i = 0; i < count && count <= kMostNamed; i++) {
            const bool isThere = what == "come";
            const std::string state = isThere ? word(*instances[i]) : "";
            add(*instances[i], " has " + what + (state.empty() ? "" : ", " + state), isThere);
        }
    }

    void addChange(const Instance& before, const Instance& after) {
        const std::string then = word(before), now = word(after);
        if (then != now) return add(after, ": " + then + " → " + now);
        const std::string differences = propertyChanges(before, after);
        if (!differences.empty()) add(after, ": " + differences);
    }

    void add(const Instance& instance, const std::string& what, bool isThere = true) {
        const std::string level = isThere ? stateOf(served_.name, instance, policy_).level : "";
        changes_.push_back(
            {timeStamp(), keyOf(served_, instance), level, printable(shortName(instance) + what)});
    }

    const ServedClass& served_;
    const CheckPolicy& policy_;
    std::vector<PageChange>& changes_;
};

const ClassAnswer* answerFor(const Inventory& inventory, const std::string& className) {
    for (const ClassAnswer& answer : inventory) {
        if (sameName(answer.className, className)) {
            return answer.response.rc == CMPI_RC_OK ? &answer : nullptr;
        }
    }
    return nullptr;
}

}  // namespace

std::string timeStamp() {
    const std::time_t now = std::time(nullptr);
    std::tm parts = {};
    gmtime_r(&now, &parts);
    char text[40];
    std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &parts);
    return text;
}

std::vector<PageChange> changesBetween(const Inventory& before, const Inventory& after,
                                       const CheckPolicy& policy) {
    std::vector<PageChange> changes;
    for (const ServedClass& served : servedClasses()) {
        const ClassAnswer* then = answerFor(before, served.name);
        const ClassAnswer* now = answerFor(after, served.name);
        if (then && now) {
            Comparison(served, policy, changes)
                .compare(then->response.instances, now->response.instances);
        }
    }
    return changes;
}

ordered_json changesAsJson(const std::vector<PageChange>& changes) {
    ordered_json list = ordered_json::array();
    for (const PageChange& change : changes) {
        list.push_back({{"time", change.time},
                        {"key", change.key},
                        {"level", change.level},
                        {"text", change.text}});
    }
    return list;
}

}  // namespace testbed
