// What the broker does instead of answering truthfully: refuse, delay, falsify, or run a hook.
#pragma once

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "books.h"

namespace testbed {

/// A rule applies to a call of `entry` whose given filters all match. The first rule that applies
/// and has not run out decides.
struct FaultRule {
    Entry entry = Entry::Associators;
    std::optional<std::string> className;     ///< class of the path, compared without case
    std::optional<std::string> assocClass;    ///< as passed by the provider
    std::optional<std::string> resultClass;   ///< as passed by the provider
    std::optional<std::string> name;          ///< property or key name
    std::optional<std::string> pathContains;  ///< part of the path's text

    int skip = 0;    ///< let that many matching calls through first
    int times = -1;  ///< then apply to that many calls; -1: for ever

    CMPIrc rc = CMPI_RC_OK;              ///< status to answer
    std::optional<std::string> message;  ///< message of the status; none: no message object
    bool nullResult = false;  ///< answer NULL (implied when rc is not OK, unless keepResult)
    bool keepResult = false;  ///< answer the true result together with the status
    bool wrongType = false;   ///< getNext, getElementAt, getKey, getProperty: a number instead
    std::chrono::milliseconds delay{0};  ///< wait before answering
    std::function<void()> hook;          ///< run first, without the broker's locks
};

/// What a call finds: nothing, or the effect to apply.
using FaultEffect = std::optional<FaultRule>;

/// Thread-safe.
class Faults {
public:
    /// Returns a number for `remove`.
    int add(FaultRule rule);
    void remove(int id);
    /// Forgets all rules; calls that wait because of one go on at once.
    void clear();
    /// From now on nothing is waited for, rules and latency alike: the manager is to end.
    void endWaits();
    /// Delay for every query (see isQuery) that no rule catches.
    void setLatency(std::chrono::milliseconds minimum, std::chrono::milliseconds maximum);
    /// Picks the rule for a call and counts it.
    FaultEffect match(const CallRecord& call);
    static void runHook(const FaultEffect& effect);
    /// Waits as long as the effect says, or a query's answer takes when there is none.
    void wait(const FaultEffect& effect, bool isQuery);
    std::chrono::milliseconds drawLatency();
    /// Whether any rule names an entry of an object (see isObjectEntry); cheap.
    bool hasObjectRules() const { return hasObjectRules_; }

private:
    struct Entry_ {
        int id;
        FaultRule rule;
        int seen = 0;     // matching calls let through, at most rule.skip
        int applied = 0;  // calls that the rule decided
    };
    void noteObjectRules();  // mutex_ held
    void sleep(std::chrono::milliseconds time);

    std::atomic<bool> hasObjectRules_ = false;
    std::mutex mutex_;
    std::condition_variable waits_;                      // some waits are over before their time
    unsigned clearings_ = 0;                             // guarded by mutex_
    bool isEnding_ = false;                              // guarded by mutex_
    std::vector<Entry_> rules_;                          // guarded by mutex_
    int nextId_ = 1;                                     // guarded by mutex_
    std::chrono::milliseconds minimum_{0}, maximum_{0};  // guarded by mutex_
    unsigned state_ = 12345;                             // guarded by mutex_
};

}  // namespace testbed
