// Object paths and instances as plain data: what the repository keeps and a client receives.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "cim_value.h"

namespace testbed {

/// CIM names compare without regard to letter case.
bool sameName(std::string_view left, std::string_view right);

/// Lower-case copy, the form in which names are used as map keys.
std::string foldName(std::string_view name);

/// For containers of names: spellings that differ in letter case are one key.
struct NameHash {
    using is_transparent = void;
    std::size_t operator()(std::string_view name) const;
};
struct NameEqual {
    using is_transparent = void;
    bool operator()(std::string_view left, std::string_view right) const {
        return sameName(left, right);
    }
};

using NamedValue = std::pair<std::string, CimValue>;

struct ObjectPath {
    std::string nameSpace;
    std::string className;
    std::vector<NamedValue> keys;
    std::string host = {};  ///< no part of the identity

    /// Adds or replaces a key.
    ObjectPath& key(std::string_view name, CimValue value);
    const CimValue* findKey(std::string_view name) const;

    /// Equality as CIM has it: names without case, keys in any order, values by content.
    bool operator==(const ObjectPath& other) const;
    /// `namespace:Class.Key="value",…`, keys in their own order.
    std::string text() const;
    /// A text that is equal for equal paths; a map key.
    std::string identity() const;
};

struct Instance {
    ObjectPath path;
    std::vector<NamedValue> properties;

    /// Adds or replaces a property.
    Instance& set(std::string_view name, CimValue value);
    void erase(std::string_view name);
    /// NULL when the instance has no such property.
    const CimValue* find(std::string_view name) const;
    bool operator==(const Instance& other) const = default;
};

}  // namespace testbed
