// Reading what a site expects, overrules and ignores, with spellings that mean the same.
#include "check_policy.h"

#include <algorithm>
#include <charconv>
#include <optional>

namespace testbed {
namespace {

/// "Hot-spare" and "HOT_SPARE" are the same word.
std::string foldedWord(std::string text) {
    std::replace_if(
        text.begin(), text.end(), [](char c) { return c == '-' || c == '_'; }, ' ');
    return foldName(text);
}

std::optional<CheckLevel> levelNamed(const std::string& name) {
    for (const CheckLevel level : {CheckLevel::Ok, CheckLevel::Warning, CheckLevel::Critical}) {
        if (sameName(name, levelName(level))) return level;
    }
    return std::nullopt;
}

/// NULL for a word that names no kind.
const ServedClass* kindNamed(const std::string& singular) {
    for (const ServedClass& served : servedClasses()) {
        if (served.isCounted && sameName(singular, served.singular)) return &served;
    }
    return nullptr;
}

bool isPlural(const std::string& text) {
    const auto classes = servedClasses();
    return std::any_of(classes.begin(), classes.end(), [&](const ServedClass& served) {
        return served.isCounted && text == served.plural;
    });
}

}  // namespace

bool takeExpected(const std::string& text, ExpectedCounts& counts) {
    const std::size_t equals = std::min(text.find('='), text.size());
    const bool atLeast = equals > 0 && text[equals - 1] == '>';
    const std::string plural = text.substr(0, equals - (atLeast ? 1 : 0));
    const std::string number = text.substr(std::min(equals + 1, text.size()));
    const char* end = number.data() + number.size();
    std::size_t count = 0;
    const auto [stop, error] = std::from_chars(number.data(), end, count);
    if (!isPlural(plural) || error != std::errc() || stop != end) return false;
    counts[plural] = ExpectedCount(count, !atLeast);
    return true;
}

bool CheckPolicy::takeLevel(const std::string& text) {
    const std::size_t equals = text.rfind('=');
    if (equals == std::string::npos) return false;
    const auto level = levelNamed(text.substr(equals + 1));
    const std::size_t colon = text.find(':');
    const bool ofKind = colon < equals;
    const ServedClass* kind = ofKind ? kindNamed(text.substr(0, colon)) : nullptr;
    if (!level || (ofKind && !kind)) return false;
    const std::size_t begin = ofKind ? colon + 1 : 0;
    const std::string word = foldedWord(text.substr(begin, equals - begin));
    bool known = false;
    for (const StateRule& rule : stateRules()) {
        if (*rule.word == '\0' || foldName(rule.word) != word) continue;
        if (kind && !sameName(kind->name, rule.className)) continue;
        levels_[{foldName(rule.className), rule.word}] = *level;
        known = true;
    }
    return known;
}

bool CheckPolicy::takeIgnored(const std::string& text) {
    const std::size_t colon = std::min(text.find(':'), text.size());
    const ServedClass* kind = kindNamed(text.substr(0, colon));
    std::string id = text.substr(std::min(colon + 1, text.size()));
    if (!kind) return false;
    if (id.starts_with(kind->prefix)) id.erase(0, std::string_view(kind->prefix).size());
    if (id.empty()) return false;
    ignored_.emplace(foldName(kind->name), id);
    return true;
}

bool CheckPolicy::ignores(const ServedClass& served, const Instance& instance) const {
    const auto identity = identityOf(served, instance);
    return identity && ignored_.contains({foldName(served.name), *identity});
}

std::optional<Verdict> CheckPolicy::judge(const std::string& className,
                                          const Instance& instance) const {
    auto verdict = testbed::judge(className, instance);
    if (!verdict) return verdict;
    const auto level = levels_.find({foldName(className), verdict->word});
    if (verdict->isTableState && level != levels_.end()) {
        verdict->level = level->second;
        if (verdict->finding.empty()) verdict->finding = foldName(verdict->word);
        if (verdict->level == CheckLevel::Ok) verdict->finding.clear();
    }
    const ServedClass* served = findServedClass(className);
    verdict->ignored = verdict->level != CheckLevel::Ok && served && ignores(*served, instance);
    return verdict;
}

}  // namespace testbed
