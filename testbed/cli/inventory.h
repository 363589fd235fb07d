// What a client sees: the provider's classes and its answers for them.
#pragma once

#include <optional>
#include <span>
#include <string>
#include <vector>

#include "instance_client.h"

namespace testbed {

/// A class that the provider serves, and how its instances name the controller they belong to.
struct ServedClass {
    const char* name;
    const char* heading;      ///< for people
    const char* identityKey;  ///< the key that has the controller's id
    const char* prefix;       ///< what stands before the id in that key
    bool isDevice;            ///< "_" and the device's id follow the controller's id
    const char* singular;     ///< "drive"
    const char* plural;       ///< "drives"; what an option can count
    bool isCounted;           ///< false for software, which nobody counts
};

/// Controllers first.
std::span<const ServedClass> servedClasses();
/// NULL for a class that is not served.
const ServedClass* findServedClass(const std::string& name);

/// What identifies an instance behind its class's prefix: "C0" for a controller, "C0_32_3" for a
/// device of it. None for an instance that does not say it.
std::optional<std::string> identityOf(const ServedClass& served, const Instance& instance);
/// True when the identity may be one of that controller's; ids with underscores leave a doubt.
bool belongsTo(const ServedClass& served, const std::string& identity,
               const std::string& controllerId);

/// Which of the controllers, named by their ids, an instance belongs to: the one with the longest
/// id that fits. None for a stray.
std::optional<std::size_t> ownerAmong(std::span<const std::string> controllerIds,
                                      const ServedClass& served, const Instance& instance);

/// What people call it: its ElementName, or its path when it tells none.
std::string nameOf(const Instance& instance);

struct ClassAnswer {
    std::string className;
    Response response;
};

using Inventory = std::vector<ClassAnswer>;

/// Enumerates the classes one after the other.
Inventory collectInventory(InstanceClient& client, const std::vector<std::string>& classNames,
                           const std::string& nameSpace);

/// True when both hold the same instances with the same values in the same order.
bool sameAnswers(const Inventory& left, const Inventory& right);

}  // namespace testbed
