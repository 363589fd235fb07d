// What a page shows of an element beside its properties: names, state, sign, size, members.
#pragma once

#include <map>
#include <nlohmann/json_fwd.hpp>
#include <set>
#include <string>
#include <vector>

#include "check_policy.h"
#include "inventory.h"

namespace testbed {

/// An element's state for people. The level is that of a check; the sign tells it without colour.
struct ElementState {
    std::string word;   ///< "hot spare"; "" for what has no state
    std::string level;  ///< "ok", "warning" or "critical"; "" for what is not judged
    std::string look;   ///< "ok", "warning", "critical", "spare", "free", "rebuild", "idle",
                        ///< "ignored" or "plain"
    std::string sign;   ///< one character
};

ElementState stateOf(const std::string& className, const Instance& instance,
                     const CheckPolicy& policy);

/// Every look with its sign and what it means.
nlohmann::ordered_json looksAsJson();

/// "drive:C0_32_1": names an element within a page.
std::string keyOf(const ServedClass& served, const Instance& instance);

/// "1.8 TB"; powers of ten, as drives are sold.
std::string sizeText(std::uint64_t bytes);

/// By key: what a command calls the element, "C0 32_1".
using CommandTargets = std::map<std::string, std::string>;
/// By controller and place, "C0 3e1": the drive's key.
using DrivePlaces = std::map<std::string, std::string>;

/// The views of one inventory's elements, which must outlive it.
class ElementViews {
public:
    ElementViews(const Inventory& inventory, const CheckPolicy& policy,
                 const CommandTargets& targets, const DrivePlaces& places);

    nlohmann::ordered_json of(const ServedClass& served, const Instance& instance) const;
    const std::vector<std::string>& controllerIds() const { return controllers_; }

private:
    std::vector<std::string> memberKeys(const Instance& volume,
                                        const std::string& controller) const;

    const CheckPolicy& policy_;
    const CommandTargets& targets_;
    const DrivePlaces& places_;
    std::vector<std::string> controllers_;
    std::set<std::string> drives_;  // keys
};

}  // namespace testbed
