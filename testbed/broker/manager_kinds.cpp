// The tables of behaviours and of managers, and reading a user's choice of them.
#include "manager_kinds.h"

#include <algorithm>
#include <cctype>
#include <iterator>
#include <sstream>

namespace testbed {

namespace {

/// A behaviour that is one value of a member; off is the member's default.
template <auto member, auto value>
constexpr ManagerBehaviour row(const char* name, const char* summary) {
    return {name, summary,
            [](BrokerOptions& options, bool on) {
                if (on) options.*member = value;
                if (!on && options.*member == value) options.*member = BrokerOptions().*member;
            },
            [](const BrokerOptions& options) { return options.*member == value; }};
}

template <auto member>
constexpr ManagerBehaviour flag(const char* name, const char* summary) {
    return row<member, true>(name, summary);
}

constexpr const char* kHost = "manager.example.com";

void setHostInPaths(BrokerOptions& options, bool on) {
    options.hostInPaths = on ? kHost : "";
}

bool hasHostInPaths(const BrokerOptions& options) {
    return !options.hostInPaths.empty();
}

using Options = BrokerOptions;

constexpr ManagerBehaviour kBehaviours[] = {
    row<&Options::flush, FlushOffer::OwnFunction>(
        "flush-function", "exports the function tool_mm_flush; the context table's flush is null"),
    row<&Options::flush, FlushOffer::None>(
        "no-flush", "has no flush of any kind; the context table's flush is null"),
    flag<&Options::objectsPerThread>("objects-per-thread",
                                     "keeps what a thread obtains until it is flushed or ends, "
                                     "whatever it attaches and detaches"),
    flag<&Options::attachDoesNothing>("attach-does-nothing",
                                      "attachThread does nothing; includes objects-per-thread"),
    flag<&Options::unflushedEndIsMisuse>(
        "unflushed-end", "frees twice what a thread holds that ends: noted as a misuse"),
    flag<&Options::instancesWithoutKeys>("no-keys", "newInstance leaves the key properties null"),
    flag<&Options::refusesCharsInArrays>(
        "no-chars-in-arrays", "an array of strings refuses CMPI_chars (13) and takes CMPI_string"),
    row<&Options::filteredKeys, FilteredKeys::NamesGoToo>(
        "filter-drops-names",
        "a property filter without key list takes the keys from the names too"),
    row<&Options::filteredKeys, FilteredKeys::Stay>(
        "filter-keeps-keys", "a property filter without key list spares the key properties"),
    flag<&Options::silentSuccess>("silent-success",
                                  "a call that succeeds leaves the caller's status as it was"),
    flag<&Options::randomOrder>("random-order", "gives results in another order each time"),
    {"host-in-paths", "paths in results have a host name", setHostInPaths, hasHostInPaths},
    flag<&Options::unknownClassFails>("unknown-class-fails",
                                      "a walk with an unknown class or association fails (5)"),
    flag<&Options::danglingFails>("dangling-fails",
                                  "a walk that meets a dangling reference fails (6)"),
    flag<&Options::serialQueries>("serial-queries", "answers one query at a time"),
    flag<&Options::numericKeys>("numeric-keys", "passes keys that read as numbers as numbers"),
    row<&Options::factoryCalls, 6>("factory-per-class",
                                   "calls the factory six times at once, on threads of their own"),
    row<&Options::whileStopping, WhileStopping::Refuse>("refuse-at-stop",
                                                        "refuses queries (1) while it stops"),
    row<&Options::whileStopping, WhileStopping::Silent>("silent-at-stop",
                                                        "answers no query while it stops"),
    flag<&Options::repeatsStop>("repeated-stop",
                                "repeats its stop every four seconds on a new thread"),
    flag<&Options::requestsDuringStop>("requests-at-stop", "passes requests on while it stops"),
};

constexpr const char* kSmall[] = {"flush-function",     "attach-does-nothing", "unflushed-end",
                                  "filter-drops-names", "random-order",        "serial-queries",
                                  "numeric-keys",       "factory-per-class",   "silent-at-stop",
                                  "repeated-stop"};
constexpr const char* kLarge[] = {
    "no-flush",     "no-keys",       "no-chars-in-arrays",  "filter-keeps-keys",
    "random-order", "host-in-paths", "unknown-class-fails", "dangling-fails"};
constexpr const char* kWorst[] = {"no-flush",           "unflushed-end",      "no-keys",
                                  "no-chars-in-arrays", "filter-drops-names", "silent-success",
                                  "random-order",       "host-in-paths",      "unknown-class-fails",
                                  "dangling-fails",     "serial-queries",     "numeric-keys",
                                  "factory-per-class",  "silent-at-stop",     "repeated-stop",
                                  "requests-at-stop"};

constexpr ManagerKind kKinds[] = {
    {"host", "the host's manager: flush in the context table", {}},
    {"small", "a small manager written in C, a process for each provider", kSmall},
    {"large", "a large manager written in C++", kLarge},
    {"worst", "everything at once that can be combined", kWorst},
};

template <class Row>
const Row* findRow(std::span<const Row> rows, const std::string& name) {
    const auto found = std::find_if(rows.begin(), rows.end(),
                                    [&](const Row& known) { return name == known.name; });
    return found == rows.end() ? nullptr : &*found;
}

template <class Row>
std::string namesOf(std::span<const Row> rows) {
    std::string names;
    for (const Row& known : rows) names += (names.empty() ? "" : ", ") + std::string(known.name);
    return names;
}

/// "no-keys", "no-keys=on" or "no-keys=off".
void setBehaviour(BrokerOptions& options, const std::string& word) {
    const auto equals = word.find('=');
    const std::string name = word.substr(0, equals);
    const std::string value = equals == std::string::npos ? "on" : word.substr(equals + 1);
    const ManagerBehaviour* behaviour = findRow(managerBehaviours(), name);
    if (behaviour == nullptr) {
        throw UnknownManager("unknown manager or behaviour \"" + name + "\"; managers are " +
                             namesOf(managerKinds()) + "; behaviours are " +
                             namesOf(managerBehaviours()));
    }
    if (value != "on" && value != "off") {
        throw UnknownManager("a behaviour is on or off, not \"" + value + "\"");
    }
    behaviour->set(options, value == "on");
}

}  // namespace

std::string ManagerBehaviour::memberName() const {
    std::string member;
    for (const char* c = name; *c != '\0'; ++c) {
        const bool hyphen = *c == '-';
        if (hyphen) ++c;
        member += hyphen ? static_cast<char>(std::toupper(static_cast<unsigned char>(*c))) : *c;
    }
    return member;
}

std::span<const ManagerBehaviour> managerBehaviours() {
    return kBehaviours;
}

std::span<const ManagerKind> managerKinds() {
    return kKinds;
}

void setManagerKind(BrokerOptions& options, const std::string& name) {
    const ManagerKind* kind = findRow(managerKinds(), name);
    if (kind == nullptr) {
        throw UnknownManager("unknown manager \"" + name + "\"; managers are " +
                             namesOf(managerKinds()));
    }
    for (const ManagerBehaviour& behaviour : kBehaviours) behaviour.set(options, false);
    for (const char* behaviour : kind->behaviours) setBehaviour(options, behaviour);
}

void chooseManager(BrokerOptions& options, const std::string& words) {
    BrokerOptions chosen = options;
    std::istringstream list(words);
    bool first = true;
    for (std::string word; std::getline(list, word, ',');) {
        if (first && findRow(managerKinds(), word) != nullptr) {
            setManagerKind(chosen, word);
        } else {
            setBehaviour(chosen, word);
        }
        first = false;
    }
    options = std::move(chosen);
}

std::string managerTable() {
    std::string head = "| behaviour |", rule = "|---|", rows;
    for (const ManagerKind& kind : kKinds) {
        head += std::string(" ") + kind.name + " |";
        rule += "---|";
    }
    for (const ManagerBehaviour& behaviour : kBehaviours) {
        rows += std::string("| `") + behaviour.name + "`: " + behaviour.summary + " |";
        for (const ManagerKind& kind : kKinds) {
            BrokerOptions options;
            setManagerKind(options, kind.name);
            rows += behaviour.isOn(options) ? " yes |" : " |";
        }
        rows += "\n";
    }
    return head + "\n" + rule + "\n" + rows;
}

}  // namespace testbed
