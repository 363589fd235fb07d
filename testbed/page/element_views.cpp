// The tables of looks, and the words, sizes and members that go with an element.
#include "element_views.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "cim_words.h"
#include "printable.h"
#include "volume_members.h"

namespace testbed {
namespace {

using nlohmann::ordered_json;

constexpr const char* kVolume = "Tovexa_PlexorStorageVolume";
constexpr const char* kDrive = "Tovexa_PlexorStorageExtent";
constexpr const char* kPort = "Tovexa_PlexorSASSATAPort";
constexpr const char* kBattery = "Tovexa_PlexorBattery";

/// Looks that stand for a level, in the order of levels, then those for single states.
struct Look {
    const char* look;
    const char* sign;
    const char* meaning;
};

constexpr Look kLooks[] = {
    {"ok", "✓", "well"},
    {"warning", "!", "a warning"},
    {"critical", "✕", "critical"},
    {"rebuild", "↻", "being rebuilt"},
    {"spare", "S", "hot spare"},
    {"free", "○", "unconfigured"},
    {"idle", "–", "reaches nothing"},
    {"ignored", "~", "acknowledged"},
    {"plain", "", "not judged"},
};

/// States that look like no other of their level.
struct StateLook {
    const char* className;
    const char* word;
    const char* look;
};

constexpr StateLook kStateLooks[] = {
    {kDrive, "hot spare", "spare"}, {kDrive, "unconfigured good", "free"},
    {kDrive, "rebuild", "rebuild"}, {kPort, "no contact", "idle"},
    {kPort, "dormant", "idle"},
};

const Look& lookNamed(const std::string& name) {
    for (const Look& look : kLooks) {
        if (name == look.look) return look;
    }
    return kLooks[0];
}

const Look& lookOf(const std::string& className, const std::string& word,
                   const std::optional<Verdict>& verdict) {
    if (!verdict) return lookNamed("plain");
    if (verdict->ignored) return lookNamed("ignored");
    if (verdict->level == CheckLevel::Critical) return lookNamed("critical");
    for (const StateLook& row : kStateLooks) {
        if (sameName(className, row.className) && word == row.word) return lookNamed(row.look);
    }
    return lookNamed(levelName(verdict->level));
}

std::uint64_t numberOf(const Instance& instance, const char* property) {
    const CimValue* value = instance.find(property);
    return value && !value->isNull ? value->asUnsigned() : 0;
}

/// A battery that is well does something: it charges or learns.
std::string wordFor(const std::string& className, const Instance& instance,
                    const Verdict& verdict) {
    if (sameName(className, kBattery) && verdict.level == CheckLevel::Ok) {
        const auto word = wordOf(batteryStatusWords(), numberOf(instance, "BatteryStatus"));
        if (!word.empty()) return std::string(word);
    }
    return foldName(verdict.word);
}

/// The name without "on controller C0", which stands above it.
std::string labelOf(const std::string& name, const std::string& controller) {
    for (const char* joint : {" on controller ", " on Controller "}) {
        if (name.ends_with(joint + controller)) {
            return name.substr(0, name.size() - controller.size() - std::string(joint).size());
        }
    }
    return name;
}

}  // namespace

ElementState stateOf(const std::string& className, const Instance& instance,
                     const CheckPolicy& policy) {
    const auto verdict = policy.judge(className, instance);
    const std::string word = verdict ? wordFor(className, instance, *verdict) : "";
    const Look& look = lookOf(className, word, verdict);
    return {word, verdict ? levelName(verdict->level) : "", look.look, look.sign};
}

ordered_json looksAsJson() {
    ordered_json looks = ordered_json::array();
    for (const Look& look : kLooks) {
        looks.push_back({{"look", look.look}, {"sign", look.sign}, {"meaning", look.meaning}});
    }
    return looks;
}

std::string keyOf(const ServedClass& served, const Instance& instance) {
    return std::string(served.singular) + ":" +
           identityOf(served, instance).value_or(instance.path.text());
}

std::string sizeText(std::uint64_t bytes) {
    constexpr const char* kUnits[] = {"bytes", "kB", "MB", "GB", "TB", "PB", "EB"};
    double size = static_cast<double>(bytes);
    std::size_t unit = 0;
    while (size >= 999.95 && unit + 1 < std::size(kUnits)) {
        size /= 1000;
        unit++;
    }
    char text[40];
    std::snprintf(text, sizeof text, size < 10 && unit > 0 ? "%.1f" : "%.0f", size);
    std::string number = text;
    if (number.ends_with(".0")) number.resize(number.size() - 2);
    return number + " " + kUnits[unit];
}

ElementViews::ElementViews(const Inventory& inventory, const CheckPolicy& policy,
                           const CommandTargets& targets, const DrivePlaces& places)
    : policy_(policy), targets_(targets), places_(places) {
    const ServedClass& controllers = servedClasses().front();
    for (const ClassAnswer& answer : inventory) {
        const ServedClass* served = findServedClass(answer.className);
        for (const Instance& instance : answer.response.instances) {
            if (served == &controllers) {
                controllers_.push_back(identityOf(*served, instance).value_or(""));
            }
            if (sameName(answer.className, kDrive)) drives_.insert(keyOf(*served, instance));
        }
    }
}

std::vector<std::string> ElementViews::memberKeys(const Instance& volume,
                                                  const std::string& controller) const {
    const CimValue* name = volume.find("ElementName");
    std::vector<std::string> keys;
    for (const std::string& member : membersIn(name ? name->asString() : "")) {
        std::string key = "drive:" + controller + "_" + member;
        const auto place = places_.find(controller + " " + member);
        if (!drives_.contains(key) && place != places_.end()) key = place->second;
        if (drives_.contains(key)) keys.push_back(std::move(key));
    }
    return keys;
}

ordered_json ElementViews::of(const ServedClass& served, const Instance& instance) const {
    const auto owner = ownerAmong(controllers_, served, instance);
    const std::string controller = owner ? controllers_[*owner] : "";
    const std::string key = keyOf(served, instance);
    const std::string name = shortName(instance);
    const ElementState state = stateOf(served.name, instance, policy_);
    const auto identity = identityOf(served, instance);
    const bool isWithin = owner && served.isDevice && identity;
    ordered_json view = {{"key", key},
                         {"kind", served.singular},
                         {"controller", controller},
                         {"id", printable(isWithin ? identity->substr(controller.size() + 1)
                                                   : identity.value_or(""))},
                         {"name", printable(name)},
                         {"label", printable(labelOf(name, controller))},
                         {"state", state.word},
                         {"level", state.level},
                         {"look", state.look},
                         {"sign", state.sign}};
    const std::uint64_t bytes =
        numberOf(instance, "BlockSize") * numberOf(instance, "NumberOfBlocks");
    if (bytes > 0) view["size"] = sizeText(bytes);
    if (sameName(served.name, kVolume)) view["members"] = memberKeys(instance, controller);
    const auto target = targets_.find(key);
    if (target != targets_.end()) view["target"] = target->second;
    return view;
}

}  // namespace testbed
