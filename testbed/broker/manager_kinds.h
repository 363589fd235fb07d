// Object managers by name, and every single behaviour in which they differ.
#pragma once

#include <span>
#include <stdexcept>
#include <string>

#include "broker_options.h"

namespace testbed {

/// A name that neither a kind of manager nor a behaviour has. The text is one line for the user.
struct UnknownManager : std::invalid_argument {
    using std::invalid_argument::invalid_argument;
};

struct ManagerBehaviour {
    const char* name;
    const char* summary;  ///< what such a manager does; one sentence
    /// Off is what the host's manager does.
    void (*set)(BrokerOptions& options, bool on);
    bool (*isOn)(const BrokerOptions& options);

    /// The name as a scenario file has it: "random-order" is "randomOrder" there.
    std::string memberName() const;
};

struct ManagerKind {
    const char* name;
    const char* summary;
    std::span<const char* const> behaviours;  ///< those that are on
};

std::span<const ManagerBehaviour> managerBehaviours();
std::span<const ManagerKind> managerKinds();

/// Turns on the behaviours of that kind and all others off. Throws UnknownManager.
void setManagerKind(BrokerOptions& options, const std::string& kind);

/// Carries out a list such as "large,random-order,no-keys=off": a kind, which must be the first, or
/// none, and single behaviours. Throws UnknownManager, and then nothing has changed.
void chooseManager(BrokerOptions& options, const std::string& words);

/// Kinds and behaviours as a table in Markdown.
std::string managerTable();

}  // namespace testbed
