// Matching calls with the rules, counting the rules down, and waits that can be ended.
#include "faults.h"

#include <algorithm>

#include "cim_object.h"

namespace testbed {

namespace {

bool nameMatches(const std::optional<std::string>& wanted, const std::optional<std::string>& name) {
    return !wanted || (name && sameName(*wanted, *name));
}

bool applies(const FaultRule& rule, const CallRecord& call) {
    if (rule.entry != call.entry) return false;
    if (rule.className && !sameName(*rule.className, call.className)) return false;
    if (rule.pathContains && call.path.find(*rule.pathContains) == std::string::npos) return false;
    return nameMatches(rule.assocClass, call.assocClass) &&
           nameMatches(rule.resultClass, call.resultClass) && nameMatches(rule.name, call.name);
}

}  // namespace

int Faults::add(FaultRule rule) {
    const std::lock_guard lock(mutex_);
    const int id = nextId_++;
    rules_.push_back(Entry_{id, std::move(rule)});
    noteObjectRules();
    return id;
}

void Faults::remove(int id) {
    const std::lock_guard lock(mutex_);
    std::erase_if(rules_, [&](const Entry_& entry) { return entry.id == id; });
    noteObjectRules();
}

void Faults::clear() {
    const std::lock_guard lock(mutex_);
    rules_.clear();
    noteObjectRules();
    clearings_++;
    waits_.notify_all();
}

void Faults::endWaits() {
    const std::lock_guard lock(mutex_);
    isEnding_ = true;
    waits_.notify_all();
}

void Faults::noteObjectRules() {
    hasObjectRules_ = std::any_of(rules_.begin(), rules_.end(), [](const Entry_& entry) {
        return isObjectEntry(entry.rule.entry);
    });
}

void Faults::setLatency(std::chrono::milliseconds minimum, std::chrono::milliseconds maximum) {
    const std::lock_guard lock(mutex_);
    minimum_ = minimum;
    maximum_ = std::max(minimum, maximum);
}

FaultEffect Faults::match(const CallRecord& call) {
    const std::lock_guard lock(mutex_);
    for (auto entry = rules_.begin(); entry != rules_.end(); ++entry) {
        if (!applies(entry->rule, call)) continue;
        if (entry->seen < entry->rule.skip) {
            ++entry->seen;
            continue;
        }
        if (entry->rule.times == 0) continue;
        const FaultRule rule = entry->rule;
        // A rule that has run out is forgotten, so that long runs do not drag them along.
        if (++entry->applied == rule.times) rules_.erase(entry);
        return rule;
    }
    return std::nullopt;
}

void Faults::runHook(const FaultEffect& effect) {
    if (effect && effect->hook) effect->hook();
}

void Faults::wait(const FaultEffect& effect, bool isQuery) {
    if (effect) {
        sleep(effect->delay);
    } else if (isQuery) {
        sleep(drawLatency());
    }
}

void Faults::sleep(std::chrono::milliseconds time) {
    if (time.count() == 0) return;
    std::unique_lock lock(mutex_);
    const unsigned before = clearings_;
    waits_.wait_for(lock, time, [&] { return isEnding_ || clearings_ != before; });
}

std::chrono::milliseconds Faults::drawLatency() {
    const std::lock_guard lock(mutex_);
    const auto range = static_cast<unsigned>((maximum_ - minimum_).count());
    if (range == 0) return minimum_;
    state_ = state_ * 1103515245u + 12345u;
    return minimum_ + std::chrono::milliseconds((state_ >> 8) % (range + 1));
}

}  // namespace testbed
