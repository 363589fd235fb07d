// The tables of states and charges, and judging an instance by them.
#include "check_rules.h"

#include <algorithm>
#include <vector>

#include "cim_words.h"
#include "inventory.h"

namespace testbed {
namespace {

constexpr const char* kVolume = "Tovexa_PlexorStorageVolume";
constexpr const char* kDrive = "Tovexa_PlexorStorageExtent";
constexpr const char* kPort = "Tovexa_PlexorSASSATAPort";
constexpr const char* kBattery = "Tovexa_PlexorBattery";

constexpr auto kOther = std::nullopt;
constexpr CheckLevel kOk = CheckLevel::Ok;
constexpr CheckLevel kWarning = CheckLevel::Warning;
constexpr CheckLevel kCritical = CheckLevel::Critical;

// Of rules with equal numbers the first one counts for a name without a known word.
constexpr StateRule kStateRules[] = {
    {kVolume, "OPTIMAL", 2, 5, kOk, ""},
    {kVolume, "DEGRADED", 3, 10, kWarning, "degraded"},
    {kVolume, "OFFLINE", 6, 30, kCritical, "offline"},
    {kVolume, "UNDEFINED", kOther, 0, kWarning, ""},
    {kDrive, "ONLINE", 2, 5, kOk, ""},
    {kDrive, "HOT SPARE", 2, 5, kOk, ""},
    {kDrive, "REBUILD", 2, 5, kWarning, "rebuilding"},
    {kDrive, "UNCONFIGURED GOOD", 2, 5, kOk, ""},
    {kDrive, "UNCONFIGURED GOOD", 15, 5, kOk, ""},
    {kDrive, "FAILED", 6, 30, kCritical, "failed"},
    {kDrive, "UNCONFIGURED BAD", 6, 10, kWarning, "unconfigured bad"},
    {kDrive, "OFFLINE", 12, 20, kCritical, "offline"},
    {kDrive, "UNDEFINED", kOther, 10, kWarning, ""},
    {kPort, "", 2, 5, kOk, ""},
    {kPort, "", 15, 5, kOk, ""},
    {kPort, "", 6, 30, kCritical, ""},
    {kPort, "", 12, 20, kOk, ""},
    {kPort, "", kOther, 0, kWarning, ""},
    {kBattery, "", 2, 5, kOk, ""},
    {kBattery, "", 15, 5, kOk, ""},
    {kBattery, "", 6, 30, kCritical, ""},
    {kBattery, "", 12, 20, kCritical, ""},
    {kBattery, "", kOther, 0, kWarning, ""},
};

constexpr ChargeRule kChargeRules[] = {
    {4, kWarning},
    {5, kCritical},
    {9, kCritical},
    {13, kWarning},
};

/// A status that no rule has.
constexpr std::uint64_t kSeveral = 0xffff;

/// For a HealthState that does not belong to the OperationalStatus beside it.
CheckLevel levelOfHealth(std::uint64_t health) {
    if (health == 5) return kOk;
    return health >= 20 ? kCritical : kWarning;
}

std::uint64_t numberOf(const Instance& instance, const char* property) {
    const CimValue* value = instance.find(property);
    if (!value) return 0;
    // The provider tells one state. Of several, a bad one must not hide behind a good one.
    const auto* elements = std::get_if<std::vector<CimValue>>(&value->data);
    return elements && elements->size() > 1 ? kSeveral : value->asUnsigned();
}

bool saysState(const std::string& name, const StateRule& rule) {
    return *rule.word != '\0' && name.ends_with(std::string(" - ") + rule.word);
}

/// The rules for an OperationalStatus; not empty for a class that is judged.
std::vector<const StateRule*> rulesFor(const std::string& className, std::uint64_t status) {
    std::vector<const StateRule*> exact, others;
    for (const StateRule& rule : kStateRules) {
        if (!sameName(rule.className, className)) continue;
        if (rule.operationalStatus == kOther) others.push_back(&rule);
        if (rule.operationalStatus == status) exact.push_back(&rule);
    }
    return exact.empty() ? others : exact;
}

/// The rule for the instance's numbers and name; NULL when no rule has that HealthState.
const StateRule* ruleOf(const std::vector<const StateRule*>& rules, const Instance& instance) {
    const std::uint64_t health = numberOf(instance, "HealthState");
    const std::string name = nameOf(instance);
    const StateRule* found = nullptr;
    for (const StateRule* rule : rules) {
        if (rule->healthState != health) continue;
        if (!found || saysState(name, *rule)) found = rule;
    }
    return found;
}

std::string wordOr(CodeWords words, std::uint64_t code, const char* fallback) {
    const std::string_view word = wordOf(words, code);
    return word.empty() ? fallback : std::string(word);
}

Verdict verdictOf(CheckLevel level, const std::string& word) {
    return {level, level == kOk ? "" : word, word};
}

Verdict verdictOfRule(const StateRule& rule, std::uint64_t status) {
    const std::string statusWord = wordOr(operationalStatusWords(), status, "undefined");
    Verdict verdict = verdictOf(rule.level, *rule.finding != '\0' ? rule.finding : statusWord);
    verdict.isTableState = *rule.word != '\0';
    verdict.word = verdict.isTableState ? rule.word : statusWord;
    return verdict;
}

Verdict verdictOfState(const std::vector<const StateRule*>& rules, const Instance& instance) {
    const std::uint64_t status = numberOf(instance, "OperationalStatus");
    if (const StateRule* rule = ruleOf(rules, instance)) return verdictOfRule(*rule, status);
    // No state of the provider's: the worse of what the two numbers say.
    const std::uint64_t health = numberOf(instance, "HealthState");
    const CheckLevel level = std::max(rules.front()->level, levelOfHealth(health));
    if (levelOfHealth(health) == level) {
        return verdictOf(level, wordOr(healthStateWords(), health, "undefined"));
    }
    return verdictOf(level, wordOr(operationalStatusWords(), status, "undefined"));
}

Verdict verdictOfCharge(const Instance& instance) {
    const std::uint64_t status = numberOf(instance, "BatteryStatus");
    for (const ChargeRule& rule : kChargeRules) {
        if (rule.batteryStatus == status) {
            return verdictOf(rule.level, wordOr(batteryStatusWords(), status, "undefined"));
        }
    }
    return {};
}

}  // namespace

std::span<const StateRule> stateRules() {
    return kStateRules;
}

const char* levelName(CheckLevel level) {
    static constexpr const char* kNames[] = {"ok", "warning", "critical"};
    return kNames[static_cast<int>(level)];
}

std::span<const ChargeRule> chargeRules() {
    return kChargeRules;
}

std::optional<Verdict> judge(const std::string& className, const Instance& instance) {
    const auto rules = rulesFor(className, numberOf(instance, "OperationalStatus"));
    if (rules.empty()) return std::nullopt;
    Verdict state = verdictOfState(rules, instance);
    if (!sameName(className, kBattery)) return state;
    Verdict charge = verdictOfCharge(instance);
    // The charge tells more than a status of the same level.
    return charge.level >= state.level && charge.level != kOk ? charge : state;
}

std::string shortName(const Instance& instance) {
    std::string name = nameOf(instance);
    const auto* said = std::find_if(std::begin(kStateRules), std::end(kStateRules),
                                    [&](const StateRule& rule) { return saysState(name, rule); });
    if (said != std::end(kStateRules)) name.resize(name.rfind(" - "));
    for (const char* detail : {", Drives(", " Fw: "}) {
        if (const std::size_t at = name.find(detail); at != std::string::npos) name.resize(at);
    }
    return name;
}

}  // namespace testbed
