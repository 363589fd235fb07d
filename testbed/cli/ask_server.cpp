// Asking class by class, refusing what was not asked for, and asking once more after a while.
#include "ask_server.h"

#include <algorithm>
#include <cstdio>
#include <set>
#include <thread>

#include "inventory_gaps.h"
#include "printable.h"

namespace testbed {
namespace {

using Clock = std::chrono::steady_clock;

/// A text of the server's in a line for people, cut where it is long.
std::string quoted(const std::string& text) {
    constexpr std::size_t kLongest = 120;
    return printable(text.size() > kLongest ? text.substr(0, kLongest) + "..." : text);
}

/// What tells an instance from the others of its class; "" for one that does not say it.
std::string identityIn(const Instance& instance, const ServedClass* served) {
    if (!instance.path.keys.empty()) return instance.path.identity();
    return served ? identityOf(*served, instance).value_or("") : "";
}

/// Throws WbemError for instances that were not asked for.
void requireAsked(const std::string& className, const std::string& nameSpace,
                  const Response& response) {
    const ServedClass* served = findServedClass(className);
    std::set<std::string> met;
    for (const Instance& instance : response.instances) {
        const ObjectPath& path = instance.path;
        if (!sameName(path.className, className)) {
            throw WbemError("an instance of " + quoted(path.className) + " in the answer for " +
                            className);
        }
        if (!sameName(path.nameSpace, nameSpace)) {
            throw WbemError("an instance in " + quoted(path.nameSpace) + " in the answer for " +
                            nameSpace);
        }
        if (!met.insert(identityIn(instance, served)).second) {
            throw WbemError("the same instance twice in the answer for " + className);
        }
    }
}

Answers askOnce(const AskTarget& target, std::atomic<int>& answered) {
    WbemClient client(target.url, {.deadline = target.deadline, .tls = target.tls});
    Answers answers;
    const auto start = Clock::now();
    try {
        for (const std::string& name : target.classNames) {
            Response response = client.enumerateInstances(name, {}, target.nameSpace);
            requireAsked(name, target.nameSpace, response);
            answers.inventory.push_back({name, std::move(response)});
            answered++;
        }
    } catch (const WbemError& error) {
        answers.failure = target.url.authority() + ": " + error.what();
    }
    answers.seconds = std::chrono::duration<double>(Clock::now() - start).count();
    return answers;
}

bool isWhole(const Answers& answers) {
    return answers.failure.empty() &&
           std::all_of(answers.inventory.begin(), answers.inventory.end(),
                       [](const ClassAnswer& answer) { return answer.response.rc == CMPI_RC_OK; });
}

std::string secondsText(std::chrono::milliseconds time) {
    char text[40];
    std::snprintf(text, sizeof text, "%g s", std::chrono::duration<double>(time).count());
    return text;
}

/// Puts what the later answers lack behind them.
void complete(Inventory& later, Inventory& earlier) {
    for (std::size_t i = later.size(); i < earlier.size(); i++) {
        later.push_back(std::move(earlier[i]));
    }
}

}  // namespace

Answers askServer(const AskTarget& target, std::atomic<int>& answered) {
    Answers first = askOnce(target, answered);
    if (!target.refresh || !isWhole(first)) return first;
    if (target.deadline - Clock::now() <= *target.refresh) {
        first.failure = target.url.authority() + ": no time left to ask again after " +
                        secondsText(*target.refresh);
        return first;
    }
    std::this_thread::sleep_for(*target.refresh);
    Answers second = askOnce(target, answered);
    second.seconds += first.seconds;
    second.arriving = differenceOf(first.inventory, second.inventory);
    if (!second.arriving.empty()) second.arriving += " within " + secondsText(*target.refresh);
    complete(second.inventory, first.inventory);
    return second;
}

}  // namespace testbed
